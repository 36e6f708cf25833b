#ifndef WORDCATCHER_TESTS_LABELROWS_H
#define WORDCATCHER_TESTS_LABELROWS_H

#include <cstddef>
#include <cstdint>
#include <random>
#include <utility>
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

/// A row so many edits of any kind away; `anyLabel()` gives what is inserted and put in place.
template <typename AnyLabel>
Labels edited(Labels labels, std::size_t edits, std::mt19937& random, AnyLabel anyLabel) {
  for (; edits > 0; --edits) {
    const auto place = labels.begin() + static_cast<std::ptrdiff_t>(random() % (labels.size() + 1));
    switch (random() % 4) {
      case 0:
        labels.insert(place, anyLabel());
        break;
      case 1:
        if (place != labels.end()) {
          labels.erase(place);
        }
        break;
      case 2:
        if (place != labels.end()) {
          *place = anyLabel();
        }
        break;
      default:
        if (place != labels.end() && place + 1 != labels.end()) {
          std::swap(place[0], place[1]);
        }
        break;
    }
  }
  return labels;
}

}  // namespace wordcatcher::testing

#endif
