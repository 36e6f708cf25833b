#ifndef WORDCATCHER_FUZZY_SWAPTABLE_H
#define WORDCATCHER_FUZZY_SWAPTABLE_H

// The automaton of a SwapPattern as a table that serves all queries.
//
// Which set of states a code unit leads to depends on the query only by the columns behind which
// the query has that code unit, by how far away the end of a limited head is, and by how much
// longer than the query words must be to have all edits. There are few sets, and few columns, so
// all steps are made once for a program: a table for each walk, with swaps and without, and for
// each such length, 32 in all, of some 200 KB. That a set of states does not depend on the query
// itself, so that its automaton need not be made for each, is the discovery of Schulz and Mihov,
// "Fast string correction with Levenshtein automata" (2002).
//
// Unlike those of a SwapPattern the sets may hold states behind the end of the query. From these
// nothing is accepted, nor do they keep a walk alive that the others would not.

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "wordcatcher/fuzzy/SwapAutomaton.h"

namespace wordcatcher {

/// All steps at up to K edits, K being 1 or 2, with the head's limit in edits that one of two walks
/// has, and the least length that words of K edits have. Immutable.
///
/// After d code units a query with a limited head of h code units is in stage h - d, where all
/// stages beyond the first and the last are alike. A set of states is a number in its stage.
template <unsigned K>
class SwapTable {
 public:
  using B = SwapBand<K>;
  using Number = std::uint8_t;
  static constexpr Number kDead = 0;
  static constexpr std::uint8_t kNotAccepted = UINT8_MAX;
  static constexpr unsigned kColumns = B::kColumns;
  static constexpr unsigned kWindow = kColumns + 1;
  static constexpr std::size_t kMatchings = std::size_t{1} << kWindow;

  /// From the last stage on no state is limited any more. From the first one back all are, and
  /// after one more code unit as well.
  static constexpr std::int64_t kLastStage = -static_cast<std::int64_t>(K) - 1;
  static constexpr std::int64_t kFirstStage = std::int64_t{K} + 2;

  /// What is to be known of a set of states, where the query has r code units more than were read.
  struct State {
    std::int32_t leastRest;  // code units that a word may still have, less r
    std::int32_t mostRest;
    std::uint8_t wanted;  // the columns behind which a match leads on; kMatchings: all leads on
    std::array<std::uint8_t, kColumns + 1> distances;  // of a word that ends, by r + K, or
                                                       // kNotAccepted; the last one is that
  };

  /// The sets of a stage.
  struct Stage {
    const State* states;
    const Number* steps;  // kMatchings for each

    /// The set in the next stage, where the query's code units behind `columns` match.
    Number next(Number from, std::uint64_t columns) const noexcept {
      return steps[from * kMatchings + columns];
    }
  };

  SwapTable(const SwapTable&) = delete;
  SwapTable& operator=(const SwapTable&) = delete;

  /// The table of the first walk, in which the head holds its border, or of the second. A word that
  /// takes K edits is not accepted unless it is at least so many code units longer than the query:
  /// from -K, which excludes none, to K. Made when it is first asked for. Safe for any number of
  /// threads.
  static const SwapTable& ofFirst(bool swaps, int leastLonger);
  static const SwapTable& ofSecond(bool swaps, int leastLonger);

  const Stage& stage(std::int64_t stage) const noexcept { return _stages[indexOf(stage)]; }

  /// The set before anything is read; the stage is at least 0, or kLastStage for no limit.
  Number start(std::int64_t stage) const noexcept { return _starts[indexOf(stage)]; }

 private:
  SwapTable(bool swaps, unsigned editsOfHead, bool headHoldsBorder, int leastLonger);
  template <bool Swaps, bool IsFirst, int LeastLonger>
  static const SwapTable& made();
  template <bool Swaps, bool IsFirst>
  static const SwapTable& tableOf(int leastLonger);

  static std::size_t indexOf(std::int64_t stage) noexcept {
    return static_cast<std::size_t>(std::clamp(stage, kLastStage, kFirstStage) - kLastStage);
  }
  static constexpr std::size_t kStages = kFirstStage - kLastStage + 1;

  std::array<Stage, kStages> _stages = {};
  std::array<Number, kStages> _starts = {};
  std::vector<State> _states;
  std::vector<Number> _steps;
};

}  // namespace wordcatcher

#endif
