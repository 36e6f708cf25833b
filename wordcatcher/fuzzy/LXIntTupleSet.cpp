#include "wordcatcher/fuzzy/LXIntTupleSet.h"

#include <algorithm>

#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {

LXIntTupleSet::LXIntTupleSet(std::initializer_list<LXIntTuple> labels) {
  insert(labels.begin(), labels.end());
}

bool LXIntTupleSet::contains(const LXIntTuple& label) const {
  return std::binary_search(_labels.begin(), _labels.end(), label);
}

std::pair<LXIntTupleSet::const_iterator, bool> LXIntTupleSet::insert(const LXIntTuple& label) {
  const auto place = std::lower_bound(_labels.begin(), _labels.end(), label);
  if (place != _labels.end() && *place == label) {
    return {place, false};
  }
  return {_labels.insert(place, label), true};
}

std::uint64_t LXIntTupleSet::hash() const noexcept {
  // FNV-1a over the labels' hashes (Fowler, Noll and Vo's 64-bit offset basis and prime).
  std::uint64_t value = 14695981039346656037U;
  for (const auto& label : _labels) {
    value = (value ^ label.hash()) * 1099511628211U;
  }
  return value;
}

std::u16string LXIntTupleSet::description() const { return textFormOfSet(_labels); }

std::ostream& operator<<(std::ostream& stream, const LXIntTupleSet& labels) {
  return writeUtf8(stream, labels.description());
}

}  // namespace wordcatcher
