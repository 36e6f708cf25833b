#include "cli/Substitutes.h"

#include <unicode/utf8.h>

#include <algorithm>
#include <cstddef>

namespace wordcatcher::cli {

std::string withSubstitutes(std::string bytes) {
  constexpr char kSubstitute = '\x1a';
  for (std::size_t end = 0; end < bytes.size();) {
    const std::size_t begin = end;
    UChar32 character = 0;
    U8_NEXT(bytes.data(), end, bytes.size(), character);
    if (character < 0) {
      std::fill(bytes.begin() + static_cast<std::ptrdiff_t>(begin),
                bytes.begin() + static_cast<std::ptrdiff_t>(end), kSubstitute);
    }
  }
  return bytes;
}

}  // namespace wordcatcher::cli
