// The automaton that is read from a table against the pattern that is simulated for each query, and
// the walks' bounds against the words that are accepted.

#include "wordcatcher/fuzzy/TableAutomaton.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <random>
#include <vector>

#include "LabelRows.h"
#include "wordcatcher/fuzzy/SwapAutomaton.h"

namespace wordcatcher {
namespace {

using testing::edited;
using testing::Labels;
using testing::labelsUpTo;
using Random = std::mt19937;

std::vector<QueryUnit> unitsOf(const Labels& query) {
  std::vector<QueryUnit> units(query.size());
  std::transform(query.begin(), query.end(), units.begin(),
                 [](std::uint16_t label) { return QueryUnit{.label = label}; });
  return units;
}

/// The three ways to limit a query's head that there are tables for.
enum class Limit { first, second, none };

/// A query in both forms.
template <unsigned K>
class Both {
 public:
  using Table = SwapTable<K>;
  using Automaton = TableAutomaton<K>;

  Both(const std::vector<QueryUnit>& units, bool swaps, Limit limit, std::size_t head,
       int leastLonger)
      : _literal(units, swaps, literalLimit(limit, head)),
        _leastLength(static_cast<std::ptrdiff_t>(units.size()) + leastLonger),
        _table(limit == Limit::none
                   ? TablePattern<K>(units, Table::ofFirst(swaps, leastLonger))
                   : TablePattern<K>(units,
                                     limit == Limit::first ? Table::ofFirst(swaps, leastLonger)
                                                           : Table::ofSecond(swaps, leastLonger),
                                     head)),
        _automaton(_table, false, _memory) {}

  /// Compares what both say of a word; whether they accept it.
  bool expectSame(const Labels& word) {
    std::uint64_t set = _literal.start();
    for (std::size_t depth = 0; depth < word.size() && set != 0; ++depth) {
      set = stepped(set, depth, word[depth]);
    }
    const std::uint64_t accepted = set == 0 ? 0 : set & _literal.acceptingAt(word.size());
    const bool isLongEnough = static_cast<std::ptrdiff_t>(word.size()) >= _leastLength;
    const bool isAccepted =
        accepted != 0 && (isLongEnough || SwapBand<K>::distanceOf(accepted) < K);
    const std::uint32_t distance =
        isAccepted ? SwapBand<K>::distanceOf(accepted) : Automaton::kNotAccepted;
    expectWalk(word, distance);
    return isAccepted;
  }

 private:
  static HeadLimit literalLimit(Limit limit, std::size_t head) {
    return limit == Limit::first    ? HeadLimit{head, Halves<K>::kInFirst, true}
           : limit == Limit::second ? HeadLimit{head, Halves<K>::kInSecond, false}
                                    : HeadLimit{0, K, false};
  }

  std::uint64_t stepped(std::uint64_t set, std::size_t depth, std::uint16_t label) const {
    return (_literal.editedAt(set, depth) |
            _literal.closedAt(_literal.matchedAt(set, depth, label), depth + 1)) &
           _literal.validAt(depth + 1);
  }

  /// Reads a word as a walk does that goes down to it, or reads its rest at once from anywhere.
  void expectWalk(const Labels& word, std::uint32_t distance) {
    const auto labelAt = [&word](std::size_t at) { return word[at]; };
    const bool isAccepted = distance != Automaton::kNotAccepted;
    auto state = _automaton.at(0, _table.start());
    for (std::size_t depth = 0; depth <= word.size(); ++depth) {
      _automaton.enter(depth);
      EXPECT_EQ(_automaton.distanceBehind(state, depth, word.size(), labelAt), distance) << depth;
      const auto level = _automaton.level(depth);
      EXPECT_EQ(level.distance(state), _automaton.distanceAnywhere(state, depth));
      const auto rest =
          static_cast<std::uint8_t>(std::min<std::size_t>(word.size() - depth, image::kLengthCap));
      EXPECT_TRUE(!isAccepted || level.fits(state, rest, rest) == 1U) << depth;
      if (depth == word.size()) {
        EXPECT_EQ(level.distance(state), distance);
        return;
      }
      const auto next = _automaton.nextAnywhere(state, depth, word[depth]);
      EXPECT_EQ(_automaton.next(level, state, depth, word[depth]), next);
      EXPECT_TRUE(next != Automaton::kDead || !isAccepted) << depth;
      const std::uint64_t bit = std::uint64_t{1} << image::labelBit(word[depth]);
      EXPECT_TRUE(!isAccepted || word[depth] == 0 || (level.wanted(state) & bit) != 0) << depth;
      if (next == Automaton::kDead) {
        // As LazyAutomaton, it is not asked about what is behind.
        EXPECT_EQ(_automaton.level(depth + 1).fits(next, 0, UINT8_MAX), 0U);
        EXPECT_EQ(_automaton.level(depth + 1).wanted(next), 0U);
        return;
      }
      state = next;
    }
  }

  SwapPattern<K> _literal;
  std::ptrdiff_t _leastLength;  // of words of K edits
  TablePattern<K> _table;
  AutomatonMemory _memory;
  Automaton _automaton;
};

constexpr std::array<Limit, 3> kLimits = {Limit::first, Limit::second, Limit::none};

template <unsigned K>
void expectSmallWorld(std::size_t length, std::uint16_t letters) {
  const auto words = labelsUpTo(length + 1, letters);
  std::size_t accepted = 0;
  for (const auto& query : labelsUpTo(length, letters)) {
    const auto units = unitsOf(query);
    for (const Limit limit : kLimits) {
      for (std::size_t head = 0; head <= (limit == Limit::none ? 0 : query.size()); ++head) {
        for (int leastLonger = -int{K}; leastLonger <= int{K}; ++leastLonger) {
          for (const bool swaps : {false, true}) {
            Both<K> both(units, swaps, limit, head, leastLonger);
            for (const auto& word : words) {
              accepted += both.expectSame(word) ? 1U : 0U;
            }
            ASSERT_FALSE(::testing::Test::HasFailure())
                << ::testing::PrintToString(query) << ", head " << head << ", limit "
                << static_cast<int>(limit) << (swaps ? ", swaps" : "") << ", longer by "
                << leastLonger;
          }
        }
      }
    }
  }
  EXPECT_GT(accepted, 10000U);
}

TEST(TableAutomatonTest, EveryQueryOfTwoLetters) {
  expectSmallWorld<1>(5, 2);
  expectSmallWorld<2>(5, 2);
}

TEST(TableAutomatonTest, EveryQueryOfThreeLetters) {
  expectSmallWorld<1>(4, 3);
  expectSmallWorld<2>(4, 3);
}

template <unsigned K>
void expectLongQueries() {
  Random random(K);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  // Common labels, rare ones, and, for a word of a damaged image, 0 and more than there are.
  const std::vector<std::uint16_t> all = {1, 2, 62, 63, 64, 300, 0, 65535};
  std::size_t accepted = 0;
  for (const std::size_t length : {6U, 20U, 50U, 56U, 57U, 58U, 59U, 60U, 61U, 70U, 300U}) {
    for (int round = 0; round < 60; ++round) {
      const std::vector<std::uint16_t> letters(all.begin(), all.begin() + 1 + round % 8);
      const auto anyLetter = [&] { return letters[random() % letters.size()]; };
      const Labels query = edited(Labels(length, 1), length, random, anyLetter);
      const Limit limit = kLimits[random() % kLimits.size()];
      const auto units = unitsOf(query);
      const std::size_t head = random() % (query.size() + 1);
      const int leastLonger = static_cast<int>(random() % (2 * K + 1)) - int{K};
      Both<K> both(units, round % 2 == 0, limit, head, leastLonger);
      for (int word = 0; word < 20; ++word) {
        accepted += both.expectSame(edited(query, random() % (K + 2), random, anyLetter)) ? 1U : 0U;
        if (::testing::Test::HasFailure()) {
          return;
        }
      }
      both.expectSame(Labels(query.size() + 200, 1));
    }
  }
  EXPECT_GT(accepted, 4000U);
}

TEST(TableAutomatonTest, LongQueriesAndRareLetters) {
  expectLongQueries<1>();
  expectLongQueries<2>();
}

}  // namespace
}  // namespace wordcatcher
