#ifndef WORDCATCHER_CLI_QUESTIONS_H
#define WORDCATCHER_CLI_QUESTIONS_H

#include <functional>
#include <string>
#include <vector>

#include "cli/Failure.h"
#include "cli/InputLines.h"

namespace wordcatcher::cli {

class Output;

/// The texts that a verb answers one by one: the command line's, or else the lines of standard
/// input.
class Questions {
 public:
  /// Writes the answer to one question and returns whether there was a match.
  using Answer = std::function<bool(const InputLine& question, Output& output)>;

  /// Failure if a text is not UTF-8. `headings` puts each question on a line above its answer where
  /// there may be several: always for standard input, of which nobody knows whether more follows.
  Questions(const std::vector<std::string>& texts, bool headings);

  /// Answers every question, the lines of standard input each as soon as it has come. kMatched if
  /// one of them matched, also when the reader of the answers goes before the end; else kNoMatch.
  ExitCode answerEach(const Answer& answer) const;

 private:
  std::vector<InputLine> _questions;
  bool _headings;
};

}  // namespace wordcatcher::cli

#endif
