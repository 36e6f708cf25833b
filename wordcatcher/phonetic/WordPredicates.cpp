#include "wordcatcher/phonetic/WordPredicates.h"

#include <algorithm>

namespace wordcatcher {

std::u16string_view substring(std::u16string_view s, std::int64_t start,
                              std::size_t length) noexcept {
  const auto begin = static_cast<std::size_t>(std::max<std::int64_t>(start, 0));
  return begin < s.size() ? s.substr(begin, length) : std::u16string_view();
}

char16_t nth(std::u16string_view s, std::size_t index) noexcept {
  return index < s.size() ? s[index] : u' ';
}

bool _isOneOf(std::u16string_view s, StringList list) noexcept {
  return std::find(list.begin(), list.end(), s) != list.end();
}

bool ssa(std::u16string_view s, std::int64_t start, std::size_t length, StringList list) noexcept {
  return _isOneOf(substring(s, start, length), list);
}

bool _isVowel(std::u16string_view s, std::int64_t position) noexcept {
  static constexpr std::u16string_view kVowels[] = {u"E", u"A", u"I", u"O", u"U", u"Y"};
  return ssa(s, position, 1, kVowels);
}

bool _slavoGermanic(std::u16string_view s) noexcept {
  const auto contains = [s](std::u16string_view piece) {
    return s.find(piece) != std::u16string_view::npos;
  };
  // A word with WITZ has a W; the list names the endings that it is about.
  return contains(u"W") || contains(u"K") || contains(u"CZ") || contains(u"WITZ");
}

}  // namespace wordcatcher
