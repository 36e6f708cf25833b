#ifndef WORDCATCHER_CLI_FAILURE_H
#define WORDCATCHER_CLI_FAILURE_H

#include <cerrno>
#include <stdexcept>
#include <string>
#include <system_error>

namespace wordcatcher::cli {

/// What the command tells its caller.
enum ExitCode : int {
  kMatched = 0,  ///< also: an index was written, or is whole
  kNoMatch = 1,  ///< queries ran, and none of them matched
  kFailed = 2,   ///< wrong usage, or a failure that was reported on standard error
};

/// Ends a verb with kFailed. The text is one sentence that says what went wrong and what to do.
class Failure : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// The text of an errno value.
inline std::string errorText(int code = errno) { return std::generic_category().message(code); }

inline std::string inQuotes(const std::string& text) { return '"' + text + '"'; }

}  // namespace wordcatcher::cli

#endif
