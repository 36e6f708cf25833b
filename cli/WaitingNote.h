#ifndef WORDCATCHER_CLI_WAITINGNOTE_H
#define WORDCATCHER_CLI_WAITINGNOTE_H

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <thread>

#include "cli/ProgressBar.h"

namespace wordcatcher::cli {

/// A line on standard error that says what is going on and for how many seconds, from the first
/// full second on: for work that does not come back to say how far it is. It is wiped away at the
/// end. Nothing is shown when standard error is no terminal.
///
/// Thread safety: any number of threads may begin and pause it.
class WaitingNote {
 public:
  /// Names the work; called from the note's own thread.
  using What = std::function<std::string()>;

  /// Begins at once. `what` names the work: Checking names.wci
  explicit WaitingNote(const std::string& what);

  /// Waits for begin().
  explicit WaitingNote(What what);

  ~WaitingNote() = default;
  WaitingNote(const WaitingNote&) = delete;
  WaitingNote& operator=(const WaitingNote&) = delete;

  /// Counts the seconds from now on, unless it is counting already. Cheap.
  void begin();

  /// Wipes the line away and shows none until begin(). Cheap.
  void pause();

 private:
  void tick(const std::stop_token& stop);

  What _what;
  std::mutex _mutex;
  std::condition_variable_any _wake;
  ProgressBar _line;
  std::optional<std::chrono::steady_clock::time_point> _since;
  std::chrono::seconds _shown{0};
  // Last, so that it has ended before what it uses goes.
  std::jthread _thread;
};

}  // namespace wordcatcher::cli

#endif
