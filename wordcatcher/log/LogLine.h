#ifndef WORDCATCHER_LOG_LOGLINE_H
#define WORDCATCHER_LOG_LOGLINE_H

#include <initializer_list>
#include <string>
#include <string_view>
#include <variant>

#include "wordcatcher/log/LogSink.h"

namespace wordcatcher {

/// The text of an errno value, looked up only when a line is really written.
struct ErrorText {
  int code;
};

/// One argument of a log line; strings are only viewed until the line is made.
using LogArgument = std::variant<int, std::string_view, std::u16string_view, ErrorText>;

/// The sink in force.
LogSink& logSink() noexcept;

/// Replaces the placeholders of `pattern` ("%s", "%@", "%d", "%u") by the arguments, in order.
/// Precondition: there are as many arguments as placeholders.
std::string formatLogLine(std::string_view pattern, std::initializer_list<LogArgument> arguments);

/// Writes one line to the sink in force, formatting it only if the sink wants it. Leaves errno as
/// it was, so that logging never disturbs an error test that follows.
void logLine(std::string_view pattern, std::initializer_list<LogArgument> arguments);

}  // namespace wordcatcher

#endif
