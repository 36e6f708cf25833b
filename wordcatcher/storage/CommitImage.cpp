#include "wordcatcher/storage/CommitImage.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <random>
#include <string_view>
#include <system_error>

#include "wordcatcher/Error.h"

namespace wordcatcher {

namespace {

// Names may have 255 bytes on all common file systems; what is added to the target's takes 22.
constexpr std::size_t kMaxNameBytes = 200;

// A name of 64 random bits is taken by accident never, and by intent not often in a row.
constexpr int kNameAttempts = 16;

const char* adviceFor(int code) {
  switch (code) {
    case ENOSPC:
    case EDQUOT:
    case EFBIG:
      return "make room there and try again";
    case EACCES:
    case EPERM:
    case EROFS:
      return "check the permissions of its directory, in which a file must be made, and try again";
    case ENOENT:
    case ENOTDIR:
      return "create its directory, or name another, and try again";
    default:
      return "check the device and try again, or name another place";
  }
}

[[noreturn]] void throwNotWritable(const std::string& path, const char* step, int code) {
  throw Error(ErrorCode::notWritable, "The index " + path + " cannot be written (" + step + ": " +
                                          std::generic_category().message(code) + "); " +
                                          adviceFor(code) + ".");
}

/// The directory part of a path with its "/", or nothing; and the name in it.
struct SplitPath {
  std::string directory;
  std::string name;

  explicit SplitPath(const std::string& path) {
    const std::size_t slash = path.rfind('/');
    const std::size_t begin = slash == std::string::npos ? 0 : slash + 1;
    directory = path.substr(0, begin);
    name = path.substr(begin);
  }
};

/// ".NAME-HEX": hidden, so that what looks for indexes passes it over.
std::string temporaryStem(const SplitPath& target) {
  std::size_t kept = std::min(target.name.size(), kMaxNameBytes);
  // Not within a character: some file systems refuse names that are not UTF-8.
  while (kept > 0 && kept < target.name.size() && (target.name[kept] & 0xC0) == 0x80) {
    --kept;
  }
  std::random_device source;
  std::array<char, 17> digits{};
  (void)std::snprintf(digits.data(), digits.size(), "%08x%08x", source(), source());
  return target.directory + "." + target.name.substr(0, kept) + "-" + digits.data();
}

/// One replacement on its way: whatever happens, its files are closed and removed with it.
class Replacement {
 public:
  Replacement(FileSystem& files, const std::string& path) : _files(files), _path(path) {
    checkTarget();
    createTemporary();
  }

  ~Replacement() {
    closeFile(_file);
    closeFile(_directory);
    if (!_temporary.empty()) {
      _files.remove(_temporary);
    }
    if (!_backup.empty()) {
      _files.remove(_backup);
    }
  }

  Replacement(const Replacement&) = delete;
  Replacement& operator=(const Replacement&) = delete;

  void write(std::span<const std::byte> bytes) {
    while (!bytes.empty()) {
      const ssize_t written = _files.write(_file, bytes);
      if (written < 0 && errno == EINTR) {
        continue;
      }
      if (written <= 0) {
        fail("writing it", written < 0 ? errno : ENOSPC);
      }
      bytes = bytes.subspan(static_cast<std::size_t>(written));
    }
    if (!sync(_file)) {
      fail("bringing it to the device", errno);
    }
    // An interrupted close has closed all the same, and the file has been synced.
    if (closeFile(_file) != 0 && errno != EINTR) {
      fail("closing it", errno);
    }
  }

  void publish() {
    openDirectory();
    keepOldFile();
    if (_files.rename(_temporary, _path) != 0) {
      fail("renaming it", errno);
    }
    _temporary.clear();
    if (!sync(_directory) && errno != EINVAL && errno != ENOTSUP) {
      const int code = errno;
      const bool restored = restoreOldFile();
      fail(restored ? "bringing its directory to the device"
                    : "bringing its directory to the device; the new index is in its place, but a "
                      "power failure may undo that",
           code);
    }
  }

 private:
  [[noreturn]] void fail(const char* step, int code) const { throwNotWritable(_path, step, code); }

  /// A rename would also replace devices and pipes.
  void checkTarget() const {
    const SplitPath target(_path);
    if (target.name.empty() || _path.find('\0') != std::string::npos) {
      throw Error(ErrorCode::notWritable,
                  "The path of the index does not name a file: it is empty, ends in \"/\" or holds "
                  "U+0000; name a file.");
    }
    struct stat status = {};
    if (_files.status(_path, status) == 0 && !S_ISREG(status.st_mode)) {
      throw Error(ErrorCode::notWritable,
                  _path + (S_ISDIR(status.st_mode) ? " is a directory" : " is not a regular file") +
                      "; name a file for the index.");
    }
  }

  void createTemporary() {
    const SplitPath target(_path);
    for (int attempt = 0; _file < 0; ++attempt) {
      _stem = temporaryStem(target);
      _temporary = _stem + ".tmp";
      _file = _files.create(_temporary);
      if (_file < 0) {
        _temporary.clear();
        if ((errno != EEXIST && errno != EINTR) || attempt == kNameAttempts) {
          fail("making a file beside it", errno);
        }
      }
    }
  }

  /// Before the rename, so that a directory that cannot be synced changes nothing.
  void openDirectory() {
    const std::string directory = SplitPath(_path).directory;
    do {
      _directory = _files.openDirectory(directory.empty() ? "." : directory);
    } while (_directory < 0 && errno == EINTR);
    if (_directory < 0) {
      fail("opening its directory", errno);
    }
  }

  void keepOldFile() {
    _backup = _stem + ".old";
    if (_files.link(_path, _backup) != 0) {
      _backup.clear();
      _isNew = errno == ENOENT;
    }
  }

  bool restoreOldFile() {
    if (!_backup.empty() && _files.rename(_backup, _path) == 0) {
      _backup.clear();
      return true;
    }
    return _isNew && _files.remove(_path) == 0;
  }

  bool sync(int file) {
    // Only an interruption is tried again: after another failure a second try succeeds without
    // having written what the first one lost.
    int result = 0;
    do {
      result = _files.sync(file);
    } while (result != 0 && errno == EINTR);
    return result == 0;
  }

  int closeFile(int& file) {
    const int closed = file;
    file = -1;
    return closed < 0 ? 0 : _files.close(closed);
  }

  FileSystem& _files;
  const std::string& _path;
  std::string _stem;
  std::string _temporary;  // empty once it is renamed
  std::string _backup;     // the old file's second name while it is needed
  bool _isNew = false;     // there was no old file
  int _file = -1;
  int _directory = -1;
};

}  // namespace

void commitImage(FileSystem& files, const std::string& path, std::span<const std::byte> bytes) {
  Replacement replacement(files, path);
  replacement.write(bytes);
  replacement.publish();
}

}  // namespace wordcatcher
