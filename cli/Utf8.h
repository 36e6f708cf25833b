#ifndef WORDCATCHER_CLI_UTF8_H
#define WORDCATCHER_CLI_UTF8_H

#include <optional>
#include <string>
#include <string_view>

namespace wordcatcher::cli {

/// The string that these bytes are the UTF-8 form of, or nothing if they are not well-formed or
/// more than ICU can count (2^31 - 1 bytes).
std::optional<std::u16string> fromUtf8(std::string_view bytes);

/// UTF-8 form of a string; unpaired surrogates become U+FFFD.
std::string toUtf8(std::u16string_view text);

/// The bytes with U+001A, the control character SUBSTITUTE, in place of each byte that is no part
/// of well-formed UTF-8: UTF-8 of the same length, so that offsets stay what they are.
std::string withSubstitutes(std::string bytes);

/// Whether nothing but white space is in it.
bool isBlank(std::u16string_view text);

}  // namespace wordcatcher::cli

#endif
