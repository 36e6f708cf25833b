#ifndef WORDCATCHER_STORAGE_SEARCHIMAGE_H
#define WORDCATCHER_STORAGE_SEARCHIMAGE_H

#include <array>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/storage/SearchImageFormat.h"
#include "wordcatcher/storage/TwoWidths.h"
#include "wordcatcher/storage/WalkMemory.h"

namespace wordcatcher {

/// A search image opened for reading: a prefix tree of words, forward and backward, with the values
/// (data strings) that each word carries. Immutable; any number of threads read it at once.
///
/// Opening checks the header and the bounds of the sections, in constant time. What is followed
/// later is checked where it is followed: an image that is hostile but has the right checksums
/// gives an Error (damaged) or wrong answers, and nothing worse.
class SearchImage {
 public:
  /// How the bytes come into memory: mapped, or copied, for files that may shrink while they are
  /// read (a mapped file that shrinks ends its reader with a bus error).
  enum class Load { map, copy };

  /// Opens a file. Throws Error: notFound, notReadable, notAnIndex or damaged.
  static std::shared_ptr<const SearchImage> open(const std::string& path, Load load);

  /// Takes over the bytes of an image. Throws Error: notAnIndex or damaged.
  static std::shared_ptr<const SearchImage> fromBytes(std::vector<std::byte> bytes);

  ~SearchImage();
  SearchImage(const SearchImage&) = delete;
  SearchImage& operator=(const SearchImage&) = delete;

  const image::Header& header() const noexcept { return *_header; }
  std::uint32_t wordCount() const noexcept { return _wordCount; }
  std::uint32_t valueCount() const noexcept { return _valueCount; }
  std::uint64_t unitCount() const noexcept { return _wordText.size(); }  // of all words
  std::uint64_t postingCount() const noexcept { return _postings.size(); }
  std::uint64_t phraseWordCount() const noexcept { return _phraseWords.size(); }  // of all phrases

  /// The label of a code unit; 0 when no word holds it. Constant time for ASCII, else logarithmic
  /// in the number of labels.
  std::uint16_t labelOf(char16_t unit) const noexcept {
    return unit < _asciiLabels.size() ? _asciiLabels[unit] : findLabel(unit);
  }

  /// The labels of a word, and its code units. The word must be below wordCount().
  using Labels = TwoWidths<std::uint8_t, std::uint16_t>;
  Labels labelsOf(std::uint32_t word) const {
    if (word >= _wordCount) {
      throwDamaged("it refers to a word that is not there");
    }
    const std::uint32_t begin = _wordOffsets[word];
    const std::uint32_t end = _wordOffsets[word + 1];
    if (begin > end || end > _wordText.size()) {
      throwDamaged("a word lies outside its section");
    }
    return _wordText.subspan(begin, end - begin);
  }

  /// Ask memory early for what labelsOf() will read: first the offset, some time later the labels.
  /// Any word may be given.
  void prefetchOffsetOf(std::uint32_t word) const noexcept {
    if (word < _wordCount) {
      __builtin_prefetch(&_wordOffsets[word]);
    }
  }
  void prefetchLabelsOf(std::uint32_t word) const noexcept {
    if (word < _wordCount && _wordOffsets[word] < _wordText.size()) {
      __builtin_prefetch(_wordText.addressOf(_wordOffsets[word]));
    }
  }

  /// The code unit of a label of a word.
  char16_t unitOf(std::uint16_t label) const {
    if (label >= _labels.size()) {
      throwDamaged("a word holds a label that is not there");
    }
    return static_cast<char16_t>(_labels[label]);
  }

  std::u16string textOf(std::uint32_t word) const;

  /// The same for a word of so many code units, as a tree says. Throws Error (damaged) for another
  /// length: words that overlap could make a text far longer than the image of many hits.
  std::u16string textOf(std::uint32_t word, std::size_t length) const {
    if (labelsOf(word).size() != length) {
      throwDamaged("a word does not have the length of its place in a tree");
    }
    return textOf(word);
  }

  /// One of the two trees, and the word that stands at each of its places.
  struct Tree {
    std::span<const image::TreeSlot> slots;
    std::span<const std::uint32_t> order;  // empty: place and word are the same
  };
  const Tree& forward() const noexcept { return _forward; }
  const Tree& backward() const noexcept { return _backward; }

  /// Memory for walks of the trees, which may be in any state; for one thread at a time. It must be
  /// gone before the image is.
  WalkMemoryPool::Loan lendWalkMemory() const { return _walkMemory.lend(); }

  /// The values of a word, ascending; each is below valueCount() or the image is damaged.
  std::span<const std::uint32_t> postingsOf(std::uint32_t word) const;

  /// Asks memory early for what postingsOf() will read first. Any word may be given.
  void prefetchPostingsOf(std::uint32_t word) const noexcept {
    if (word < _wordCount) {
      __builtin_prefetch(_postingOffsets.addressOf(word));
    }
  }

  /// A value as UTF-8, and the number of counted words of its phrase. Throws Error (damaged) for a
  /// value that is not there.
  std::string_view valueText(std::uint32_t value) const;
  std::uint32_t countedWordsOf(std::uint32_t value) const;

  /// The phrases of a value, one after the other, each the words of a phrase in its order, the last
  /// flagged with image::kPhraseEnd. A word may be anything in a damaged image. Throws Error
  /// (damaged) for a value that is not there.
  std::span<const std::uint32_t> phrasesOf(std::uint32_t value) const {
    if (value >= _valueCount) {
      throwDamaged("it refers to a data string that is not there");
    }
    const std::uint32_t begin = _phraseOffsets[value];
    const std::uint32_t end = _phraseOffsets[value + 1];
    if (begin > end || end > _phraseWords.size()) {
      throwDamaged("a phrase lies outside its section");
    }
    return _phraseWords.subspan(begin, end - begin);
  }

  /// Ask memory early for what phrasesOf() will read: first the offset, some time later the words.
  /// Any value may be given.
  void prefetchPhrasesOf(std::uint32_t value) const noexcept {
    if (value < _valueCount) {
      __builtin_prefetch(&_phraseOffsets[value]);
    }
  }
  void prefetchPhraseWordsOf(std::uint32_t value) const noexcept {
    if (value < _valueCount && _phraseOffsets[value] < _phraseWords.size()) {
      __builtin_prefetch(&_phraseWords[_phraseOffsets[value]]);
    }
  }

  /// The values by the lengths of their phrases: ascending, not empty unless there are no values.
  std::span<const image::PhraseClass> phraseClasses() const noexcept { return _phraseClasses; }

  /// Checks everything: that the sections fill the file, checksums, orders, ranges, that both trees
  /// hold exactly the words. Throws Error (damaged) that says what is wrong. Linear in the file,
  /// whatever its bytes are.
  void verify() const;

  /// Throws the Error (damaged) of a reader that met something impossible in this image.
  [[noreturn]] void throwDamaged(const std::string& what) const;

  /// The whole file.
  std::span<const std::byte> bytes() const noexcept { return _bytes; }

 private:
  SearchImage() = default;
  void bind(const std::string& name);
  std::uint16_t findLabel(char16_t unit) const noexcept;
  template <typename Element>
  std::span<const Element> sectionOf(image::SectionKind kind) const;
  template <typename Narrow, typename Wide>
  TwoWidths<Narrow, Wide> sectionOfEither(image::SectionKind kind) const;
  const image::Section& find(image::SectionKind kind) const;
  void verifySections() const;
  void verifyLabels() const;
  void verifyWords() const;
  void verifyValues() const;
  image::PhraseShape verifyPhrases(std::uint32_t value) const;
  void verifyPostings() const;

  std::vector<std::byte> _copy;
  void* _mapping = nullptr;
  std::size_t _mappedBytes = 0;
  std::span<const std::byte> _bytes;
  std::string _name;

  const image::Header* _header = nullptr;
  std::span<const image::Section> _sections;
  std::uint32_t _wordCount = 0;
  std::uint32_t _valueCount = 0;
  std::span<const std::uint16_t> _labels;
  std::array<std::uint16_t, 128> _asciiLabels{};  // of the units that most words are made of
  std::span<const std::uint32_t> _wordOffsets;
  Labels _wordText;
  Tree _forward;
  Tree _backward;
  TwoWidths<std::uint32_t, std::uint64_t> _postingOffsets;
  std::span<const std::uint32_t> _postings;
  std::span<const std::uint64_t> _valueOffsets;
  std::span<const char> _valueText;
  std::span<const std::uint32_t> _countedWords;
  std::span<const std::uint32_t> _phraseOffsets;
  std::span<const std::uint32_t> _phraseWords;
  std::span<const image::PhraseClass> _phraseClasses;

  mutable WalkMemoryPool _walkMemory;
};

}  // namespace wordcatcher

#endif
