#include "wordcatcher/text/Unicode.h"

#include <unicode/ustring.h>

#include <cstdint>
#include <limits>
#include <stdexcept>

namespace wordcatcher {

namespace {

constexpr UChar32 kReplacement = 0xFFFD;
constexpr const char* kRootLocale = "";

std::int32_t icuLength(std::size_t length) {
  if (length > static_cast<std::size_t>(std::numeric_limits<std::int32_t>::max() / 4)) {
    throw std::length_error("A text must not be longer than 536,870,911 code units or bytes.");
  }
  return static_cast<std::int32_t>(length);
}

using CaseMapping = std::int32_t (*)(UChar*, std::int32_t, const UChar*, std::int32_t, const char*,
                                     UErrorCode*);

std::u16string mapCase(CaseMapping mapping, std::u16string_view text) {
  const std::int32_t length = icuLength(text.size());
  std::u16string result(text.size() + text.size() / 8 + 8, u'\0');
  UErrorCode status = U_ZERO_ERROR;
  std::int32_t needed =
      mapping(result.data(), icuLength(result.size()), text.data(), length, kRootLocale, &status);
  if (status == U_BUFFER_OVERFLOW_ERROR) {
    status = U_ZERO_ERROR;
    result.resize(static_cast<std::size_t>(needed));
    needed = mapping(result.data(), needed, text.data(), length, kRootLocale, &status);
  }
  if (U_FAILURE(status)) {
    throw std::runtime_error(u_errorName(status));
  }
  result.resize(static_cast<std::size_t>(needed));
  return result;
}

}  // namespace

std::optional<std::string> toUtf8(std::u16string_view text) {
  const std::int32_t length = icuLength(text.size());
  std::string bytes(text.size() * 3, '\0');
  std::int32_t used = 0;
  UErrorCode status = U_ZERO_ERROR;
  u_strToUTF8(bytes.data(), icuLength(bytes.size()), &used, text.data(), length, &status);
  if (U_FAILURE(status)) {
    return std::nullopt;
  }
  bytes.resize(static_cast<std::size_t>(used));
  return bytes;
}

std::optional<std::u16string> fromUtf8(std::string_view bytes) {
  const std::int32_t length = icuLength(bytes.size());
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

std::string displayUtf8(std::u16string_view text) {
  const std::int32_t length = icuLength(text.size());
  std::string bytes(text.size() * 3, '\0');
  std::int32_t used = 0;
  UErrorCode status = U_ZERO_ERROR;
  u_strToUTF8WithSub(bytes.data(), icuLength(bytes.size()), &used, text.data(), length,
                     kReplacement, nullptr, &status);
  bytes.resize(static_cast<std::size_t>(used));
  return bytes;
}

std::u16string toLower(std::u16string_view text) { return mapCase(&u_strToLower, text); }

std::u16string toUpper(std::u16string_view text) { return mapCase(&u_strToUpper, text); }

}  // namespace wordcatcher
