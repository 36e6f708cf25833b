#ifndef WORDCATCHER_STORAGE_LEAFTAILS_H
#define WORDCATCHER_STORAGE_LEAFTAILS_H

// What is left of the words of a leaf, in the 64 bits of its slot. Most leaves of a tree have room
// for it, so that a word is accepted or rejected without a look at its text.

#include <cstddef>
#include <cstdint>
#include <optional>

#include "wordcatcher/storage/SearchImageFormat.h"

namespace wordcatcher::image {

/// Ten codes of 6 bits, the first in the lowest bits, and above them the number of words, which is
/// never 0. The first word is the codes of its labels; each further one the length that it shares
/// with the word before, and the labels behind that. Between two words stands a 0; codes that are
/// not needed are 0.
struct LeafTails {
  static constexpr unsigned kCodes = 10;
  static constexpr unsigned kCodeBits = 6;
  static constexpr unsigned kCountShift = kCodes * kCodeBits;
  static constexpr std::uint64_t kCodeMask = (std::uint64_t{1} << kCodeBits) - 1;
  static constexpr std::uint64_t kAllCodes = (std::uint64_t{1} << kCountShift) - 1;
  static constexpr std::size_t kMaxWords = 15;

  /// The tails of `count` words, of which word i has `lengthOf(i)` labels, `labelAt(i, position)`;
  /// nothing when there is no room for them.
  template <typename LengthOf, typename LabelAt>
  static std::optional<std::uint64_t> encoded(std::size_t count, LengthOf lengthOf,
                                              LabelAt labelAt) {
    if (count == 0 || count > kMaxWords) {
      return std::nullopt;
    }
    Codes codes;
    for (std::size_t word = 0; word < count; ++word) {
      std::size_t shared = 0;
      if (word > 0) {
        while (shared < lengthOf(word) && shared < lengthOf(word - 1) &&
               labelAt(word, shared) == labelAt(word - 1, shared)) {
          ++shared;
        }
        codes.add(0);
        codes.add(shared);
      }
      for (std::size_t position = shared; position < lengthOf(word); ++position) {
        if (labelAt(word, position) >= kRareBit || codes.count >= kCodes) {
          return std::nullopt;
        }
        codes.add(labelAt(word, position));
      }
    }
    return codes.count > kCodes ? std::nullopt
                                : std::optional(codes.bits | std::uint64_t{count} << kCountShift);
  }

 private:
  struct Codes {
    std::uint64_t bits = 0;
    unsigned count = 0;

    void add(std::uint64_t code) {
      if (count < kCodes) {
        bits |= code << (count * kCodeBits);
      }
      ++count;
    }
  };
};

/// The number of words of a leaf, with tails or without, from its slot or the slot's `children`.
inline std::uint64_t leafWords(std::uint64_t children) {
  const std::uint64_t withTails = children >> LeafTails::kCountShift;
  return withTails != 0 ? withTails : children;
}
inline std::uint64_t leafWords(const TreeSlot& leaf) { return leafWords(leaf.children); }

inline bool hasTails(std::uint64_t children) { return children >> LeafTails::kCountShift != 0; }
inline bool hasTails(const TreeSlot& leaf) { return hasTails(leaf.children); }

/// Whether a leaf may hold a word whose tail begins with one of a set of codes, of which 0 is that
/// of no tail. Leaves with several words, and those without tails, always may.
inline bool mayHold(std::uint64_t children, std::uint64_t codes) {
  const std::uint64_t isNotAlone = (children >> LeafTails::kCountShift) ^ 1;
  return (isNotAlone | (codes >> (children & LeafTails::kCodeMask) & 1)) != 0;
}

}  // namespace wordcatcher::image

#endif
