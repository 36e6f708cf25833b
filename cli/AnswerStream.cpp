// The threads share one loop: take the next text, answer it, hand the answer in. Only one thread
// reads at a time, and what is handed in early waits for the answers before it. There is no queue
// of texts to fill or to drain: a thread that has a text is answering it.

#include "cli/AnswerStream.h"

#include <sys/eventfd.h>
#include <unistd.h>

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <exception>
#include <iostream>
#include <map>
#include <mutex>
#include <optional>
#include <system_error>
#include <thread>
#include <utility>

#include "cli/AnswerProgress.h"
#include "cli/InputLines.h"
#include "cli/Output.h"
#include "cli/ProgressBar.h"

namespace wordcatcher::cli {

namespace {

// Enough that no thread waits for a slow text before its own, unless that takes very long.
constexpr std::uint64_t kAheadPerThread = 16;
constexpr std::size_t kBytesAhead = std::size_t{16} << 20U;

/// Can be waited for by poll() from the moment on when it is raised.
class Signal {
 public:
  Signal() : _descriptor(eventfd(0, EFD_CLOEXEC)) {
    if (_descriptor < 0) {
      throw Failure("Cannot open another file (" + errorText() + "): allow more open files.");
    }
  }
  ~Signal() { close(_descriptor); }
  Signal(const Signal&) = delete;
  Signal& operator=(const Signal&) = delete;

  int descriptor() const noexcept { return _descriptor; }
  bool raised() const noexcept { return _raised; }
  void raise() noexcept {
    _raised = true;
    static_cast<void>(eventfd_write(_descriptor, 1));
  }

 private:
  int _descriptor;
  bool _raised = false;
};

/// Where the texts come from. One thread at a time.
class Texts {
 public:
  Texts(const std::vector<std::string>& texts, int stop) : _texts(texts) {
    if (texts.empty()) {
      _lines.emplace("-", stop);
    }
  }

  std::optional<std::string> next() {
    if (!_lines) {
      return _taken < _texts.size() ? std::optional(_texts[_taken++]) : std::nullopt;
    }
    return _lines->nextBytes();
  }

  const InputLines* lines() const { return _lines ? &*_lines : nullptr; }

 private:
  const std::vector<std::string>& _texts;
  std::size_t _taken = 0;
  std::optional<InputLines> _lines;
};

class AnswerStream {
 public:
  AnswerStream(const std::vector<std::string>& texts, const AnswerText& answer, unsigned threads)
      : _texts(texts, _stopReading.descriptor()),
        _answer(answer),
        _ahead(threads == 1 ? 1 : threads * kAheadPerThread) {}

  /// One thread's share of the work; returns when nothing is left to do.
  void work() {
    try {
      while (auto taken = take()) {
        handIn(taken->number, answerTo(*taken));
      }
    } catch (const OutputClosed&) {
      // Whoever reads the answers has seen enough.
      stop(nullptr);
    } catch (...) {
      stop(std::current_exception());
    }
  }

  ExitCode result() const {
    if (_failure) {
      std::rethrow_exception(_failure);
    }
    return _matched ? kMatched : kNoMatch;
  }

 private:
  struct Taken {
    std::uint64_t number;
    std::string text;
    std::exception_ptr failure;  // reading it failed
  };

  struct Answered {
    std::size_t textBytes = 0;
    TextAnswer answer;
    std::exception_ptr failure;

    std::size_t bytes() const { return textBytes + answer.output.size(); }
  };

  /// The next text, once there is room for it.
  std::optional<Taken> take() {
    const std::lock_guard reading(_reading);
    {
      std::unique_lock lock(_state);
      _room.wait(lock, [this] { return _stopped || hasRoom(); });
      if (_stopped || _ended) {
        return std::nullopt;
      }
    }
    Taken taken{_taken, {}, nullptr};
    try {
      _progress.took();
      auto text = _texts.next();
      if (!text) {
        _ended = true;
        return std::nullopt;
      }
      taken.text = std::move(*text);
    } catch (...) {
      _ended = true;
      taken.failure = std::current_exception();
    }
    const std::lock_guard lock(_state);
    ++_taken;
    ++_inWork;
    _progress.begin();
    _bytes += taken.text.size();
    return taken;
  }

  bool hasRoom() const {
    return _taken == _written || (_taken - _written < _ahead && _bytes < kBytesAhead);
  }

  Answered answerTo(const Taken& taken) const {
    Answered answered{taken.text.size(), {}, taken.failure};
    if (!answered.failure) {
      try {
        answered.answer = _answer(taken.text);
      } catch (...) {
        answered.failure = std::current_exception();
      }
    }
    return answered;
  }

  void handIn(std::uint64_t number, Answered answered) {
    const std::lock_guard lock(_state);
    --_inWork;
    _bytes += answered.answer.output.size();
    _waiting.emplace(number, std::move(answered));
    while (!_stopped && !_waiting.empty() && _waiting.begin()->first == _written) {
      // Until all of it is written nothing more is.
      _stopped = true;
      write(_waiting.begin()->second);
      _stopped = false;
      _bytes -= _waiting.begin()->second.bytes();
      _waiting.erase(_waiting.begin());
      ++_written;
    }
    if (_inWork > 0) {
      _progress.begin();
    } else {
      _progress.pause();
    }
    _room.notify_all();
  }

  void write(const Answered& answered) {
    if (answered.failure) {
      std::rethrow_exception(answered.failure);
    }
    _matched = _matched || answered.answer.matched;
    _output.write(answered.answer.output);
    _output.flush();
    if (!answered.answer.note.empty()) {
      std::cerr << ProgressBar::lineStart() + answered.answer.note + '\n' << std::flush;
    }
  }

  void stop(const std::exception_ptr& failure) {
    const std::lock_guard lock(_state);
    if (!_stopReading.raised()) {
      _failure = failure;
      _stopped = true;
      _stopReading.raise();
      _room.notify_all();
    }
  }

  Signal _stopReading;

  // Held while a text is being waited for and read.
  std::mutex _reading;
  Texts _texts;
  AnswerProgress _progress{_texts.lines()};
  bool _ended = false;

  const AnswerText& _answer;
  const std::uint64_t _ahead;

  // Held for all that follows; taken after _reading where both are.
  std::mutex _state;
  std::condition_variable _room;
  std::uint64_t _taken = 0;    // texts; changes only while _reading is held as well
  std::uint64_t _written = 0;  // answers
  std::uint64_t _inWork = 0;   // texts that are being answered
  std::size_t _bytes = 0;      // of the texts between the two and of their answers
  std::map<std::uint64_t, Answered> _waiting;
  Output _output{[this] { _progress.pause(); }};
  bool _matched = false;
  bool _stopped = false;
  std::exception_ptr _failure;
};

}  // namespace

ExitCode answerInOrder(const std::vector<std::string>& texts, const AnswerText& answer,
                       unsigned threads) {
  AnswerStream stream(texts, answer, threads);
  {
    std::vector<std::jthread> others;
    try {
      while (others.size() + 1 < threads) {
        others.emplace_back([&stream] { stream.work(); });
      }
    } catch (const std::system_error&) {
      // No more threads are to be had: those that there are do the same.
    }
    stream.work();
  }
  return stream.result();
}

}  // namespace wordcatcher::cli
