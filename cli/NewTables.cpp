#include "cli/NewTables.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

#include "cli/Failure.h"
#include "wordcatcher/storage/TableFile.h"

namespace wordcatcher::cli {

namespace {

constexpr mode_t kDirectoryPermissions = 0777;

[[noreturn]] void throwCannotWrite(const std::string& path, const std::string& reason) {
  throw Failure("Cannot write " + inQuotes(path) + " (" + reason +
                "): make the directory and its tables writable, or choose another directory.");
}

/// Whether no process holds the file's lock.
bool isUnlocked(const std::string& path) {
  const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK);
  if (descriptor < 0) {
    return false;
  }
  const bool unlocked = flock(descriptor, LOCK_EX | LOCK_NB) == 0 || errno != EWOULDBLOCK;
  close(descriptor);
  return unlocked;
}

/// Clears the header, as it is while a table is being written. Nothing can be done if that fails,
/// and the run has already failed.
void markUnfinished(const std::string& path) {
  const int descriptor = open(path.c_str(), O_WRONLY | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK);
  if (descriptor < 0) {
    return;
  }
  constexpr std::array<char, kHeaderBytes> kNoHeader{};
  static_cast<void>(pwrite(descriptor, kNoHeader.data(), kNoHeader.size(), 0) < 0);
  close(descriptor);
}

}  // namespace

NewTables::~NewTables() {
  const std::lock_guard lock(_mutex);
  discard();
}

void NewTables::prepare() {
  const std::lock_guard lock(_mutex);
  createDirectory();
  for (std::size_t i = 0; i < IndexDirectory::kTables; ++i) {
    _created.at(i) = createTable(_directory.tables().at(i));
  }
}

void NewTables::startWriting() {
  const std::lock_guard lock(_mutex);
  _phase = Phase::kWriting;
}

void NewTables::keep() {
  const std::lock_guard lock(_mutex);
  _phase = Phase::kKept;
}

void NewTables::discardForGood() {
  std::unique_lock lock(_mutex);
  discard();
  lock.release();
}

void NewTables::createDirectory() {
  if (mkdir(_directory.path().c_str(), kDirectoryPermissions) == 0) {
    _createdDirectory = true;
    return;
  }
  const int code = errno;
  struct stat status {};
  if (stat(_directory.name().c_str(), &status) == 0 && !S_ISDIR(status.st_mode)) {
    throw Failure(inQuotes(_directory.name()) + " is not a directory: choose another name.");
  }
  if (stat(_directory.path().c_str(), &status) != 0) {
    throw Failure("Cannot create the directory " + inQuotes(_directory.name()) + " (" +
                  errorText(code) + "): create its parent directory or choose another place.");
  }
}

/// Creates an empty table file; false if one that can be written stands there.
bool NewTables::createTable(const std::string& path) {
  int descriptor =
      open(path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, kPermissions);
  const bool created = descriptor >= 0;
  if (!created && errno == EEXIST) {
    descriptor = open(path.c_str(), O_RDWR | O_NOFOLLOW | O_CLOEXEC | O_NONBLOCK);
  }
  if (descriptor < 0) {
    throwCannotWrite(path, errorText());
  }
  struct stat status {};
  const bool regular = fstat(descriptor, &status) == 0 && S_ISREG(status.st_mode);
  close(descriptor);
  if (!regular) {
    throwCannotWrite(path, "not a regular file");
  }
  return created;
}

void NewTables::discard() {
  if (_phase == Phase::kKept) {
    return;
  }
  for (std::size_t i = 0; i < IndexDirectory::kTables; ++i) {
    const auto& path = _directory.tables().at(i);
    if (_created.at(i)) {
      if (mayRemove(i)) {
        unlink(path.c_str());
      }
    } else if (_phase == Phase::kWriting) {
      markUnfinished(path);
    }
  }
  if (_createdDirectory) {
    // Fails, as it should, when someone else has put something there.
    rmdir(_directory.path().c_str());
  }
}

/// Between being created and being locked, a file may have become another process's.
bool NewTables::mayRemove(std::size_t table) const {
  if (_phase == Phase::kWriting) {
    return true;
  }
  const auto& path = _directory.tables().at(table);
  struct stat status {};
  const bool empty = stat(path.c_str(), &status) == 0 && status.st_size == 0;
  const auto lastOpen = _directory.lastOpenTable();
  const bool lockedByUs = lastOpen && table < *lastOpen;
  return empty && (lockedByUs || isUnlocked(path));
}

}  // namespace wordcatcher::cli
