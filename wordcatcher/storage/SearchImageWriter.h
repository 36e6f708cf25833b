#ifndef WORDCATCHER_STORAGE_SEARCHIMAGEWRITER_H
#define WORDCATCHER_STORAGE_SEARCHIMAGEWRITER_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

namespace wordcatcher {

/// Collects words and the values (data strings) that they carry, and makes the bytes of a search
/// image of them. Memory: the distinct words, 8 bytes a posting, the distinct values; while the
/// image is made, the image beside them. One thread at a time.
class SearchImageWriter {
 public:
  /// An identifier of a value in this writer.
  using Value = std::uint32_t;

  /// `mode`: 0 words, 1 whole texts, 2 phonetic words; only remembered.
  explicit SearchImageWriter(std::uint32_t mode) : _mode(mode) {}

  /// Registers a data string (UTF-8) whose phrase has so many counted words, once: the same string
  /// gives the same value. Throws Error (tooLarge) beyond 2^30 values.
  Value addValue(std::string_view text, std::uint32_t countedWords);

  /// Adds a word, or more values to it. The same posting twice counts once. The word must not be
  /// empty, or hold U+0000. Throws Error (tooLarge) beyond 2^30 words.
  void addWord(std::u16string_view word);
  void addPosting(std::u16string_view word, Value value);

  /// Counts one phrase, for the image's own figures.
  void countPhrase() noexcept { ++_phrases; }

  std::size_t wordCount() const noexcept { return _words.size(); }
  std::size_t valueCount() const noexcept { return _valueEnds.size(); }
  std::uint64_t phraseCount() const noexcept { return _phrases; }

  /// The image's bytes; the writer is spent afterwards. n log n in words, values and postings.
  std::vector<std::byte> finish() &&;

 private:
  std::uint32_t wordId(std::u16string_view word);
  std::string_view valueText(Value value) const noexcept;

  std::uint32_t _mode;
  std::uint64_t _phrases = 0;
  std::unordered_map<std::u16string, std::uint32_t> _wordIds;
  std::vector<const std::u16string*> _words;
  std::vector<std::pair<std::uint32_t, Value>> _postings;
  std::string _valueText;
  std::vector<std::uint64_t> _valueEnds;
  std::vector<std::uint32_t> _countedWords;
  std::unordered_multimap<std::uint64_t, Value> _valuesByHash;
};

}  // namespace wordcatcher

#endif
