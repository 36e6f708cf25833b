#include "cli/WaitingNote.h"

#include <unistd.h>

#include <utility>

namespace wordcatcher::cli {

namespace {

using std::chrono::steady_clock;

constexpr std::chrono::milliseconds kWaitAtMost{100};

}  // namespace

WaitingNote::WaitingNote(const std::string& what) : WaitingNote([what] { return what; }) {
  begin();
}

WaitingNote::WaitingNote(What what) : _what(std::move(what)) {
  if (isatty(STDERR_FILENO) == 1) {
    _thread = std::jthread([this](const std::stop_token& stop) { tick(stop); });
  }
}

void WaitingNote::begin() {
  if (!_thread.joinable()) {
    return;
  }
  const std::lock_guard lock(_mutex);
  if (!_since) {
    _since = steady_clock::now();
    _shown = {};
  }
}

void WaitingNote::pause() {
  if (!_thread.joinable()) {
    return;
  }
  const std::lock_guard lock(_mutex);
  _since.reset();
  _line.wipe();
}

/// Looks rather than being woken, so that beginning and pausing cost next to nothing.
void WaitingNote::tick(const std::stop_token& stop) {
  std::unique_lock lock(_mutex);
  while (!_wake.wait_for(lock, stop, kWaitAtMost, [] { return false; }) && !stop.stop_requested()) {
    if (!_since) {
      continue;
    }
    const auto seconds =
        std::chrono::duration_cast<std::chrono::seconds>(steady_clock::now() - *_since);
    if (seconds > _shown) {
      _shown = seconds;
      _line.say(_what() + " ... " + std::to_string(seconds.count()) + " s");
    }
  }
}

}  // namespace wordcatcher::cli
