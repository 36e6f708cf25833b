#ifndef WORDCATCHER_FUZZY_NEARWORDS_H
#define WORDCATCHER_FUZZY_NEARWORDS_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher {

/// A word of an image near another.
struct NearWord {
  std::uint32_t word;
  std::uint32_t edits;
  std::uint32_t length;  // in code units

  friend bool operator==(const NearWord&, const NearWord&) = default;
};

/// How many edits a word of an image may be away: at most 3, and one less, if not 0 already, when
/// it is shorter than so many code units.
struct NearLimit {
  std::uint32_t edits = 0;
  std::size_t fromLength = 0;
};

/// Every word of the image within the limit of a lower-cased one, ascending by word: plain edit
/// distance, with no signs of special meaning, neighbours swapped being one edit if
/// `transpositions` says so (see editDistance). Safe for any number of threads. Throws Error
/// (damaged).
std::vector<NearWord> nearWords(const SearchImage& image, std::u16string_view word, NearLimit limit,
                                bool transpositions);

// Those below are safe for any number of threads, and throw Error (damaged). They read the siblings
// of a place one after the other where these have rare labels, which most have not.

/// The word of the image that is this one. Linear in the word.
std::optional<std::uint32_t> exactWord(const SearchImage& image, std::u16string_view word);

/// The words of the image that are one word, any code unit and another word. Linear in the first,
/// and in the second for each unit that stands behind the first in the image.
std::vector<std::uint32_t> wordsWithUnitBetween(const SearchImage& image, std::u16string_view head,
                                                std::u16string_view tail);

/// What stands between two words that are written as one.
enum class Seam : std::uint8_t {
  none = 0,
  unit = 1,  // one code unit, whichever
};

/// Two words of an image that are one, with or without a code unit between them.
struct JoinedWords {
  std::uint32_t head;
  std::uint32_t tail;

  friend bool operator==(const JoinedWords&, const JoinedWords&) = default;
};

/// The pairs of words of the image which, written as one, are this word, ascending by their tails'
/// lengths; with `seam` unit also those between which one unit of it stands. Fewer than twice as
/// many as the word has units. Linear in the word.
std::vector<JoinedWords> wordsJoinedIn(const SearchImage& image, std::u16string_view word,
                                       Seam seam);

}  // namespace wordcatcher

#endif
