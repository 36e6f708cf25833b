#include "wordcatcher/text/ByteOffsets.h"

#include <unicode/utf16.h>
#include <unicode/utf8.h>

#include <algorithm>

namespace wordcatcher {

ByteOffsets::ByteOffsets(std::string_view bytes) {
  const auto isAscii = [](char byte) { return static_cast<unsigned char>(byte) < 0x80; };
  if (std::all_of(bytes.begin(), bytes.end(), isAscii)) {
    return;
  }
  _offsets.reserve(bytes.size() + 1);
  for (std::size_t end = 0; end < bytes.size();) {
    const auto begin = static_cast<std::uint32_t>(end);
    UChar32 character = 0;
    // The source of how many bytes an ill-formed sequence has is ICU, as for decodeUtf8().
    U8_NEXT_OR_FFFD(bytes.data(), end, bytes.size(), character);
    _offsets.insert(_offsets.end(), static_cast<std::size_t>(U16_LENGTH(character)), begin);
  }
  _offsets.push_back(static_cast<std::uint32_t>(bytes.size()));
}

}  // namespace wordcatcher
