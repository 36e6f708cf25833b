#include "wordcatcher/text/WordSegmenter.h"

#include <unicode/ubrk.h>

#include <cstdint>
#include <limits>
#include <new>
#include <stdexcept>

namespace wordcatcher {

WordSegmenter::WordSegmenter() {
  UErrorCode status = U_ZERO_ERROR;
  _iterator.reset(ubrk_open(UBRK_WORD, "", nullptr, 0, &status));
  if (U_FAILURE(status)) {
    throw std::runtime_error(
        "ICU's word-boundary rules cannot be loaded; check that its data is installed.");
  }
}

WordSegmenter::WordSegmenter(const WordSegmenter& other) {
  UErrorCode status = U_ZERO_ERROR;
  _iterator.reset(ubrk_clone(other._iterator.get(), &status));
  if (U_FAILURE(status)) {
    throw std::bad_alloc();
  }
}

WordSegmenter::~WordSegmenter() = default;

void WordSegmenter::CloseIterator::operator()(UBreakIterator* iterator) const noexcept {
  ubrk_close(iterator);
}

void WordSegmenter::start(std::u16string_view text) {
  if (text.size() > static_cast<std::size_t>(std::numeric_limits<std::int32_t>::max())) {
    throw std::length_error(
        "A text must not be longer than 2,147,483,647 code units; give it in shorter pieces.");
  }
  _text = text.empty() ? std::u16string_view(u"") : text;  // ICU takes no null pointer
  UErrorCode status = U_ZERO_ERROR;
  ubrk_setText(_iterator.get(), _text.data(), static_cast<std::int32_t>(_text.size()), &status);
  if (U_FAILURE(status)) {
    throw std::runtime_error(u_errorName(status));
  }
}

std::optional<std::u16string_view> WordSegmenter::next() {
  std::int32_t begin = ubrk_current(_iterator.get());
  for (;;) {
    const std::int32_t end = ubrk_next(_iterator.get());
    if (end == UBRK_DONE) {
      return std::nullopt;
    }
    if (ubrk_getRuleStatus(_iterator.get()) >= UBRK_WORD_NONE_LIMIT) {
      return _text.substr(static_cast<std::size_t>(begin), static_cast<std::size_t>(end - begin));
    }
    begin = end;
  }
}

}  // namespace wordcatcher
