#ifndef WORDCATCHER_FUZZY_EDITDISTANCE_H
#define WORDCATCHER_FUZZY_EDITDISTANCE_H

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace wordcatcher {

/// The edits between two strings: code units replaced, inserted or left out and, if
/// `transpositions` says so, two neighbours swapped, no code unit being edited twice (the optimal
/// string alignment distance; Boytsov, "Indexing methods for approximate dictionary searching",
/// 2011, section 2.1). Time and memory: the product of the lengths, and three rows of the shorter.
inline std::uint64_t editDistance(std::u16string_view a, std::u16string_view b,
                                  bool transpositions) {
  if (a.size() < b.size()) {
    std::swap(a, b);
  }
  std::vector<std::uint64_t> beforeLast;
  std::vector<std::uint64_t> last(b.size() + 1);
  for (std::size_t j = 0; j <= b.size(); ++j) {
    last[j] = j;
  }
  std::vector<std::uint64_t> row(b.size() + 1);
  for (std::size_t i = 1; i <= a.size(); ++i) {
    row[0] = i;
    for (std::size_t j = 1; j <= b.size(); ++j) {
      const std::uint64_t replaced = last[j - 1] + (a[i - 1] == b[j - 1] ? 0 : 1);
      row[j] = std::min({replaced, last[j] + 1, row[j - 1] + 1});
      if (transpositions && i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1]) {
        row[j] = std::min(row[j], beforeLast[j - 2] + 1);
      }
    }
    beforeLast = last;
    std::swap(last, row);
  }
  return last[b.size()];
}

}  // namespace wordcatcher

#endif
