#ifndef WORDCATCHER_CLI_ANSWERSTREAM_H
#define WORDCATCHER_CLI_ANSWERSTREAM_H

#include <functional>
#include <string>
#include <vector>

#include "cli/Failure.h"

namespace wordcatcher::cli {

/// What is printed for one text.
struct TextAnswer {
  std::string output;  ///< for standard output
  std::string note;    ///< a line for standard error, without its end, or empty
  bool matched = false;
};

/// Answers one text. Called by several threads at once.
using AnswerText = std::function<TextAnswer(const std::string& text)>;

/// Answers the texts, or without any the lines of standard input, on `threads` threads. The answers
/// come in the order of the texts, each written as soon as it and those before it are there; a line
/// is answered before the next one comes.
///
/// Memory: no more lines are read than a few for each thread, and no more than 16 MiB of them
/// unless a single one is longer.
///
/// kMatched if one of the texts matched, also when the reader of the answers goes before the end;
/// else kNoMatch. The first failure in the order of the texts is thrown after the answers before
/// it were written.
ExitCode answerInOrder(const std::vector<std::string>& texts, const AnswerText& answer,
                       unsigned threads);

}  // namespace wordcatcher::cli

#endif
