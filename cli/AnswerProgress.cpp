#include "cli/AnswerProgress.h"

#include <unistd.h>

#include "cli/ProgressBar.h"

namespace wordcatcher::cli {

AnswerProgress::AnswerProgress(const InputLines* lines)
    : _lines(lines),
      _ofInput(lines != nullptr && isatty(STDOUT_FILENO) == 0 && isatty(STDIN_FILENO) == 0),
      _total(_ofInput ? lines->bytesInAll() : std::nullopt),
      _note([this] { return shown(); }) {
  if (_ofInput) {
    _note.begin();
  }
}

void AnswerProgress::took() {
  if (_ofInput) {
    _taken = _lines->bytesTaken();
  }
}

void AnswerProgress::begin() {
  if (!_ofInput) {
    _note.begin();
  }
}

void AnswerProgress::pause() {
  if (!_ofInput) {
    _note.pause();
  }
}

std::string AnswerProgress::shown() const {
  return _ofInput ? ProgressBar::line(_taken, _total, "bytes") : "Answering";
}

}  // namespace wordcatcher::cli
