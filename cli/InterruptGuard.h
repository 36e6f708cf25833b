#ifndef WORDCATCHER_CLI_INTERRUPTGUARD_H
#define WORDCATCHER_CLI_INTERRUPTGUARD_H

#include <csignal>
#include <functional>
#include <thread>

namespace wordcatcher::cli {

/// While it lives, SIGINT, SIGTERM and SIGHUP first run a clean-up and then end the process as they
/// always do, at once, whatever the main thread is doing or waiting for. Signals that the process
/// was started to ignore stay ignored.
///
/// The signals are taken by a thread of the guard's own, so that the clean-up may use whatever a
/// thread may. Construct it before any other thread, which must inherit the blocked signals.
class InterruptGuard {
 public:
  explicit InterruptGuard(std::function<void()> cleanUp);
  ~InterruptGuard();
  InterruptGuard(const InterruptGuard&) = delete;
  InterruptGuard& operator=(const InterruptGuard&) = delete;

 private:
  void wait(const std::stop_token& stop) const;

  std::function<void()> _cleanUp;
  sigset_t _signals{};
  sigset_t _previousMask{};
  std::jthread _thread;
};

}  // namespace wordcatcher::cli

#endif
