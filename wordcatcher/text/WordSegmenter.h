#ifndef WORDCATCHER_TEXT_WORDSEGMENTER_H
#define WORDCATCHER_TEXT_WORDSEGMENTER_H

#include <memory>
#include <optional>
#include <string_view>

struct UBreakIterator;

namespace wordcatcher {

/// Cuts a text into its word tokens by the Unicode word-boundary rules (UAX #29), as ICU's word
/// iterator of the root locale applies them: letters, numbers, kana and ideographs are words;
/// spaces and punctuation are not. Making one loads the rules, so an object that segments often
/// keeps one. Used by one thread at a time.
class WordSegmenter {
 public:
  WordSegmenter();
  ~WordSegmenter();

  /// A segmenter of its own with the same rules, at a tenth of the cost of loading them. Several
  /// threads may copy one that is not in use.
  WordSegmenter(const WordSegmenter& other);
  WordSegmenter& operator=(const WordSegmenter&) = delete;

  /// Begins at the start of `text`, which must outlive the walk. Linear in the text, over all calls
  /// of next().
  void start(std::u16string_view text);

  /// The next word token in text order, as a view into the text; nothing at the end.
  std::optional<std::u16string_view> next();

 private:
  struct CloseIterator {
    void operator()(UBreakIterator* iterator) const noexcept;
  };

  std::unique_ptr<UBreakIterator, CloseIterator> _iterator;
  std::u16string_view _text;
};

}  // namespace wordcatcher

#endif
