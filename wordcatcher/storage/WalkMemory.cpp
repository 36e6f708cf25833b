#include "wordcatcher/storage/WalkMemory.h"

#include <functional>
#include <thread>

namespace wordcatcher {

namespace {

/// The place at which a thread begins to look, so that each mostly has one to itself.
std::size_t firstPlace() {
  // The hash may be the number itself, which is an address: the lowest bits are alike.
  const std::size_t number = std::hash<std::thread::id>()(std::this_thread::get_id());
  return number ^ number >> 12U;
}

}  // namespace

WalkMemoryPool::~WalkMemoryPool() {
  for (auto& place : _places) {
    delete place.memory.load(std::memory_order_acquire);
  }
}

WalkMemoryPool::Loan WalkMemoryPool::lend() {
  const std::size_t first = firstPlace();
  for (std::size_t i = 0; i < kPlaces; ++i) {
    auto& place = _places[(first + i) % kPlaces].memory;
    if (place.load(std::memory_order_relaxed) == nullptr) {
      continue;
    }
    if (WalkMemory* memory = place.exchange(nullptr, std::memory_order_acquire)) {
      return Loan(memory, {this});
    }
  }
  return Loan(new WalkMemory, {this});
}

void WalkMemoryPool::giveBack(WalkMemory* memory) noexcept {
  const std::size_t first = firstPlace();
  for (std::size_t i = 0; i < kPlaces && memory->bytes() <= kMostBytes; ++i) {
    auto& place = _places[(first + i) % kPlaces].memory;
    WalkMemory* free = nullptr;
    if (place.load(std::memory_order_relaxed) == nullptr &&
        place.compare_exchange_strong(free, memory, std::memory_order_release,
                                      std::memory_order_relaxed)) {
      return;
    }
  }
  delete memory;
}

}  // namespace wordcatcher
