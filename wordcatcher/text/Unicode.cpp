#include "wordcatcher/text/Unicode.h"

#include <unicode/ustring.h>

#include <algorithm>
#include <cstdint>
#include <limits>
#include <stdexcept>

namespace wordcatcher {

namespace {

constexpr UChar32 kReplacement = 0xFFFD;
constexpr const char* kRootLocale = "";

constexpr std::size_t kMaxLength = std::numeric_limits<std::int32_t>::max();

[[noreturn]] void throwTooLong() {
  throw std::length_error(
      "A text must not be longer than 2,147,483,647 code units; give it in shorter pieces.");
}

std::int32_t icuLength(std::size_t length) {
  if (length > kMaxLength) {
    throwTooLong();
  }
  return static_cast<std::int32_t>(length);
}

/// Room for the UTF-8 form of so many code units, as far as ICU can count it.
std::size_t utf8Room(std::size_t units) { return std::min(units * 3, kMaxLength); }

using CaseMapping = std::int32_t (*)(UChar*, std::int32_t, const UChar*, std::int32_t, const char*,
                                     UErrorCode*);

std::u16string mapCase(CaseMapping mapping, std::u16string_view text) {
  if (text.empty()) {
    return {};
  }
  const std::int32_t length = icuLength(text.size());
  std::u16string result(std::min(text.size() + text.size() / 8 + 8, kMaxLength), u'\0');
  UErrorCode status = U_ZERO_ERROR;
  std::int32_t needed =
      mapping(result.data(), icuLength(result.size()), text.data(), length, kRootLocale, &status);
  if (status == U_BUFFER_OVERFLOW_ERROR) {
    status = U_ZERO_ERROR;
    result.resize(static_cast<std::size_t>(needed));
    needed = mapping(result.data(), needed, text.data(), length, kRootLocale, &status);
  }
  if (status == U_INDEX_OUTOFBOUNDS_ERROR) {
    throwTooLong();
  }
  if (U_FAILURE(status)) {
    throw std::runtime_error(u_errorName(status));
  }
  result.resize(static_cast<std::size_t>(needed));
  return result;
}

}  // namespace

std::optional<std::string> toUtf8(std::u16string_view text) {
  if (text.empty() || text.size() > kMaxLength) {
    return text.empty() ? std::optional<std::string>("") : std::nullopt;
  }
  std::string bytes(utf8Room(text.size()), '\0');
  std::int32_t used = 0;
  UErrorCode status = U_ZERO_ERROR;
  u_strToUTF8(bytes.data(), icuLength(bytes.size()), &used, text.data(), icuLength(text.size()),
              &status);
  if (U_FAILURE(status)) {
    return std::nullopt;
  }
  bytes.resize(static_cast<std::size_t>(used));
  return bytes;
}

std::optional<std::u16string> fromUtf8(std::string_view bytes) {
  if (bytes.empty() || bytes.size() > kMaxLength) {
    return bytes.empty() ? std::optional<std::u16string>(u"") : std::nullopt;
  }
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

std::u16string decodeUtf8(std::string_view bytes) {
  if (bytes.empty()) {
    return {};
  }
  const std::int32_t length = icuLength(bytes.size());
  std::u16string text(bytes.size(), u'\0');
  std::int32_t used = 0;
  UErrorCode status = U_ZERO_ERROR;
  u_strFromUTF8WithSub(text.data(), length, &used, bytes.data(), length, kReplacement, nullptr,
                       &status);
  text.resize(static_cast<std::size_t>(used));
  return text;
}

std::string displayUtf8(std::u16string_view text) {
  if (text.empty()) {
    return {};
  }
  text = text.substr(0, kMaxLength / 3);
  std::string bytes(utf8Room(text.size()), '\0');
  std::int32_t used = 0;
  UErrorCode status = U_ZERO_ERROR;
  u_strToUTF8WithSub(bytes.data(), icuLength(bytes.size()), &used, text.data(),
                     icuLength(text.size()), kReplacement, nullptr, &status);
  bytes.resize(static_cast<std::size_t>(used));
  return bytes;
}

std::u16string toLower(std::u16string_view text) { return mapCase(&u_strToLower, text); }

std::u16string toUpper(std::u16string_view text) { return mapCase(&u_strToUpper, text); }

}  // namespace wordcatcher
