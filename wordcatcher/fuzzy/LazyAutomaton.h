#ifndef WORDCATCHER_FUZZY_LAZYAUTOMATON_H
#define WORDCATCHER_FUZZY_LAZYAUTOMATON_H

// The deterministic automaton of a query, made while a tree is walked in step with it.
//
// A walk reads many code units from few sets of states: of a thousand steps some seventy differ. So
// a set of states gets a number when it is first met, and a step is made once from each for each
// class of code units: those that match nothing within reach are one class, and each that does is
// one of its own. All further steps are read from a table. This is the subset construction on
// demand (Aho, Lam, Sethi, Ullman, "Compilers", section 3.7.4). As a state belongs to one depth, a
// walk that goes level by level may forget those of former depths, when they have become many.

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <utility>
#include <vector>

#include "wordcatcher/storage/SearchImageFormat.h"
#include "wordcatcher/storage/WalkMemory.h"

namespace wordcatcher {

/// `QueryPattern` is a BandedPattern or a SwapPattern. With two lanes a word is accepted when lane
/// 0 accepts it, at the distance in lane 1, if that accepts it, too: forward as from the start;
/// backward so that nothing is left out behind the last code unit read, which is the word's first.
template <unsigned K, unsigned Lanes, typename QueryPattern>
class LazyAutomaton {
 public:
  using Pattern = QueryPattern;
  using B = typename Pattern::B;
  using Number = std::uint32_t;
  using State = AutomatonMemory::State;
  static constexpr Number kDead = 0;
  static constexpr std::uint32_t kNotAccepted = UINT32_MAX;

  /// Both must live as long as this does.
  LazyAutomaton(const Pattern& pattern, bool backward, AutomatonMemory& memory)
      : _pattern(pattern), _backward(backward), _memory(memory) {}

  /// Takes possession of the memory; before all else.
  void begin() {
    _memory.states.assign(1, {.distance = kNotAccepted});
    _memory.steps.resize(kFewestSlots / 2 * kClasses);
    std::fill_n(_memory.steps.begin(), kClasses, kDead);
    _memory.slots.assign(kFewestSlots, 0);
  }

  /// Before places after so many code units are read, those after 0 first.
  void enter(std::size_t) noexcept {}

  /// The state of a set of states of the pattern's after `depth` code units, at which no word ends.
  Number at(std::size_t depth, std::uint64_t set) { return numberOf(depth, set, kNotAccepted); }

  /// The state after one code unit that can only be an insertion.
  Number afterInsertion() {
    const std::uint64_t set =
        _pattern.closedAt(B::inLanes(std::uint64_t{1} << (B::kColumns + K - 1)), 1) &
        _pattern.validAt(1);
    return set == 0 ? kDead : numberOf(1, set, distanceOf(1, {set, set}));
  }

  /// What is asked of states after so many code units as the places that are read, or one more.
  class Level {
   public:
    explicit Level(const AutomatonMemory& memory) : _memory(memory) {}

    /// The labels of the children, as bits of their sets, that can lead on from a state.
    std::uint64_t wanted(Number state) const noexcept { return _memory.states[state].wanted; }

    /// 1 if words that have so many code units more can be of a length that is accepted, else 0.
    unsigned fits(Number state, std::uint8_t shortest, std::uint8_t longest) const noexcept {
      const State& at = _memory.states[state];
      return static_cast<unsigned>(shortest <= at.mostRest) &
             static_cast<unsigned>(longest >= at.leastRest);
    }

    /// The distance of a word that ends, or kNotAccepted.
    std::uint32_t distance(Number state) const noexcept { return _memory.states[state].distance; }

   private:
    const AutomatonMemory& _memory;
  };
  Level level(std::size_t) const noexcept { return Level(_memory); }

  /// The state behind a code unit read in another, which is after `depth` code units, the level's.
  Number next(const Level&, Number from, std::size_t depth, std::uint16_t label) {
    const std::size_t step = from * kClasses + classOf(depth, label);
    const Number to = _memory.steps[step];
    return to != kUnknown ? to : make(step, from, depth, label);
  }

  /// The same, also beyond the depths of all states but the dead one.
  Number nextAnywhere(Number from, std::size_t depth, std::uint16_t label) {
    return next(level(depth), from, std::min(depth, _pattern.length() + K), label);
  }

  /// The distance of a word that ends, after any number of code units, or kNotAccepted.
  std::uint32_t distanceAnywhere(Number state, std::size_t) const noexcept {
    return _memory.states[state].distance;
  }

  /// The distance of a word that goes on to `length` code units, `labelAt(depth)`, or kNotAccepted.
  /// Makes no states: what is left of a word is mostly like that of no other.
  template <typename LabelAt>
  std::uint32_t distanceBehind(Number from, std::size_t depth, std::size_t length,
                               LabelAt labelAt) const {
    const State& state = _memory.states[from];
    if (depth == length) {
      return state.distance;
    }
    Step last = {state.set, state.set};
    for (; depth < length && (last.set & B::kLane) != 0; ++depth) {
      last = stepOf(last.set, depth, labelAt(depth));
    }
    return (last.set & B::kLane) != 0 ? distanceOf(length, last) : kNotAccepted;
  }

  /// Whether there are so many states that the ones of former depths should be forgotten.
  bool isLarge() const noexcept { return _memory.states.size() >= kManyStates; }

  /// Forgets all states but those that the places are in, all after `depth` code units, and gives
  /// these new numbers. Bounds the memory by what the states of one depth take.
  template <typename Places>
  void forgetAllBut(Places& places, std::size_t depth) {
    _memory.former.swap(_memory.states);
    begin();
    for (auto& place : places) {
      const State& state = _memory.former[place.state];
      place.state = numberOf(depth, state.set, state.distance);
    }
  }

  const State& operator[](Number state) const noexcept { return _memory.states[state]; }

 private:
  static constexpr std::size_t kFewestSlots = K < 2 ? 64 : 256;
  static constexpr std::size_t kManyStates = 1024;
  static constexpr Number kUnknown = UINT32_MAX;
  static constexpr std::uint64_t kEnd = std::uint64_t{1} << image::kEndBit;
  /// A label within reach has the class of the first column in which it stands, all others have one
  /// in common. A power of two, so that rows are shifted to.
  static constexpr std::size_t kClasses = std::bit_ceil(Pattern::kWindow + 1U);

  /// The first column with the label, or one behind the last.
  std::size_t classOf(std::size_t depth, std::uint16_t label) const noexcept {
    constexpr std::uint64_t kNone = std::uint64_t{1} << Pattern::kWindow;
    return static_cast<std::size_t>(std::countr_zero(_pattern.labelColumns(depth, label) | kNone));
  }

  /// What a step leads to. `unclosed`: without what only leaving out code units behind the last one
  /// read leads to.
  struct Step {
    std::uint64_t set;
    std::uint64_t unclosed;
  };

  Step stepOf(std::uint64_t set, std::size_t depth, std::uint16_t label) const noexcept {
    const std::uint64_t byEdit = _pattern.editedAt(set, depth);
    const std::uint64_t match = _pattern.matchedAt(set, depth, label);
    return {(byEdit | _pattern.closedAt(match, depth + 1)) & _pattern.validAt(depth + 1),
            byEdit | match};
  }

  [[gnu::noinline]] Number make(std::size_t step, Number from, std::size_t depth,
                                std::uint16_t label) {
    const Step made = stepOf(_memory.states[from].set, depth, label);
    const Number to = (made.set & B::kLane) == 0
                          ? kDead
                          : numberOf(depth + 1, made.set, distanceOf(depth + 1, made));
    _memory.steps[step] = to;
    return to;
  }

  void addSteps(Number state) {
    const std::size_t first = state * kClasses;
    if (first == _memory.steps.size()) {
      _memory.steps.resize(2 * first);
    }
    std::fill_n(_memory.steps.begin() + static_cast<std::ptrdiff_t>(first), kClasses, kUnknown);
  }

  /// The distance at the end of a word.
  std::uint32_t distanceOf(std::size_t depth, const Step& last) const noexcept {
    const std::uint64_t accepting = _pattern.acceptingAt(depth);
    std::uint64_t accepted = last.set & accepting & B::kLane;
    if constexpr (Lanes == 2) {
      const std::uint64_t ofWhole = _backward ? last.unclosed : last.set;
      accepted = accepted == 0 ? 0 : (ofWhole & accepting) >> B::kLaneBits;
    }
    return accepted == 0 ? kNotAccepted : B::distanceOf(accepted);
  }

  Number numberOf(std::size_t depth, std::uint64_t set, std::uint32_t distance) {
    if (2 * _memory.states.size() >= _memory.slots.size()) {
      grow();
    }
    Number& slot = slotOf(depth, set, distance);
    if (slot == 0) {
      slot = static_cast<Number>(_memory.states.size());
      const std::uint64_t byEdit = _pattern.editedAt(set, depth) & _pattern.validAt(depth + 1);
      const std::uint64_t wanted = (byEdit & B::kLane) != 0 ? ~kEnd : matchingChildren(depth, set);
      const auto [least, most] = restOf(depth, set);
      _memory.states.push_back(
          {set, wanted, least, most, distance, static_cast<std::uint32_t>(depth)});
      addSteps(slot);
    }
    return slot;
  }

  /// How many code units a word may still have. A state of e edits in column c, behind which the
  /// query has r code units, allows r - (K - e) to r + (K - e); r is less by one for each column.
  std::pair<std::uint16_t, std::uint16_t> restOf(std::size_t depth, std::uint64_t set) const {
    std::uint64_t most = 0;
    std::uint64_t least = 0;
    for (unsigned edits = 0; edits <= K; ++edits) {
      const std::uint64_t row = B::rowOf(set, edits);
      most |= row << edits;
      least |= row << (K - edits);
    }
    const auto restOfMiddle =
        static_cast<std::int64_t>(_pattern.length()) - static_cast<std::int64_t>(depth);
    const auto capped = [](std::int64_t length) {
      return static_cast<std::uint16_t>(
          std::clamp<std::int64_t>(length, 0, std::int64_t{image::kLengthCap}));
    };
    return {capped(restOfMiddle + K - (std::bit_width(least) - 1)),
            capped(restOfMiddle + 2 * std::int64_t{K} - std::countr_zero(most))};
  }

  /// The labels that lead on from a set of states without an edit.
  std::uint64_t matchingChildren(std::size_t depth, std::uint64_t set) const {
    std::uint64_t children = 0;
    for (std::uint64_t columns = _pattern.matchableColumns(set, depth); columns != 0;
         columns &= columns - 1) {
      children |= _pattern.childBits(depth, static_cast<unsigned>(std::countr_zero(columns)));
    }
    return children;
  }

  Number& slotOf(std::size_t depth, std::uint64_t set, std::uint32_t distance) {
    // Knuth's multiplicative hashing, see NumberIndex.h. The highest bits depend on all of them:
    // the same set at many depths must not meet itself.
    constexpr std::uint64_t kGoldenRatio = 0x9E3779B97F4A7C15;
    auto& slots = _memory.slots;
    const std::uint64_t mixed = (set ^ depth * kGoldenRatio) * kGoldenRatio;
    std::size_t slot = mixed >> std::countl_zero(slots.size() - 1);
    for (; slots[slot] != 0; slot = (slot + 1) & (slots.size() - 1)) {
      const State& state = _memory.states[slots[slot]];
      if (state.set == set && state.depth == depth && state.distance == distance) {
        break;
      }
    }
    return slots[slot];
  }

  void grow() {
    _memory.slots.assign(2 * _memory.slots.size(), 0);
    for (Number number = 1; number < _memory.states.size(); ++number) {
      const State& state = _memory.states[number];
      slotOf(state.depth, state.set, state.distance) = number;
    }
  }

  const Pattern& _pattern;
  bool _backward;
  AutomatonMemory& _memory;
};

}  // namespace wordcatcher

#endif
