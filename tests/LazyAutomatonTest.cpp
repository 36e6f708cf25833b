// The automaton that is made while it is walked against the patterns that it is made of, step by
// step.

#include "wordcatcher/fuzzy/LazyAutomaton.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <optional>
#include <random>
#include <utility>
#include <vector>

#include "LabelRows.h"
#include "wordcatcher/fuzzy/BandedAutomaton.h"
#include "wordcatcher/fuzzy/SwapAutomaton.h"

namespace wordcatcher {
namespace {

using Random = std::mt19937;
using testing::Labels;

/// Common labels, the rarest common one, rare ones, and, for a word of a damaged image, 0 and more
/// than there are.
constexpr std::array<std::uint16_t, 8> kLabels = {1, 2, 62, 63, 64, 300, 0, 65535};

std::uint16_t anyLabel(Random& random, std::size_t letters) { return kLabels[random() % letters]; }

std::vector<QueryUnit> anyQuery(Random& random, std::size_t length, std::size_t letters,
                                bool holdsAny) {
  std::vector<QueryUnit> units(length);
  for (auto& unit : units) {
    unit = holdsAny && random() % 5 == 0 ? QueryUnit{.label = 0, .any = true}
                                         : QueryUnit{.label = anyLabel(random, letters)};
  }
  return units;
}

/// A word some edits away.
Labels wordNear(const std::vector<QueryUnit>& units, Random& random, std::size_t letters) {
  Labels labels;
  for (const auto& unit : units) {
    labels.push_back(unit.any ? anyLabel(random, letters) : unit.label);
  }
  return testing::edited(std::move(labels), random() % 5, random,
                         [&random] { return anyLabel(random, kLabels.size()); });
}

/// The states after each code unit of a word, by the pattern alone.
template <unsigned Lanes, typename Pattern>
struct Literal {
  using B = typename Pattern::B;

  std::vector<std::uint64_t> sets;      // those at which lane 0 is alive
  std::vector<std::uint64_t> unclosed;  // without what is left out behind the last one

  Literal(const Pattern& pattern, std::uint64_t start, const Labels& word)
      : sets{start}, unclosed{start} {
    for (std::size_t depth = 0; depth < word.size(); ++depth) {
      const std::uint64_t byEdit = pattern.editedAt(sets.back(), depth);
      const std::uint64_t match = pattern.matchedAt(sets.back(), depth, word[depth]);
      const std::uint64_t set =
          (byEdit | pattern.closedAt(match, depth + 1)) & pattern.validAt(depth + 1);
      if ((set & B::kLane) == 0) {
        break;
      }
      sets.push_back(set);
      unclosed.push_back(byEdit | match);
    }
  }

  std::optional<std::uint32_t> distance(const Pattern& pattern, std::size_t depth,
                                        bool backward) const {
    const std::uint64_t accepting = pattern.acceptingAt(depth);
    const std::uint64_t first = sets[depth] & accepting & B::kLane;
    std::uint64_t last = first;
    if constexpr (Lanes == 2) {
      last = ((backward ? unclosed : sets)[depth] & accepting) >> B::kLaneBits;
    }
    return first == 0 || last == 0 ? std::nullopt : std::optional(B::distanceOf(last));
  }
};

/// Reads words with one automaton, and counts those that it accepts.
template <unsigned K, unsigned Lanes, typename Pattern>
class Reader {
 public:
  using B = typename Pattern::B;
  using Automaton = LazyAutomaton<K, Lanes, Pattern>;

  Reader(const Pattern& pattern, std::uint64_t start, bool backward, AutomatonMemory& memory)
      : _pattern(pattern),
        _start(start),
        _backward(backward),
        _memory(memory),
        _automaton(pattern, backward, memory) {}

  /// `forgets`: whether to forget all other states amid the word.
  bool read(const Labels& word, bool forgets, Random& random) {
    const Literal<Lanes, Pattern> literal(_pattern, _start, word);
    const std::size_t alive = literal.sets.size() - 1;
    std::optional<std::uint32_t> ofWhole;
    if (alive == word.size() && !word.empty()) {
      ofWhole = literal.distance(_pattern, alive, _backward);
    }
    _automaton.begin();
    auto state = _automaton.at(0, _start);
    for (std::size_t depth = 0; depth <= alive && state != Automaton::kDead; ++depth) {
      if (forgets && random() % 3 == 0) {
        state = forgetAllBut(state, depth);
      }
      expectState(state, depth, literal);
      expectBehind(state, depth, word, ofWhole);
      if (depth < word.size()) {
        const bool goesOn = depth < alive;
        const std::uint64_t bit = std::uint64_t{1} << image::labelBit(word[depth]);
        EXPECT_TRUE(!goesOn || word[depth] == 0 || (_automaton[state].wanted & bit) != 0);
        const auto next = _automaton.nextAnywhere(state, depth, word[depth]);
        EXPECT_EQ(next != Automaton::kDead, goesOn);
        EXPECT_EQ(_automaton.next(_automaton.level(depth), state, depth, word[depth]), next)
            << "made";
        state = next;
      }
    }
    for (const std::size_t depth : {0U, 100000U}) {
      EXPECT_EQ(_automaton.nextAnywhere(Automaton::kDead, depth, 1), Automaton::kDead);
    }
    return ofWhole.has_value();
  }

 private:
  struct Place {
    std::uint32_t state;
  };

  std::uint32_t forgetAllBut(std::uint32_t state, std::size_t depth) {
    std::vector<Place> places = {{state}, {state}};
    _automaton.forgetAllBut(places, depth);
    EXPECT_EQ(places[0].state, places[1].state);
    EXPECT_EQ(_memory.states.size(), 2U) << "and the dead one";
    return places[0].state;
  }

  void expectState(std::uint32_t state, std::size_t depth,
                   const Literal<Lanes, Pattern>& literal) const {
    EXPECT_EQ(_automaton[state].set, literal.sets[depth]) << depth;
    EXPECT_EQ(_automaton[state].depth, depth);
    if (depth > 0) {
      EXPECT_EQ(_automaton[state].distance,
                literal.distance(_pattern, depth, _backward).value_or(Automaton::kNotAccepted));
    }
  }

  void expectBehind(std::uint32_t state, std::size_t depth, const Labels& word,
                    std::optional<std::uint32_t> ofWhole) const {
    if (!word.empty()) {
      EXPECT_EQ(_automaton.distanceBehind(state, depth, word.size(),
                                          [&word](std::size_t at) { return word[at]; }),
                ofWhole.value_or(Automaton::kNotAccepted));
    }
    if (ofWhole) {
      const auto rest = std::min<std::size_t>(word.size() - depth, image::kLengthCap);
      EXPECT_LE(_automaton[state].leastRest, rest);
      EXPECT_GE(_automaton[state].mostRest, rest);
    }
  }

  const Pattern& _pattern;
  std::uint64_t _start;
  bool _backward;
  AutomatonMemory& _memory;
  Automaton _automaton;
};

/// A query's length, mostly short; some have no table of labels, some are longer than rests are
/// told.
std::size_t anyLength(Random& random) {
  constexpr std::size_t kLong = 400;
  switch (random() % 20) {
    case 0:
      return 40 + random() % 40;
    case 1:
      return kLong;
    default:
      return 1 + random() % 12;
  }
}

HeadLimit anyLimit(Random& random, std::size_t length, unsigned mostEdits) {
  return {random() % (length + 1), static_cast<unsigned>(random() % (mostEdits + 1)),
          random() % 2 == 0};
}

constexpr int kQueries = 400;
constexpr int kWords = 20;

/// Whether the words of a query with these units were mostly accepted is told by the count.
template <unsigned K, unsigned Lanes, typename Pattern>
std::size_t readWords(const std::vector<QueryUnit>& units, const Pattern& pattern,
                      std::uint64_t start, bool backward, std::size_t letters, Random& random,
                      AutomatonMemory& memory) {
  Reader<K, Lanes, Pattern> reader(pattern, start, backward, memory);
  std::size_t accepted = 0;
  for (int i = 0; i < kWords; ++i) {
    accepted += reader.read(wordNear(units, random, letters), i % 2 == 0, random) ? 1U : 0U;
  }
  return accepted;
}

template <unsigned K, unsigned Lanes>
void expectBanded() {
  Random random(K + 10 * Lanes);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  AutomatonMemory memory;
  std::size_t accepted = 0;
  for (int i = 0; i < kQueries && !::testing::Test::HasFailure(); ++i) {
    const std::size_t letters = 1 + random() % kLabels.size();
    const auto units = anyQuery(random, anyLength(random), letters, i % 3 == 0);
    const bool backward = i % 2 == 0;
    const BandedPattern<K, Lanes> pattern(units, anyLimit(random, units.size(), K));
    accepted +=
        readWords<K, Lanes>(units, pattern, backward ? pattern.closedStart() : pattern.start(),
                            backward, letters, random, memory);
  }
  EXPECT_GT(accepted, kQueries * kWords / 20) << "words that tell something";
}

TEST(LazyAutomatonTest, OfBandsOfOneLane) {
  expectBanded<0, 1>();
  expectBanded<1, 1>();
  expectBanded<2, 1>();
  expectBanded<3, 1>();
  expectBanded<4, 1>();
}

TEST(LazyAutomatonTest, OfBandsOfTwoLanes) {
  expectBanded<1, 2>();
  expectBanded<2, 2>();
  expectBanded<3, 2>();
}

template <unsigned K>
void expectSwaps() {
  Random random(K);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  AutomatonMemory memory;
  std::size_t accepted = 0;
  for (int i = 0; i < kQueries && !::testing::Test::HasFailure(); ++i) {
    const std::size_t letters = 1 + random() % kLabels.size();
    const auto units = anyQuery(random, anyLength(random), letters, false);
    const SwapPattern<K> pattern(units, i % 2 == 0, anyLimit(random, units.size(), K));
    accepted += readWords<K, 1>(units, pattern, pattern.start(), false, letters, random, memory);
  }
  EXPECT_GT(accepted, kQueries * kWords / 20) << "words that tell something";
}

TEST(LazyAutomatonTest, WithSwaps) {
  expectSwaps<1>();
  expectSwaps<2>();
  expectSwaps<3>();
}

TEST(LazyAutomatonTest, MakesEachStateOnce) {
  const std::vector<QueryUnit> units(200, {.label = 1});
  const BandedPattern<2> pattern(units, {0, 2});
  AutomatonMemory memory;
  LazyAutomaton<2, 1, BandedPattern<2>> automaton(pattern, false, memory);
  automaton.begin();
  std::size_t known = 0;
  for (int round = 0; round < 2; ++round) {
    auto state = automaton.at(0, pattern.start());
    for (std::size_t depth = 0; depth < units.size(); ++depth) {
      state = automaton.next(automaton.level(depth), state, depth, 1);
    }
    EXPECT_EQ(automaton[state].distance, 0U);
    EXPECT_TRUE(round == 0 || memory.states.size() == known);
    known = memory.states.size();
  }
  EXPECT_EQ(known, units.size() + 2) << "one for each depth, and the dead one";
}

}  // namespace
}  // namespace wordcatcher
