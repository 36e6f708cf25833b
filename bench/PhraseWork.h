#ifndef WORDCATCHER_BENCH_PHRASEWORK_H
#define WORDCATCHER_BENCH_PHRASEWORK_H

#include <algorithm>
#include <cstddef>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "WorkFiles.h"
#include "wordcatcher/matcher/Index.h"

namespace wordcatcher::bench {

/// What the drivers do that ask misspelled phrases of an index of phrases. Their arguments are
///
///     PHRASES QUERIES INDEX plain|numbered
///
/// The data string of a phrase is itself; "numbered" adds its number, so that phrases that repeat
/// are records of their own.
class PhraseWork {
 public:
  explicit PhraseWork(const std::vector<std::string>& arguments);

  /// Writes the index: its size, the seconds that it took, and the peak memory before and after.
  void build();

  /// Opens it, and tells the seconds.
  Index open();

  /// Asks every question once to see what is found: first, within ten, or at all, where
  /// `isSource(question, value)` tells whether a value is what the question was made of; how often
  /// the first one has the source's phrase to the letter; and how many answers were cut short. Then
  /// asks it all again, warm, and tells the latency of an answer with its release, in microseconds,
  /// as medianSeconds() has it. `ask(text)` gives an answer with `matches` and `truncated`.
  template <typename Ask, typename IsSource>
  void ask(Ask ask, IsSource isSource);

  /// Whether a value's phrase has the words of the question's source. Hyphens stand for spaces:
  /// what stands between words says nothing to an index of words.
  bool hasWordsOfSource(const Question& question, std::string_view value) const;

  bool isNumbered() const { return _numbered; }

  std::string dataOf(std::size_t number) const {
    return _numbered ? _phrases[number] + "{ " + std::to_string(number) + " }" : _phrases[number];
  }

  /// What was told so far.
  nlohmann::json result;

 private:
  /// Whether a value's phrase is the question's source to the letter.
  bool isSpelledAsSource(const Question& question, std::string_view value) const;

  std::vector<std::string> _phrases;
  std::vector<Question> _questions;
  std::string _path;
  bool _numbered;
};

template <typename Ask, typename IsSource>
void PhraseWork::ask(Ask ask, IsSource isSource) {
  constexpr std::size_t kShown = 10;
  std::size_t found = 0;
  std::size_t first = 0;
  std::size_t spelledFirst = 0;
  std::size_t withinTen = 0;
  std::size_t matchCount = 0;
  std::size_t truncated = 0;
  for (const auto& question : _questions) {
    const auto answer = ask(question.text);
    const auto& matches = answer.matches;
    const auto source = std::find_if(matches.begin(), matches.end(), [&](const auto& match) {
      return isSource(question, std::string_view(match.value));
    });
    const auto place = static_cast<std::size_t>(source - matches.begin());
    const bool isThere = source != matches.end();
    found += isThere ? 1 : 0;
    first += isThere && place == 0 ? 1 : 0;
    spelledFirst += !matches.empty() && isSpelledAsSource(question, matches.front().value) ? 1 : 0;
    withinTen += isThere && place < kShown ? 1 : 0;
    matchCount += matches.size();
    truncated += answer.truncated ? 1 : 0;
  }
  result["query"] = latency(
      medianSeconds(_questions.size(), [&](std::size_t number) { ask(_questions[number].text); }));
  result["questions"] = _questions.size();
  result["found"] = found;
  result["foundFirst"] = first;
  result["spelledFirst"] = spelledFirst;
  result["foundWithinTen"] = withinTen;
  result["matches"] = matchCount;
  result["truncated"] = truncated;
  result["peakBytes"] = peakMemory();
}

}  // namespace wordcatcher::bench

#endif
