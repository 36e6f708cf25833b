#include "cli/WordCounter.h"

#include <cstdint>

#include "cli/Failure.h"

namespace wordcatcher::cli {

WordCounter::WordCounter() {
  UErrorCode status = U_ZERO_ERROR;
  _iterator.reset(ubrk_open(UBRK_WORD, "", nullptr, 0, &status));
  if (U_FAILURE(status)) {
    throw Failure("ICU's word-boundary rules cannot be loaded: check that ICU is fully installed.");
  }
}

std::size_t WordCounter::count(std::u16string_view text) {
  UErrorCode status = U_ZERO_ERROR;
  ubrk_setText(_iterator.get(), text.data(), static_cast<std::int32_t>(text.size()), &status);
  std::size_t words = 0;
  while (U_SUCCESS(status) && ubrk_next(_iterator.get()) != UBRK_DONE) {
    words += ubrk_getRuleStatus(_iterator.get()) >= UBRK_WORD_NONE_LIMIT ? 1U : 0U;
  }
  return words;
}

}  // namespace wordcatcher::cli
