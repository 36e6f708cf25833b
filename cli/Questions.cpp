#include "cli/Questions.h"

#include <utility>

#include "cli/Output.h"
#include "cli/ReadingBar.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher::cli {

Questions::Questions(const std::vector<std::string>& texts, bool headings)
    : _headings(headings && texts.size() != 1) {
  for (const auto& utf8 : texts) {
    auto text = fromUtf8(utf8);
    if (!text) {
      throw Failure("Text " + std::to_string(_questions.size() + 1) +
                    " of the command line is not valid UTF-8: give it in UTF-8.");
    }
    _questions.push_back({utf8, std::move(*text)});
  }
}

ExitCode Questions::answerEach(const Answer& answer) const {
  Output output;
  bool matched = false;
  const auto ask = [&](const InputLine& question) {
    if (_headings) {
      output.write(question.utf8 + '\n');
    }
    matched |= answer(question, output);
  };
  try {
    for (const auto& question : _questions) {
      ask(question);
    }
    if (_questions.empty()) {
      InputLines lines("-");
      ReadingBar progress(lines);
      while (const auto question = lines.next()) {
        progress.show();
        ask(*question);
        output.flush();
      }
    }
    output.flush();
  } catch (const OutputClosed&) {
    // Whoever reads the answers has seen enough.
  }
  return matched ? kMatched : kNoMatch;
}

}  // namespace wordcatcher::cli
