#include "cli/Utf8.h"

#include <unicode/uchar.h>
#include <unicode/ustring.h>
#include <unicode/utf8.h>

#include <algorithm>
#include <cstdint>
#include <limits>
#include <sstream>

#include "wordcatcher/text/TextForm.h"

namespace wordcatcher::cli {

std::optional<std::u16string> fromUtf8(std::string_view bytes) {
  if (bytes.size() > static_cast<std::size_t>(std::numeric_limits<std::int32_t>::max())) {
    return std::nullopt;
  }
  const auto length = static_cast<std::int32_t>(bytes.size());
  // UTF-16 never takes more code units than UTF-8 takes bytes.
  std::u16string text(bytes.size(), u'\0');
  std::int32_t used = 0;
  UErrorCode status = U_ZERO_ERROR;
  u_strFromUTF8(text.data(), length, &used, bytes.data(), length, &status);
  if (U_FAILURE(status)) {
    return std::nullopt;
  }
  text.resize(static_cast<std::size_t>(used));
  return text;
}

std::string toUtf8(std::u16string_view text) {
  std::ostringstream stream;
  writeUtf8(stream, text);
  return stream.str();
}

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

bool isBlank(std::u16string_view text) {
  // Every white-space character is one code unit.
  return std::all_of(text.begin(), text.end(), [](char16_t unit) { return u_isUWhiteSpace(unit); });
}

}  // namespace wordcatcher::cli
