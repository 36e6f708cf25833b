#ifndef WORDCATCHER_TEXT_TEXTFORM_H
#define WORDCATCHER_TEXT_TEXTFORM_H

#include <concepts>
#include <ostream>
#include <string>
#include <string_view>
#include <type_traits>

#include "wordcatcher/Export.h"

namespace wordcatcher {

/// The text form of a value inside descriptions: a string is itself. Types without a form here need
/// an overload beside them.
inline std::u16string textForm(std::u16string_view text) { return std::u16string(text); }

/// Bytes that are not UTF-8 appear as U+FFFD.
WORDCATCHER_EXPORT std::u16string textForm(std::string_view utf8);

/// An integer in decimal.
template <std::integral Integer>
std::u16string textForm(Integer number) {
  const std::string digits = std::to_string(number);
  return {digits.begin(), digits.end()};
}

/// An object's own description().
template <typename Object>
requires requires(const Object& object) {
  { object.description() } -> std::convertible_to<std::u16string>;
}
std::u16string textForm(const Object& object) { return object.description(); }

/// The text forms of a range's members in its own order: {a, b}.
template <typename Range>
std::u16string textFormOfSet(const Range& members) {
  std::u16string text = u"{";
  for (const auto& member : members) {
    if (text.size() > 1) {
      text += u", ";
    }
    if constexpr (std::is_pointer_v<std::decay_t<decltype(member)>>) {
      text += textForm(*member);
    } else {
      text += textForm(member);
    }
  }
  return text += u'}';
}

/// Writes a string as UTF-8; unpaired surrogates appear as U+FFFD.
WORDCATCHER_EXPORT std::ostream& writeUtf8(std::ostream& stream, std::u16string_view text);

}  // namespace wordcatcher

#endif
