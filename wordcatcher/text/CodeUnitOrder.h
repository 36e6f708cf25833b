#ifndef WORDCATCHER_TEXT_CODEUNITORDER_H
#define WORDCATCHER_TEXT_CODEUNITORDER_H

#include <algorithm>
#include <cstdint>
#include <string_view>

namespace wordcatcher {

/// The rank of a UTF-8 byte among the bytes that may stand in its place, in the order of UTF-16
/// code units. That is the order of the bytes but for one thing: surrogate pairs (lead bytes F0 to
/// F4) come before U+E000 to U+FFFF (lead bytes EE and EF), whose ranks therefore are FE and FF.
/// The source of the exchange is Unicode's "UTF-8 in UTF-16 order" (The Unicode Standard,
/// section 5.17).
inline std::uint8_t utf16Rank(char byte) noexcept {
  constexpr unsigned kPrivateUse = 0xEE;
  constexpr unsigned kSupplementary = 0xF0;
  const unsigned value = static_cast<unsigned char>(byte);
  const bool exchanged = value >= kPrivateUse && value < kSupplementary;
  return static_cast<std::uint8_t>(exchanged ? value + 0x10 : value);
}

/// Whether one UTF-8 string comes before another in the order of their UTF-16 code units. Linear in
/// the common prefix.
inline bool utf16Less(std::string_view a, std::string_view b) noexcept {
  const auto [left, right] = std::mismatch(a.begin(), a.end(), b.begin(), b.end());
  if (left == a.end() || right == b.end()) {
    return left == a.end() && right != b.end();
  }
  return utf16Rank(*left) < utf16Rank(*right);
}

}  // namespace wordcatcher

#endif
