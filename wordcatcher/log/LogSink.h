#ifndef WORDCATCHER_LOG_LOGSINK_H
#define WORDCATCHER_LOG_LOGSINK_H

#include <string_view>

#include "wordcatcher/Export.h"

namespace wordcatcher {

/// Where the library's log lines go. The classic classes report failures here and carry on; nothing
/// is ever printed. Derive from it to route the lines into a host's own log.
///
/// Thread safety: the library calls a sink from whatever thread it runs on and takes no lock, so a
/// sink shared by several threads guards itself.
class WORDCATCHER_EXPORT LogSink {
 public:
  LogSink() = default;
  LogSink(const LogSink&) = delete;
  LogSink& operator=(const LogSink&) = delete;
  virtual ~LogSink();

  /// Whether a line made from this message pattern is wanted. `pattern` is the fixed text with its
  /// placeholders ("%s Could not init db at %@"); answering false discards the line before anything
  /// is formatted. The default wants every line.
  virtual bool accepts(std::string_view pattern) const noexcept;

  /// Takes one finished line: UTF-8, without a newline. Unpaired surrogates of the strings that it
  /// shows appear as U+FFFD.
  virtual void write(std::string_view line) noexcept = 0;
};

/// Makes `sink` the receiver of every line that follows, for the whole process, and returns the one
/// before. Null means the sink that the library starts with: syslog, level info. The sink is not
/// owned: it must live until it has been replaced and no call into the library is under way.
WORDCATCHER_EXPORT LogSink* setLogSink(LogSink* sink) noexcept;

/// The sink that discards everything, for hosts that want silence.
WORDCATCHER_EXPORT LogSink* silentLogSink() noexcept;

}  // namespace wordcatcher

#endif
