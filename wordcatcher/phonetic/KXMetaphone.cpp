#include "wordcatcher/phonetic/KXMetaphone.h"

#include <unicode/uchar.h>
#include <unicode/utf16.h>

#include <cstddef>
#include <cstdint>
#include <limits>
#include <stdexcept>

#include "wordcatcher/phonetic/LetterRules.h"
#include "wordcatcher/text/Unicode.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

namespace {

/// As far as ICU counts, and so the most that a word of a text can have.
constexpr std::size_t kLongestWord = std::numeric_limits<std::int32_t>::max();

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

/// Upper-cases a word into `letters`, which has room for it, if it is all made of the letters A to
/// Z, as most words are: these need no tables of Unicode.
bool upperCaseBasicLetters(std::u16string_view word, char16_t* letters) {
  constexpr unsigned kCaseBit = u'a' ^ u'A';
  bool basic = true;
  for (const char16_t unit : word) {
    const unsigned letter = unit & ~kCaseBit;
    basic &= letter - u'A' <= u'Z' - u'A';
    *letters++ = static_cast<char16_t>(letter);
  }
  return basic;
}

/// The word as the letter rules see it: without punctuation, upper-cased, a space on either side.
/// It stands at the start of `memory`.
std::u16string_view paddedWord(std::u16string_view word, std::u16string& memory) {
  const std::size_t length = word.size() + 2;
  if (memory.size() < length) {
    memory.resize(length);
  }
  if (!upperCaseBasicLetters(word, memory.data() + 1)) {
    return memory = u' ' + toUpper(withoutPunctuation(word)) + u' ';
  }
  memory[0] = u' ';
  memory[length - 1] = u' ';
  return std::u16string_view(memory).substr(0, length);
}

}  // namespace

KXMetaphone::KXMetaphone() : _segmenter(std::make_unique<WordSegmenter>()) {}

KXMetaphone::KXMetaphone(const WordSegmenter& rules)
    : _segmenter(std::make_unique<WordSegmenter>(rules)) {}

KXMetaphone::~KXMetaphone() = default;

std::u16string KXMetaphone::translate(std::u16string_view text) {
  _segmenter->start(text);
  std::u16string codes;
  codes.reserve(text.size());
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
  if (word.size() > kLongestWord) {
    throw std::length_error(
        "A word must not be longer than 2,147,483,647 code units; leave it out or cut it.");
  }
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
  const std::u16string_view padded = paddedWord(word, _memory);
  const auto length = static_cast<std::uint16_t>(padded.size());
  if (length == 0) {
    return false;
  }
  LetterRules(*this, padded, length).run();
  return true;
}

void KXMetaphone::reset() {
  _primary.clear();
  _secondary.clear();
  _isAlternate = false;
}

}  // namespace wordcatcher
