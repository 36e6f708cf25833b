#include "CodeBounds.h"

#include <unicode/ubrk.h>
#include <unicode/ustring.h>

#include <algorithm>
#include <cstdint>
#include <memory>
#include <stdexcept>
#include <string>

namespace wordcatcher::testing {

namespace {

struct CloseWords {
  void operator()(UBreakIterator* words) const { ubrk_close(words); }
};

std::u16string upperCased(std::u16string_view word) {
  if (word.empty()) {
    return {};
  }
  // No character becomes more than three times as long.
  std::u16string upper(3 * word.size(), u'\0');
  UErrorCode status = U_ZERO_ERROR;
  const std::int32_t length =
      u_strToUpper(upper.data(), static_cast<std::int32_t>(upper.size()), word.data(),
                   static_cast<std::int32_t>(word.size()), "", &status);
  if (U_FAILURE(status)) {
    throw std::runtime_error(u_errorName(status));
  }
  upper.resize(static_cast<std::size_t>(length));
  return upper;
}

bool isLetterOfARule(char16_t unit) {
  return (unit >= u'A' && unit <= u'Z') || unit == u'Ç' || unit == u'Ñ';
}

std::size_t spacesIn(std::u16string_view text) {
  return static_cast<std::size_t>(std::count(text.begin(), text.end(), u' '));
}

}  // namespace

CodeBounds boundsOfWord(std::u16string_view word) {
  const std::u16string upper = upperCased(word);
  const auto letters = std::count_if(upper.begin(), upper.end(), &isLetterOfARule);
  return {2 * static_cast<std::size_t>(letters), spacesIn(upper) + 2};
}

CodeBounds boundsOfText(std::u16string_view text) {
  UErrorCode status = U_ZERO_ERROR;
  static const std::unique_ptr<UBreakIterator, CloseWords> words(
      ubrk_open(UBRK_WORD, "", nullptr, 0, &status));
  ubrk_setText(words.get(), text.data(), static_cast<std::int32_t>(text.size()), &status);
  if (U_FAILURE(status)) {
    throw std::runtime_error(u_errorName(status));
  }
  CodeBounds bounds;
  std::int32_t begin = 0;
  for (std::int32_t end = ubrk_next(words.get()); end != UBRK_DONE; end = ubrk_next(words.get())) {
    if (ubrk_getRuleStatus(words.get()) >= UBRK_WORD_NONE_LIMIT) {
      const CodeBounds word = boundsOfWord(
          text.substr(static_cast<std::size_t>(begin), static_cast<std::size_t>(end - begin)));
      bounds.letters += word.letters;
      bounds.spaces += word.spaces + 1;
    }
    begin = end;
  }
  return bounds;
}

bool within(const CodeBounds& bounds, std::u16string_view codes) {
  const std::size_t spaces = spacesIn(codes);
  return codes.find_first_not_of(u"AFHJKLMNPRSTX0 ") == codes.npos && spaces <= bounds.spaces &&
         codes.size() - spaces <= bounds.letters;
}

}  // namespace wordcatcher::testing
