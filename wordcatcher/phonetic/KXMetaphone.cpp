#include "wordcatcher/phonetic/KXMetaphone.h"

#include <unicode/uchar.h>
#include <unicode/utf16.h>

#include <cstdint>
#include <utility>

#include "wordcatcher/phonetic/LetterRules.h"
#include "wordcatcher/text/Unicode.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

namespace {

std::u16string withoutPunctuation(std::u16string_view word) {
  std::u16string letters;
  letters.reserve(word.size());
  for (std::size_t i = 0; i < word.size();) {
    const std::size_t begin = i;
    UChar32 character = 0;
    U16_NEXT(word.data(), i, word.size(), character);
    if ((U_GET_GC_MASK(character) & U_GC_P_MASK) == 0) {
      letters.append(word, begin, i - begin);
    }
  }
  return letters;
}

std::u16string paddedWord(std::u16string_view word) {
  return u' ' + toUpper(withoutPunctuation(word)) + u' ';
}

}  // namespace

KXMetaphone::KXMetaphone() : _segmenter(std::make_unique<WordSegmenter>()) {}

KXMetaphone::~KXMetaphone() = default;

std::u16string KXMetaphone::translate(std::u16string_view text) {
  std::u16string codes;
  _segmenter->start(text);
  while (const auto word = _segmenter->next()) {
    codes += _translateWord(*word);
    codes += u' ';
  }
  return codes;
}

std::u16string KXMetaphone::_translateWord(std::u16string_view word) {
  const std::u16string padded = paddedWord(word);
  const auto length = static_cast<std::uint16_t>(padded.size());
  if (length == 0) {
    return {};
  }
  LetterRules(*this, padded, length).run();
  std::u16string code = std::move(_isAlternate ? _secondary : _primary);
  reset();
  return code;
}

void KXMetaphone::_append(std::u16string_view code) { _append_alt(code, code); }

void KXMetaphone::_append_alt(std::u16string_view primary, std::u16string_view alternate) {
  _primary += primary;
  _secondary += alternate;
}

void KXMetaphone::reset() {
  _primary.clear();
  _secondary.clear();
  _isAlternate = false;
}

}  // namespace wordcatcher
