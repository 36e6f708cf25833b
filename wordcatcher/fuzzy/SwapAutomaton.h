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

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

#include "wordcatcher/fuzzy/BandedAutomaton.h"

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
  static constexpr std::uint64_t closed(std::uint64_t states) {
    return Plain::closed(states & kPlain) | (states & ~kPlain);
  }

  static constexpr std::uint64_t edited(std::uint64_t states) {
    return Plain::edited(states & kPlain);
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
      const std::uint64_t entering =
          states & ((matching >> 1) * kSwapStarts) & kSwapRows & ~kSwapStarts;
      next |= (entering >> 1) << kPlainBits;
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

/// A query prepared for simulation at up to K edits, the head as free to be left out as the rest;
/// with `swaps` false it is the plain Levenshtein automaton.
template <unsigned K>
class SwapPattern {
 public:
  using B = SwapBand<K>;

  /// `restricted` code units at the head may only be passed with at most `edits` edits; a swap of
  /// the last of them with the one behind is not held against them.
  SwapPattern(std::span<const std::uint16_t> labels, bool swaps, std::size_t restricted,
              unsigned edits)
      : _labels(labels), _swaps(swaps) {
    const std::size_t depths = labels.size() + K + 2;
    if (depths > _fewStates.size()) {
      _manyStates.resize(depths);
      _states = _manyStates.data();
    }
    const auto length = static_cast<std::int64_t>(labels.size());
    for (std::size_t depth = 0; depth < depths; ++depth) {
      const auto shift = static_cast<std::int64_t>(depth) - static_cast<std::int64_t>(K);
      const auto head = static_cast<std::int64_t>(restricted) - shift;
      const std::uint64_t inside = below(length + 1 - shift) & ~below(-shift);
      const std::uint64_t plain = (inside * Plain::kStarts) &
                                  ~((inside & below(head)) * Plain::rowStarts(edits + 1, K + 1));
      const std::uint64_t swapping =
          swaps ? (inside * B::kSwapStarts) &
                      ~((inside & below(head - 1)) * Plain::rowStarts(edits, K))
                : 0;
      _states[depth].valid = plain | swapping << B::kPlainBits;
      const std::uint64_t end = below(length + 1 - shift) & ~below(length - shift);
      _states[depth].accepting = end * Plain::kStarts;
    }
    if (labels.size() + B::kColumns < 64) {
      for (std::size_t p = 0; p < labels.size(); ++p) {
        if (labels[p] != 0 && labels[p] < image::kRareBit) {
          _table[labels[p]] |= std::uint64_t{1} << (p + K);
        }
      }
      _hasTable = true;
    }
  }

  SwapPattern(const SwapPattern&) = delete;
  SwapPattern& operator=(const SwapPattern&) = delete;

  std::size_t length() const noexcept { return _labels.size(); }

  /// How many code units of the query a step looks at, and the label of one of them; 0 where there
  /// is none.
  static constexpr unsigned kWindow = B::kColumns + 1;
  std::uint16_t labelAt(std::size_t depth, unsigned column) const noexcept {
    const std::size_t p = depth + column - K;
    return p < _labels.size() ? _labels[p] : 0;
  }

  std::uint64_t validAt(std::size_t depth) const noexcept { return _states[depth].valid; }
  std::uint64_t acceptingAt(std::size_t depth) const noexcept { return _states[depth].accepting; }

  std::uint64_t start() const noexcept { return B::closed(std::uint64_t{1} << K) & validAt(0); }
  std::uint64_t step(std::uint64_t states, std::size_t depth, std::uint16_t label) const noexcept {
    return (editedAt(states, depth) | B::closed(matchedAt(states, depth, label))) &
           _states[depth + 1].valid;
  }
  std::uint64_t editedAt(std::uint64_t states, std::size_t) const noexcept {
    return B::edited(states);
  }
  std::uint64_t matchedAt(std::uint64_t states, std::size_t depth,
                          std::uint16_t label) const noexcept {
    return B::matched(states, matching(depth, label));
  }

  /// The columns behind which a code unit may match.
  std::uint64_t matchableColumns(std::uint64_t states) const noexcept {
    const std::uint64_t columns = B::columnsOf(states);
    return columns | B::swapColumnsOf(states) | (_swaps ? columns << 1 : 0);
  }

  /// The bits, in a tree's sets of children, of the labels that match behind a column.
  std::uint64_t childBits(std::size_t depth, unsigned column) const noexcept {
    return image::childBit(labelAt(depth, column));
  }

 private:
  using Plain = Band<K>;

  /// Per depth: the states that may be, and those at the end of the query.
  struct AtDepth {
    std::uint64_t valid;
    std::uint64_t accepting;
  };

  static std::uint64_t below(std::int64_t column) noexcept {
    if (column <= 0) {
      return 0;
    }
    return column >= B::kColumns ? Plain::kRow : (std::uint64_t{1} << column) - 1;
  }

  std::uint64_t matching(std::size_t depth, std::uint16_t label) const noexcept {
    if (_hasTable && label < image::kRareBit) {
      return (_table[label] >> depth) & ((std::uint64_t{1} << (B::kColumns + 1)) - 1);
    }
    std::uint64_t bits = 0;
    for (unsigned c = 0; c <= B::kColumns; ++c) {
      const std::size_t p = depth + c - K;
      if (p < _labels.size() && _labels[p] == label && label != 0) {
        bits |= std::uint64_t{1} << c;
      }
    }
    return bits;
  }

  std::span<const std::uint16_t> _labels;
  bool _swaps;
  std::array<AtDepth, 48> _fewStates;
  std::vector<AtDepth> _manyStates;
  AtDepth* _states = _fewStates.data();
  // For queries that fit: bit p + K of a label's row says that it is the query's code unit p.
  std::uint64_t _table[image::kRareBit] = {};
  bool _hasTable = false;
};

}  // namespace wordcatcher

#endif
