#ifndef WORDCATCHER_MATCHER_SPANQUERY_H
#define WORDCATCHER_MATCHER_SPANQUERY_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "wordcatcher/fuzzy/LXFuzzyIndex.h"
#include "wordcatcher/matcher/KXWordcatch.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

/// The tuning values of a span query; lengths in code units.
struct SpanQueryLimits {
  std::int64_t editDistance;
  std::int64_t ignoredWordLength;
  std::int64_t ignoredWordLengthForEditDistance;
};

/// One span query over words: looks up each word of a text, intersects the phrases that the words
/// bring, and scores what is left. Used once.
///
/// Arithmetic on scores wraps around: the host may set the running counter to any value.
class SpanQuery {
 public:
  /// `wordsMatched` is the matcher's running counter, which the query raises and takes into
  /// account.
  SpanQuery(LXFuzzyIndex& index, WordSegmenter& segmenter, const SpanQueryLimits& limits,
            std::int64_t& wordsMatched)
      : _index(index), _segmenter(segmenter), _limits(limits), _wordsMatched(wordsMatched) {}

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

  LXFuzzyIndex& _index;
  WordSegmenter& _segmenter;
  SpanQueryLimits _limits;
  std::int64_t& _wordsMatched;
  std::vector<CandidateSet> _candidates;
  std::int64_t _searchedWords = 0;
  std::int64_t _countedWords = 0;
};

}  // namespace wordcatcher

#endif
