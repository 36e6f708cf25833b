#include "wordcatcher/fuzzy/SwapTable.h"

#include <bit>
#include <cassert>
#include <limits>
#include <span>
#include <unordered_map>
#include <utility>

#include "wordcatcher/fuzzy/SwapAutomaton.h"

namespace wordcatcher {

namespace {

/// The sets of states of a stage by number; number 0 is the empty set, the dead state.
class NumberedSets {
 public:
  std::size_t size() const noexcept { return _sets.size(); }
  std::uint64_t operator[](std::size_t number) const { return _sets[number]; }

  std::uint8_t numberOf(std::uint64_t set) {
    const auto [place, isNew] = _numbers.try_emplace(set, static_cast<std::uint8_t>(_sets.size()));
    if (isNew) {
      _sets.push_back(set);
      assert(_sets.size() <= UINT8_MAX);
    }
    return place->second;
  }

 private:
  std::vector<std::uint64_t> _sets = {0};
  std::unordered_map<std::uint64_t, std::uint8_t> _numbers = {{0, 0}};
};

template <unsigned K>
typename SwapTable<K>::State stateOf(std::uint64_t set) {
  using B = SwapBand<K>;
  typename SwapTable<K>::State state = {};
  state.distances.fill(SwapTable<K>::kNotAccepted);
  if (set == 0) {
    // No word is that short.
    state.mostRest = std::numeric_limits<std::int32_t>::min() / 2;
    return state;
  }
  std::uint64_t most = 0;
  std::uint64_t least = 0;
  for (unsigned edits = 0; edits <= K; ++edits) {
    most |= B::rowOf(set, edits) << edits;
    least |= B::rowOf(set, edits) << (K - edits);
  }
  // A state in column c has c - K of the r code units less before it; see also LazyAutomaton.
  constexpr std::int32_t kEdits = K;
  state.leastRest = kEdits - (std::bit_width(least) - 1);
  state.mostRest = 2 * kEdits - std::countr_zero(most);
  for (unsigned column = 0; column < SwapTable<K>::kColumns; ++column) {
    const std::uint64_t accepted = set & (Band<K>::kStarts << column);
    if (accepted != 0) {
      state.distances[column] = static_cast<std::uint8_t>(B::distanceOf(accepted));
    }
  }
  return state;
}

/// All states but those that can only lead to words of K edits and too few code units. Of K edits
/// nothing is left, so that column c says what such a word is longer by at its end: K - c. A swap
/// that is under way ends one column up.
template <unsigned K>
std::uint64_t longEnough(int leastLonger) {
  using Plain = Band<K>;
  const int columns = static_cast<int>(K) - leastLonger + 1;
  const std::uint64_t tooFar = Plain::kRow & ~((std::uint64_t{1} << columns) - 1);
  const std::uint64_t tooFarToSwap = Plain::kRow & ~((std::uint64_t{1} << (columns - 1)) - 1);
  return ~(tooFar << (K * Plain::kColumns) |
           tooFarToSwap << (SwapBand<K>::kPlainBits + (K - 1) * Plain::kColumns));
}

}  // namespace

// All of it is read off the pattern of a query in which every stage is so far from both ends that
// these make no difference.
template <unsigned K>
SwapTable<K>::SwapTable(bool swaps, unsigned editsOfHead, bool headHoldsBorder, int leastLonger) {
  constexpr std::size_t kHead = 3 * K + 5;
  const std::vector<QueryUnit> units(2 * kHead);
  const SwapPattern<K> pattern(units, swaps, {kHead, editsOfHead, headHoldsBorder});
  const std::uint64_t begin = std::uint64_t{1} << K;
  const auto validAt = [&pattern, allowed = longEnough<K>(leastLonger)](std::size_t depth) {
    return pattern.validAt(depth) & allowed;
  };

  std::array<NumberedSets, kStages> setsOf;
  std::array<std::size_t, kStages> firsts = {};
  for (std::int64_t stage = kFirstStage; stage >= kLastStage; --stage) {
    // The first stage and the next share their sets, and the last one is followed by itself.
    auto& sets = setsOf[indexOf(stage == kFirstStage ? stage - 1 : stage)];
    auto& next = setsOf[indexOf(stage - 1)];
    const auto depth = static_cast<std::size_t>(static_cast<std::int64_t>(kHead) - stage);
    if (stage >= 0 || stage == kLastStage) {
      _starts[indexOf(stage)] = sets.numberOf(pattern.closedAt(begin, depth) & validAt(depth));
    }
    firsts[indexOf(stage)] = _states.size();
    for (std::size_t number = 0; number < sets.size(); ++number) {
      const std::uint64_t set = sets[number];
      State state = stateOf<K>(set);
      for (std::size_t columns = 0; columns < kMatchings; ++columns) {
        const std::uint64_t byMatch = pattern.closedAt(B::matched(set, columns), depth + 1);
        const Number to =
            next.numberOf((pattern.editedAt(set, depth) | byMatch) & validAt(depth + 1));
        _steps.push_back(to);
        if (to != kDead && std::has_single_bit(columns)) {
          state.wanted = static_cast<std::uint8_t>(state.wanted | columns);
        }
      }
      if (_steps[_steps.size() - kMatchings] != kDead) {
        state.wanted = kMatchings;
      }
      _states.push_back(state);
    }
  }
  for (std::size_t i = 0; i < kStages; ++i) {
    _stages[i] = {_states.data() + firsts[i], _steps.data() + firsts[i] * kMatchings};
  }
}

template <unsigned K>
template <bool Swaps, bool IsFirst, int LeastLonger>
const SwapTable<K>& SwapTable<K>::made() {
  // Never destroyed: threads and destructors may still ask while the program ends.
  static const SwapTable& table =
      *new SwapTable(Swaps, IsFirst ? Halves<K>::kInFirst : Halves<K>::kInSecond, IsFirst,
                     LeastLonger);  // NOLINT(*-owning-memory)
  return table;
}

template <unsigned K>
template <bool Swaps, bool IsFirst>
const SwapTable<K>& SwapTable<K>::tableOf(int leastLonger) {
  constexpr int kEdits = K;
  return [leastLonger]<int... I>(std::integer_sequence<int, I...>)->const SwapTable& {
    constexpr std::array<const SwapTable& (*)(), sizeof...(I)> kTables = {
        &made<Swaps, IsFirst, I - kEdits>...};
    return kTables.at(static_cast<std::size_t>(leastLonger) + K)();  // from below 0 it wraps around
  }
  (std::make_integer_sequence<int, 2 * kEdits + 1>());
}

template <unsigned K>
const SwapTable<K>& SwapTable<K>::ofFirst(bool swaps, int leastLonger) {
  return swaps ? tableOf<true, true>(leastLonger) : tableOf<false, true>(leastLonger);
}

template <unsigned K>
const SwapTable<K>& SwapTable<K>::ofSecond(bool swaps, int leastLonger) {
  return swaps ? tableOf<true, false>(leastLonger) : tableOf<false, false>(leastLonger);
}

template class SwapTable<1>;
template class SwapTable<2>;

}  // namespace wordcatcher
