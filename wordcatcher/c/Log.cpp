#include <cstddef>
#include <mutex>
#include <new>
#include <string>
#include <string_view>

#include "wordcatcher/log/LogSink.h"
#include "wordcatcher/wordcatcher.h"

namespace {

struct Receiver {
  wordcatcher_log_handler handler = nullptr;
  void* context = nullptr;
};

class HandlerSink final : public wordcatcher::LogSink {
 public:
  void set(Receiver receiver) noexcept {
    const std::lock_guard lock(_guard);
    _receiver = receiver;
  }

  void write(std::string_view line) noexcept override {
    const Receiver receiver = get();
    if (receiver.handler == nullptr) {
      return;
    }
    std::string terminated;
    try {
      terminated = line;
    } catch (...) {
      constexpr std::string_view kLost = "A log line was lost: memory ran out.";
      receiver.handler(receiver.context, kLost.data(), kLost.size());
      return;
    }
    receiver.handler(receiver.context, terminated.c_str(), terminated.size());
  }

 private:
  // The handler is called without the lock, so that it may call the library and log slowly.
  Receiver get() noexcept {
    const std::lock_guard lock(_guard);
    return _receiver;
  }

  std::mutex _guard;
  Receiver _receiver;
};

/// Never destroyed: other threads may log until the process ends.
HandlerSink& handlerSink() noexcept {
  alignas(HandlerSink) static std::byte storage[sizeof(HandlerSink)];
  static auto* const sink = new (&storage) HandlerSink;
  return *sink;
}

}  // namespace

void wordcatcher_log_set_handler(wordcatcher_log_handler handler, void* context) {
  if (handler == nullptr) {
    wordcatcher::setLogSink(nullptr);
    handlerSink().set({});
    return;
  }
  handlerSink().set({handler, context});
  wordcatcher::setLogSink(&handlerSink());
}
