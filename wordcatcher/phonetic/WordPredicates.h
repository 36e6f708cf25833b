#ifndef WORDCATCHER_PHONETIC_WORDPREDICATES_H
#define WORDCATCHER_PHONETIC_WORDPREDICATES_H

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <span>
#include <string_view>

#include "wordcatcher/Export.h"

namespace wordcatcher {

// The questions that the letter rules of the phonetic encoder ask about a word. They look at code
// units and match upper-case letters only, since the rules see upper-cased words. No position is out
// of range: what lies outside a word reads as a space or as an empty piece. All of them are safe for
// concurrent use; none allocates.

/// Strings to compare with, in the order in which they are tried.
using StringList = std::span<const std::u16string_view>;

/// The piece of `s` of `length` code units from `start`, clipped at the end of `s` and empty if
/// nothing is left. A negative start is moved to 0 without shortening the piece: (s, -1, 3) is the
/// first three code units. The piece views into `s`.
WORDCATCHER_EXPORT std::u16string_view substring(std::u16string_view s, std::int64_t start,
                                                 std::size_t length) noexcept;

/// The code unit at `index`, or a space (U+0020) if `s` ends before it.
WORDCATCHER_EXPORT char16_t nth(std::u16string_view s, std::size_t index) noexcept;

/// Whether `s` equals a member of the list, code unit for code unit.
WORDCATCHER_EXPORT bool _isOneOf(std::u16string_view s, StringList list) noexcept;

/// Whether the piece of `length` code units from `start`, as substring() gives it, is a member of
/// the list.
WORDCATCHER_EXPORT bool ssa(std::u16string_view s, std::int64_t start, std::size_t length,
                            StringList list) noexcept;

/// Whether the code unit at `position` is one of E, A, I, O, U and Y. A negative position means the
/// first code unit.
WORDCATCHER_EXPORT bool _isVowel(std::u16string_view s, std::int64_t position) noexcept;

/// Whether the spelling points to a Slavonic or Germanic word: it holds W, K or CZ. Linear in `s`.
WORDCATCHER_EXPORT bool _slavoGermanic(std::u16string_view s) noexcept;

inline bool _isOneOf(std::u16string_view s,
                     std::initializer_list<std::u16string_view> list) noexcept {
  return _isOneOf(s, StringList(list.begin(), list.size()));
}

inline bool ssa(std::u16string_view s, std::int64_t start, std::size_t length,
                std::initializer_list<std::u16string_view> list) noexcept {
  return ssa(s, start, length, StringList(list.begin(), list.size()));
}

}  // namespace wordcatcher

#endif
