#ifndef WORDCATCHER_TEXT_BYTEOFFSETS_H
#define WORDCATCHER_TEXT_BYTEOFFSETS_H

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace wordcatcher {

/// Where each UTF-16 code unit of a decoded text stands in its UTF-8 bytes. Memory: four bytes a
/// code unit, or none where all bytes are ASCII.
class ByteOffsets {
 public:
  /// Of the text that decodeUtf8() makes of these bytes. Linear.
  explicit ByteOffsets(std::string_view bytes);

  /// The byte at which a code unit begins; the second half of a surrogate pair begins with the
  /// first. The number of units gives the number of bytes.
  std::size_t of(std::size_t unit) const noexcept {
    return _offsets.empty() ? unit : _offsets[unit];
  }

 private:
  std::vector<std::uint32_t> _offsets;
};

}  // namespace wordcatcher

#endif
