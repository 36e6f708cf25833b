// Encodes any code units: nothing throws, and the codes are letters of the code alone, at most two
// for each letter of the upper-cased text and three spaces for each word.

#include <unicode/ubrk.h>
#include <unicode/ustring.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>
#include <string_view>

#include "wordcatcher/phonetic/KXMetaphone.h"

namespace {

void require(bool holds) {
  if (!holds) {
    std::abort();
  }
}

std::size_t upperCasedLength(std::u16string_view word) {
  UErrorCode preflight = U_ZERO_ERROR;
  return static_cast<std::size_t>(u_strToUpper(
      nullptr, 0, word.data(), static_cast<std::int32_t>(word.size()), "", &preflight));
}

/// The most code units that the codes of the text can have.
std::size_t longestCodes(std::u16string_view text) {
  UErrorCode status = U_ZERO_ERROR;
  static UBreakIterator* const words = ubrk_open(UBRK_WORD, "", nullptr, 0, &status);
  ubrk_setText(words, text.data(), static_cast<std::int32_t>(text.size()), &status);
  require(U_SUCCESS(status));
  std::size_t most = 0;
  std::int32_t begin = 0;
  for (std::int32_t end = ubrk_next(words); end != UBRK_DONE; end = ubrk_next(words)) {
    if (ubrk_getRuleStatus(words) >= UBRK_WORD_NONE_LIMIT) {
      most += 2 * upperCasedLength(text.substr(static_cast<std::size_t>(begin),
                                               static_cast<std::size_t>(end - begin))) +
              3;
    }
    begin = end;
  }
  return most;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static wordcatcher::KXMetaphone encoder;
  std::u16string text(size / sizeof(char16_t), u'\0');
  if (!text.empty()) {
    std::memcpy(text.data(), data, text.size() * sizeof(char16_t));
  }
  const std::u16string codes = encoder.translate(text);
  require(codes.find_first_not_of(u"AFHJKLMNPRSTX0 ") == codes.npos);
  require(codes.size() <= longestCodes(text));
  require(encoder.translate(text) == codes);
  require(encoder._translateWord(text) == encoder._translateWord(text));
  return 0;
}
