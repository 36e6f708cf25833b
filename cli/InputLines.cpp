#include "cli/InputLines.h"

#include <fcntl.h>
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

InputLines::InputLines(const std::string& path)
    : _name(path == "-" ? "standard input" : path),
      _descriptor(path == "-" ? STDIN_FILENO : open(path.c_str(), O_RDONLY | O_CLOEXEC)),
      _owned(path != "-") {
  if (_descriptor < 0) {
    throw Failure("Cannot read " + quoted(_name) + " (" + errorText() +
                  "): check the file's name and permissions.");
  }
}

InputLines::~InputLines() {
  if (_owned) {
    close(_descriptor);
  }
}

std::optional<InputLine> InputLines::next() {
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
  auto text = fromUtf8(*line);
  if (!text) {
    throw Failure(place() + " is not valid UTF-8: convert the input to UTF-8 and try again.");
  }
  return InputLine{std::move(*line), std::move(*text)};
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

bool InputLines::readMore() {
  std::array<char, kBlockBytes> block{};
  ssize_t count = 0;
  do {
    count = read(_descriptor, block.data(), block.size());
  } while (count < 0 && errno == EINTR);
  if (count < 0) {
    throw Failure("Cannot read " + quoted(_name) + " (" + errorText() +
                  "): give a text file, or a pipe, that can be read.");
  }
  _buffer.append(block.data(), static_cast<std::size_t>(count));
  return count > 0;
}

}  // namespace wordcatcher::cli
