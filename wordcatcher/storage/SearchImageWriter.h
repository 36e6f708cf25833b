#ifndef WORDCATCHER_STORAGE_SEARCHIMAGEWRITER_H
#define WORDCATCHER_STORAGE_SEARCHIMAGEWRITER_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string_view>
#include <vector>

#include "wordcatcher/storage/SearchImageFormat.h"
#include "wordcatcher/storage/StringPool.h"

namespace wordcatcher {

/// Collects words, and phrases of them with their values (data strings), and makes the bytes of a
/// search image of them. Memory: the distinct words, 4 bytes a word of a phrase and 4 a phrase, the
/// distinct values; while the image is made, about twice the image beside them. One thread at a
/// time.
class SearchImageWriter {
 public:
  /// An identifier of a value in this writer.
  using Value = std::uint32_t;

  /// `mode`: 0 words, 1 whole texts, 2 phonetic words; only remembered. `limit`: how many words
  /// and how many values may be added, for tests; the format has no room for more than that.
  explicit SearchImageWriter(std::uint32_t mode, std::uint32_t limit = image::TreeSlot::kIndex)
      : _mode(mode), _limit(limit) {}

  /// The value of a data string (UTF-8), if it was registered.
  std::optional<Value> findValue(std::string_view text) const noexcept {
    return _values.find(text);
  }

  /// Registers a data string (UTF-8) whose phrase has so many counted words, once: the same string
  /// gives the same value. Throws Error (tooLarge) beyond the limit.
  Value addValue(std::string_view text, std::uint32_t countedWords);

  /// Adds a word; the same one has the same number, which is this writer's own. The word must not
  /// be empty, or hold U+0000. Throws Error (tooLarge) beyond the limit, or 2^32 - 1 code units of
  /// all words.
  std::uint32_t addWord(std::u16string_view word);

  /// Adds a phrase of these words, in its order: each carries the value. The same phrase with the
  /// same value twice counts once; no words at all add nothing. Throws Error (tooLarge) for 2^32
  /// words of all phrases.
  void addPhrase(std::span<const std::uint32_t> words, Value value);

  /// Adds a phrase of one word.
  void addPosting(std::u16string_view word, Value value);

  /// Counts one phrase, for the image's own figures.
  void countPhrase() noexcept { ++_phrases; }

  std::size_t wordCount() const noexcept { return _words.size(); }
  std::size_t valueCount() const noexcept { return _values.size(); }
  std::uint64_t phraseCount() const noexcept { return _phrases; }

  /// How much was added so far; rollBack() takes back what was added since.
  struct Mark {
    std::uint32_t words;
    std::uint32_t values;
    std::size_t phraseWords;
    std::uint64_t phrases;
  };
  Mark mark() const noexcept {
    return {_words.size(), _values.size(), _phraseWords.size(), _phrases};
  }
  void rollBack(const Mark& mark) noexcept;

  /// Everything that was added, in the order of the image.
  class Content;
  Content content() const;

  /// The image's bytes. The writer stays as it is, and may make another image. n log n in words,
  /// values and postings. Throws Error (tooLarge) for a tree of more than 2^30 places.
  std::vector<std::byte> finish() const;

 private:
  std::uint32_t _mode;
  std::uint32_t _limit;
  std::uint64_t _phrases = 0;
  StringPool<char16_t> _words;
  std::vector<std::uint32_t>
      _phraseWords;  // of each phrase: its value, its words, the last flagged
  StringPool<char> _values;
  std::vector<std::uint32_t> _countedWords;
};

/// What a writer holds, numbered anew: words ascending by code units, values by the shapes of their
/// phrases, then the code units of their UTF-16 forms. Refers to the writer, which must not change
/// meanwhile.
class SearchImageWriter::Content {
 public:
  explicit Content(const SearchImageWriter& writer);

  std::uint32_t wordCount() const noexcept { return static_cast<std::uint32_t>(_words.size()); }
  std::u16string_view word(std::uint32_t word) const noexcept {
    return _writer._words[_words[word]];
  }

  /// The values of a word, ascending, each once.
  std::span<const std::uint32_t> postingsOf(std::uint32_t word) const noexcept {
    return std::span(_postings).subspan(_offsets[word], _offsets[word + 1] - _offsets[word]);
  }

  std::uint32_t valueCount() const noexcept { return static_cast<std::uint32_t>(_values.size()); }
  std::string_view value(std::uint32_t value) const noexcept {
    return _writer._values[_values[value]];
  }
  std::uint32_t countedWords(std::uint32_t value) const noexcept {
    return _writer._countedWords[_values[value]];
  }

  /// The posting lists one after the other, and where each begins, and the last one's end.
  const std::vector<std::uint32_t>& postings() const noexcept { return _postings; }
  const std::vector<std::uint64_t>& postingOffsets() const noexcept { return _offsets; }

  /// The phrases of the values one after the other, as in the image, where each value's begin, and
  /// the last one's end; and the classes of values.
  const std::vector<std::uint32_t>& phraseWords() const noexcept { return _phraseWords; }
  const std::vector<std::uint32_t>& phraseOffsets() const noexcept { return _phraseOffsets; }
  const std::vector<image::PhraseClass>& phraseClasses() const noexcept { return _classes; }

 private:
  struct Phrases;
  Phrases gatherPhrases() const;
  void numberValues(const Phrases& phrases);
  void gatherPostings();

  const SearchImageWriter& _writer;
  std::vector<std::uint32_t> _words;
  std::vector<std::uint32_t> _values;
  std::vector<std::uint64_t> _offsets;
  std::vector<std::uint32_t> _postings;
  std::vector<std::uint32_t> _phraseOffsets;
  std::vector<std::uint32_t> _phraseWords;
  std::vector<image::PhraseClass> _classes;
};

}  // namespace wordcatcher

#endif
