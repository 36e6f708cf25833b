#ifndef WORDCATCHER_MATCHER_SPANQUERY_H
#define WORDCATCHER_MATCHER_SPANQUERY_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/matcher/SpanQueryTrace.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

/// The tuning values and budgets of a span query; lengths in code units.
struct SpanQueryLimits {
  std::int64_t editDistance;
  std::int64_t ignoredWordLength;
  std::int64_t ignoredWordLengthForEditDistance;
  std::size_t maxWords;      // words of the text that are looked at
  std::size_t maxWordUnits;  // a longer word is counted, and finds nothing
};

/// A value (data string) of an image with its score; smaller is better.
struct ScoredValue {
  std::uint32_t value;
  std::int64_t distance;

  friend bool operator==(const ScoredValue&, const ScoredValue&) = default;
};

/// The last steps of a span query: penalises phrases for their lengths, drops those beyond the
/// bound, and sorts the rest by distance, then value by UTF-16 code units.
std::vector<ScoredValue> scorePhrases(const SearchImage& image,
                                      const std::vector<ScoredValue>& phrases, std::int64_t penalty,
                                      std::int64_t countedWords, std::int64_t editDistance);

/// One span query over the words of an image: looks up each word of a text, intersects the values
/// that the words bring, and scores what is left. Used once.
///
/// Values are numbers, so that sets are sorted lists. A word costs its search and the posting lists
/// of its hits; memory is 16 bytes a posting of two words at a time, and two bytes a value of the
/// image where posting lists are long. Arithmetic on scores wraps around: the host may set the
/// running counter to any value. One thread at a time; throws Error (damaged) as the image does.
class SpanQuery {
 public:
  /// `wordsMatched` is the running counter, which the query raises and takes into account.
  SpanQuery(const SearchImage& image, WordSegmenter& segmenter, const SpanQueryLimits& limits,
            std::int64_t& wordsMatched)
      : _image(image), _segmenter(segmenter), _limits(limits), _wordsMatched(wordsMatched) {}

  /// The values within the bound, ascending by distance, then value; nothing when no word of the
  /// text brought a candidate.
  std::optional<std::vector<ScoredValue>> run(std::u16string_view text);

  /// Has the query tell what becomes of the trace's value. To be called before run().
  void tellTo(SpanQueryTrace& trace) noexcept { _trace = &trace; }

  /// Whether a budget cut something off.
  bool truncated() const noexcept { return _truncated; }

 private:
  /// The values that one word brings, ascending, with the distance of the hit that brought each.
  struct CandidateSet {
    std::vector<std::uint32_t> values;
    std::vector<std::uint32_t> distances;
  };

  void lookUpLongWords(std::u16string_view text);
  void lookUpEveryWord(std::u16string_view text);
  void lookUp(std::u16string_view word);
  CandidateSet candidatesOf(const std::vector<WordHit>& hits) const;
  CandidateSet mergeShortLists(const std::vector<WordHit>& hits) const;
  CandidateSet markLongLists(const std::vector<WordHit>& hits) const;
  void penaliseMissingHits();
  std::int64_t disjointPenalty() const;
  bool intersect(const CandidateSet& others);
  std::vector<ScoredValue> scored() const;

  const SearchImage& _image;
  WordSegmenter& _segmenter;
  SpanQueryLimits _limits;
  std::int64_t& _wordsMatched;
  std::vector<CandidateSet> _candidates;
  std::int64_t _searchedWords = 0;
  std::int64_t _countedWords = 0;
  bool _truncated = false;
  SpanQueryTrace* _trace = nullptr;

  // The values in play, and what every one of them has been penalised by.
  std::vector<ScoredValue> _phrases;
  std::int64_t _penalty = 0;
};

}  // namespace wordcatcher

#endif
