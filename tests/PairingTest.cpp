// The best pairing against all pairings.

#include "wordcatcher/matcher/Pairing.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <random>
#include <tuple>
#include <vector>

namespace wordcatcher {
namespace {

constexpr std::uint64_t kManySteps = 10'000'000;

/// The options of each word of a phrase.
using Options = std::vector<std::vector<PairOption>>;

struct Solution {
  PairingScore score;
  std::vector<Pair> pairs;
};

/// Takes the steps that it needs off `steps`.
Solution solveWithin(std::uint64_t& steps, Pairing& pairing, const Options& options) {
  pairing.start();
  for (const auto& ofWord : options) {
    pairing.nextWord();
    for (const auto& option : ofWord) {
      pairing.add(option);
    }
  }
  const PairingScore score = pairing.solve(steps);
  return {score, {pairing.pairs().begin(), pairing.pairs().end()}};
}

Solution solve(Pairing& pairing, const Options& options) {
  std::uint64_t steps = kManySteps;
  return solveWithin(steps, pairing, options);
}

/// What the header says of a pairing.
Solution scored(const std::vector<Pair>& pairs) {
  Solution solution = {{}, pairs};
  PairingScore& score = solution.score;
  for (std::size_t i = 0; i < pairs.size(); ++i) {
    const PairOption& option = pairs[i].option;
    score.gain += 2U * (option.textWords + option.phraseWords) - option.edits;
    score.words += option.phraseWords;
    score.exact += option.edits == 0 ? option.phraseWords : 0U;
    if (i > 0) {
      const Pair& last = pairs[i - 1];
      const bool isDirectly =
          last.phrasePosition + last.option.phraseWords == pairs[i].phrasePosition &&
          last.option.position + last.option.textWords == option.position;
      score.disorder += isDirectly ? 0 : (last.option.position < option.position ? 1 : 2);
    }
  }
  return solution;
}

/// All that the order of pairings looks at: the smallest is the best.
auto keyOf(const Solution& solution) {
  const PairingScore& score = solution.score;
  std::vector<std::uint32_t> inText;
  std::vector<std::uint32_t> inPhrase;
  for (const Pair& pair : solution.pairs) {
    inText.push_back(pair.option.position);
    inPhrase.push_back(pair.phrasePosition);
  }
  return std::make_tuple(~score.gain, ~score.words, ~score.exact, score.disorder, inText, inPhrase);
}

/// Calls `visit` with every one-to-one pairing.
void forEachPairing(const Options& options, std::size_t textWords,
                    const std::function<void(const std::vector<Pair>&)>& visit) {
  std::vector<Pair> chosen;
  std::vector<bool> taken(textWords);
  const std::function<void(std::uint32_t)> from = [&](std::uint32_t position) {
    if (position >= options.size()) {
      visit(chosen);
      return;
    }
    from(position + 1);
    for (const PairOption& option : options[position]) {
      const auto last = option.position + option.textWords - 1U;
      if (taken[option.position] || taken[last]) {
        continue;
      }
      taken[option.position] = true;
      taken[last] = true;
      chosen.push_back({position, option});
      from(position + option.phraseWords);
      chosen.pop_back();
      taken[option.position] = false;
      taken[last] = false;
    }
  };
  from(0);
}

Solution bestOfAll(const Options& options, std::size_t textWords) {
  Solution best;
  forEachPairing(options, textWords, [&best](const std::vector<Pair>& pairs) {
    Solution solution = scored(pairs);
    if (keyOf(solution) < keyOf(best)) {
      best = std::move(solution);
    }
  });
  return best;
}

Options anyOptions(std::size_t phraseWords, std::size_t textWords, bool joins,
                   std::mt19937& random) {
  Options options(phraseWords);
  const auto edits = [&random] { return static_cast<std::uint8_t>(random() % 4); };
  const std::size_t rarity = 1 + random() % 4;
  for (std::size_t i = 0; i < phraseWords; ++i) {
    for (std::uint32_t j = 0; j < textWords; ++j) {
      if (random() % rarity == 0) {
        options[i].push_back({j, 1, 1, edits()});
      }
      if (joins && j + 1 < textWords && random() % 6 == 0) {
        options[i].push_back({j, 2, 1, 1});
      }
    }
    for (std::uint32_t j = 0; j < textWords; ++j) {
      if (joins && i + 1 < phraseWords && random() % 6 == 0) {
        options[i].push_back({j, 1, 2, 1});
      }
    }
  }
  return options;
}

void expectBest(Pairing& pairing, const Options& options, std::size_t textWords) {
  const Solution found = solve(pairing, options);
  const Solution best = bestOfAll(options, textWords);
  ASSERT_TRUE(keyOf(scored(found.pairs)) == keyOf(found)) << "the score is that of the pairs";
  ASSERT_TRUE(keyOf(found) == keyOf(best))
      << "gain " << found.score.gain << " for " << best.score.gain << ", words "
      << found.score.words << " for " << best.score.words << ", exact " << found.score.exact
      << " for " << best.score.exact << ", disorder " << found.score.disorder << " for "
      << best.score.disorder;
  ASSERT_TRUE(pairing.isExact());
}

TEST(PairingTest, IsTheBestOfAllPairings) {
  std::mt19937 random(21);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  for (int i = 0; i < 20000 && !HasFailure(); ++i) {
    const std::size_t textWords = 1 + random() % 5;
    Pairing pairing(textWords);
    // One object pairs many phrases, and must not remember any.
    for (int phrase = 0; phrase < 3; ++phrase) {
      expectBest(pairing, anyOptions(random() % 5, textWords, i % 2 == 0, random), textWords);
    }
  }
}

TEST(PairingTest, OfLongerPhrasesWithFewOptions) {
  std::mt19937 random(22);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  for (int i = 0; i < 1000 && !HasFailure(); ++i) {
    const std::size_t textWords = 6 + random() % 4;
    Pairing pairing(textWords);
    Options options(7);
    for (auto& ofWord : options) {
      for (std::uint32_t j = 0; j < textWords; ++j) {
        if (random() % 5 == 0) {
          ofWord.push_back({j, 1, 1, static_cast<std::uint8_t>(random() % 2)});
        }
      }
    }
    expectBest(pairing, options, textWords);
  }
}

TEST(PairingTest, LessEditsComeBeforeEverythingElse) {
  Pairing pairing(4);
  // One word behind the other with two edits each, or in the other order with two edits in all.
  const Solution found = solve(pairing, {{{0, 1, 1, 2}, {3, 1, 1, 0}}, {{1, 1, 1, 2}}});
  ASSERT_EQ(found.pairs.size(), 2U);
  EXPECT_EQ(found.pairs[0].option.position, 3U);
  EXPECT_EQ(found.score.gain, 6U);
  EXPECT_EQ(found.score.disorder, 2U);
}

TEST(PairingTest, MoreWordsComeBeforeExactOnes) {
  Pairing pairing(2);
  // The word 0 exactly (4), or the words 0 and 1 with three and one edits (1 + 3).
  const Solution found = solve(pairing, {{{0, 1, 1, 0}, {1, 1, 1, 3}}, {{0, 1, 1, 1}}});
  EXPECT_EQ(found.score.gain, 4U);
  EXPECT_EQ(found.score.words, 2U);
  EXPECT_EQ(found.score.exact, 0U);
}

TEST(PairingTest, AnOnlyWordJoinsWithTheNextBeforeItIsJoined) {
  Pairing pairing(3);
  // The text's words 0 and 1 are the phrase's word 0, or word 2 is its words 0 and 1.
  const Solution found = solve(pairing, {{{0, 2, 1, 1}, {2, 1, 2, 1}}, {}});
  ASSERT_EQ(found.pairs.size(), 1U);
  EXPECT_EQ(found.pairs[0].option.position, 2U);
  EXPECT_EQ(found.score.gain, 5U);
  EXPECT_EQ(found.score.words, 2U);
}

TEST(PairingTest, ExactWordsComeBeforeTheirOrder) {
  Pairing pairing(4);
  // 1 + 1 edits side by side, or 0 + 2 apart.
  const Solution found =
      solve(pairing, {{{0, 1, 1, 1}, {3, 1, 1, 0}}, {{0, 1, 1, 2}, {1, 1, 1, 2}, {3, 1, 1, 0}}});
  EXPECT_EQ(found.score.exact, 1U);
  EXPECT_EQ(found.score.gain, 7U);
}

TEST(PairingTest, LessDisorderComesBeforeEarlierWords) {
  Pairing pairing(5);
  const Solution found = solve(pairing, {{{0, 1, 1, 0}, {3, 1, 1, 0}}, {{4, 1, 1, 0}}});
  ASSERT_EQ(found.pairs.size(), 2U);
  EXPECT_EQ(found.pairs[0].option.position, 3U);
  EXPECT_EQ(found.score.disorder, 0U);
}

TEST(PairingTest, WordsBetweenAreLessDisorderThanAnotherOrder) {
  Pairing pairing(6);
  const Solution found =
      solve(pairing, {{{2, 1, 1, 0}}, {{0, 1, 1, 0}, {1, 1, 1, 0}, {4, 1, 1, 0}, {5, 1, 1, 0}}});
  ASSERT_EQ(found.pairs.size(), 2U);
  EXPECT_EQ(found.pairs[1].option.position, 4U);
  EXPECT_EQ(found.score.disorder, 1U);
  EXPECT_EQ(solve(pairing, {{{2, 1, 1, 0}}, {{0, 1, 1, 0}, {1, 1, 1, 0}}}).score.disorder, 2U);
}

TEST(PairingTest, NothingToPair) {
  Pairing pairing(3);
  for (const Options& options : {Options(), Options(5)}) {
    const Solution found = solve(pairing, options);
    EXPECT_EQ(found.score.gain, 0U);
    EXPECT_TRUE(found.pairs.empty());
    EXPECT_TRUE(pairing.isExact());
  }
}

/// A phrase of equal words in a text in which every second word is one.
Options everySecond(std::size_t phraseWords, std::size_t textWords) {
  std::vector<PairOption> ofWord;
  for (std::uint32_t j = 0; j < textWords; j += 2) {
    ofWord.push_back({j, 1, 1, 0});
  }
  return Options(phraseWords, ofWord);
}

void expectOneToOne(const Solution& found, std::size_t textWords) {
  std::vector<bool> taken(textWords);
  std::uint32_t nextPosition = 0;
  for (const Pair& pair : found.pairs) {
    EXPECT_GE(pair.phrasePosition, nextPosition);
    nextPosition = pair.phrasePosition + pair.option.phraseWords;
    for (std::uint32_t i = 0; i < pair.option.textWords; ++i) {
      EXPECT_FALSE(taken[pair.option.position + i]);
      taken[pair.option.position + i] = true;
    }
  }
  EXPECT_TRUE(keyOf(scored(found.pairs)) == keyOf(found));
}

TEST(PairingTest, ABudgetBoundsTheWork) {
  // More words want a place than there are.
  constexpr std::size_t kTextWords = 20;
  const Options options = everySecond(12, kTextWords);
  for (const std::uint64_t budget : {0U, 1U, 10U, 600U, 1000U, 100000U}) {
    Pairing pairing(kTextWords);
    std::uint64_t steps = budget;
    const Solution found = solveWithin(steps, pairing, options);
    EXPECT_LE(steps, budget);
    expectOneToOne(found, kTextWords);
    EXPECT_FALSE(pairing.isExact());
    EXPECT_EQ(steps, 0U);
    if (budget >= 600) {
      EXPECT_EQ(found.score.words, kTextWords / 2) << "the best so far";
    }
  }
}

TEST(PairingTest, LongPhrasesArePairedWithoutTryingAll) {
  // As deep as the phrase is long, trying all would need more stack than there is.
  constexpr std::size_t kTextWords = 4096;
  constexpr std::size_t kWanted = 20;  // words of the text that all of the phrase want
  Pairing pairing(kTextWords);
  const Solution found = solve(pairing, everySecond(1500, 2 * kWanted));
  expectOneToOne(found, kTextWords);
  EXPECT_EQ(found.score.words, kWanted);
  EXPECT_FALSE(pairing.isExact());
}

TEST(PairingTest, LongPhrasesWhoseWordsDoNotMeetAreExact) {
  constexpr std::size_t kWords = 20000;
  Options options(kWords);
  for (std::uint32_t i = 0; i < kWords; ++i) {
    options[i].push_back({i, 1, 1, 0});
  }
  Pairing pairing(kWords);
  const Solution found = solve(pairing, options);
  EXPECT_EQ(found.score.words, kWords);
  EXPECT_EQ(found.score.disorder, 0U);
  EXPECT_TRUE(pairing.isExact());
}

}  // namespace
}  // namespace wordcatcher
