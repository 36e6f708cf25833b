#ifndef WORDCATCHER_MATCHER_PAIRING_H
#define WORDCATCHER_MATCHER_PAIRING_H

// The best one-to-one pairing of the words of a phrase with the words of a text.
//
// A pair takes one word of either side; a text's word that joins two neighbouring words of the
// phrase is paired with both, and a word of the phrase that joins two of the text as well. A pair
// takes its words out of those that cost 2 each, and costs its edits: so its gain is 2 a word less
// its edits. The best pairing has the greatest gain, then the most words of the phrase, then the
// most of these without edits, then the least disorder, then the earliest words of the text, then
// of the phrase.
//
// Mostly every word of the phrase can take what is best for it without being in another's way;
// the least disorder is then found word by word from the end (dynamic programming). Where two words
// want one word of the text, or words are joined, all pairings are tried, the most promising first,
// and given up as soon as they cannot become better than the best so far (branch and bound).

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace wordcatcher {

/// A way of pairing words from some word of a phrase on: that one, or it and the next, with a word
/// of the text, or that and the next.
struct PairOption {
  std::uint32_t position;    // the word of the text, or the first of the two
  std::uint8_t textWords;    // 1 or 2
  std::uint8_t phraseWords;  // 1 or 2, not both 2
  std::uint8_t edits;

  std::uint64_t gain() const noexcept { return 2U * (textWords + phraseWords) - edits; }
};

/// A pair of the best pairing.
struct Pair {
  std::uint32_t phrasePosition;
  PairOption option;
};

/// How good a pairing is.
struct PairingScore {
  std::uint64_t gain = 0;
  std::uint64_t words = 0;  // of the phrase, paired
  std::uint64_t exact = 0;  // of those, without edits
  // For each pair but the first: 0 when it follows the one before directly on both sides, 1 when
  // words are between, 2 when it stands before it in the text.
  std::uint64_t disorder = 0;
};

/// Finds best pairings, one after the other, of one text. Used by one thread.
class Pairing {
 public:
  /// `textWords`: how many words the text has.
  explicit Pairing(std::size_t textWords) : _used(textWords) {}

  /// Begins a phrase, and names the ways of pairing its words: nextWord() for each word in order,
  /// each followed by its options, ascending by position. What goes beyond 4,096 options and 8 a
  /// word of the text is left out, and isExact() is false from then on.
  void start();
  void nextWord();
  void add(const PairOption& option);

  /// What pairing all words could come to at the most, each part by itself, if none stood in
  /// another's way; with no disorder.
  const PairingScore& most() const noexcept { return _most; }

  /// The best pairing of what was named. `steps` is a budget, which the work is taken off: when it
  /// is used up, the best pairing so far is taken, and isExact() is false from then on.
  PairingScore solve(std::uint64_t& steps);
  bool isExact() const noexcept { return _isExact; }

  /// The pairs of the last solution, in the phrase's order.
  std::span<const Pair> pairs() const noexcept { return _best; }

 private:
  struct Word {
    std::uint32_t position;
    std::uint32_t firstOption;
    std::uint32_t endOption;
    std::uint64_t bestGain;
    std::uint64_t mostWords;  // of the phrase, that an option takes
    std::uint64_t mostExact;
  };
  /// What comes behind an option in the best way.
  struct Onward {
    std::uint64_t disorder;
    std::uint32_t next;  // an option, or kNone
  };
  static constexpr std::uint32_t kNone = UINT32_MAX;

  void pairOnlyWord();
  bool pairEachByItself();
  void tryAll(std::uint64_t& steps);
  void tryFrom(std::size_t word, std::uint64_t& steps);
  void tryOption(std::size_t word, const PairOption& option, std::uint64_t& steps);
  bool isLater() const;  // whether the pairing in hand takes later words of the text than the best
  bool isEarlier() const;  // earlier ones, or the same, and earlier ones of the phrase
  bool isFree(const PairOption& option) const;
  void use(const PairOption& option, bool isUsed);
  bool follows(const Pair& last, std::uint32_t phrasePosition, const PairOption& option) const;
  std::uint64_t disorderOf(const Pair& last, std::uint32_t phrasePosition,
                           const PairOption& option) const;
  void rankOnward(const Word& word);
  Onward bestOnward(const Word& word, std::uint32_t option) const;
  PairingScore scoreOf(std::span<const Pair> pairs) const;

  std::vector<std::uint8_t> _used;  // a text's words that the pairing in hand takes
  std::vector<PairOption> _options;
  std::vector<Word> _words;  // those with options only
  std::vector<Onward> _onward;
  std::vector<std::uint32_t> _bestUpTo;      // of a word's options, the best up to each one
  std::vector<std::uint32_t> _bestBehind;    // and from it on
  std::vector<PairingScore> _reachableFrom;  // the most that words from one on can add
  std::uint32_t _phraseWords = 0;
  PairingScore _most;
  bool _hasJoins = false;
  bool _isExact = true;
  std::vector<Pair> _current;
  PairingScore _currentScore;
  std::vector<Pair> _best;
  PairingScore _bestScore;
};

}  // namespace wordcatcher

#endif
