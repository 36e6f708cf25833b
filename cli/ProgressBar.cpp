#include "cli/ProgressBar.h"

#include <unistd.h>

#include <algorithm>
#include <iostream>

namespace wordcatcher::cli {

namespace {

constexpr std::chrono::milliseconds kRedrawEvery{100};
constexpr std::size_t kWidth = 40;
constexpr std::size_t kPercent = 100;
// Back to the start of the line, and clear it.
constexpr const char* kWipe = "\r\x1b[K";

}  // namespace

ProgressBar::ProgressBar(std::optional<std::size_t> total)
    : _total(total),
      _terminal(isatty(STDERR_FILENO) == 1),
      _next(std::chrono::steady_clock::now()) {}

ProgressBar::~ProgressBar() {
  if (_drawn) {
    std::cerr << kWipe << std::flush;
  }
}

void ProgressBar::show(std::size_t done) {
  if (!_terminal) {
    return;
  }
  const auto now = std::chrono::steady_clock::now();
  if (now < _next) {
    return;
  }
  _next = now + kRedrawEvery;
  if (!_total) {
    draw(std::to_string(done) + " phrases read");
    return;
  }
  const std::size_t total = std::max<std::size_t>(*_total, 1);
  const std::size_t filled = done * kWidth / total;
  draw('[' + std::string(filled, '#') + std::string(kWidth - filled, ' ') + "] " +
       std::to_string(done * kPercent / total) + " % of " + std::to_string(total) + " phrases");
}

void ProgressBar::say(const std::string& text) {
  if (_terminal) {
    draw(text);
  }
}

void ProgressBar::draw(const std::string& line) {
  std::cerr << kWipe + line << std::flush;
  _drawn = true;
}

}  // namespace wordcatcher::cli
