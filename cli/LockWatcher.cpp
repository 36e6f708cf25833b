#include "cli/LockWatcher.h"

#include <chrono>
#include <cstddef>
#include <iostream>
#include <optional>

#include "cli/Failure.h"
#include "cli/IndexDirectory.h"
#include "cli/ProgressBar.h"

namespace wordcatcher::cli {

namespace {

constexpr std::chrono::milliseconds kLookEvery{100};
constexpr std::chrono::seconds kPatience{2};

}  // namespace

LockWatcher::LockWatcher(const IndexDirectory& directory)
    : _directory(directory), _thread([this](const std::stop_token& stop) { watch(stop); }) {}

void LockWatcher::watch(const std::stop_token& stop) {
  using Clock = std::chrono::steady_clock;
  std::optional<std::size_t> table;
  auto since = Clock::now();
  bool told = false;
  std::unique_lock lock(_mutex);
  while (!_wake.wait_for(lock, stop, kLookEvery, [] { return false; }) && !stop.stop_requested()) {
    const auto now = _directory.awaitedTable();
    if (now != table) {
      since = Clock::now();
      told = false;
    }
    table = now;
    if (table && !told && Clock::now() - since >= kPatience) {
      std::cerr << ProgressBar::lineStart() +
                       ("wordcatcher: waiting for " + inQuotes(_directory.tables().at(*table)) +
                        ", which another process holds open; Ctrl-C gives up.\n")
                << std::flush;
      told = true;
    }
  }
}

}  // namespace wordcatcher::cli
