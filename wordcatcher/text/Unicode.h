#ifndef WORDCATCHER_TEXT_UNICODE_H
#define WORDCATCHER_TEXT_UNICODE_H

#include <optional>
#include <string>
#include <string_view>

namespace wordcatcher {

// Conversions between UTF-16 and UTF-8 and the case mappings of the root locale. All of them are
// linear in the text and safe for concurrent use. ICU counts up to 2^31 - 1: a string that is
// longer, or whose other form is, has no other form; the case mappings throw std::length_error for
// it.

/// UTF-8 form of a string, or nothing if it holds an unpaired surrogate: such a string has none,
/// and a replacement character would make another string of it.
std::optional<std::string> toUtf8(std::u16string_view text);

/// The string that these bytes are the UTF-8 form of, or nothing if they are not well-formed.
std::optional<std::u16string> fromUtf8(std::string_view bytes);

/// The string of these bytes as far as they are well-formed; each ill-formed sequence is one
/// U+FFFD, which is no part of a word. Throws std::length_error beyond 2^31 - 1 bytes.
std::u16string decodeUtf8(std::string_view bytes);

/// UTF-8 for people to read: unpaired surrogates appear as U+FFFD; cut off beyond 2^31 - 1 bytes.
std::string displayUtf8(std::u16string_view text);

/// Full lower-case mapping of the root locale; the result may be longer than the text.
std::u16string toLower(std::u16string_view text);

/// Full upper-case mapping of the root locale; the result may be longer than the text.
std::u16string toUpper(std::u16string_view text);

}  // namespace wordcatcher

#endif
