#ifndef WORDCATCHER_MATCHER_INDEX_H
#define WORDCATCHER_MATCHER_INDEX_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/Export.h"
#include "wordcatcher/matcher/Find.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher {

/// An index opened for reading: a search image, or a classic index directory.
///
///     #include "wordcatcher/matcher/Index.h"
///
///     const auto index = wordcatcher::Index::open("names.wci");
///     for (const auto& match : index.find("holidays in trinidat and tobbago").matches) {
///       std::cout << match.value << " costs " << match.cost << '\n';
///     }
///
/// find() is the call to take, unless you need the answers of an older host, which query() gives.
/// search() finds words instead of phrases, and explain() and explainQuery() tell why.
///
/// An Index is immutable and cheap to copy; any number of threads use one at once, without locks.
/// No lock file is needed: any number of processes read one image, also from read-only media, while
/// a builder publishes a new one, which those who open the path from then on see.
///
/// Strings are UTF-8; each ill-formed byte sequence of a text separates words, like a space. Errors
/// are Error; every call may throw Error (damaged) when the file turns out to be damaged, and does
/// nothing worse, whatever the file holds.
///
/// Budgets: a query looks at no more than the options allow and says when it left something out, so
/// that texts of strangers cannot make it run away. Beside its result a query needs at most
/// 64 bytes for each code unit of its longest word, 32 for each byte of the text and 64 for each
/// posting of the words that it finds (a word without any counts as one), and, whatever the text,
/// 512 KB and 16 bytes for each word of the index. find() needs 512 bytes for each word of the text
/// more; what it finds are the words within the edit limits. An index keeps memory of its queries
/// for the next ones: at most 1 MB for each of those that run at once, and 8 MB in all.
class WORDCATCHER_EXPORT Index {
 public:
  /// How an index file gets into memory.
  enum class Load {
    map,   ///< map the file: opens in constant time, whatever its size
    copy,  ///< copy it into memory: for files on storage that may shrink while they are read
  };

  /// How an index is opened, and the budgets of its queries.
  struct Options {
    Load load = Load::map;             ///< how the file gets into memory
    std::size_t maxQueryWords = 4096;  ///< words of a text that are looked at
    std::size_t maxWordUnits = 1024;   ///< code units of a word (or whole text) that is looked up
  };

  /// Opens a search image (a file), or a classic index (a directory, or a prefix of its files'
  /// names), of which an image is built in memory; its tables are locked only while they are read.
  /// A classic index is queried by words, unless a mode is given. Constant time for an image that
  /// is mapped, linear in the size else. Throws Error: notFound, notReadable, notAnIndex, damaged.
  static Index open(const std::string& path);

  /// The same with options. `mode` says how a classic index is to be queried, and is not looked at
  /// for an image, which remembers.
  static Index open(const std::string& path, const Options& options,
                    MatchingMode mode = MatchingMode::words);

  /// One phrase that a query found.
  struct Match {
    std::string value;              ///< the data string; in whole-text mode the stored text
    std::int64_t distance;          ///< as KXWordcatcher::query scores it; edits in whole-text mode
    std::vector<std::string> data;  ///< in whole-text mode: the data strings; else empty
  };

  /// What query() found.
  struct QueryResult {
    /// Whether any word of the text was found with data; always true in whole-text mode.
    bool found = false;
    std::vector<Match> matches;  ///< ascending by distance, then value by UTF-16 code units
    bool truncated = false;      ///< whether a budget cut something off
  };

  /// The matches of a fresh classic matcher in the same mode (see KXWordcatcher::query), where its
  /// first result, nothing, is `found` being false.
  ///
  /// The time is at most that of search() for each word of the text within 2 edits (0 in an index
  /// of codes, 3 for a whole text), and linear in the phrases under all words found, which no
  /// budget bounds; then n log n in the matches.
  QueryResult query(std::string_view text) const;

  /// One stored word (or whole text, or code) near another.
  struct WordMatch {
    std::string value;              ///< as stored: lower-cased, or a code
    std::int64_t distance;          ///< edits between the two
    std::vector<std::string> data;  ///< ascending by UTF-16 code units
  };

  /// What search() found.
  struct SearchResult {
    std::vector<WordMatch> matches;  ///< in the order of LXFuzzyIndex::search_withMaxDistance
    bool truncated = false;          ///< the word is longer than maxWordUnits and was not looked up
  };

  /// As LXFuzzyIndex::search_withMaxDistance, in its order; strings with characters outside the
  /// Basic Multilingual Plane are found as well, each such character counting as two code units.
  /// Throws Error (badInput) for a word that is not UTF-8 or a distance above 16.
  ///
  /// The time is linear in the distinct beginnings of stored words that are within the distance of
  /// some beginning of the word, times the distance: few of them at 1 or 2 edits, and all that the
  /// index holds at a distance as great as its words are long.
  SearchResult search(std::string_view word, std::int64_t maxDistance) const;

  /// The phrases that a text holds, wholly or in part, the best one first.
  ///
  /// Every phrase is judged by itself. Its cost is the edits of its words, and 2 for each of its
  /// words that the text lacks, and 2 for each word of the text that it leaves over, over the best
  /// one-to-one pairing of the words of both; words are paired within the edit limit of the
  /// phrase's word. Two neighbouring words that the other side writes as one, with the same
  /// letters, are paired with it for one edit, unless all edit limits of words are 0; and also when
  /// a code unit stands for the space ("goldnfish", "rai way"), if a stored word of so many code
  /// units may have two edits. A phrase is found when at least one of its words is paired.
  ///
  /// The order: the smaller cost; then more words of the phrase paired; then more of these without
  /// edits; then less disorder (0 for a pair that follows the one before it directly, in the phrase
  /// and in the text, 1 for one with words between, 2 for one that stands before it in the text);
  /// then the rarer paired words (fewer phrases under them in all); then the shorter phrase (words,
  /// then code units); then the value by UTF-16 code units. Of several best pairings the one with
  /// the least disorder counts, then the one that takes the text's words earliest, then the
  /// phrase's. A value that was stored with several phrases is found once, by the best.
  ///
  /// In an index of phonetic codes the codes are compared exactly; in one of whole texts the text
  /// is one word, and so is each phrase.
  ///
  /// Ranges are of the text as given, in bytes, half-open. Words are those of Unicode's rules; at
  /// most Options::maxQueryWords are looked at, a word of more than Options::maxWordUnits is not
  /// looked up, at most 1,000,000 words near those of the text are taken (a word near two of them
  /// counts twice), and FindOptions::maxPostings bounds the phrases that are judged. Throws Error
  /// (badInput) for edit limits that are too large.
  ///
  /// `limit` k gives the first k of all matches, unless the result is `truncated`: what a budget
  /// cut off may have come before some that are listed, and with another limit it may cut at
  /// another place, so that the first k may then differ from those of a longer list.
  ///
  /// The time is that of search() for each word of the text, within the most edits that a stored
  /// word so near to it may have, and, for each two neighbours, linear in the stored beginnings of
  /// one code unit more than the first; then at most FindOptions::maxPostings phrases are judged,
  /// each in time linear in its words and in the ways to pair them, and as many steps taken to try
  /// pairings. Phrases are met in the order of what they may cost at best, so that a small `limit`
  /// ends this early; with `overlaps` other than `all`, all matches are found and sorted first.
  FindResult find(std::string_view text) const;

  /// The same with options: how many, how far, which of those that overlap.
  FindResult find(std::string_view text, const FindOptions& options) const;

  /// Why a value has its cost for a text, or why find() does not list it with these options. The
  /// value is given as find() prints it. Throws as find() does.
  ///
  /// The time is linear in the index's values, beside a call of find() and, for a value that it
  /// does not list, up to two without a limit. Comparing the words of both takes at most
  /// FindExplanation::kMaxSteps; if they do not suffice, the explanation is `truncated`.
  FindExplanation explain(std::string_view text, std::string_view value) const;

  /// The same for what find() does with these options.
  FindExplanation explain(std::string_view text, std::string_view value,
                          const FindOptions& options) const;

  /// The same for the distance of query(), step by step. Linear in the index's values, beside two
  /// calls of query() and, for a value that is not stored, one of find().
  QueryExplanation explainQuery(std::string_view text, std::string_view value) const;

  /// What an index holds.
  struct Info {
    MatchingMode mode;       ///< how it was built and is queried
    std::uint64_t phrases;   ///< phrases added; 0 for a classic index, which does not count them
    std::uint64_t words;     ///< distinct stored words
    std::uint64_t values;    ///< distinct data strings
    std::uint64_t bytes;     ///< of the image
    std::string generation;  ///< 32 hexadecimal digits, random for each build
    std::uint32_t version;   ///< of the format
  };

  /// What the index holds. Constant time.
  Info info() const;

  /// Checks the whole image. Throws Error (damaged) that names what is wrong. Linear in its size.
  void verify() const;

 private:
  struct State;
  explicit Index(std::shared_ptr<const State> state);
  std::shared_ptr<const State> _state;
};

}  // namespace wordcatcher

#endif
