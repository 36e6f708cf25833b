#ifndef WORDCATCHER_CLI_ANSWERPROGRESS_H
#define WORDCATCHER_CLI_ANSWERPROGRESS_H

#include <atomic>
#include <cstdint>
#include <optional>
#include <string>

#include "cli/InputLines.h"
#include "cli/WaitingNote.h"

namespace wordcatcher::cli {

/// Shows on standard error how far the answering of texts is, from a second on: how much of a file
/// was taken, or of a pipe, of which nobody knows how much will come. Where the answers appear on
/// the screen they tell that well enough, and where somebody types the texts it would be in the
/// way: there, and for texts of the command line, it shows only for how long a text is being
/// answered.
///
/// Thread safety: begin() and pause() may come from any thread, took() from one at a time.
class AnswerProgress {
 public:
  /// `lines` are where the texts come from, and must outlive this; null for the command line.
  explicit AnswerProgress(const InputLines* lines);

  /// To be called at every line.
  void took();

  /// A text is being answered.
  void begin();

  /// An answer is about to be written, or nothing is being answered.
  void pause();

 private:
  std::string shown() const;

  const InputLines* _lines;
  bool _ofInput;
  std::optional<std::uint64_t> _total;
  std::atomic<std::uint64_t> _taken = 0;
  // Last, so that its thread has ended before what it shows goes.
  WaitingNote _note;
};

}  // namespace wordcatcher::cli

#endif
