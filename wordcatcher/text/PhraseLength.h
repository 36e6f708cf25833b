#ifndef WORDCATCHER_TEXT_PHRASELENGTH_H
#define WORDCATCHER_TEXT_PHRASELENGTH_H

#include <cstdint>
#include <string_view>

#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

/// Words of this many code units or fewer do not count towards the length of a phrase.
inline constexpr std::int64_t kUncountedWordLength = 3;

/// The phrase at the head of a data string: what stands before the first "{ ", which begins the
/// host's own fields. For UTF-8 and UTF-16.
template <typename Char>
std::basic_string_view<Char> phraseOf(std::basic_string_view<Char> value) noexcept {
  constexpr Char kFieldSeparator[] = {'{', ' '};
  return value.substr(0, value.find(std::basic_string_view<Char>(kFieldSeparator, 2)));
}

/// The length of a phrase: its words of more than `uncountedLength` code units. Linear.
inline std::int64_t countedWords(WordSegmenter& segmenter, std::u16string_view phrase,
                                 std::int64_t uncountedLength = kUncountedWordLength) {
  std::int64_t count = 0;
  segmenter.start(phrase);
  while (const auto word = segmenter.next()) {
    if (static_cast<std::int64_t>(word->size()) > uncountedLength) {
      ++count;
    }
  }
  return count;
}

}  // namespace wordcatcher

#endif
