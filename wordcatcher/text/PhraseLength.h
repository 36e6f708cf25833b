#ifndef WORDCATCHER_TEXT_PHRASELENGTH_H
#define WORDCATCHER_TEXT_PHRASELENGTH_H

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

/// Words of this many code units or fewer do not count when lengths of phrases are compared.
inline constexpr std::size_t kUncountedWordLength = 3;

/// The phrase at the head of a data string: what stands before the first "{ ", behind which a host
/// keeps fields of its own; all of it if there is none.
std::u16string_view phraseOf(std::u16string_view value) noexcept;

/// The number of counted words of a text: those of more than kUncountedWordLength code units.
/// Linear in the text.
std::uint32_t countedWords(WordSegmenter& segmenter, std::u16string_view text);

}  // namespace wordcatcher

#endif
