#include "wordcatcher/text/PhraseLength.h"

namespace wordcatcher {

std::u16string_view phraseOf(std::u16string_view value) noexcept {
  return value.substr(0, value.find(u"{ "));
}

std::uint32_t countedWords(WordSegmenter& segmenter, std::u16string_view text) {
  std::uint32_t count = 0;
  segmenter.start(text);
  while (const auto word = segmenter.next()) {
    if (word->size() > kUncountedWordLength) {
      ++count;
    }
  }
  return count;
}

}  // namespace wordcatcher
