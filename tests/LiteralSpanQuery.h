#ifndef WORDCATCHER_TESTS_LITERALSPANQUERY_H
#define WORDCATCHER_TESTS_LITERALSPANQUERY_H

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

#include "wordcatcher/fuzzy/LXFuzzyMatch.h"
#include "wordcatcher/matcher/KXWordcatch.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher::testing {

/// The tuning values of a span query; lengths in code units.
struct LiteralLimits {
  std::int64_t editDistance;
  std::int64_t ignoredWordLength;
  std::int64_t ignoredWordLengthForEditDistance;
};

/// The yardstick of span queries, step by step on sets of strings. One span query over words: looks
/// up each word of a text, intersects the phrases that the words bring, and scores what is left.
/// Used once.
///
/// Arithmetic on scores wraps around: the host may set the running counter to any value.
class LiteralSpanQuery {
 public:
  /// Looks one word up within a number of edits, in the order of a search.
  using Search = std::function<std::vector<LXFuzzyMatch>(std::u16string_view, std::int64_t)>;

  /// `wordsMatched` is the matcher's running counter, which the query raises and takes into
  /// account.
  LiteralSpanQuery(Search search, WordSegmenter& segmenter, const LiteralLimits& limits,
                   std::int64_t& wordsMatched)
      : _search(std::move(search)),
        _segmenter(segmenter),
        _limits(limits),
        _wordsMatched(wordsMatched) {}

  /// The records within the bound, ascending by distance, then value; nothing when no word of the
  /// text brought a candidate.
  std::optional<std::vector<KXWordcatch>> run(std::u16string_view text);

 private:
  /// The phrases in play, each with its distance: a set of records by value.
  using CandidateSet = std::unordered_map<std::u16string, std::int64_t>;

  void lookUpLongWords(std::u16string_view text);
  void lookUpEveryWord(std::u16string_view text);
  void lookUp(std::u16string_view word);
  void penaliseMissingHits(CandidateSet& phrases) const;
  void intersect(CandidateSet& phrases, const CandidateSet& others);
  void penaliseLength(CandidateSet& phrases);
  std::vector<KXWordcatch> withinBound(CandidateSet&& phrases) const;
  std::int64_t countedWordsOf(std::u16string_view value);

  Search _search;
  WordSegmenter& _segmenter;
  LiteralLimits _limits;
  std::int64_t& _wordsMatched;
  std::vector<CandidateSet> _candidates;
  std::int64_t _searchedWords = 0;
  std::int64_t _countedWords = 0;
};

}  // namespace wordcatcher::testing

#endif
