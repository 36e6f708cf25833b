#ifndef WORDCATCHER_CLI_READINGBAR_H
#define WORDCATCHER_CLI_READINGBAR_H

#include <unistd.h>

#include <chrono>
#include <optional>

#include "cli/InputLines.h"
#include "cli/ProgressBar.h"

namespace wordcatcher::cli {

/// Shows how far a file of texts is answered, from a second on. Where the answers appear on the
/// screen they tell that well enough, and of a pipe nobody knows how much will come: then nothing
/// is shown.
class ReadingBar {
 public:
  explicit ReadingBar(const InputLines& lines) : _lines(lines) {
    if (const auto bytes = lines.bytesInAll(); bytes && isatty(STDOUT_FILENO) == 0) {
      _bar.emplace(ProgressBar::Options{bytes, "bytes", std::chrono::seconds(1)});
    }
  }

  /// To be called at every line.
  void show() {
    if (_bar) {
      _bar->show(_lines.bytesTaken());
    }
  }

 private:
  const InputLines& _lines;
  std::optional<ProgressBar> _bar;
};

}  // namespace wordcatcher::cli

#endif
