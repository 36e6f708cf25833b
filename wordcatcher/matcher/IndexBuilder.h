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
/// readers see the old index or the new one, whole, whatever happens meanwhile. A builder that is
/// dropped without commit() leaves everything as it was.
///
/// Memory: the distinct words, 8 bytes a posting (a phrase under a word), the distinct data
/// strings; in commit() the image beside them. Errors: Error, after which the builder is as before
/// the call. Thread safety: one thread at a time.
class WORDCATCHER_EXPORT IndexBuilder {
 public:
  struct Options {
    MatchingMode mode = MatchingMode::words;

    /// Where to write the three table files of a classic index as well; a prefix of file names,
    /// such as a directory with its trailing "/". Nothing by default. They are written by commit(),
    /// before the image takes its place, and a failure there leaves the image as it was.
    std::optional<std::string> tables;
  };

  /// A builder whose commit() will write to `path`. Nothing is touched yet.
  explicit IndexBuilder(std::string path);
  IndexBuilder(std::string path, Options options);
  ~IndexBuilder();

  IndexBuilder(IndexBuilder&&) noexcept;
  IndexBuilder& operator=(IndexBuilder&&) noexcept;

  /// Adds one phrase with its data string, or none: such a phrase's words are found by search(),
  /// and the phrase is not found by query(). A data string that begins with the phrase, and puts
  /// any further fields after "{ ", lets queries judge the phrase's length. The same phrase and
  /// data added twice count once. Linear in the strings.
  ///
  /// Throws Error: badInput for strings that are not UTF-8 or hold U+0000, tooLarge beyond 2^30
  /// words or data strings.
  void add(std::string_view phrase, std::optional<std::string_view> data);

  /// Phrases added so far.
  std::uint64_t phraseCount() const noexcept;

  /// Distinct stored words (whole texts, codes) so far.
  std::uint64_t wordCount() const noexcept;

  /// Writes the index: to a temporary file beside the target, synced, renamed over the target, the
  /// directory synced. The builder is empty afterwards. n log n in what was added. Returns the
  /// bytes of the image.
  ///
  /// Throws Error (notWritable) when anything of that fails: the target is then as it was, no
  /// temporary file is left, and what was added is kept, so that the call may be tried again.
  std::uint64_t commit();

 private:
  struct State;
  std::unique_ptr<State> _state;
};

}  // namespace wordcatcher

#endif
