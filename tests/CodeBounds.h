#ifndef WORDCATCHER_TESTS_CODEBOUNDS_H
#define WORDCATCHER_TESTS_CODEBOUNDS_H

#include <cstddef>
#include <string_view>

namespace wordcatcher::testing {

/// How many letters and spaces phonetic codes have, or may have at most.
struct CodeBounds {
  std::size_t letters = 0;
  std::size_t spaces = 0;
};

/// The most that KXMetaphone::_translateWord() may give: two letters for each letter that a rule
/// knows, which are A to Z, Ç and Ñ once the word is upper-cased; one space for each of the word's
/// own and for each of the two around it.
CodeBounds boundsOfWord(std::u16string_view word);

/// The most that KXMetaphone::translate() may give: the bounds of each word that ICU finds, and one
/// more space for each.
CodeBounds boundsOfText(std::u16string_view text);

/// Whether `codes` are made of nothing but letters of the code and spaces, neither more than the
/// bounds allow.
bool within(const CodeBounds& bounds, std::u16string_view codes);

}  // namespace wordcatcher::testing

#endif
