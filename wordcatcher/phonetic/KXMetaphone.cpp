#include "wordcatcher/phonetic/KXMetaphone.h"

#include <unicode/uchar.h>
#include <unicode/utf16.h>

#include <algorithm>
#include <cstdint>

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

/// Upper-cases a word between the two spaces that `padded` begins and ends with, if it is all made
/// of the letters A to Z, as most words are: these need no tables of Unicode.
bool upperCaseBasicLetters(std::u16string_view word, std::u16string& padded) {
  constexpr unsigned kCaseBit = u'a' ^ u'A';
  bool basic = true;
  std::transform(word.begin(), word.end(), padded.begin() + 1, [&basic](char16_t unit) {
    const unsigned letter = unit & ~kCaseBit;
    basic &= letter - u'A' <= u'Z' - u'A';
    return static_cast<char16_t>(letter);
  });
  return basic;
}

/// The word as the letter rules see it: without punctuation, upper-cased, a space on either side.
void prepare(std::u16string_view word, std::u16string& padded) {
  padded.resize(word.size() + 2);
  padded.front() = u' ';
  padded.back() = u' ';
  if (!upperCaseBasicLetters(word, padded)) {
    padded = u' ' + toUpper(withoutPunctuation(word)) + u' ';
  }
}

}  // namespace

KXMetaphone::KXMetaphone() : _segmenter(std::make_unique<WordSegmenter>()) {}

KXMetaphone::~KXMetaphone() = default;

std::u16string KXMetaphone::translate(std::u16string_view text) {
  std::u16string codes;
  codes.reserve(text.size());
  _segmenter->start(text);
  while (const auto word = _segmenter->next()) {
    if (encode(*word)) {
      codes += code();
      reset();
    }
    codes += u' ';
  }
  return codes;
}

std::u16string KXMetaphone::_translateWord(std::u16string_view word) {
  if (!encode(word)) {
    return {};
  }
  std::u16string result = code();
  reset();
  return result;
}

/// Leaves the word's code in the buffers; false if its padded length counts as 0, which leaves the
/// buffers alone.
bool KXMetaphone::encode(std::u16string_view word) {
  prepare(word, _padded);
  const auto length = static_cast<std::uint16_t>(_padded.size());
  if (length == 0) {
    return false;
  }
  LetterRules(*this, _padded, length).run();
  return true;
}

void KXMetaphone::reset() {
  _primary.clear();
  _secondary.clear();
  _isAlternate = false;
}

}  // namespace wordcatcher
