#ifndef WORDCATCHER_STORAGE_FILESYSTEM_H
#define WORDCATCHER_STORAGE_FILESYSTEM_H

#include <sys/stat.h>
#include <sys/types.h>

#include <cstddef>
#include <span>
#include <string>

namespace wordcatcher {

/// The calls by which a file is replaced, so that a test can let any of them fail. Each is its
/// namesake of POSIX, and reports as that does: -1, and errno. Any number of threads.
class FileSystem {
 public:
  FileSystem() = default;
  virtual ~FileSystem() = default;
  FileSystem(const FileSystem&) = delete;
  FileSystem& operator=(const FileSystem&) = delete;

  virtual int status(const std::string& path, struct stat& status);

  /// Opens a new file for writing, with mode 0666 less the creation mask; fails when the name is
  /// taken, be it by a link that leads nowhere.
  virtual int create(const std::string& path);

  /// Opens a directory for sync().
  virtual int openDirectory(const std::string& path);

  virtual ssize_t write(int file, std::span<const std::byte> bytes);
  virtual int sync(int file);
  virtual int close(int file);

  /// Gives a file a second name; a symbolic link is not followed.
  virtual int link(const std::string& from, const std::string& to);

  virtual int rename(const std::string& from, const std::string& to);
  virtual int remove(const std::string& path);
};

}  // namespace wordcatcher

#endif
