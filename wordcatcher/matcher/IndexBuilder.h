#ifndef WORDCATCHER_MATCHER_INDEXBUILDER_H
#define WORDCATCHER_MATCHER_INDEXBUILDER_H

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "wordcatcher/Export.h"

namespace wordcatcher {

/// How phrases are stored and found.
enum class MatchingMode : std::uint32_t {
  words = 0,          ///< by their words, each within an edit distance
  wholeText = 1,      ///< as one string, within an edit distance
  phoneticWords = 2,  ///< by codes of how their words sound
};

/// Builds an index of phrases: one search image file (.wci).
///
///     IndexBuilder builder("names.wci");
///     builder.add("Trinidad and Tobago", "Trinidad and Tobago{ TT }");
///     builder.commit();
///
/// Strings are UTF-8. Nothing is written before commit(), which replaces the target in one step:
/// readers see the old index or the new one, whole, whatever happens meanwhile, a power failure
/// included. A builder that is dropped without commit() leaves everything as it was.
///
/// Memory: the distinct words, 8 bytes a posting (a phrase under a word), the distinct data
/// strings; in commit() about twice the image beside them. Errors: Error, after which the builder
/// is as before the call. Thread safety: one thread at a time. A builder that was moved from may
/// only be assigned to or destroyed.
class WORDCATCHER_EXPORT IndexBuilder {
 public:
  /// What a builder makes beside the image, and in which mode.
  struct Options {
    MatchingMode mode = MatchingMode::words;  ///< the image remembers it

    /// Where to write the three table files of a classic index as well; a prefix of file names,
    /// such as a directory with its trailing "/". Nothing by default. They are written by commit(),
    /// before the image takes its place, and a failure there leaves the image as it was, but not
    /// the table files, which are written over in place. commit() waits for processes that have
    /// them open, and takes time quadratic in the phrases under the most frequent word.
    std::optional<std::string> tables;
  };

  /// A builder whose commit() will write to `path`. Nothing is touched yet. Its mode is words.
  explicit IndexBuilder(std::string path);

  /// The same with options. Throws Error (badInput) for a mode that does not exist.
  IndexBuilder(std::string path, Options options);

  /// Drops what was not committed; no file is touched.
  ~IndexBuilder();

  /// Takes over what was added.
  IndexBuilder(IndexBuilder&&) noexcept;

  /// Takes over what was added; what this builder held is dropped.
  IndexBuilder& operator=(IndexBuilder&&) noexcept;

  /// Adds one phrase with its data string, or none: such a phrase's words are found by search(),
  /// and the phrase is not found by query(). A data string that begins with the phrase, and puts
  /// any further fields after "{ ", lets queries judge the phrase's length. The same phrase and
  /// data added again change nothing but phraseCount(). A phrase in which there is nothing to find
  /// (no word, or no text at all) is accepted, and never found. Linear in the strings.
  ///
  /// Throws Error: badInput for strings that are not UTF-8 or hold U+0000; tooLarge beyond 2^30
  /// words or data strings, 2^32 code units of all words, or 2^28 bytes of one string.
  void add(std::string_view phrase, std::optional<std::string_view> data);

  /// Phrases added so far, each time that one was added.
  std::uint64_t phraseCount() const noexcept;

  /// Distinct stored words (whole texts, codes) so far.
  std::uint64_t wordCount() const noexcept;

  /// Writes the index: to a temporary file beside the target, synced, renamed over the target, the
  /// directory synced. The file has the permissions of a new one (0666 less the creation mask); a
  /// symbolic link at the target is replaced, not followed. The builder is empty afterwards. n log
  /// n in what was added. Returns the bytes of the image.
  ///
  /// Throws Error when anything of that fails: notWritable, or tooLarge for more than the format
  /// can hold. The target is then as it was, no temporary file is left, and what was added is kept,
  /// so that the call may be tried again. (One limit: on a file system without hard links, when the
  /// last step, the sync of the directory, fails, the new index stays, and the sentence says so.)
  ///
  /// A process that is killed in this call may leave hidden files beside the target, ".NAME-" with
  /// 16 hexadecimal digits and ".tmp" or ".old". Nothing reads them; delete them when no builder
  /// runs.
  std::uint64_t commit();

 private:
  struct State;
  std::unique_ptr<State> _state;
};

}  // namespace wordcatcher

#endif
