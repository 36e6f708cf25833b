#include "wordcatcher/phonetic/WordPredicates.h"

#include <gtest/gtest.h>

#include <limits>

namespace wordcatcher {
namespace {

constexpr std::u16string_view kEdge = u" EDGE ";

TEST(WordPredicatesTest, APieceIsClippedAtTheEnd) {
  EXPECT_EQ(substring(kEdge, 1, 4), u"EDGE");
  EXPECT_EQ(substring(kEdge, 4, 5), u"E ");
  EXPECT_EQ(substring(kEdge, 0, std::numeric_limits<std::size_t>::max()), kEdge);
  EXPECT_EQ(substring(kEdge, 2, 0), u"");
}

TEST(WordPredicatesTest, ANegativeStartIsMovedWithoutShorteningThePiece) {
  EXPECT_EQ(substring(kEdge, -1, 3), u" ED");
  EXPECT_EQ(substring(kEdge, std::numeric_limits<std::int64_t>::min(), 2), u" E");
}

TEST(WordPredicatesTest, NothingIsLeftAtTheEndAndBeyond) {
  EXPECT_EQ(substring(kEdge, 6, 1), u"");
  EXPECT_EQ(substring(kEdge, 7, 1), u"");
  EXPECT_EQ(substring(kEdge, std::numeric_limits<std::int64_t>::max(), 6), u"");
  EXPECT_EQ(substring(u"", 0, 1), u"");
}

TEST(WordPredicatesTest, APieceViewsIntoItsString) {
  EXPECT_EQ(substring(kEdge, 2, 2).data(), kEdge.data() + 2);
}

TEST(WordPredicatesTest, ReadingAtTheEndAndBeyondGivesASpace) {
  EXPECT_EQ(nth(u"EDGE", 0), u'E');
  EXPECT_EQ(nth(u"EDGE", 3), u'E');
  EXPECT_EQ(nth(u"EDGE", 4), u' ');
  EXPECT_EQ(nth(u"EDGE", 5), u' ');
  EXPECT_EQ(nth(u"", std::numeric_limits<std::size_t>::max()), u' ');
}

TEST(WordPredicatesTest, AListIsMatchedWholeAndByCodeUnits) {
  EXPECT_TRUE(_isOneOf(u"DG", {u"DT", u"DG"}));
  EXPECT_FALSE(_isOneOf(u"D", {u"DT", u"DG"}));
  EXPECT_FALSE(_isOneOf(u"DGE", {u"DT", u"DG"}));
  EXPECT_FALSE(_isOneOf(u"dg", {u"DT", u"DG"}));
  EXPECT_FALSE(_isOneOf(u"É", {u"E\u0301"}));
  EXPECT_FALSE(_isOneOf(u"DG", StringList()));
  EXPECT_TRUE(_isOneOf(u"", {u""}));
}

TEST(WordPredicatesTest, APieceIsComparedWithAList) {
  EXPECT_TRUE(ssa(kEdge, 2, 2, {u"DT", u"DG"}));
  EXPECT_FALSE(ssa(kEdge, 1, 2, {u"DT", u"DG"}));
  EXPECT_TRUE(ssa(kEdge, 4, 2, {u"E "}));
  // Clipped to the one space at the end, which is not the two that were asked for.
  EXPECT_FALSE(ssa(kEdge, 5, 2, {u"  "}));
  EXPECT_TRUE(ssa(kEdge, 5, 2, {u" "}));
  EXPECT_TRUE(ssa(kEdge, -2, 3, {u" ED"}));
  static constexpr std::u16string_view kTable[] = {u"EDG", u"DGE"};
  EXPECT_TRUE(ssa(kEdge, 2, 3, kTable));
}

TEST(WordPredicatesTest, YIsAVowelAndOnlyUpperCaseLettersAre) {
  for (const std::u16string_view vowel : {u"A", u"E", u"I", u"O", u"U", u"Y"}) {
    EXPECT_TRUE(_isVowel(vowel, 0));
  }
  for (const std::u16string_view other : {u"a", u"y", u"W", u"É", u" ", u""}) {
    EXPECT_FALSE(_isVowel(other, 0));
  }
  EXPECT_FALSE(_isVowel(kEdge, 0));
  EXPECT_TRUE(_isVowel(kEdge, 1));
  EXPECT_FALSE(_isVowel(kEdge, 6));
  EXPECT_TRUE(_isVowel(u"EDGE", -1));
}

TEST(WordPredicatesTest, WAndKAndCzAreSlavoGermanic) {
  EXPECT_TRUE(_slavoGermanic(u" WAGNER "));
  EXPECT_TRUE(_slavoGermanic(u" NOWAK "));
  EXPECT_TRUE(_slavoGermanic(u" DEKKER "));
  EXPECT_TRUE(_slavoGermanic(u" CZAR "));
  EXPECT_TRUE(_slavoGermanic(u" HOROWITZ "));
  EXPECT_FALSE(_slavoGermanic(u" GIOVANNI "));
  EXPECT_FALSE(_slavoGermanic(u" ZC "));
  EXPECT_FALSE(_slavoGermanic(u" wagner "));
  EXPECT_FALSE(_slavoGermanic(u""));
}

TEST(WordPredicatesTest, AnswersAreKnownToTheCompiler) {
  static_assert(substring(u" EDGE ", -1, 3) == u" ED");
  static_assert(nth(u"EDGE", 4) == u' ');
  static_assert(_isVowel(u" EDGE ", 1));
  static_assert(_slavoGermanic(u" CZAR "));
  SUCCEED();
}

}  // namespace
}  // namespace wordcatcher
