// Encodes any code units: nothing throws, the codes keep their bounds, and the same text has the
// same codes again.

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>

#include "TranslationCheck.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace wordcatcher::testing;
  static wordcatcher::KXMetaphone encoder;
  std::u16string text(size / sizeof(char16_t), u'\0');
  if (!text.empty()) {
    std::memcpy(text.data(), data, text.size() * sizeof(char16_t));
  }
  const std::u16string codes = checkedCodes(encoder, text);
  require(checkedCodes(encoder, text) == codes);
  return 0;
}
