// What an automaton accepts whose head may be passed with few edits only, against a table of edit
// distances with the same limit: every small query, word and limit.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <optional>
#include <vector>

#include "LabelRows.h"
#include "wordcatcher/fuzzy/BandedAutomaton.h"
#include "wordcatcher/fuzzy/SwapAutomaton.h"

namespace wordcatcher {
namespace {

using testing::Labels;
using testing::labelsUpTo;

constexpr std::uint64_t kNever = 1000;

/// The least edits from a query to a word with which the limit is kept; kNever when none do.
std::uint64_t literalEdits(const Labels& query, const Labels& word, bool swaps, HeadLimit limit) {
  const auto kept = [&limit](std::uint64_t edits, bool isOfHead) {
    return isOfHead && edits > limit.edits ? kNever : edits;
  };
  std::vector<std::vector<std::uint64_t>> table(query.size() + 1,
                                                std::vector<std::uint64_t>(word.size() + 1));
  for (std::size_t p = 0; p <= query.size(); ++p) {
    const bool isOfHead = p <= limit.units;  // the query's code unit p - 1
    const bool isBeforeEnd = p < limit.units || (p == limit.units && limit.holdsBorder);
    const bool isSwapOfHead = isOfHead || (p == limit.units + 1 && limit.holdsBorder);
    for (std::size_t d = 0; d <= word.size(); ++d) {
      std::uint64_t least = p == 0 && d == 0 ? 0 : kNever;
      if (p > 0) {
        least = std::min(least, kept(table[p - 1][d] + 1, isOfHead));
      }
      if (d > 0) {
        least = std::min(least, kept(table[p][d - 1] + 1, isBeforeEnd));
      }
      if (p > 0 && d > 0) {
        const std::uint64_t before = table[p - 1][d - 1];
        least = std::min(least, query[p - 1] == word[d - 1] ? before : kept(before + 1, isOfHead));
      }
      if (swaps && p > 1 && d > 1 && query[p - 1] == word[d - 2] && query[p - 2] == word[d - 1]) {
        least = std::min(least, kept(table[p - 2][d - 2] + 1, isSwapOfHead));
      }
      table[p][d] = std::min(least, kNever);
    }
  }
  return table[query.size()][word.size()];
}

/// The distance at which the automaton accepts a word.
template <typename Pattern>
std::optional<std::uint32_t> distance(const Pattern& pattern, std::uint64_t start,
                                      const Labels& word) {
  std::uint64_t set = start;
  for (std::size_t depth = 0; depth < word.size() && set != 0; ++depth) {
    set = (pattern.editedAt(set, depth) |
           pattern.closedAt(pattern.matchedAt(set, depth, word[depth]), depth + 1)) &
          pattern.validAt(depth + 1);
  }
  const std::uint64_t accepted = set == 0 ? 0 : set & pattern.acceptingAt(word.size());
  return accepted == 0 ? std::nullopt : std::optional(Pattern::B::distanceOf(accepted));
}

/// Compares all words for a query and a limit; how many are accepted.
template <unsigned K, typename Pattern>
std::size_t expectAll(const Pattern& pattern, std::uint64_t start, const Labels& query,
                      const std::vector<Labels>& words, bool swaps, HeadLimit limit) {
  std::size_t accepted = 0;
  for (const auto& word : words) {
    const std::uint64_t literal = literalEdits(query, word, swaps, limit);
    const auto expected =
        literal > K ? std::nullopt : std::optional(static_cast<std::uint32_t>(literal));
    const auto found = distance(pattern, start, word);
    EXPECT_EQ(found, expected) << K << " edits, " << limit.units << " units at the head with "
                               << limit.edits << (limit.holdsBorder ? " and its border" : "")
                               << (swaps ? ", swaps" : "") << ", the query "
                               << ::testing::PrintToString(query) << ", the word "
                               << ::testing::PrintToString(word);
    accepted += found ? 1U : 0U;
  }
  return accepted;
}

template <unsigned K>
void expectLimits(std::size_t length, std::uint16_t letters) {
  const auto words = labelsUpTo(length + 1, letters);
  std::size_t accepted = 0;
  for (const auto& query : labelsUpTo(length, letters)) {
    std::vector<QueryUnit> units(query.size());
    std::transform(query.begin(), query.end(), units.begin(),
                   [](std::uint16_t label) { return QueryUnit{.label = label}; });
    for (std::size_t head = 0; head <= query.size(); ++head) {
      for (unsigned edits = 0; edits <= K; ++edits) {
        for (const bool holdsBorder : {false, true}) {
          const HeadLimit limit = {head, edits, holdsBorder};
          const BandedPattern<K> banded(units, limit);
          accepted += expectAll<K>(banded, banded.closedStart(), query, words, false, limit);
          for (const bool swaps : {false, true}) {
            const SwapPattern<K> swapping(units, swaps, limit);
            accepted += expectAll<K>(swapping, swapping.start(), query, words, swaps, limit);
          }
          if (::testing::Test::HasFailure()) {
            return;
          }
        }
      }
    }
  }
  EXPECT_GT(accepted, 10000U);
}

TEST(HeadLimitTest, OfEveryQueryOfTwoLetters) {
  expectLimits<1>(5, 2);
  expectLimits<2>(5, 2);
  expectLimits<3>(5, 2);
}

TEST(HeadLimitTest, OfEveryQueryOfThreeLetters) {
  expectLimits<1>(4, 3);
  expectLimits<2>(4, 3);
}

/// However K edits lie, one of the two halves of a query keeps its limit: the first with its border
/// or the second without.
class HalvesTest : public ::testing::TestWithParam<unsigned> {};

TEST_P(HalvesTest, OneKeepsItsLimit) {
  const unsigned most = GetParam();
  const auto words = labelsUpTo(5, 2);
  for (const auto& query : words) {
    const Labels reversed(query.rbegin(), query.rend());
    for (const auto& word : words) {
      const Labels reversedWord(word.rbegin(), word.rend());
      for (std::size_t half = 0; half <= query.size(); ++half) {
        for (unsigned inFirst = 0; inFirst < most; ++inFirst) {
          for (const bool swaps : {false, true}) {
            const std::uint64_t edits = literalEdits(query, word, swaps, {0, kNever});
            const std::uint64_t first = literalEdits(query, word, swaps, {half, inFirst, true});
            const std::uint64_t second = literalEdits(
                reversed, reversedWord, swaps, {query.size() - half, most - inFirst - 1, false});
            ASSERT_TRUE(edits > most || std::min(first, second) == edits)
                << ::testing::PrintToString(query) << ", " << ::testing::PrintToString(word);
          }
        }
      }
    }
  }
}

INSTANTIATE_TEST_SUITE_P(Edits, HalvesTest, ::testing::Values(1, 2, 3, 4));

}  // namespace
}  // namespace wordcatcher
