#include "wordcatcher/storage/FileSystem.h"

#include <fcntl.h>
#include <unistd.h>

#include <cstdio>

#include "wordcatcher/storage/TableFile.h"

namespace wordcatcher {

int FileSystem::status(const std::string& path, struct stat& status) {
  return ::stat(path.c_str(), &status);
}

int FileSystem::create(const std::string& path) {
  return ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, kPermissions);
}

int FileSystem::openDirectory(const std::string& path) {
  return ::open(path.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
}

ssize_t FileSystem::write(int file, std::span<const std::byte> bytes) {
  return ::write(file, bytes.data(), bytes.size());
}

int FileSystem::sync(int file) { return ::fsync(file); }

int FileSystem::close(int file) { return ::close(file); }

int FileSystem::link(const std::string& from, const std::string& to) {
  return ::linkat(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), 0);
}

int FileSystem::rename(const std::string& from, const std::string& to) {
  return std::rename(from.c_str(), to.c_str());
}

int FileSystem::remove(const std::string& path) { return ::unlink(path.c_str()); }

}  // namespace wordcatcher
