#include "wordcatcher/storage/TinyCDB.h"

#include <cdb.h>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/mman.h>
#include <syslog.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <unordered_set>
#include <utility>

#include "wordcatcher/log/LogLine.h"
#include "wordcatcher/storage/TableFile.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

constexpr const char* kSetMode = "-[TinyCDB setMode:]";
constexpr const char* kSetValue = "-[TinyCDB setValue:forKey:]";
constexpr const char* kValuesFor = "-[TinyCDB valuesFor:]";

/// Opens a file and waits for its exclusive lock. errno afterwards is what open() left: a failure
/// of the lock (a file system without locks) neither fails the call nor shows in it.
int openLocked(const std::string& path, int flags) {
  const int descriptor = open(path.c_str(), flags | O_CLOEXEC, kPermissions);
  if (descriptor >= 0) {
    const int openCode = errno;
    while (flock(descriptor, LOCK_EX) != 0 && errno == EINTR) {
    }
    errno = openCode;
  }
  return descriptor;
}

/// Closes a file and gives its lock back. Closing alone would not: a mapping that outlives the
/// descriptor keeps the open file, and with it the lock, alive.
void closeLocked(int descriptor) {
  if (descriptor >= 0) {
    flock(descriptor, LOCK_UN);
    close(descriptor);
  }
}

/// The bytes that are stored for a string: its UTF-8 form up to the first zero byte.
std::optional<std::string> storedBytes(std::optional<std::u16string_view> text) {
  if (!text) {
    return std::nullopt;
  }
  return toUtf8(text->substr(0, text->find(u'\0')));
}

}  // namespace

TinyCDB::TinyCDB(std::string path)
    : _cdb(std::make_unique<struct cdb>()),
      _cdbmake(std::make_unique<struct cdb_make>()),
      _cdbfind(std::make_unique<struct cdb_find>()),
      _path(std::move(path)) {}

TinyCDB::~TinyCDB() {
  unmapReadHandle(*_cdb);
  std::free(buf);
}

void TinyCDB::setMode(std::int32_t mode) {
  if (_mode != mode && _mode != 0) {
    if (_mode == kWriting) {
      logLine("%s Finalizing %@", {kSetMode, _path});
      if (!_makeStarted || cdb_make_finish(_cdbmake.get()) != 0) {
        logLine("%s Could not finalize for db make at %@, db may be corrupted!", {kSetMode, _path});
      }
    }
    closeLocked(_fileDesc);
    // A mode that opens nothing may be left later, and must not close the number a second time.
    _fileDesc = -1;
  }
  if (mode == kWriting) {
    enterWriting();
  } else if (mode == kReading) {
    enterReading();
  }
  _mode = mode;
}

void TinyCDB::enterWriting() {
  // A successful open leaves errno alone, and the test for EEXIST below reads it even then: a stale
  // EEXIST of the host would open the file twice and wait for our own lock.
  errno = 0;
  _fileDesc = openLocked(_path, O_RDWR | O_CREAT | O_EXCL | O_NOFOLLOW);
  if (_fileDesc < 0 && errno != EEXIST) {
    logLine("%s Could not RDRW open file %@ because (%d) %s",
            {kSetMode, _path, errno, ErrorText{errno}});
  }
  if (errno == EEXIST) {
    _fileDesc = openLocked(_path, O_RDWR | O_EXCL | O_NOFOLLOW);
    if (_fileDesc < 0) {
      logLine("%s Could not open file %@ because (%d) %s",
              {kSetMode, _path, errno, ErrorText{errno}});
    }
  }
  if (_fileDesc < 0) {
    logLine("%s Could not RDRW open file %@ because (%d) %s",
            {kSetMode, _path, errno, ErrorText{errno}});
  }
  _makeStarted = cdb_make_start(_cdbmake.get(), _fileDesc) == 0;
  if (!_makeStarted) {
    logLine("%s Could not init for db make at %@ because (%d) %s",
            {kSetMode, _path, errno, ErrorText{errno}});
  }
}

void TinyCDB::enterReading() {
  _fileDesc = openLocked(_path, O_RDONLY);
  if (_fileDesc < 0) {
    logLine("%s Could not RDONLY open file %@", {kSetMode, _path});
  }
  const struct cdb previous = *_cdb;
  if (cdb_init(_cdb.get(), _fileDesc) != 0) {
    logLine("%s Could not init db at %@", {kSetMode, _path});
  } else {
    unmapReadHandle(previous);
  }
}

std::int32_t TinyCDB::getMode() const noexcept { return cdb_fileno(_cdb.get()) > 0 ? 1 : 0; }

void TinyCDB::setValue_forKey(std::optional<std::u16string_view> value,
                              std::optional<std::u16string_view> key) {
  const auto keyBytes = storedBytes(key);
  const auto valueBytes = storedBytes(value);
  if (!keyBytes || !valueBytes) {
    return;
  }
  // Outside a writing pass the writer's record holds no buffer, or a descriptor that was closed and
  // may be the host's by now.
  const bool writing = _mode == kWriting && _makeStarted;
  if (!writing) {
    errno = EBADF;
  }
  if (!writing ||
      cdb_make_add(_cdbmake.get(), keyBytes->data(), static_cast<unsigned>(keyBytes->size()),
                   valueBytes->data(), static_cast<unsigned>(valueBytes->size())) != 0) {
    logLine("%s Could not put %@ into key %@ because (%d) %s",
            {kSetValue, *value, *key, errno, ErrorText{errno}});
  }
}

std::set<std::u16string> TinyCDB::valuesFor(std::u16string_view key) {
  std::set<std::u16string> values;
  const auto keyBytes = storedBytes(key);
  // The library's bounds checks take two things for granted that a file or a caller may break: a
  // mapping that holds at least the header, and a key that is no longer than the file.
  const bool usable = keyBytes && _cdb->cdb_mem != nullptr && _cdb->cdb_fsize >= kHeaderBytes &&
                      keyBytes->size() < _cdb->cdb_fsize;
  const int found = usable ? cdb_findinit(_cdbfind.get(), _cdb.get(), keyBytes->data(),
                                          static_cast<unsigned>(keyBytes->size()))
                           : 0;
  if (found != 1) {
    logLine("%s Could not init query for @\"%@\" because (%d)", {kValuesFor, key, errno});
    // The cursor of a miss has nothing to give, and that of a damaged file points nowhere.
    return values;
  }
  std::unordered_set<std::string> seen;
  while (cdb_findnext(_cdbfind.get()) > 0) {
    if (!readFoundValue()) {
      logLine("%s unable to read value for %@", {kValuesFor, key});
    }
    const std::size_t length = _cdb->cdb_vlen;
    if (length > 0 && (buf == nullptr || length > static_cast<std::size_t>(blen))) {
      continue;
    }
    // After a failed read, whatever the buffer holds.
    const auto inserted =
        seen.emplace(length == 0 ? "" : reinterpret_cast<const char*>(buf), length);
    if (!inserted.second) {
      continue;
    }
    if (auto value = fromUtf8(*inserted.first)) {
      values.insert(std::move(*value));
    }
  }
  return values;
}

/// Copies the value that the cursor stands on into `buf`. A length that `blen` cannot express, or
/// one for which there is no memory, counts as unreadable.
bool TinyCDB::readFoundValue() {
  const unsigned length = _cdb->cdb_vlen;
  if (length > static_cast<unsigned>(std::numeric_limits<std::int32_t>::max())) {
    return false;
  }
  _allocbuf(static_cast<std::int32_t>(length));
  if (length == 0) {
    return true;
  }
  return buf != nullptr && cdb_read(_cdb.get(), buf, length, _cdb->cdb_vpos) == 0;
}

void TinyCDB::_allocbuf(std::int32_t size) {
  if (blen >= size) {
    return;
  }
  // `blen` is never negative, so the size is at least 1 here.
  // NOLINTBEGIN(clang-analyzer-optin.portability.UnixAPI)
  auto* const grown =
      static_cast<unsigned char*>(std::realloc(buf, static_cast<std::size_t>(size)));
  // NOLINTEND(clang-analyzer-optin.portability.UnixAPI)
  if (grown == nullptr) {
    std::free(buf);
    syslog(LOG_USER | LOG_ERR, "Unable to allocate %u bytes", static_cast<unsigned>(size));
  } else {
    // So that a failed read leaves nothing undefined to decode.
    const std::int32_t kept = buf == nullptr ? 0 : blen;
    std::memset(grown + kept, 0, static_cast<std::size_t>(size - kept));
  }
  buf = grown;
  blen = size;
}

void TinyCDB::unmapReadHandle(const struct cdb& handle) noexcept {
  if (handle.cdb_mem != nullptr) {
    munmap(const_cast<unsigned char*>(handle.cdb_mem), handle.cdb_fsize);
  }
}

const std::string& TinyCDB::path() const noexcept { return _path; }

void TinyCDB::setPath(std::string path) { _path = std::move(path); }

}  // namespace wordcatcher
