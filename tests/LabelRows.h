#ifndef WORDCATCHER_TESTS_LABELROWS_H
#define WORDCATCHER_TESTS_LABELROWS_H

#include <cstddef>
#include <cstdint>
#include <vector>

namespace wordcatcher::testing {

/// The code units of a query or a word, as an image numbers them.
using Labels = std::vector<std::uint16_t>;

/// All rows of up to so many of the labels 1 to `letters`, the shorter ones first.
inline std::vector<Labels> labelsUpTo(std::size_t length, std::uint16_t letters) {
  std::vector<Labels> all = {{}};
  for (std::size_t i = 0; all[i].size() < length; ++i) {
    for (std::uint16_t letter = 1; letter <= letters; ++letter) {
      all.push_back(all[i]);
      all.back().push_back(letter);
    }
  }
  return all;
}

}  // namespace wordcatcher::testing

#endif
