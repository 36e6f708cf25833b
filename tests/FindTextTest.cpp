// What is looked up for a word of a text: as few edits as the limits of the stored words leave.

#include "wordcatcher/matcher/FindText.h"

#include <gtest/gtest.h>

#include <array>
#include <string>
#include <utility>

namespace wordcatcher {
namespace {

/// The edits within which a word is looked up, and the length from which on words may have them.
std::pair<std::uint32_t, std::size_t> lookedUp(const std::string& word, const EditLimits& limits,
                                               MatchingMode mode = MatchingMode::words) {
  WordSegmenter segmenter;
  const FindText text(word, mode, limits, segmenter, 10, 100);
  const NearLimit limit = text.nearLimit(text.words.at(0));
  return {limit.edits, limit.fromLength};
}

std::pair<std::uint32_t, std::size_t> lookedUp(std::size_t length, const EditLimits& limits) {
  return lookedUp(std::string(length, 'a'), limits);
}

using Limit = std::pair<std::uint32_t, std::size_t>;

TEST(NearLimitTest, OfTheDefaultLimits) {
  // Stored words have 1 edit from 3 code units on, and 2 from 6 on.
  const std::array<Limit, 10> expected = {
      {{0, 0}, {1, 3}, {1, 3}, {2, 6}, {2, 6}, {2, 6}, {2, 6}, {2, 6}, {2, 7}, {2, 8}}};
  for (std::size_t length = 1; length <= expected.size(); ++length) {
    EXPECT_EQ(lookedUp(length, {}), expected.at(length - 1)) << length;
  }
}

TEST(NearLimitTest, OfLimitsThatShrinkWithTheLength) {
  const EditLimits limits = {3, 5, 2, 1, 0};
  const std::array<Limit, 7> expected = {{{2, 0}, {2, 0}, {2, 1}, {2, 2}, {2, 3}, {1, 5}, {0, 0}}};
  for (std::size_t length = 1; length <= expected.size(); ++length) {
    EXPECT_EQ(lookedUp(length, limits), expected.at(length - 1)) << length;
  }
}

TEST(NearLimitTest, OfNumbersTextsAndCodes) {
  EditLimits limits;
  EXPECT_EQ(lookedUp("covid19", limits), Limit(0, 0));
  limits.numberEdits = 1;
  EXPECT_EQ(lookedUp("covid19", limits), Limit(1, 6));
  EXPECT_EQ(lookedUp("a1", limits), Limit(1, 3));
  EXPECT_EQ(lookedUp("covid19", limits, MatchingMode::wholeText), Limit(3, 4));
  EXPECT_EQ(lookedUp("Catherine", limits, MatchingMode::phoneticWords), Limit(0, 0));
}

}  // namespace
}  // namespace wordcatcher
