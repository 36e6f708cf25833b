#ifndef WORDCATCHER_TEXT_CODEUNITORDER_H
#define WORDCATCHER_TEXT_CODEUNITORDER_H

#include <algorithm>
#include <string_view>

namespace wordcatcher {

/// Whether one UTF-8 string comes before another in the order of their UTF-16 code units. That is
/// the order of the bytes but for one thing: surrogate pairs (lead bytes F0 to F4) come before
/// U+E000 to U+FFFF (lead bytes EE and EF). The source of the exchange is Unicode's "UTF-8 in
/// UTF-16 order" (The Unicode Standard, section 5.17). Linear in the common prefix.
inline bool utf16Less(std::string_view a, std::string_view b) noexcept {
  const auto [left, right] = std::mismatch(a.begin(), a.end(), b.begin(), b.end());
  if (left == a.end() || right == b.end()) {
    return left == a.end() && right != b.end();
  }
  const auto rank = [](char byte) {
    const unsigned value = static_cast<unsigned char>(byte);
    constexpr unsigned kPrivateUse = 0xEE;
    constexpr unsigned kSupplementary = 0xF0;
    if (value < kPrivateUse) {
      return value;
    }
    return value < kSupplementary ? value + 0x10 : value;
  };
  // Ranks of EE and EF become FE and FF, above F4.
  return rank(*left) < rank(*right);
}

}  // namespace wordcatcher

#endif
