#include "wordcatcher/log/LogLine.h"

#include <cassert>
#include <cerrno>
#include <system_error>

#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

struct ArgumentText {
  std::string operator()(int number) const { return std::to_string(number); }
  std::string operator()(std::string_view text) const { return std::string(text); }
  std::string operator()(std::u16string_view text) const { return displayUtf8(text); }
  std::string operator()(ErrorText error) const {
    return std::generic_category().message(error.code);
  }
};

}  // namespace

std::string formatLogLine(std::string_view pattern, std::initializer_list<LogArgument> arguments) {
  std::string line;
  const auto* argument = arguments.begin();
  for (std::size_t i = 0; i < pattern.size(); ++i) {
    if (pattern[i] != '%' || i + 1 == pattern.size()) {
      line += pattern[i];
      continue;
    }
    ++i;
    assert(argument != arguments.end());
    line += std::visit(ArgumentText{}, *argument++);
  }
  assert(argument == arguments.end());
  return line;
}

void logLine(std::string_view pattern, std::initializer_list<LogArgument> arguments) {
  const int savedErrno = errno;
  LogSink& sink = logSink();
  if (sink.accepts(pattern)) {
    sink.write(formatLogLine(pattern, arguments));
  }
  errno = savedErrno;
}

}  // namespace wordcatcher
