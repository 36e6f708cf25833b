#ifndef WORDCATCHER_MATCHER_SPANSHORTCUT_H
#define WORDCATCHER_MATCHER_SPANSHORTCUT_H

// A span query that looks up as few words as it can.
//
// A value is in the result only if every word of the text that brings any value brings it. So it
// suffices to look up one word that brings few, and to compare the words of each of its values'
// phrases with the other words of the text. That leaves three questions which the looked-up words
// would have answered by the way, and which mostly have a cheap answer:
//
// - Does a word that brings none of the values bring others? Then nothing is found. Mostly it is
//   stored as it stands; else it is looked up.
// - Does a word bring exactly the values of the first word? Then its distances do not count. Mostly
//   some value tells the two apart.
// - Are there as many hits as counted words? Mostly every word has one.
//
// Where a cheap answer is missing the query is left to SpanQuery; so it is where phrases are so
// long, or so many under one value, that comparing them is not cheap.

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/fuzzy/WordJudge.h"
#include "wordcatcher/matcher/NumberIndex.h"
#include "wordcatcher/matcher/SpanQuery.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

/// What a span query answers.
struct SpanAnswer {
  std::optional<std::vector<ScoredValue>> scored;  // as SpanQuery::run
  bool truncated = false;
};

/// One query whose running counter begins at 0 and is not asked for. Used once, by one thread.
class SpanShortcut {
 public:
  SpanShortcut(const SearchImage& image, WordSegmenter& segmenter, const SpanQueryLimits& limits)
      : _image(image), _segmenter(segmenter), _limits(limits) {}

  /// The answer, or nothing where only SpanQuery can tell. Throws Error (damaged).
  std::optional<SpanAnswer> run(std::u16string_view text);

 private:
  /// A distinct word of the text that is to be looked up.
  struct Word {
    std::u16string text;
    std::unique_ptr<WordJudge> judge;
    std::optional<std::vector<WordHit>> hits;  // if it was looked up
    bool bringsAny = true;                     // whether it brings any value
  };
  static constexpr std::uint8_t kNone = UINT8_MAX;  // no distance

  // Of a word of a phrase with one of the text. Bounds the time, whatever the image's bytes are,
  // and the memory; a stored word is remembered as well, in the room of some distances.
  static constexpr std::uint64_t kMaxComparisons = 1U << 16U;
  static constexpr std::uint64_t kComparisonsAWord = 8;

  bool cut(std::u16string_view text);
  bool judgeCandidates();
  bool spendOn(std::uint32_t value);
  void addWord(std::u16string_view token);
  void lookUp(Word& word);
  std::uint64_t valuesOf(const Word& word) const;
  std::optional<std::size_t> lookUpFew();
  std::vector<std::uint32_t> candidatesOf(const Word& word) const;
  std::span<const std::uint8_t> distancesOfWord(std::uint32_t word);
  std::span<const std::uint8_t> distancesOf(std::uint32_t value);
  bool bringsCandidate(std::size_t word, std::size_t candidate) const;
  bool bringsNothing(std::size_t word);
  std::optional<bool> bringsSame(std::size_t a, std::size_t b);
  bool bringsOther(std::size_t a, std::size_t b);
  bool hasHitsEnough() const;
  std::vector<std::uint32_t> knownHits(std::size_t word) const;
  std::optional<std::vector<ScoredValue>> scored();

  const SearchImage& _image;
  WordSegmenter& _segmenter;
  SpanQueryLimits _limits;
  bool _truncated = false;
  std::uint64_t _comparisons = kMaxComparisons;  // that may still be made
  std::int64_t _countedWords = 0;
  std::vector<Word> _words;
  std::vector<std::size_t> _occurrences;  // of words in the text, in its order
  NumberIndex _judged;                    // stored words
  std::vector<std::uint32_t> _judgedWords;
  std::vector<std::uint8_t> _ofWords;  // for each of them the distances for the words of the text
  std::vector<std::uint32_t> _candidates;
  std::vector<std::uint8_t> _ofCandidates;  // likewise for each of the candidates

  // What distancesOf() works with, for each word of the text.
  struct Bringing {
    std::uint32_t values;
    std::uint32_t word;
  };
  std::vector<Bringing> _first;
  std::vector<std::uint8_t> _best;
};

}  // namespace wordcatcher

#endif
