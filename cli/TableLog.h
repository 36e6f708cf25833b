#ifndef WORDCATCHER_CLI_TABLELOG_H
#define WORDCATCHER_CLI_TABLELOG_H

#include <string_view>

#include "wordcatcher/log/LogSink.h"

namespace wordcatcher::cli {

/// Listens to the library's storage log while it lives, since the tables report failures nowhere
/// else, and copies the lines to standard error on request. One at a time.
///
/// Two kinds of line tell of no failure: the one that a table is being finished, and the one of a
/// look-up that found nothing, of which a query causes many.
class TableLog final : public LogSink {
 public:
  /// `verbose` copies every line to standard error.
  explicit TableLog(bool verbose);
  ~TableLog() override;

  bool accepts(std::string_view pattern) const noexcept override;
  void write(std::string_view line) noexcept override;

  /// Whether a failure was logged.
  bool failed() const noexcept { return _failed; }

  /// errno of the first failure.
  int errorCode() const noexcept { return _errorCode; }

 private:
  bool _verbose;
  LogSink* _previous;
  // Set by accepts(), which sees the message pattern and the error code before anything can change
  // them. The library logs on the thread that calls it, which is also the one that asks.
  mutable bool _failed = false;
  mutable int _errorCode = 0;
};

}  // namespace wordcatcher::cli

#endif
