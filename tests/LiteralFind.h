#ifndef WORDCATCHER_TESTS_LITERALFIND_H
#define WORDCATCHER_TESTS_LITERALFIND_H

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/matcher/Find.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::testing {

/// The edits between two strings, by the textbook table: code units replaced, inserted, left out
/// and, if `transpositions`, two neighbours swapped, which are then not edited again.
std::uint64_t literalEdits(std::u16string_view a, std::u16string_view b, bool transpositions);

/// The yardstick of Index::find: judges every phrase of every value by trying all pairings of its
/// words with those of the text. Knows the phrases as they were given to the builder, and nothing
/// of images. For small phrases and texts that are well-formed UTF-8.
class LiteralFind {
 public:
  explicit LiteralFind(MatchingMode mode = MatchingMode::words) : _mode(mode) {}

  void add(std::string_view phrase, std::string_view value);

  /// What find() gives for every value that it finds, in order, limit and overlaps aside.
  std::vector<FoundPhrase> findAll(std::string_view text, const FindOptions& options) const;

 private:
  using Phrase = std::vector<std::u16string>;  // its words, lower-cased

  struct Token {
    std::u16string word;
    std::size_t begin;
    std::size_t end;
  };
  /// Words of the phrase paired with words of the text: one of each, or two of one side.
  struct Pair {
    std::size_t phrasePosition;
    std::size_t phraseWords;
    std::size_t textPosition;
    std::size_t textWords;
    std::uint64_t edits;
  };
  using Pairs = std::vector<Pair>;  // in the order of the phrase

  struct Judged {
    std::uint64_t cost = 0;
    std::uint64_t words = 0;
    std::uint64_t exact = 0;
    std::uint64_t disorder = 0;
    std::uint64_t rarity = 0;
    Phrase phrase;
    Pairs pairs;
  };

  Phrase wordsOf(std::string_view phrase) const;
  std::vector<std::u16string> lookedUp(std::u16string_view word) const;
  std::vector<Token> cut(std::string_view text) const;
  bool mayPair(std::u16string_view inPhrase, std::u16string_view inText, std::uint64_t edits,
               const EditLimits& limits) const;
  Judged judge(const Phrase& phrase, const std::vector<Token>& text,
               const FindOptions& options) const;
  std::vector<Pair> waysToPair(const Phrase& phrase, const std::vector<Token>& text,
                               const FindOptions& options) const;
  std::uint64_t valuesUnder(const std::u16string& word) const;

  MatchingMode _mode;
  std::map<std::string, std::vector<Phrase>> _values;
  mutable std::map<std::u16string, std::uint64_t> _valuesUnder;
};

}  // namespace wordcatcher::testing

#endif
