#ifndef WORDCATCHER_FUZZY_IMAGESEARCH_H
#define WORDCATCHER_FUZZY_IMAGESEARCH_H

#include <cstdint>
#include <string_view>
#include <vector>

#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher {

/// One word of an image that lies near a query.
struct WordHit {
  std::uint32_t word;
  std::uint32_t distance;  // edits
  std::uint32_t length;    // code units
  std::uint32_t values;    // how many values the word carries

  friend bool operator==(const WordHit&, const WordHit&) = default;
};

/// Every word of the image within `maxDistance` edits of a lower-cased query, exactly as the walk
/// of the query's automaton finds them, in the same order: more values first, then the smaller
/// distance, then the shorter word, then by code units. That includes its ways with a missing first
/// character, "*" and "_" (see LXFuzzyIndex::search_withMaxDistance).
///
/// Up to 4 edits the automaton is simulated bit-parallel, on words of any length, in two walks of
/// the trees at the most; a walk visits each place once at the most. Beyond, all words are read one
/// after the other, by a table of edit distances. Memory is a few words a code unit of the query
/// and, whatever the image's bytes are, less than a few times the image. Safe for any number of
/// threads. Throws Error (damaged) when the image turns out to be damaged. There are at most
/// wordCount() hits, with at most postingCount() values in all.
std::vector<WordHit> searchImage(const SearchImage& image, std::u16string_view query,
                                 std::int64_t maxDistance);

}  // namespace wordcatcher

#endif
