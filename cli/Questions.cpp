#include "cli/Questions.h"

#include <optional>
#include <utility>

#include "cli/AnswerProgress.h"
#include "cli/Output.h"
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
  std::optional<InputLines> lines;
  if (_questions.empty()) {
    lines.emplace("-");
  }
  AnswerProgress progress(lines ? &*lines : nullptr);
  Output output([&progress] { progress.pause(); });
  bool matched = false;
  const auto ask = [&](const InputLine& question) {
    if (_headings) {
      output.write(question.utf8 + '\n');
    }
    progress.begin();
    matched |= answer(question, output);
    progress.pause();
    output.flush();
  };
  try {
    for (const auto& question : _questions) {
      ask(question);
    }
    while (lines) {
      progress.took();
      const auto question = lines->next();
      if (!question) {
        break;
      }
      ask(*question);
    }
  } catch (const OutputClosed&) {
    // Whoever reads the answers has seen enough.
  }
  return matched ? kMatched : kNoMatch;
}

}  // namespace wordcatcher::cli
