#ifndef WORDCATCHER_STORAGE_PHRASEWORDS_H
#define WORDCATCHER_STORAGE_PHRASEWORDS_H

// Reading the lists of phrases of a search image: words, the last of each phrase flagged.

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <span>

#include "wordcatcher/storage/SearchImageFormat.h"

namespace wordcatcher::image {

/// The first of the phrases: up to its flagged word, or all when no word is flagged.
inline std::span<const std::uint32_t> firstPhrase(std::span<const std::uint32_t> phrases) {
  const auto last = std::find_if(phrases.begin(), phrases.end(),
                                 [](std::uint32_t word) { return (word & kPhraseEnd) != 0; });
  const auto size = static_cast<std::size_t>(last - phrases.begin());
  return phrases.first(std::min(size + 1, phrases.size()));
}

inline std::uint16_t cappedShape(std::size_t figure) {
  return static_cast<std::uint16_t>(std::min<std::size_t>(figure, kShapeCap));
}

/// The shape of a value with these phrases; `unitsOf(word)` gives the code units of a word. Linear.
template <typename UnitsOf>
PhraseShape shapeOf(std::span<const std::uint32_t> phrases, UnitsOf unitsOf) {
  PhraseShape shape;
  for (bool isFirst = true; !phrases.empty(); isFirst = false) {
    const auto phrase = firstPhrase(phrases);
    phrases = phrases.subspan(phrase.size());
    std::size_t units = 0;
    for (const std::uint32_t word : phrase) {
      units += unitsOf(word & ~kPhraseEnd);
    }
    const std::uint16_t words = cappedShape(phrase.size());
    if (isFirst || words < shape.fewestWords) {
      shape.fewestWords = words;
      shape.units = cappedShape(units);
    } else if (words == shape.fewestWords) {
      shape.units = std::min(shape.units, cappedShape(units));
    }
    shape.mostWords = std::max(shape.mostWords, words);
  }
  return shape;
}

}  // namespace wordcatcher::image

#endif
