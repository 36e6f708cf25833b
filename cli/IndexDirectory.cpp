#include "cli/IndexDirectory.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <fstream>
#include <memory>

#include "cli/Failure.h"
#include "cli/LockWatcher.h"
#include "cli/TableLog.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/storage/TableFile.h"

namespace wordcatcher::cli {

namespace {

// A table file begins with 256 pairs of 32-bit little-endian numbers: where a hash table begins and
// how many slots of 8 bytes it has.
constexpr std::size_t kPairBytes = 8;
constexpr std::uint64_t kSlotBytes = 8;

// Links to the files that this process has open, and what is known of each.
const std::string kDescriptors = "/proc/self/fd/";
const std::string kDescriptorInfo = "/proc/self/fdinfo/";

using Header = std::array<unsigned char, kHeaderBytes>;

struct CloseDirectory {
  void operator()(DIR* directory) const noexcept { closedir(directory); }
};

std::uint64_t littleEndian32(const unsigned char* bytes) {
  return bytes[0] | std::uint64_t{bytes[1]} << 8U | std::uint64_t{bytes[2]} << 16U |
         std::uint64_t{bytes[3]} << 24U;
}

/// Where the table ends, or nothing if the header was never written or points outside the file.
std::optional<std::uint64_t> endOfTable(const Header& header, std::uint64_t fileBytes) {
  std::uint64_t end = kHeaderBytes;
  for (std::size_t pair = 0; pair < kHeaderBytes; pair += kPairBytes) {
    const std::uint64_t begin = littleEndian32(&header.at(pair));
    const std::uint64_t slots = littleEndian32(&header.at(pair + kPairBytes / 2));
    if (begin < kHeaderBytes) {
      return std::nullopt;
    }
    end = std::max(end, begin + slots * kSlotBytes);
  }
  return end <= fileBytes ? std::optional(end) : std::nullopt;
}

/// Bytes of a table from its header to the end of its hash tables, or nothing if the file is no
/// finished table.
std::optional<std::uint64_t> tableSize(const std::string& path) {
  const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
  if (descriptor < 0) {
    return std::nullopt;
  }
  struct stat status {};
  Header header{};
  const bool whole =
      fstat(descriptor, &status) == 0 &&
      pread(descriptor, header.data(), header.size(), 0) == static_cast<ssize_t>(header.size());
  close(descriptor);
  return whole ? endOfTable(header, static_cast<std::uint64_t>(status.st_size)) : std::nullopt;
}

std::string tryIndexing(const std::string& directory) {
  return "index the phrases again with " + inQuotes("wordcatcher index --tables " + directory) +
         ".";
}

/// Whether a lock is held through a descriptor.
bool holdsLock(const std::string& descriptor) {
  std::ifstream info(kDescriptorInfo + descriptor);
  for (std::string line; std::getline(info, line);) {
    if (line.starts_with("lock:")) {
      return true;
    }
  }
  return false;
}

bool sameFile(const struct stat& a, const struct stat& b) {
  return a.st_dev == b.st_dev && a.st_ino == b.st_ino;
}

}  // namespace

IndexDirectory::IndexDirectory(const std::string& directory)
    : _name(directory), _path(directory.ends_with('/') ? directory : directory + '/') {
  if (directory.empty()) {
    throw Failure("The name of the index directory is empty: give a directory.");
  }
  _tables = {_path + "edgeTable.tdb", _path + "dataTable.tdb", _path + "finalTable.tdb"};
}

void IndexDirectory::openForReading(const TableLog& log, const std::function<void()>& open) const {
  checkReadable();
  {
    const LockWatcher watcher(*this);
    try {
      open();
    } catch (const Error&) {
      tableBytes();
      throw;
    }
  }
  // Only now is no other process still writing them.
  tableBytes();
  if (log.failed()) {
    throw Failure("Cannot open the index in " + inQuotes(_name) + " (" +
                  errorText(log.errorCode()) + "): check the directory's permissions, or " +
                  tryIndexing(_name));
  }
}

void IndexDirectory::checkReadable() const {
  struct stat status {};
  if (stat(_path.c_str(), &status) != 0) {
    throw Failure("Cannot read the directory " + inQuotes(_name) + " (" + errorText() +
                  "): check its name, or " + tryIndexing(_name));
  }
  for (const auto& table : _tables) {
    const int descriptor = ::open(table.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    if (descriptor < 0) {
      throw Failure("Cannot read the table " + inQuotes(table) + " (" + errorText() +
                    "): check that " + inQuotes(_name) + " is the index's directory, or " +
                    tryIndexing(_name));
    }
    const bool regular = fstat(descriptor, &status) == 0 && S_ISREG(status.st_mode);
    close(descriptor);
    if (!regular) {
      throw Failure(inQuotes(table) + " is not a regular file: remove it, then " +
                    tryIndexing(_name));
    }
  }
}

std::uint64_t IndexDirectory::tableBytes() const {
  std::uint64_t sum = 0;
  for (const auto& table : _tables) {
    const auto size = tableSize(table);
    if (!size) {
      throw Failure(inQuotes(table) +
                    " is not a table, or is damaged or unfinished: " + tryIndexing(_name));
    }
    sum += *size;
  }
  return sum;
}

std::optional<std::size_t> IndexDirectory::lastTable(bool unlocked) const {
  const std::unique_ptr<DIR, CloseDirectory> descriptors(opendir(kDescriptors.c_str()));
  std::array<struct stat, kTables> tables{};
  std::array<bool, kTables> exists{};
  for (std::size_t i = 0; i < kTables; ++i) {
    exists.at(i) = stat(_tables.at(i).c_str(), &tables.at(i)) == 0;
  }
  std::optional<std::size_t> last;
  while (descriptors != nullptr) {
    const auto* const entry = readdir(descriptors.get());
    if (entry == nullptr) {
      break;
    }
    struct stat open {};
    if (stat((kDescriptors + entry->d_name).c_str(), &open) != 0) {
      continue;
    }
    for (std::size_t i = 0; i < kTables; ++i) {
      if (exists.at(i) && sameFile(open, tables.at(i)) && !(unlocked && holdsLock(entry->d_name))) {
        last = std::max(last.value_or(i), i);
      }
    }
  }
  return last;
}

}  // namespace wordcatcher::cli
