#include "cli/InterruptGuard.h"

#include <pthread.h>
#include <unistd.h>

#include <utility>

namespace wordcatcher::cli {

namespace {

// Wakes the guard's thread when there is nothing to guard any more. Ignored by default, so that one
// from outside loses nothing.
constexpr int kWakeUp = SIGURG;

bool isIgnored(int signal) {
  struct sigaction action {};
  return sigaction(signal, nullptr, &action) == 0 && action.sa_handler == SIG_IGN;
}

/// Ends the process by the signal. Only the calling thread unblocks it, and so takes it.
void endBy(int signal) {
  sigset_t one;
  sigemptyset(&one);
  sigaddset(&one, signal);
  kill(getpid(), signal);
  pthread_sigmask(SIG_UNBLOCK, &one, nullptr);
}

}  // namespace

InterruptGuard::InterruptGuard(std::function<void()> cleanUp) : _cleanUp(std::move(cleanUp)) {
  sigemptyset(&_signals);
  sigaddset(&_signals, kWakeUp);
  for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
    if (!isIgnored(signal)) {
      sigaddset(&_signals, signal);
    }
  }
  pthread_sigmask(SIG_BLOCK, &_signals, &_previousMask);
  _thread = std::jthread([this](const std::stop_token& stop) { wait(stop); });
}

InterruptGuard::~InterruptGuard() {
  _thread.request_stop();
  pthread_kill(_thread.native_handle(), kWakeUp);
  _thread.join();
  pthread_sigmask(SIG_SETMASK, &_previousMask, nullptr);
}

void InterruptGuard::wait(const std::stop_token& stop) const {
  while (!stop.stop_requested()) {
    int signal = 0;
    if (sigwait(&_signals, &signal) == 0 && signal != kWakeUp) {
      _cleanUp();
      endBy(signal);
    }
  }
}

}  // namespace wordcatcher::cli
