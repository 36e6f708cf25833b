#ifndef WORDCATCHER_PHONETIC_WORDPREDICATES_H
#define WORDCATCHER_PHONETIC_WORDPREDICATES_H

/// @file
///
/// The questions that the letter rules of the phonetic encoder ask about a word. They look at code
/// units and match upper-case letters only, since the rules see upper-cased words. No position is
/// out of range: what lies outside a word reads as a space or as an empty piece. All of them are
/// safe for concurrent use; none allocates. They are inline because the rules ask dozens of them a
/// word.

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <span>
#include <string_view>

namespace wordcatcher {

/// Strings to compare with, in the order in which they are tried.
using StringList = std::span<const std::u16string_view>;

/// The piece of `s` of `length` code units from `start`, clipped at the end of `s` and empty if
/// nothing is left. A negative start is moved to 0 without shortening the piece: (s, -1, 3) is the
/// first three code units. The piece views into `s`.
constexpr std::u16string_view substring(std::u16string_view s, std::int64_t start,
                                        std::size_t length) noexcept {
  const auto begin = static_cast<std::size_t>(std::max<std::int64_t>(start, 0));
  return begin < s.size() ? s.substr(begin, length) : std::u16string_view();
}

/// The code unit at `index`, or a space (U+0020) if `s` ends before it.
constexpr char16_t nth(std::u16string_view s, std::size_t index) noexcept {
  return index < s.size() ? s[index] : u' ';
}

/// Whether `s` equals a member of the list, code unit for code unit.
constexpr bool _isOneOf(std::u16string_view s, StringList list) noexcept {
  return std::find(list.begin(), list.end(), s) != list.end();
}

/// Whether the piece of `length` code units from `start`, as substring() gives it, is a member of
/// the list.
constexpr bool ssa(std::u16string_view s, std::int64_t start, std::size_t length,
                   StringList list) noexcept {
  return _isOneOf(substring(s, start, length), list);
}

/// The same for a list that is written where it is asked for.
constexpr bool _isOneOf(std::u16string_view s,
                        std::initializer_list<std::u16string_view> list) noexcept {
  return _isOneOf(s, StringList(list.begin(), list.size()));
}

/// The same for a list that is written where it is asked for.
constexpr bool ssa(std::u16string_view s, std::int64_t start, std::size_t length,
                   std::initializer_list<std::u16string_view> list) noexcept {
  return ssa(s, start, length, StringList(list.begin(), list.size()));
}

/// Whether the code unit at `position` is one of E, A, I, O, U and Y. A negative position means the
/// first code unit.
constexpr bool _isVowel(std::u16string_view s, std::int64_t position) noexcept {
  const std::u16string_view letter = substring(s, position, 1);
  return !letter.empty() && std::u16string_view(u"EAIOUY").find(letter.front()) != letter.npos;
}

/// Whether the spelling points to a Slavonic or Germanic word: it holds W, K or CZ. Linear in `s`.
constexpr bool _slavoGermanic(std::u16string_view s) noexcept {
  // A word with WITZ has a W; the list names the endings that it is about.
  for (const std::u16string_view piece : {u"W", u"K", u"CZ", u"WITZ"}) {
    if (s.find(piece) != s.npos) {
      return true;
    }
  }
  return false;
}

}  // namespace wordcatcher

#endif
