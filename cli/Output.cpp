#include "cli/Output.h"

#include <unistd.h>

#include <cerrno>
#include <utility>

#include "cli/Failure.h"

namespace wordcatcher::cli {

namespace {

constexpr std::size_t kFlushBytes = 65536;

}  // namespace

void Output::write(std::string_view text) {
  _buffer += text;
  if (_buffer.size() >= kFlushBytes) {
    flush();
  }
}

void Output::flush() {
  const std::string buffer = std::exchange(_buffer, std::string());
  std::string_view left = buffer;
  if (_beforeWriting && !left.empty()) {
    _beforeWriting();
  }
  while (!left.empty()) {
    const ssize_t count = ::write(STDOUT_FILENO, left.data(), left.size());
    if (count >= 0) {
      left.remove_prefix(static_cast<std::size_t>(count));
    } else if (errno == EPIPE) {
      throw OutputClosed();
    } else if (errno != EINTR) {
      throw Failure("Cannot write standard output (" + errorText() +
                    "): send it to a place that can be written.");
    }
  }
}

}  // namespace wordcatcher::cli
