#ifndef WORDCATCHER_STORAGE_SEARCHIMAGEFORMAT_H
#define WORDCATCHER_STORAGE_SEARCHIMAGEFORMAT_H

// The layout of a search image, shared by its writer and its reader. docs/search-image.md is the
// same, byte by byte, with a worked example. All numbers are little-endian.

#include <array>
#include <bit>
#include <compare>
#include <cstddef>
#include <cstdint>

namespace wordcatcher::image {

static_assert(std::endian::native == std::endian::little,
              "Images are mapped as they stand: a big-endian machine needs a reader of its own.");

inline constexpr std::array<char, 8> kMagic = {'W', 'C', 'I', 'M', 'A', 'G', 'E', '\0'};
inline constexpr std::uint32_t kVersion = 2;
inline constexpr std::uint32_t kByteOrderMark = 0x01020304;
inline constexpr std::size_t kSectionAlignment = 64;

enum class SectionKind : std::uint32_t {
  labels = 1,       // u16: the code unit of each label; label 0 stands for the end of a word
  wordOffsets = 2,  // u32, words + 1: where each word begins in wordText, in labels
  wordText =
      3,  // u8, or u16 for more than 255 labels: the words' labels, words ascending by code units
  forwardTree = 4,     // TreeSlot: prefix tree of the words
  forwardOrder = 5,    // u32: word of each place of the forward tree; empty when they are the same
  backwardTree = 6,    // TreeSlot: prefix tree of the words read from their ends
  backwardOrder = 7,   // u32: word of each place of the backward tree
  postingOffsets = 8,  // u32, or u64 for 2^32 postings, words + 1: where each word's posting list
                       // begins in postings
  postings = 9,        // u32: the values of each word, ascending
  valueOffsets = 10,   // u64, values + 1: where each value begins in valueText
  valueText = 11,      // UTF-8: the data strings, in the order of PhraseShape
  countedWords = 12,   // u32: the counted words of each value's phrase
  phraseOffsets = 13,  // u32, values + 1: where each value's phrases begin in phraseWords
  phraseWords = 14,    // u32: the phrases of each value, as words in the phrase's order
  phraseClasses = 15,  // PhraseClass: where values with phrases of other lengths begin
};
inline constexpr std::size_t kSectionKinds = 15;
inline constexpr std::uint32_t kLastMode = 2;
inline constexpr std::size_t kMaxLabels = 0x10000;  // label 0, and every code unit but U+0000

struct Header {
  std::array<char, 8> magic;
  std::uint32_t version;
  std::uint32_t byteOrder;
  std::uint64_t fileBytes;
  std::array<std::uint64_t, 2> generation;  // random: tells two builds apart
  std::uint32_t mode;                       // 0 words, 1 whole texts, 2 phonetic words
  std::uint32_t sectionCount;
  std::uint64_t wordCount;
  std::uint64_t valueCount;
  std::uint64_t phraseCount;
  std::uint64_t reserved;
};
static_assert(sizeof(Header) == 80);

struct Section {
  SectionKind kind;
  std::uint32_t elementBytes;
  std::uint64_t offset;  // from the start of the file, a multiple of kSectionAlignment
  std::uint64_t bytes;
  std::uint64_t checksum;  // XXH3, 64 bits, of the section's bytes
};
static_assert(sizeof(Section) == 32);

// The header, the section table, and XXH3 of both.
inline constexpr std::size_t headerBytes(std::size_t sections) {
  return sizeof(Header) + sections * sizeof(Section) + sizeof(std::uint64_t);
}

/// Flags the last word of a phrase in phraseWords.
inline constexpr std::uint32_t kPhraseEnd = 0x80000000U;

/// Values are numbered by the shape of their phrases, and equal shapes by their text in UTF-16 code
/// units: so every posting list, which ascends by value, begins with the shortest phrases. Each
/// figure is at most kShapeCap, which stands for itself and all above. A value without words (a
/// phrase in which there is nothing to find) has the shape 0, 0, 0.
struct PhraseShape {
  std::uint16_t fewestWords = 0;  // of the value's phrase with the fewest words
  std::uint16_t mostWords = 0;    // of the one with the most
  std::uint16_t units = 0;        // the least code units of the words of one of the former

  // The lint takes the 0 that the compiler compares with for a null pointer.
  // NOLINTNEXTLINE(modernize-use-nullptr)
  friend auto operator<=>(const PhraseShape&, const PhraseShape&) = default;
};
inline constexpr std::uint32_t kShapeCap = 0xFFFF;

/// The values from `firstValue` on, up to the next class, have these shapes.
struct PhraseClass {
  std::uint32_t firstValue = 0;
  std::uint16_t fewestWords = 0;
  std::uint16_t mostWords = 0;

  friend bool operator==(const PhraseClass&, const PhraseClass&) = default;
};
static_assert(sizeof(PhraseClass) == 8);

/// One place of a tree: the edge that leads to it, and what stands behind it. The root is slot 0;
/// the children of a place stand together, ascending by label, behind their parent.
///
/// The bits of `children` say which labels have a child: bit 0 the end of a word, bits 1 to 62 the
/// labels 1 to 62, bit 63 any number of labels from 63 on, the last of which is flagged.
struct TreeSlot {
  std::uint64_t children = 0;  // inner place: its children; leaf: its number of words, or its
                               // LeafTails
  std::uint32_t target = 0;    // inner place: its first child; leaf: its first word; and flags
  std::uint8_t shortest =
      0;  // code units to the end of the nearest word behind the edge, at most 255
  std::uint8_t longest = 0;  // of the farthest word; 255 stands for 255 or more
  std::uint16_t label = 0;   // of the edge

  static constexpr std::uint32_t kLeaf = 0x80000000U;
  static constexpr std::uint32_t kLastChild = 0x40000000U;
  static constexpr std::uint32_t kIndex = 0x3FFFFFFFU;

  bool isLeaf() const noexcept { return (target & kLeaf) != 0; }
  bool isLastChild() const noexcept { return (target & kLastChild) != 0; }
  std::uint32_t index() const noexcept { return target & kIndex; }
};
static_assert(sizeof(TreeSlot) == 16);

inline constexpr unsigned kEndBit = 0;
inline constexpr unsigned kRareBit = 63;
inline constexpr unsigned kLengthCap = 255;

/// The bit of `children` that a label has.
inline constexpr unsigned labelBit(unsigned label) { return label < kRareBit ? label : kRareBit; }

/// A set of that bit; for label 0, which no edge has, the empty set.
inline constexpr std::uint64_t childBit(unsigned label) {
  return label == 0 ? 0 : std::uint64_t{1} << labelBit(label);
}

}  // namespace wordcatcher::image

#endif
