#ifndef WORDCATCHER_FUZZY_NEARWORDS_H
#define WORDCATCHER_FUZZY_NEARWORDS_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>
#include <utility>
#include <vector>

#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher {

/// A word of an image near another.
struct NearWord {
  std::uint32_t word;
  std::uint32_t edits;

  friend bool operator==(const NearWord&, const NearWord&) = default;
};

/// Every word of the image within so many edits of a lower-cased one, ascending by word: plain edit
/// distance, with no signs of special meaning, neighbours swapped being one edit if
/// `transpositions` says so (see editDistance). `maxEdits` is at most 3. Safe for any number of
/// threads. Throws Error (damaged).
std::vector<NearWord> nearWords(const SearchImage& image, std::u16string_view word,
                                std::uint32_t maxEdits, bool transpositions);

/// The word of the image that is this one. Linear in the word.
std::optional<std::uint32_t> exactWord(const SearchImage& image, std::u16string_view word);

/// Pairs of words of the image which, written as one, are this word: at most 64. Linear in the
/// word.
std::vector<std::pair<std::uint32_t, std::uint32_t>> wordsJoinedIn(const SearchImage& image,
                                                                   std::u16string_view word);

}  // namespace wordcatcher

#endif
