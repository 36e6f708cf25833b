#include "cli/WaitingNote.h"

#include <unistd.h>

#include <chrono>
#include <utility>

#include "cli/ProgressBar.h"

namespace wordcatcher::cli {

WaitingNote::WaitingNote(std::string what) : _what(std::move(what)) {
  if (isatty(STDERR_FILENO) == 1) {
    _thread = std::jthread([this](const std::stop_token& stop) { tick(stop); });
  }
}

void WaitingNote::tick(const std::stop_token& stop) {
  ProgressBar line;
  std::unique_lock lock(_mutex);
  for (int seconds = 1;
       !_wake.wait_for(lock, stop, std::chrono::seconds(1), [] { return false; }) &&
       !stop.stop_requested();
       ++seconds) {
    line.say(_what + " ... " + std::to_string(seconds) + " s");
  }
}

}  // namespace wordcatcher::cli
