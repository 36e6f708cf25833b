#include "wordcatcher/log/LogSink.h"

#include <syslog.h>

#include <atomic>

#include "wordcatcher/log/LogLine.h"

namespace wordcatcher {

namespace {

class SyslogSink final : public LogSink {
 public:
  void write(std::string_view line) noexcept override {
    syslog(LOG_USER | LOG_INFO, "%.*s", static_cast<int>(line.size()), line.data());
  }
};

class SilentSink final : public LogSink {
 public:
  bool accepts(std::string_view) const noexcept override { return false; }
  void write(std::string_view) noexcept override {}
};

LogSink* syslogSink() noexcept {
  static SyslogSink sink;
  return &sink;
}

// Null stands for the syslog sink, so that no order of static initialisation matters.
std::atomic<LogSink*> activeSink = nullptr;

}  // namespace

LogSink::~LogSink() = default;

bool LogSink::accepts(std::string_view /*pattern*/) const noexcept { return true; }

LogSink* setLogSink(LogSink* sink) noexcept {
  LogSink* previous = activeSink.exchange(sink);
  return previous == nullptr ? syslogSink() : previous;
}

LogSink* silentLogSink() noexcept {
  static SilentSink sink;
  return &sink;
}

LogSink& logSink() noexcept {
  LogSink* sink = activeSink.load();
  return sink == nullptr ? *syslogSink() : *sink;
}

}  // namespace wordcatcher
