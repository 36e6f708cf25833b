#ifndef WORDCATCHER_MATCHER_FIND_H
#define WORDCATCHER_MATCHER_FIND_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "wordcatcher/Export.h"

namespace wordcatcher {

/// How many edits a word of the text may be away from a stored word, by the length of the stored
/// word in UTF-16 code units when lower-cased: what a phrase's word may suffer does not depend on
/// what a text makes of it, so that a word of letters does not come nearer by one more mistake. An
/// edit is one code unit replaced, inserted or left out, the first one as any other. A limit above
/// kMaxEdits is an error (badInput).
///
/// Words that hold a digit name something that one edit turns into another thing, so those of the
/// text and those stored are only found exactly, and the limits by length do not relax this:
/// `numberEdits` alone does. Joined and split words are found all the same, if the letters and
/// digits of both sides agree, as no number is taken for another then: "a 12" finds the stored
/// word "a12", and "a12" the stored words "a 12", for the one edit that joining costs. Whole texts
/// and codes are no such words.
///
/// A code unit in place of the space between two words that the other side has ("goldnfish",
/// "rai way") is an edit as well. It is looked for where a stored word of so many code units as the
/// two and it may have two edits, digits being numbers here too.
struct EditLimits {
  /// The greatest limit that there may be, in edits.
  static constexpr std::uint32_t kMaxEdits = 3;

  std::size_t shortLength = 2;    ///< a stored word of up to so many code units is short
  std::size_t mediumLength = 5;   ///< a longer one of up to so many is medium; all others are long
  std::uint32_t shortEdits = 0;   ///< edits of a short word
  std::uint32_t mediumEdits = 1;  ///< of a medium one
  std::uint32_t longEdits = 2;    ///< of a long one
  std::uint32_t wholeTextEdits = 3;  ///< of a whole text, in an index of whole texts

  /// Of a word when it or the stored word holds a decimal digit of any script; at most those that
  /// the stored word's length allows.
  std::uint32_t numberEdits = 0;

  /// Whether all members are equal.
  friend bool operator==(const EditLimits&, const EditLimits&) = default;
};

/// What becomes of matches whose ranges in the text overlap.
enum class Overlaps : std::uint32_t {
  all = 0,      ///< every match
  noSub = 1,    ///< no match whose range lies within the larger range of another match
  longest = 2,  ///< of matches that overlap those with the longest range; then the first in order
};

/// What Index::find looks for and how much of it.
struct FindOptions {
  std::size_t limit = 10;  ///< matches at the most: the first ones of all, if not truncated
  std::optional<std::uint64_t> maxCost;  ///< the greatest cost of a match; none: any cost
  std::size_t minWords = 1;              ///< words of a phrase that the text must hold; at least 1
  EditLimits edits;                      ///< how far a word may be from a stored one
  bool transpositions = true;            ///< whether two neighbours swapped are one edit, not two
  Overlaps overlaps = Overlaps::all;     ///< which matches whose ranges overlap are listed

  /// How many postings (phrases under a word) are looked at, all words together; what lies beyond
  /// is not found, and the result says so.
  std::uint64_t maxPostings = 2'000'000;
};

/// A word of a phrase found in a text, or two in one piece.
struct FoundWord {
  std::size_t begin;    ///< where it begins in the text as the host gave it, in bytes
  std::size_t end;      ///< where it ends: the byte behind its last one
  std::string word;     ///< as stored; two words that the text joins stand with a space between
  std::uint32_t edits;  ///< between the two

  /// Whether all members are equal.
  friend bool operator==(const FoundWord&, const FoundWord&) = default;
};

/// A phrase found in a text.
struct FoundPhrase {
  std::string value;            ///< its data string
  std::uint64_t cost;           ///< see Index::find
  std::size_t begin;            ///< the range of the text that spans the hits, in bytes
  std::size_t end;              ///< the byte behind the last hit
  std::vector<FoundWord> hits;  ///< in the order of the text

  /// Whether all members are equal.
  friend bool operator==(const FoundPhrase&, const FoundPhrase&) = default;
};

/// What Index::find found.
struct FindResult {
  std::vector<FoundPhrase> matches;  ///< the best one first

  /// Whether a budget cut something off. Then there may be better matches than these, and another
  /// limit may list others: how far the budget reaches depends on it.
  bool truncated = false;

  /// Whether all members are equal.
  friend bool operator==(const FindResult&, const FindResult&) = default;
};

/// Why a phrase has its cost for a text, or why it is not found; see Index::explain.
struct WORDCATCHER_EXPORT FindExplanation {
  /// What comparing words may take. A comparison takes a step for each pair of code units of the
  /// two words, and at least kComparisonSteps; the first that would take more than is left, and all
  /// behind it, are left out.
  static constexpr std::uint64_t kMaxSteps = 16'777'216;
  static constexpr std::uint64_t kComparisonSteps = 256;  ///< see kMaxSteps

  /// A word of the phrase.
  struct PhraseWord {
    std::string word;           ///< as stored
    std::uint32_t lengthLimit;  ///< edits that a text's word may be away from it by its length; of
                                ///< a code none, of a whole text whatever its length
    std::uint32_t limit;        ///< the same: less if it holds a digit
  };

  /// A word of the phrase beside a word of the text.
  struct Comparison {
    std::string word;     ///< of the phrase
    std::uint64_t edits;  ///< between the two
    std::uint32_t limit;  ///< edits that the two may have: less than the phrase's word may have by
                          ///< its length if one of them holds a digit
    bool within;          ///< whether the two may be paired
  };

  /// A word of the text.
  struct TextWord {
    std::size_t begin;    ///< in the text, in bytes
    std::size_t end;      ///< the byte behind its last one
    std::string word;     ///< as it is looked up, or as it is if it is too long
    std::string written;  ///< if `word` is a code: as it is in the text; else empty
    bool isLookedUp;      ///< false if it is too long

    /// With the words of the phrase, in its order: with all, or fewer if `truncated`; with none if
    /// it is too long.
    std::vector<Comparison> comparisons;
  };

  std::string text;   ///< the host's
  std::string value;  ///< the host's

  bool isStored = false;                ///< whether the index holds the value
  bool isFound = false;                 ///< whether find() lists it
  bool truncated = false;               ///< whether a budget cut words, comparisons, pairings or
                                        ///< matches before it off
  std::vector<TextWord> words;          ///< of the text, in its order
  std::vector<PhraseWord> phrase;       ///< the words of the phrase that fits best
  std::vector<FoundWord> pairs;         ///< what was paired, in the order of the text
  std::vector<std::string> missing;     ///< words of the phrase that the text lacks
  std::vector<std::string> surplus;     ///< words of the text that are left over; of an index of
                                        ///< codes each with its code behind it: "dear (tr)"
  std::uint64_t edits = 0;              ///< of the pairs
  std::uint64_t cost = 0;               ///< edits, and 2 for each missing and surplus word
  std::vector<std::string> objections;  ///< sentences: which limit keeps it out; empty when found

  /// One JSON object on one line, with the names above.
  std::string toJson() const;

  /// For people: several lines, each ended by a line feed.
  std::string toText() const;
};

/// How the score of Index::query comes about for one value, step by step.
struct WORDCATCHER_EXPORT QueryExplanation {
  /// What was looked at, one thing after the other.
  struct Step {
    std::string sentence;   ///< what was looked at, and what came of it
    std::int64_t distance;  ///< the value's distance after it
  };

  std::string text;   ///< the host's
  std::string value;  ///< the host's

  bool isStored = false;      ///< whether the index holds the value
  bool isFound = false;       ///< whether query() lists it
  bool truncated = false;     ///< whether a budget cut words of the text off
  std::int64_t distance = 0;  ///< at the end; 0 for a value that was no candidate
  std::int64_t bound = 0;     ///< the greatest distance that is listed
  std::vector<Step> steps;    ///< in the order in which they are taken; of a value that is not
                              ///< stored one, which says so

  /// One JSON object on one line, with the names above.
  std::string toJson() const;

  /// For people: several lines, each ended by a line feed.
  std::string toText() const;
};

}  // namespace wordcatcher

#endif
