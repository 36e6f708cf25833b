// Memory lent to walks, to many threads at once; to be run under ThreadSanitizer as well.

#include "wordcatcher/storage/WalkMemory.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <thread>
#include <vector>

namespace wordcatcher {
namespace {

constexpr std::size_t kMostKept = 8;
constexpr std::size_t kBytesOfOne = std::size_t{1} << 20U;

TEST(WalkMemoryPoolTest, LendsAgainWhatWasGivenBack) {
  WalkMemoryPool pool;
  auto loan = pool.lend();
  const WalkMemory* const first = loan.get();
  loan.reset();
  const auto again = pool.lend();
  EXPECT_EQ(again.get(), first);
  EXPECT_NE(pool.lend().get(), first) << "one that is lent is nobody else's";
}

TEST(WalkMemoryPoolTest, KeepsNoMoreThanItMay) {
  WalkMemoryPool pool;
  {
    std::vector<WalkMemoryPool::Loan> loans;
    for (std::size_t i = 0; i < 2 * kMostKept; ++i) {
      loans.push_back(pool.lend());
      loans.back()->automaton.states.resize(1);
    }
  }
  std::vector<WalkMemoryPool::Loan> loans;
  std::size_t used = 0;
  for (std::size_t i = 0; i < 2 * kMostKept; ++i) {
    loans.push_back(pool.lend());
    used += loans.back()->automaton.states.size();
  }
  EXPECT_EQ(used, kMostKept);
}

TEST(WalkMemoryPoolTest, KeepsNothingLarge) {
  WalkMemoryPool pool;
  pool.lend()->automaton.steps.resize(kBytesOfOne / sizeof(std::uint32_t) + 1);
  EXPECT_TRUE(pool.lend()->automaton.steps.empty());
  pool.lend()->found.roomFor(kBytesOfOne / sizeof(WalkMemory::Found) + 1);
  EXPECT_EQ(pool.lend()->bytes(), 0U);
}

TEST(WalkMemoryPoolTest, NoTwoThreadsHaveTheSame) {
  constexpr int kThreads = 12;  // more than are kept
  WalkMemoryPool pool;
  std::atomic<int> wrong = 0;
  std::vector<std::thread> threads;
  threads.reserve(kThreads);
  for (int i = 0; i < kThreads; ++i) {
    threads.emplace_back([&pool, &wrong, number = static_cast<std::uint32_t>(i)] {
      for (int n = 0; n < 2000; ++n) {
        const auto one = pool.lend();
        const auto other = pool.lend();
        one->automaton.steps.assign(10, number);
        other->automaton.steps.assign(10, number + kThreads);
        for (std::size_t at = 0; at < 10; ++at) {
          wrong += one->automaton.steps[at] != number ? 1 : 0;
          wrong += other->automaton.steps[at] != number + kThreads ? 1 : 0;
        }
      }
    });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(wrong, 0);
}

}  // namespace
}  // namespace wordcatcher
