#ifndef WORDCATCHER_CLI_WORDCOUNTER_H
#define WORDCATCHER_CLI_WORDCOUNTER_H

#include <unicode/ubrk.h>

#include <cstddef>
#include <memory>
#include <string_view>

namespace wordcatcher::cli {

/// Counts the words of texts as the index cuts them: Unicode word boundaries (UAX #29), without
/// spaces and punctuation. Making one loads the rules.
class WordCounter {
 public:
  WordCounter();

  /// Linear in the text.
  std::size_t count(std::u16string_view text);

 private:
  struct Close {
    void operator()(UBreakIterator* iterator) const noexcept { ubrk_close(iterator); }
  };

  std::unique_ptr<UBreakIterator, Close> _iterator;
};

}  // namespace wordcatcher::cli

#endif
