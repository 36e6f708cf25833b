#include "cli/ProgressBar.h"

#include <unistd.h>

#include <algorithm>
#include <iostream>

namespace wordcatcher::cli {

namespace {

constexpr std::chrono::milliseconds kRedrawEvery{100};
constexpr std::uint64_t kWidth = 40;
constexpr std::uint64_t kPercent = 100;
// Back to the start of the line, and clear it.
constexpr const char* kWipe = "\r\x1b[K";

}  // namespace

ProgressBar::ProgressBar(const Options& options)
    : _options(options),
      _terminal(isatty(STDERR_FILENO) == 1),
      _next(std::chrono::steady_clock::now()) {}

ProgressBar::~ProgressBar() { wipe(); }

void ProgressBar::show(std::uint64_t done) {
  if (!_terminal) {
    return;
  }
  const auto now = std::chrono::steady_clock::now();
  if (now < _next) {
    return;
  }
  _next = now + kRedrawEvery;
  draw(line(done, _options.total, _options.unit));
}

std::string ProgressBar::line(std::uint64_t done, std::optional<std::uint64_t> total,
                              const char* unit) {
  if (!total) {
    return std::to_string(done) + ' ' + unit + " read";
  }
  const std::uint64_t all = std::max<std::uint64_t>(*total, 1);
  // A file may grow while it is read.
  const std::uint64_t shown = std::min(done, all);
  const std::uint64_t filled = shown * kWidth / all;
  return '[' + std::string(filled, '#') + std::string(kWidth - filled, ' ') + "] " +
         std::to_string(shown * kPercent / all) + " % of " + std::to_string(all) + ' ' + unit;
}

void ProgressBar::say(const std::string& text) {
  if (_terminal) {
    draw(text);
  }
}

void ProgressBar::wipe() {
  if (_drawn) {
    std::cerr << kWipe << std::flush;
    _drawn = false;
  }
}

const char* ProgressBar::lineStart() { return isatty(STDERR_FILENO) == 1 ? kWipe : ""; }

void ProgressBar::draw(const std::string& line) {
  std::cerr << kWipe + line << std::flush;
  _drawn = true;
}

}  // namespace wordcatcher::cli
