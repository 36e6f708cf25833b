#ifndef WORDCATCHER_FUZZY_LXFUZZYMATCH_H
#define WORDCATCHER_FUZZY_LXFUZZYMATCH_H

#include <cstdint>
#include <ostream>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/Export.h"

namespace wordcatcher {

/// One stored string that a search found: the string, its edit distance from the query and the data
/// strings stored with it. Immutable; free for concurrent reading.
class WORDCATCHER_EXPORT LXFuzzyMatch {
 public:
  /// Always throws std::logic_error: a match has no meaning without its values.
  [[noreturn]] LXFuzzyMatch();

  /// A record of exactly these values.
  LXFuzzyMatch(std::u16string_view value, std::int64_t distance, std::vector<std::u16string> data);

  /// The stored string, which is lower-cased.
  const std::u16string& value() const noexcept { return _LXvalue; }

  /// Edits (code units inserted, deleted or replaced), from 0 to the search's maximum.
  std::int64_t distance() const noexcept { return _LXdistance; }

  /// The data strings, each once; a search lists them ascending by code units. Empty when there are
  /// none.
  const std::vector<std::u16string>& data() const noexcept { return _LXdata; }

  /// "{ value: ..., distance: ..., data: (..., ...) }"
  std::u16string description() const;

 private:
  std::int64_t _LXdistance;
  std::vector<std::u16string> _LXdata;
  std::u16string _LXvalue;
};

/// Writes the description as UTF-8.
WORDCATCHER_EXPORT std::ostream& operator<<(std::ostream& stream, const LXFuzzyMatch& match);

}  // namespace wordcatcher

#endif
