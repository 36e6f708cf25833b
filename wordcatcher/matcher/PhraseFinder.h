#ifndef WORDCATCHER_MATCHER_PHRASEFINDER_H
#define WORDCATCHER_MATCHER_PHRASEFINDER_H

// Finding the phrases of a text, the best ones first, without looking at most of those that share a
// word with it.
//
// Every stored word near a word of the text is a source of candidates: the phrases under it. The
// words of the text are ranked, the one with the fewest phrases first, and a source belongs to the
// first of the words that it is near to. A phrase that no source of the first r words of the text
// brings leaves these r words over; with n words in the text and m in the phrase it then costs at
// least
//
//     2 (n - q) + 2 |m - q|  for q = n - r
//
// and the edits of the source that brings it. (Phrases of which words are joined or split may cost
// less; all of them are judged first.) Phrases stand in every posting list by
// their lengths, so a list falls into segments, each with one such bound. Segments are read in the
// order of their bounds, until the bound exceeds the cost of the last of the best k: nothing that
// is left can be among them. So a text that holds a phrase is answered from its rare words' lists,
// and frequent words only lend their shortest phrases.

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "wordcatcher/fuzzy/NearWords.h"
#include "wordcatcher/matcher/Find.h"
#include "wordcatcher/matcher/FindText.h"
#include "wordcatcher/matcher/NumberIndex.h"
#include "wordcatcher/matcher/Pairing.h"
#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher {

/// A phrase of an image with what its place in the order depends on.
struct RankedPhrase {
  std::uint64_t cost = 0;
  std::uint64_t words = 0;  // of the phrase, paired
  std::uint64_t exact = 0;
  std::uint64_t disorder = 0;
  std::uint64_t rarity = 0;  // phrases under the paired words
  std::uint64_t length = 0;  // words of the phrase
  std::uint32_t value = 0;
  std::span<const std::uint32_t> phrase;  // its words in the image, flag and all
  std::uint64_t steps = 0;                // the budget that its pairing had
};

/// Finds the phrases of one text. Used once, by one thread. Throws Error (damaged).
class PhraseFinder {
 public:
  /// All of these must live as long as this does. `joins`: whether words may be joined and split.
  PhraseFinder(const SearchImage& image, const FindText& text, const FindOptions& options,
               bool joins);

  /// The first `limit` phrases in order.
  std::vector<RankedPhrase> run(std::size_t limit);

  /// The best of a value's phrases; nothing when no word of any is paired, or the options' bounds
  /// exclude it.
  std::optional<RankedPhrase> judge(std::uint32_t value);

  /// The same, whatever its cost is and however few of its words are paired.
  RankedPhrase judgeAnyway(std::uint32_t value);

  /// The pairs of a phrase, in its order: those that it was judged by, whatever is left of budgets.
  std::vector<Pair> pairsOf(const RankedPhrase& phrase);

  /// Whether a budget cut something off.
  bool truncated() const noexcept { return _truncated || !_pairing.isExact(); }

  /// Whether one phrase comes before another in the order of matches.
  bool comesBefore(const RankedPhrase& a, const RankedPhrase& b) const;

 private:
  /// A stored word near words of the text, with a list of candidates.
  struct Source {
    std::uint32_t rank = 0;  // of the first word of the text that it is near to
    std::uint32_t edits = 0;
    std::span<const std::uint32_t> values;
  };
  /// Part of a source's list, in which phrases are of similar length.
  struct Segment {
    std::uint64_t bound;
    std::uint32_t source;
    std::uint32_t phraseClass;
    std::uint32_t begin;
    std::uint32_t end;
  };
  /// A way of pairing a stored word.
  struct WordOption {
    std::uint32_t word;
    PairOption option;
  };
  /// A text's word that joins two stored ones, with or without a letter between them.
  struct Split {
    std::uint32_t head;
    std::uint32_t tail;
    std::uint32_t position;
  };

  void addOption(const WordOption& option);
  Seam seamOf(std::size_t length, bool isNumber) const noexcept;
  std::vector<std::uint32_t> wordsJoining(const FindWord& first, const FindWord& second) const;
  void lookUpWords();
  std::vector<NearWord> wordsNear(const FindWord& word) const;
  bool isNumber(const NearWord& near) const;
  void lookUpJoins();
  void lookUpSplits();
  void makeTable();
  void rankWords();
  void makeSources();
  std::vector<Segment> segments() const;
  void addSegments(std::uint32_t source, std::vector<Segment>& segments) const;
  std::uint64_t leastCost(const Source& source, const image::PhraseClass& phraseClass) const;
  bool canImprove(const Segment& segment) const;
  void read(const Segment& segment);
  bool isLast(const Source& source) const;
  bool isOfOneLength(const Segment& segment) const;
  void judgeJoined();
  void judgeAll(std::span<const std::uint32_t> values);
  bool judgeAndKeep(std::uint32_t value, const Source& source);
  bool spendPosting();
  bool keep(const RankedPhrase& phrase);
  bool isFull() const noexcept { return _kept.size() >= _limit; }
  void namePairs(std::span<const std::uint32_t> phrase);
  template <typename Admit>
  std::optional<RankedPhrase> bestOf(std::uint32_t value, Admit admit);
  bool isWithinBounds(const RankedPhrase& phrase) const;
  RankedPhrase solve(std::uint32_t value, std::span<const std::uint32_t> phrase);
  std::uint64_t costOf(std::span<const std::uint32_t> phrase, std::uint64_t gain) const noexcept;
  std::span<const WordOption> optionsOf(std::uint32_t word) const;
  std::uint64_t unitsOf(std::span<const std::uint32_t> phrase) const;

  const SearchImage& _image;
  const FindText& _text;
  const FindOptions& _options;
  std::size_t _limit = 0;

  std::vector<WordOption> _wordOptions;  // ascending by word, then position
  std::vector<Split> _splits;            // ascending by head
  std::vector<std::uint32_t> _table;     // hash table: where a word's options begin, and one
  std::size_t _distinctWords = 0;        // in it
  std::vector<std::uint32_t> _ranks;     // of the text's words
  std::vector<Source> _sources;

  Pairing _pairing;
  std::uint64_t _postings;  // budgets that are left
  std::uint64_t _steps;
  std::uint64_t _phraseWords;  // that may still be read of phrases, each value being read once
  bool _truncated = false;
  NumberIndex _judged;
  std::vector<RankedPhrase> _kept;  // a heap, the last in order on top, once it is full
};

}  // namespace wordcatcher

#endif
