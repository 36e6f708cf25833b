#ifndef WORDCATCHER_FUZZY_LXINTTUPLESET_H
#define WORDCATCHER_FUZZY_LXINTTUPLESET_H

#include <cstddef>
#include <cstdint>
#include <functional>
#include <initializer_list>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

#include "wordcatcher/Export.h"
#include "wordcatcher/fuzzy/LXIntTuple.h"

namespace wordcatcher {

/// A set of labels, which is the name of a state of a query's deterministic automaton: two sets are
/// the same state when they hold the same labels, in whatever order those were collected. Kept as a
/// sorted list, since the sets are small and compared often. A value: copyable, comparable,
/// hashable; one thread at a time while it grows.
class WORDCATCHER_EXPORT LXIntTupleSet {
 public:
  /// What the set holds, as algorithms and containers of the standard library ask for it.
  using value_type = LXIntTuple;

  /// Walks the labels in order; any insert() makes it invalid.
  using const_iterator = std::vector<LXIntTuple>::const_iterator;

  /// The empty set.
  LXIntTupleSet() = default;

  /// The set of these labels, in whatever order and however often each is named.
  LXIntTupleSet(std::initializer_list<LXIntTuple> labels);

  /// The labels, ascending by index, then distance.
  const_iterator begin() const noexcept { return _labels.begin(); }

  /// Behind the last label.
  const_iterator end() const noexcept { return _labels.end(); }

  /// The number of labels.
  std::size_t size() const noexcept { return _labels.size(); }

  /// Whether there is no label.
  bool empty() const noexcept { return _labels.empty(); }

  /// Whether the set holds the label. Logarithmic in the size.
  bool contains(const LXIntTuple& label) const;

  /// 1 if the set holds the label, else 0. Logarithmic in the size.
  std::size_t count(const LXIntTuple& label) const { return contains(label) ? 1 : 0; }

  /// Adds a label and tells where it is and whether it is new. Linear in the size.
  std::pair<const_iterator, bool> insert(const LXIntTuple& label);

  /// Adds every label of a range.
  template <typename Iterator>
  void insert(Iterator first, Iterator last) {
    for (; first != last; ++first) {
      insert(*first);
    }
  }

  /// A hash of all labels: equal for equal sets. Linear in the size.
  std::uint64_t hash() const noexcept;

  /// The labels' text forms: {(0_1), (1_1)}.
  std::u16string description() const;

  /// Whether both hold the same labels.
  friend bool operator==(const LXIntTupleSet&, const LXIntTupleSet&) = default;

 private:
  std::vector<LXIntTuple> _labels;
};

/// Writes the description as UTF-8.
WORDCATCHER_EXPORT std::ostream& operator<<(std::ostream& stream, const LXIntTupleSet& labels);

}  // namespace wordcatcher

/// Lets sets of labels be keys of unordered containers.
template <>
struct std::hash<wordcatcher::LXIntTupleSet> {
  /// The object's own hash().
  std::size_t operator()(const wordcatcher::LXIntTupleSet& labels) const noexcept {
    return labels.hash();
  }
};

#endif
