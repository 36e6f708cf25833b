#ifndef WORDCATCHER_FUZZY_LXINTTUPLE_H
#define WORDCATCHER_FUZZY_LXINTTUPLE_H

#include <compare>
#include <concepts>
#include <cstdint>
#include <functional>
#include <ostream>
#include <string>

#include "wordcatcher/Export.h"

namespace wordcatcher {

/// The label of a state of a Levenshtein automaton: `index` code units of the word are accounted
/// for, at a cost of `distance` edits. A value: copyable, comparable, hashable;
/// free for concurrent reading.
class WORDCATCHER_EXPORT LXIntTuple {
 public:
  /// The label (index, distance); any two numbers are taken.
  LXIntTuple(std::int64_t index, std::int64_t distance) noexcept
      : _LXindex(index), _LXdistance(distance) {}

  /// Code units of the word that are accounted for.
  std::int64_t index() const noexcept { return _LXindex; }

  /// Edits made so far.
  std::int64_t distance() const noexcept { return _LXdistance; }

  /// Whether both numbers are equal.
  bool isEqual(const LXIntTuple& other) const noexcept { return *this == other; }

  /// An object of an unrelated class is never equal.
  template <typename Other>
  requires(!std::derived_from<Other, LXIntTuple>) bool isEqual(
      const Other& /*other*/) const noexcept {
    return false;
  }

  /// index * 31 + distance + 961, modulo 2^64: the 31-multiplier hash over the two fields.
  std::uint64_t hash() const noexcept {
    return static_cast<std::uint64_t>(_LXindex) * 31 + static_cast<std::uint64_t>(_LXdistance) +
           961;
  }

  /// The numbers as "(index_distance)".
  std::u16string description() const;

  /// By index, then distance.
  // clang-tidy 14 takes the zero of the generated comparison for a pointer.
  // NOLINTNEXTLINE(modernize-use-nullptr)
  friend auto operator<=>(const LXIntTuple&, const LXIntTuple&) noexcept = default;

 private:
  std::int64_t _LXindex;
  std::int64_t _LXdistance;
};

/// Writes the description as UTF-8.
WORDCATCHER_EXPORT std::ostream& operator<<(std::ostream& stream, const LXIntTuple& tuple);

}  // namespace wordcatcher

/// Lets labels be keys of unordered containers.
template <>
struct std::hash<wordcatcher::LXIntTuple> {
  /// The object's own hash().
  std::size_t operator()(const wordcatcher::LXIntTuple& tuple) const noexcept {
    return tuple.hash();
  }
};

#endif
