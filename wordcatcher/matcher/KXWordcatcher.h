#ifndef WORDCATCHER_MATCHER_KXWORDCATCHER_H
#define WORDCATCHER_MATCHER_KXWORDCATCHER_H

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "wordcatcher/Export.h"
#include "wordcatcher/fuzzy/LXFuzzyMatch.h"
#include "wordcatcher/matcher/KXWordcatch.h"

namespace wordcatcher {

class KXMetaphone;
class LXFuzzyIndex;
class WordSegmenter;

/// What a query returns: scored phrases in word mode and phonetic word mode, the fuzzy index's own
/// matches in whole-text mode.
using QueryResult = std::variant<std::vector<KXWordcatch>, std::vector<LXFuzzyMatch>>;

/// Finds the phrases stored in an index directory inside a free text, tolerating spelling mistakes.
///
/// Options: 0 word mode, where a phrase is indexed and found by its words; 1 whole-text mode, where
/// it is one string; 2 phonetic word mode, where the words of phrases and queries are replaced by
/// codes of their sound. Any other value indexes nothing and answers every query with nothing.
///
/// A life is: construct, setMode(2), index_withData() for every phrase, setMode(1), query(). No
/// errors are reported: a failure of the files is a line in the log (see LogSink), and queries then
/// find less. A moved-from matcher behaves as one over nothing: it stores nothing, its mode is 0,
/// and it finds nothing.
///
/// Growth: the index holds one record an adding call, so that finishing it grows with the square of
/// the number of words added; the first query after it was opened reads all of it (see
/// LXFuzzyIndex). For many phrases, several threads or readers that open often, see IndexBuilder
/// and Index.
///
/// Errors of the environment: the constructor throws std::runtime_error when ICU's data is not
/// installed; a text of more than 2^31 - 1 code units is refused with std::length_error.
///
/// Thread safety: one thread at a time; a query writes the matcher's counters.
class WORDCATCHER_EXPORT KXWordcatcher {
 public:
  /// A matcher over the index at `path`, a directory given with its trailing "/". Nothing is opened
  /// yet, and neither argument is checked.
  KXWordcatcher(std::string path, std::uint64_t options);

  /// Finishes a writing pass and gives back the locks.
  ~KXWordcatcher();

  /// Takes over the index, open as it is.
  KXWordcatcher(KXWordcatcher&&) noexcept;

  /// Takes over the index; the one that this matcher held is closed as by the destructor.
  KXWordcatcher& operator=(KXWordcatcher&&) noexcept;

  /// 0 closed, 1 reading (finishes the tables and opens them for queries), 2 writing (starts an
  /// empty index). Waits while another process holds the index open.
  void setMode(std::int32_t mode);

  /// 1 once the index has been opened for reading, else 0; not the mode last set.
  std::int32_t getMode() const noexcept;

  /// Adds one phrase with its data string, in mode 2. A data string that begins with the phrase,
  /// and puts any further fields after "{ ", lets queries judge the phrase's length: "golden
  /// retriever{ 7 }". A phrase without data is never found in word mode and phonetic word mode.
  void index_withData(std::u16string_view text, std::optional<std::u16string_view> data);

  /// The stored phrases that occur in the text, in mode 1.
  ///
  /// Word mode: each word of more than 2 code units is looked up within 2 edits (shorter ones only
  /// if there is no other); the words' phrases are intersected in text order; a phrase's distance
  /// is the sum of its words' edits, plus penalties for words that find nothing and for every
  /// counted word (of more than 3 code units) that phrase or text has more than the other; at most
  /// 2 a counted word of the text is allowed. Phonetic word mode does the same on codes, which must
  /// match exactly: only distance 0 is returned, and every later query of this matcher searches
  /// within 0 edits. Both return records ascending by distance, then value; nothing when no word
  /// finds data; an empty list when all candidates are too far.
  ///
  /// Whole-text mode: the matches of the whole text within 3 edits, in the fuzzy index's order.
  ///
  /// Words count as matched across queries: see wordsMatched().
  std::optional<QueryResult> query(std::u16string_view text);

  /// How phrases are stored and found: 0, 1 or 2, or whatever else was set.
  std::uint64_t options() const noexcept { return _options; }

  /// Changes how the following calls index and query; nothing else.
  void setOptions(std::uint64_t options) noexcept { _options = options; }

  /// Word hits with data so far. Queries add to it and never reset it, and take it into account: a
  /// text with fewer hits than counted words is penalised. Set it to 0 before a query to judge that
  /// query by itself.
  std::int64_t wordsMatched() const noexcept { return _wordsMatched; }

  /// Sets the counter; any number is taken.
  void setWordsMatched(std::int64_t count) noexcept { _wordsMatched = count; }

 private:
  std::unique_ptr<LXFuzzyIndex> _index;
  std::unique_ptr<KXMetaphone> _meta;
  std::int32_t _editDistance = 2;
  std::int32_t _ignoredWordLength = 2;
  std::int32_t _ignoredWordLengthForEditDistance = 3;
  std::uint64_t _options = 0;
  std::int64_t _wordsMatched = 0;
  std::unique_ptr<WordSegmenter> _segmenter;
};

}  // namespace wordcatcher

#endif
