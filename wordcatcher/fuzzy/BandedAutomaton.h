#ifndef WORDCATCHER_FUZZY_BANDEDAUTOMATON_H
#define WORDCATCHER_FUZZY_BANDEDAUTOMATON_H

// The Levenshtein automaton of a query, simulated in one 64-bit word.
//
// A state (p, e) means: p code units of the query are accounted for, at a cost of e edits. After d
// code units of a stored word have been read, p lies within K of d, where K is the greatest number
// of edits: every other p costs more. So the set of states is kept as K + 1 rows, one for each e,
// of 2K + 1 columns, one for each p - d from -K to K: 45 bits at most, for K = 4.
//
// Reading one more code unit moves the columns along with d. A match (p + 1, e) stays in its
// column; an extra code unit (p, e + 1) goes one column down and one row up; a replaced one (p + 1,
// e + 1) only one row up; a missing one (p + 1, e + 1, without reading) goes one column and one row
// up.
//
// The method of rows is that of Wu and Manber, "Fast text searching allowing errors" (1992); moving
// the columns along with the text is that of Ukkonen's band (1985).

#include <bit>
#include <cstddef>
#include <cstdint>
#include <span>

#include "wordcatcher/fuzzy/QueryPattern.h"

namespace wordcatcher {

/// One or two sets of states side by side in a word: lane 0 decides where a walk goes on, lane 1
/// goes along, stepped by the same instructions, where both fit (K up to 3).
template <unsigned K, unsigned Lanes = 1>
struct Band {
  static constexpr unsigned kColumns = 2 * K + 1;
  static constexpr unsigned kLaneBits = (K + 1) * kColumns;
  static_assert(Lanes * kLaneBits <= 64);
  static constexpr std::uint64_t kRow = (std::uint64_t{1} << kColumns) - 1;
  static constexpr std::uint64_t kLane = (std::uint64_t{1} << kLaneBits) - 1;

  /// The same states in every lane.
  static constexpr std::uint64_t inLanes(std::uint64_t lane) {
    return Lanes == 1 ? lane : lane | lane << (kLaneBits % 64);
  }

  /// One bit at the beginning of each row from `first` to before `end`.
  static constexpr std::uint64_t rowStarts(unsigned first, unsigned end) {
    std::uint64_t bits = 0;
    for (unsigned e = first; e < end && e <= K; ++e) {
      bits |= std::uint64_t{1} << (e * kColumns);
    }
    return bits;
  }

  static constexpr std::uint64_t kStarts = inLanes(rowStarts(0, K + 1));
  static constexpr std::uint64_t kBelowLastRow = inLanes(rowStarts(0, K) * kRow);

  /// The states below the last row that have room for one more column.
  static constexpr std::uint64_t kRoom = inLanes(rowStarts(0, K) * (kRow >> 1));

  /// Adds what missing code units lead to, any number of them, each to one of the states `passed`.
  static constexpr std::uint64_t closed(std::uint64_t states, std::uint64_t passed) {
    for (unsigned missing = 0; missing < K; ++missing) {
      states |= ((states & kRoom) << (kColumns + 1)) & passed;
    }
    return states;
  }

  /// What reading any one code unit leads to by an edit; in place of one of the query's, to one of
  /// the states `passed`. Closed when `states` are: a code unit that is missing behind the edit may
  /// as well be missing before it.
  static constexpr std::uint64_t edited(std::uint64_t states, std::uint64_t passed) {
    if constexpr (K == 0) {
      return 0;
    } else {
      const std::uint64_t inserted = ((states >> 1) & kRoom) << kColumns;
      const std::uint64_t replaced = (states & kBelowLastRow) << kColumns;
      return inserted | (replaced & passed);
    }
  }

  /// What reading a code unit leads to without an edit, or missing code units; bit c of `matching`
  /// says that the query's code unit behind column c is that one. Together with edited() and, after
  /// it, missing code units this is the whole step.
  static constexpr std::uint64_t matched(std::uint64_t states, std::uint64_t matching) {
    return states & (matching * kStarts);
  }

  /// The distance of the best of some states of one lane, of which there must be one.
  static std::uint32_t distanceOf(std::uint64_t accepted) noexcept {
    return static_cast<std::uint32_t>(std::countr_zero(accepted)) / kColumns;
  }

  /// The columns in use in the row of so many edits of lane 0.
  static constexpr std::uint64_t rowOf(std::uint64_t states, unsigned edits) {
    return states >> (edits * kColumns) & kRow;
  }

  /// The columns in use in any row of lane 0.
  static constexpr std::uint64_t columnsOf(std::uint64_t states) {
    std::uint64_t columns = states;
    for (unsigned e = 1; e <= K; ++e) {
      columns |= states >> (e * kColumns);
    }
    return columns & kRow;
  }
};

/// A query prepared for simulation at up to K edits.
template <unsigned K, unsigned Lanes = 1>
class BandedPattern : public QueryPattern<K, Band<K>::kColumns> {
 public:
  using B = Band<K, Lanes>;

  /// The head's limit holds in lane 0. The units must live as long as this does.
  BandedPattern(std::span<const QueryUnit> units, HeadLimit limit)
      : Base(units, B::kStarts,
             [limit](std::uint64_t inside, auto before) -> typename Base::Allowed {
               const auto head = static_cast<std::int64_t>(limit.units);
               const std::uint64_t tooMany = B::rowStarts(limit.edits + 1, K + 1);
               const std::uint64_t whole = inside * B::kStarts;
               const std::uint64_t passed = whole & ~((inside & before(head + 1)) * tooMany);
               return {limit.holdsBorder ? passed : whole & ~((inside & before(head)) * tooMany),
                       passed};
             }) {}

  /// The states before anything is read: nothing is accounted for, and leaving out the head of the
  /// query is not allowed yet.
  std::uint64_t start() const noexcept { return B::inLanes(std::uint64_t{1} << K); }

  /// The same, with the head left out as well.
  std::uint64_t closedStart() const noexcept { return closedAt(start(), 0) & Base::validAt(0); }

  std::uint64_t step(std::uint64_t states, std::size_t depth, std::uint16_t label) const noexcept {
    return (editedAt(states, depth) | closedAt(matchedAt(states, depth, label), depth + 1)) &
           Base::validAt(depth + 1);
  }

  /// Adds what missing code units lead to, after so many code units read.
  std::uint64_t closedAt(std::uint64_t states, std::size_t depth) const noexcept {
    return B::closed(states, Base::passedAt(depth));
  }

  /// The two parts of a step apart, neither masked by what is valid at the next depth. No missing
  /// code units follow the second.
  std::uint64_t editedAt(std::uint64_t states, std::size_t depth) const noexcept {
    const std::uint64_t edited = B::edited(states, Base::passedAt(depth + 1));
    // The states before anything is read need not be closed.
    return depth == 0 ? closedAt(edited, 1) : edited;
  }
  std::uint64_t matchedAt(std::uint64_t states, std::size_t depth,
                          std::uint16_t label) const noexcept {
    return B::matched(states, Base::matching(depth, label));
  }

  /// The columns behind which a code unit may match, after so many code units read.
  std::uint64_t matchableColumns(std::uint64_t states, std::size_t) const noexcept {
    return B::columnsOf(states);
  }

 private:
  using Base = QueryPattern<K, B::kColumns>;
};

}  // namespace wordcatcher

#endif
