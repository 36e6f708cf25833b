#ifndef WORDCATCHER_CLI_WAITINGNOTE_H
#define WORDCATCHER_CLI_WAITINGNOTE_H

#include <condition_variable>
#include <mutex>
#include <string>
#include <thread>

namespace wordcatcher::cli {

/// While it lives, a line on standard error says what is going on and for how many seconds, from
/// the first full second on, and is wiped away at the end: for work that cannot say how far it has
/// come. Nothing is shown when standard error is no terminal.
class WaitingNote {
 public:
  /// `what` names the work: Checking names.wci
  explicit WaitingNote(std::string what);
  ~WaitingNote() = default;
  WaitingNote(const WaitingNote&) = delete;
  WaitingNote& operator=(const WaitingNote&) = delete;

 private:
  void tick(const std::stop_token& stop);

  std::string _what;
  std::mutex _mutex;
  std::condition_variable_any _wake;
  // Last, so that it has ended before what it uses goes.
  std::jthread _thread;
};

}  // namespace wordcatcher::cli

#endif
