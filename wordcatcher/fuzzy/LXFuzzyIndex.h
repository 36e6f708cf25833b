#ifndef WORDCATCHER_FUZZY_LXFUZZYINDEX_H
#define WORDCATCHER_FUZZY_LXFUZZYINDEX_H

#include <cstdint>
#include <memory>
#include <optional>
#include <ostream>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "wordcatcher/Export.h"
#include "wordcatcher/fuzzy/LXFuzzyMatch.h"
#include "wordcatcher/fuzzy/LXIntTuple.h"
#include "wordcatcher/fuzzy/LXIntTupleSet.h"
#include "wordcatcher/fuzzy/LXNFA.h"
#include "wordcatcher/storage/LXDFA.h"
#include "wordcatcher/storage/PLXDFA.h"

namespace wordcatcher {

class SearchImage;
class WordSegmenter;

/// The automaton of all strings within a distance of a word.
using LevenshteinNFA = LXNFA<LXIntTuple>;

/// Its deterministic form; each state is named by the set of labels that it stands for.
using LevenshteinDFA = LXDFA<LXIntTupleSet>;

/// Strings with data, kept in a prefix tree on disk and found again within an edit distance.
///
/// Strings are stored lower-cased (root locale) and compared by UTF-16 code units. A life is:
/// construct, setMode(2), add, setMode(1), search. Modes and locks are those of TinyCDB; a failure
/// is a line in the log, and the index carries on with what it can read.
///
/// A string that holds a character outside the Basic Multilingual Plane keeps its final mark and
/// its data, but no search finds it: its two code units would each need an edge of their own, and
/// half a surrogate pair has no UTF-8 form to store. The same holds for a string with an unpaired
/// surrogate.
///
/// Growth: the tables hold one record an adding call, so finishing them grows with the square of
/// the number of words added. The first search after they were opened reads all records once and
/// builds an image of them in memory, of about 60 bytes a distinct string beside the data; later
/// searches use it. For many phrases, or for readers that open often, see IndexBuilder and Index.
///
/// Errors: the constructors throw std::runtime_error when ICU's data is not installed. A string of
/// more than 2^31 - 1 code units is refused with std::length_error.
///
/// Thread safety: one thread at a time.
class WORDCATCHER_EXPORT LXFuzzyIndex {
 public:
  /// The index at the path "test_": three files in the current directory.
  LXFuzzyIndex();

  /// The index whose table files' names begin with `path`; give a directory with its trailing "/".
  /// Nothing is opened yet.
  explicit LXFuzzyIndex(std::string path);

  /// Finishes a writing pass and gives back the locks.
  ~LXFuzzyIndex();

  LXFuzzyIndex(const LXFuzzyIndex&) = delete;
  LXFuzzyIndex& operator=(const LXFuzzyIndex&) = delete;

  /// 0 closed, 1 reading, 2 writing, which starts an empty index.
  void setMode(std::int32_t mode);

  /// 1 once the index has been opened for reading, else 0; not the mode last set.
  std::int32_t getMode() const noexcept;

  /// Adds one string without data.
  void addString(std::u16string_view string);

  /// Adds one string, lower-cased, with one data string or none. Valid in mode 2. Adding a string
  /// again adds its data to what it has. Linear in the string for the tree, which stores every
  /// prefix: bytes written grow with the square of the length.
  void addString_withData(std::u16string_view string, std::optional<std::u16string_view> data);

  /// Adds every word of the text (Unicode word boundaries, punctuation and spaces left out) as a
  /// string of its own, each with the same data.
  void addWordsFromString_data(std::u16string_view text, std::optional<std::u16string_view> data);

  /// Every stored string within `maxDistance` edits of the lower-cased query: more data strings
  /// first, then the smaller distance, then the shorter string, then by code units. The whole query
  /// is one string; an edit inserts, deletes or replaces one code unit. Empty for a null or empty
  /// query and for a negative distance; the empty string is never found.
  ///
  /// Three things that a caller may not expect: a stored string that lacks the query's first
  /// character needs one edit more than usual (at distance 1 it is not found); a "*" in the query
  /// stands for any one character at no cost; a "_" in it may be skipped at no cost and does not
  /// match a stored "_".
  ///
  /// Valid in mode 1. Visits each place of the stored tree at most twice, and far fewer at small
  /// distances; bound the length of the query and the distance for untrusted input.
  std::vector<LXFuzzyMatch> search_withMaxDistance(std::optional<std::u16string_view> query,
                                                   std::int64_t maxDistance);

  /// The class name and the address of the automaton on disk.
  std::u16string description() const;

  /// The automaton that accepts every string within `maxDistance` edits of the word, which is taken
  /// as it is. Its states are (index, distance); it has (n + 1)(k + 1) of them for a word of n code
  /// units and k edits, and only the start state for an empty word or a negative distance. Public
  /// for tools that draw or examine automata.
  static LevenshteinNFA _LXcreateNFAWithWord_withMaxDistance(std::u16string_view word,
                                                             std::int64_t maxDistance);

  /// The deterministic form of an automaton by subset construction. An edge "*" stands for every
  /// symbol that has no edge of its own. The start state is the given automaton's start label
  /// alone, not closed under empty moves.
  static LevenshteinDFA _LXcreateDFAFromNFA(const LevenshteinNFA& nfa);

  /// The labels that edges of exactly this symbol lead to from a set of labels, in one step.
  static LXIntTupleSet _LXcreateFollowingState_withState_withSymbol(const LevenshteinNFA& nfa,
                                                                    const LXIntTupleSet& state,
                                                                    std::u16string_view symbol);

 private:
  friend class Index;
  friend class KXWordcatcher;

  /// What searches answer from: an image of the tables as they were last opened for reading, made
  /// at the first search after they were opened, for reading or for writing.
  const SearchImage& image() { return *sharedImage(); }
  const std::shared_ptr<const SearchImage>& sharedImage();

  PLXDFA _LXindex;
  // Looked up by nothing and filled by nothing: always empty.
  std::unordered_map<std::u16string, std::vector<std::u16string>> _LXdata;
  std::unique_ptr<WordSegmenter> _segmenter;
  std::shared_ptr<const SearchImage> _image;
};

/// Writes the description as UTF-8.
WORDCATCHER_EXPORT std::ostream& operator<<(std::ostream& stream, const LXFuzzyIndex& index);

}  // namespace wordcatcher

#endif
