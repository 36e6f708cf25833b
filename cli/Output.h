#ifndef WORDCATCHER_CLI_OUTPUT_H
#define WORDCATCHER_CLI_OUTPUT_H

#include <functional>
#include <string>
#include <string_view>
#include <utility>

namespace wordcatcher::cli {

/// Thrown when the reader of standard output has gone: nothing is wrong, and nothing is left to do.
/// No std::exception, so that no handler of failures takes it for one.
struct OutputClosed {};

/// Buffered standard output that notices when it cannot be written. What was not flushed when it is
/// destroyed is dropped.
class Output {
 public:
  Output() = default;

  /// Calls something each time before it writes what it has buffered.
  explicit Output(std::function<void()> beforeWriting) : _beforeWriting(std::move(beforeWriting)) {}

  void write(std::string_view text);

  /// Throws OutputClosed when the pipe was closed, Failure when writing failed otherwise.
  void flush();

 private:
  std::function<void()> _beforeWriting;
  std::string _buffer;
};

}  // namespace wordcatcher::cli

#endif
