#include "cli/InputLines.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <string_view>
#include <utility>

#include "cli/Failure.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher::cli {

namespace {

constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";
constexpr std::size_t kBlockBytes = 65536;

}  // namespace

InputLines::InputLines(const std::string& path, std::optional<int> stop)
    : _name(path == "-" ? "standard input" : path),
      _descriptor(path == "-" ? STDIN_FILENO : open(path.c_str(), O_RDONLY | O_CLOEXEC)),
      _owned(path != "-"),
      _stop(stop) {
  if (_descriptor < 0) {
    throw Failure("Cannot read " + inQuotes(_name) + " (" + errorText() +
                  "): check the file's name and permissions.");
  }
}

InputLines::~InputLines() {
  if (_owned) {
    close(_descriptor);
  }
}

std::optional<std::string> InputLines::nextBytes() {
  auto line = nextRaw();
  if (!line) {
    return std::nullopt;
  }
  if (++_lineNumber == 1 && line->starts_with(kByteOrderMark)) {
    line->erase(0, kByteOrderMark.size());
  }
  if (line->ends_with('\r')) {
    line->pop_back();
  }
  return line;
}

std::optional<InputLine> InputLines::next() {
  auto line = nextBytes();
  if (!line) {
    return std::nullopt;
  }
  auto text = fromUtf8(*line);
  if (!text) {
    throw Failure(place() + " is not valid UTF-8: convert the input to UTF-8 and try again.");
  }
  return InputLine{std::move(*line), std::move(*text)};
}

std::optional<std::uint64_t> InputLines::bytesInAll() const {
  struct stat status {};
  if (fstat(_descriptor, &status) != 0 || !S_ISREG(status.st_mode)) {
    return std::nullopt;
  }
  const off_t read = lseek(_descriptor, 0, SEEK_CUR);
  const off_t left = status.st_size - read;
  return read < 0 || left < 0 ? std::nullopt
                              : std::optional(_bytesRead + static_cast<std::uint64_t>(left));
}

std::string InputLines::place() const { return _name + ", line " + std::to_string(_lineNumber); }

std::optional<std::string> InputLines::nextRaw() {
  std::size_t searched = _begin;
  for (;;) {
    const std::size_t end = _buffer.find('\n', searched);
    if (end != std::string::npos) {
      std::string line = _buffer.substr(_begin, end - _begin);
      _begin = end + 1;
      return line;
    }
    _buffer.erase(0, _begin);
    _begin = 0;
    searched = _buffer.size();
    if (!readMore()) {
      if (_buffer.empty()) {
        return std::nullopt;
      }
      return std::exchange(_buffer, std::string());
    }
  }
}

/// Waits until there is something to read, and returns false if it was told to stop instead.
bool InputLines::waitForMore() const {
  std::array<pollfd, 2> waited{pollfd{_descriptor, POLLIN, 0}, pollfd{*_stop, POLLIN, 0}};
  while (poll(waited.data(), waited.size(), -1) < 0 && errno == EINTR) {
  }
  return waited.back().revents == 0;
}

bool InputLines::readMore() {
  if (_stop && !waitForMore()) {
    _buffer.clear();
    return false;
  }
  std::array<char, kBlockBytes> block{};
  ssize_t count = 0;
  do {
    count = read(_descriptor, block.data(), block.size());
  } while (count < 0 && errno == EINTR);
  if (count < 0) {
    throw Failure("Cannot read " + inQuotes(_name) + " (" + errorText() +
                  "): give a text file, or a pipe, that can be read.");
  }
  _bytesRead += static_cast<std::uint64_t>(count);
  _buffer.append(block.data(), static_cast<std::size_t>(count));
  return count > 0;
}

}  // namespace wordcatcher::cli
