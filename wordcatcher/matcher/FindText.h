#ifndef WORDCATCHER_MATCHER_FINDTEXT_H
#define WORDCATCHER_MATCHER_FINDTEXT_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/fuzzy/NearWords.h"
#include "wordcatcher/matcher/Find.h"
#include "wordcatcher/matcher/IndexBuilder.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

/// A word of a text in which phrases are looked for.
struct FindWord {
  std::u16string word;  // as it is looked up: lower-cased, or a code, lower-cased; else as it is
  std::size_t begin;    // in the text, in bytes
  std::size_t end;
  bool isNumber;    // whether it holds a digit where that makes a difference
  bool isLookedUp;  // false for a word beyond the budget
};

/// A text cut into the words that an index of some mode is asked for.
struct FindText {
  std::vector<FindWord> words;
  std::string_view source;  // the host's text, which must live as long as this is used
  bool truncated = false;   // whether a budget cut words off, or left one out

  /// Budgets as in Index::Options. Linear in the text.
  FindText(std::string_view text, MatchingMode mode, const EditLimits& limits, WordSegmenter& words,
           std::size_t maxWords, std::size_t maxWordUnits);

  /// The edits that a stored word of so many code units may be away from a word of the text;
  /// `isNumber`: one of the two holds a digit.
  std::uint32_t editLimit(std::size_t length, bool isNumber) const noexcept;

  /// The least limit with which nearWords() leaves out no stored word that these limits admit.
  NearLimit nearLimit(const FindWord& word) const noexcept;

  bool hasCodes() const noexcept { return _mode == MatchingMode::phoneticWords; }

 private:
  MatchingMode _mode;
  EditLimits _limits;
};

/// Whether a string holds a decimal digit of any script: such words name numbers, of which one that
/// is a digit off is another.
bool holdsDigit(std::u16string_view word) noexcept;

}  // namespace wordcatcher

#endif
