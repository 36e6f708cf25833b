#include "python/FindMany.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <exception>
#include <mutex>
#include <system_error>
#include <thread>

#include "python/Text.h"

namespace wordcatcher::python {

namespace {

constexpr std::chrono::milliseconds kPauseEvery(50);

// Texts that a thread takes at once: several, so that threads seldom write to one cache line, and
// few enough for the last ones to end at about the same time.
constexpr std::size_t kMostTexts = 16;
constexpr std::size_t kTurnsOfAThread = 8;

class Work {
 public:
  Work(const Index& index, const std::vector<std::string>& texts, const FindOptions& options,
       std::size_t threads)
      : _index(index),
        _texts(texts),
        _options(options),
        _textsATurn(
            std::clamp<std::size_t>(texts.size() / (threads * kTurnsOfAThread), 1, kMostTexts)),
        _results(texts.size()) {}

  void run(const std::function<void()>& afterText) noexcept {
    try {
      while (!_ended) {
        const std::size_t begin = _next.fetch_add(_textsATurn);
        if (begin >= _texts.size()) {
          return;
        }
        const std::size_t end = std::min(begin + _textsATurn, _texts.size());
        for (std::size_t i = begin; i < end && !_ended; ++i) {
          find(i);
          afterText();
        }
      }
    } catch (...) {
      fail(std::current_exception());
    }
  }

  std::vector<FindResult> results() {
    if (_failure) {
      std::rethrow_exception(_failure);
    }
    return std::move(_results);
  }

 private:
  void find(std::size_t number) {
    FindResult& result = _results[number];
    result = _index.find(_texts[number], _options);
    if (!result.matches.empty()) {
      CodePoints(_texts[number]).convert(result);
    }
  }

  void fail(const std::exception_ptr& failure) noexcept {
    const std::lock_guard lock(_failureMutex);
    if (!_failure) {
      _failure = failure;
    }
    _ended = true;
  }

  const Index& _index;
  const std::vector<std::string>& _texts;
  const FindOptions& _options;
  std::size_t _textsATurn;
  std::vector<FindResult> _results;
  std::atomic<std::size_t> _next = 0;
  std::atomic<bool> _ended = false;
  std::mutex _failureMutex;
  std::exception_ptr _failure;
};

/// Fewer where the system has no more threads to give: the caller's own finishes the work as well.
std::vector<std::jthread> startThreads(std::size_t count, Work& work) {
  std::vector<std::jthread> threads;
  threads.reserve(count);
  try {
    while (threads.size() < count) {
      threads.emplace_back([&work] { work.run([] {}); });
    }
  } catch (const std::system_error&) {
  }
  return threads;
}

}  // namespace

std::vector<FindResult> findMany(const Index& index, const std::vector<std::string>& texts,
                                 const FindOptions& options, std::size_t threads,
                                 const std::function<void()>& pause) {
  threads = std::min(threads, std::max<std::size_t>(texts.size(), 1));
  Work work(index, texts, options, threads);
  {
    const auto helpers = startThreads(threads - 1, work);
    auto paused = std::chrono::steady_clock::now();
    work.run([&] {
      const auto now = std::chrono::steady_clock::now();
      if (now - paused >= kPauseEvery) {
        paused = now;
        pause();
      }
    });
  }
  return work.results();
}

}  // namespace wordcatcher::python
