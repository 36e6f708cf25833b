#ifndef WORDCATCHER_FUZZY_SWAPAUTOMATON_H
#define WORDCATCHER_FUZZY_SWAPAUTOMATON_H

// The Levenshtein automaton of a query in which two neighbours swapped are one edit, simulated in
// one 64-bit word; see BandedAutomaton.h for the rows and columns.
//
// Beside the states (p, e) there are states [p, e], one edit up, for "the query's code unit p + 1
// has just been read where p was expected". They stand in rows of their own above the others. The
// only way on is to read code unit p, which leads to (p + 2, e): one column up, since two code
// units of the query went by with one read. They are entered from (p, e - 1), one column down, as
// one code unit was read and none of the query is done with.
//
// The extension is that of Oflazer, "Error-tolerant finite-state recognition" (1996), in bits.

#include <cstddef>
#include <cstdint>
#include <span>

#include "wordcatcher/fuzzy/BandedAutomaton.h"
#include "wordcatcher/fuzzy/QueryPattern.h"

namespace wordcatcher {

template <unsigned K>
struct SwapBand {
  using Plain = Band<K>;
  static constexpr unsigned kColumns = Plain::kColumns;
  static constexpr unsigned kPlainBits = Plain::kLaneBits;
  static constexpr unsigned kSwapBits = K * kColumns;
  static_assert(kPlainBits + kSwapBits < 64);
  static constexpr std::uint64_t kPlain = Plain::kLane;
  static constexpr std::uint64_t kLane = (std::uint64_t{1} << (kPlainBits + kSwapBits)) - 1;
  static constexpr std::uint64_t kSwapStarts =
      Plain::rowStarts(0, K);  // before they are shifted up
  static constexpr std::uint64_t kSwapRows = kSwapStarts * Plain::kRow;

  static constexpr std::uint64_t inLanes(std::uint64_t lane) { return lane; }

  /// Adds what missing code units lead to; no code unit is missing amid a swap.
  static constexpr std::uint64_t closed(std::uint64_t states, std::uint64_t passed) {
    return Plain::closed(states & kPlain, passed) | (states & ~kPlain);
  }

  static constexpr std::uint64_t edited(std::uint64_t states, std::uint64_t passed) {
    return Plain::edited(states & kPlain, passed);
  }

  /// The swaps that can begin in a set of states.
  static constexpr std::uint64_t entered(std::uint64_t states) {
    return ((states & kSwapRows & ~kSwapStarts) >> 1) << kPlainBits;
  }

  /// What reading a code unit leads to without an edit, or by a swap; bit c of `matching` says that
  /// the query's code unit behind column c is that one, for one column more than there are.
  static constexpr std::uint64_t matched(std::uint64_t states, std::uint64_t matching) {
    const std::uint64_t here = matching & Plain::kRow;
    std::uint64_t next = Plain::matched(states & kPlain, here);
    if constexpr (K > 0) {
      constexpr std::uint64_t kLastColumn = kSwapStarts << (kColumns - 1);
      const std::uint64_t swapped = (states >> kPlainBits) & (here * kSwapStarts) & ~kLastColumn;
      next |= swapped << (1 + kColumns);
      next |= entered(states & ((matching >> 1) * kSwapStarts));
    }
    return next;
  }

  static std::uint32_t distanceOf(std::uint64_t accepted) noexcept {
    return Plain::distanceOf(accepted);
  }

  /// The columns in use in the row of so many edits; a swap's state counts as what it leads to, one
  /// column up.
  static constexpr std::uint64_t rowOf(std::uint64_t states, unsigned edits) {
    const std::uint64_t plain = Plain::rowOf(states, edits);
    return edits == 0
               ? plain
               : plain | ((states >> (kPlainBits + (edits - 1) * kColumns) & Plain::kRow) << 1);
  }

  /// The columns in use in any row of the plain states.
  static constexpr std::uint64_t columnsOf(std::uint64_t states) {
    return Plain::columnsOf(states & kPlain);
  }
  static constexpr std::uint64_t swapColumnsOf(std::uint64_t states) {
    std::uint64_t columns = 0;
    for (unsigned e = 0; e < K; ++e) {
      columns |= states >> (kPlainBits + e * kColumns);
    }
    return columns & Plain::kRow;
  }
};

/// A query prepared for simulation at up to K edits, of which its head may have fewer; with `swaps`
/// false it is the plain Levenshtein automaton.
template <unsigned K>
class SwapPattern : public QueryPattern<K, SwapBand<K>::kColumns + 1> {
 public:
  using B = SwapBand<K>;

  /// The units must live as long as this does.
  SwapPattern(std::span<const QueryUnit> units, bool swaps, HeadLimit limit)
      : Base(units, Plain::kStarts,
             [swaps, limit](std::uint64_t inside, auto before) -> typename Base::Allowed {
               const auto head = static_cast<std::int64_t>(limit.units);
               const std::int64_t border = limit.holdsBorder ? 1 : 0;
               const std::uint64_t tooMany = Plain::rowStarts(limit.edits + 1, K + 1);
               const std::uint64_t whole = inside * Plain::kStarts;
               const std::uint64_t plain = whole & ~((inside & before(head + border)) * tooMany);
               const std::uint64_t swapping =
                   (inside * B::kSwapStarts) &
                   ~((inside & before(head - 1 + border)) * Plain::rowStarts(limit.edits, K));
               return {plain | (swaps ? swapping << B::kPlainBits : 0),
                       whole & ~((inside & before(head + 1)) * tooMany)};
             }) {}

  std::uint64_t start() const noexcept {
    return closedAt(std::uint64_t{1} << K, 0) & Base::validAt(0);
  }

  /// See BandedPattern.
  std::uint64_t closedAt(std::uint64_t states, std::size_t depth) const noexcept {
    return B::closed(states, Base::passedAt(depth));
  }

  /// The two parts of a step; see BandedPattern.
  std::uint64_t editedAt(std::uint64_t states, std::size_t depth) const noexcept {
    return B::edited(states, Base::passedAt(depth + 1));
  }
  std::uint64_t matchedAt(std::uint64_t states, std::size_t depth,
                          std::uint16_t label) const noexcept {
    return B::matched(states, Base::matching(depth, label));
  }

  /// The columns behind which a code unit may match, begin a swap or complete one.
  std::uint64_t matchableColumns(std::uint64_t states, std::size_t depth) const noexcept {
    // A swap that begins has moved one column down, and has read the code unit behind the next.
    const std::uint64_t entered = B::entered(states) & Base::validAt(depth + 1);
    return B::columnsOf(states) | B::swapColumnsOf(states) | B::swapColumnsOf(entered) << 2;
  }

 private:
  using Base = QueryPattern<K, B::kColumns + 1>;
  using Plain = Band<K>;
};

}  // namespace wordcatcher

#endif
