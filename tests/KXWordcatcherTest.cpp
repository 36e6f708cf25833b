#include "wordcatcher/matcher/KXWordcatcher.h"

#include <gtest/gtest.h>

#include <sstream>
#include <unordered_set>

#include "PrivateMember.h"
#include "TestSupport.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"
#include "wordcatcher/matcher/KXWordcatch.h"

namespace wordcatcher::testing {

struct EditDistance {
  friend auto memberOf(EditDistance /*tag*/);
};
template struct PrivateMember<EditDistance, &KXWordcatcher::_editDistance>;

}  // namespace wordcatcher::testing

namespace wordcatcher {
namespace {

using testing::TemporaryDirectory;

/// Value and distance of each record, in the query's order.
using Records = std::vector<std::pair<std::u16string, std::int64_t>>;

std::optional<Records> recordsOf(const std::optional<QueryResult>& result) {
  if (!result) {
    return std::nullopt;
  }
  Records records;
  for (const auto& record : std::get<std::vector<KXWordcatch>>(*result)) {
    records.emplace_back(record.value(), record.distance());
  }
  return records;
}

constexpr const char16_t* kPuppy = u"golden retriever puppy{ 7 }";
constexpr const char16_t* kBridge = u"golden gate bridge{ 8 }";

class KXWordcatcherTest : public ::testing::Test {
 protected:
  void index(std::initializer_list<std::pair<std::u16string_view, std::u16string_view>> phrases) {
    matcher.setMode(2);
    for (const auto& [phrase, data] : phrases) {
      matcher.index_withData(phrase, data);
    }
    matcher.setMode(1);
  }

  void indexTheGoldenOnes() {
    index({{u"golden retriever puppy", kPuppy}, {u"golden gate bridge", kBridge}});
  }

  /// One query judged by itself.
  std::optional<Records> query(std::u16string_view text) {
    matcher.setWordsMatched(0);
    return recordsOf(matcher.query(text));
  }

  TemporaryDirectory directory;
  KXWordcatcher matcher{directory.path(), 0};
};

// The facade

TEST_F(KXWordcatcherTest, StartsClosedWithItsOptionsAndNoHits) {
  const KXWordcatcher fresh(directory.path(), 1);
  EXPECT_EQ(fresh.options(), 1U);
  EXPECT_EQ(fresh.wordsMatched(), 0);
  EXPECT_EQ(fresh.getMode(), 0);
  EXPECT_EQ(fresh.*memberOf(testing::EditDistance()), 2);
}

TEST_F(KXWordcatcherTest, ModesArePassedOn) {
  matcher.setMode(2);
  EXPECT_EQ(matcher.getMode(), 0);
  matcher.setMode(1);
  EXPECT_EQ(matcher.getMode(), 1);
  matcher.setMode(0);
  EXPECT_EQ(matcher.getMode(), 1);
}

TEST_F(KXWordcatcherTest, UnknownOptionsIndexNothingAndAnswerWithNothing) {
  matcher.setOptions(3);
  matcher.setMode(2);
  matcher.index_withData(u"golden gate", u"golden gate");
  matcher.setMode(1);
  EXPECT_EQ(matcher.query(u"golden"), std::nullopt);
  EXPECT_EQ(matcher.wordsMatched(), 0);
  matcher.setOptions(UINT64_MAX);
  EXPECT_EQ(matcher.query(u"golden"), std::nullopt);
  matcher.setOptions(0);
  EXPECT_EQ(query(u"golden"), std::nullopt) << "nothing was indexed";
}

TEST_F(KXWordcatcherTest, WholeTextModeReturnsTheIndexsOwnMatches) {
  matcher.setOptions(1);
  matcher.setMode(2);
  matcher.index_withData(u"São Tomé and Príncipe", u"STP");
  matcher.index_withData(u"Sao Tome", std::nullopt);
  matcher.setMode(1);
  matcher.setWordsMatched(41);
  const auto result = matcher.query(u"Sao Tomé and Principe");
  ASSERT_TRUE(result.has_value());
  const auto& matches = std::get<std::vector<LXFuzzyMatch>>(*result);
  ASSERT_EQ(matches.size(), 1U);
  EXPECT_EQ(matches[0].value(), u"são tomé and príncipe");
  EXPECT_EQ(matches[0].distance(), 2);
  EXPECT_EQ(matches[0].data(), std::vector<std::u16string>{u"STP"});
  EXPECT_EQ(matcher.wordsMatched(), 41);
  EXPECT_EQ(std::get<std::vector<LXFuzzyMatch>>(*matcher.query({})).size(), 0U);
  EXPECT_EQ(matcher.*memberOf(testing::EditDistance()), 2);
  EXPECT_TRUE(std::get<std::vector<LXFuzzyMatch>>(*matcher.query(u"")).empty());
  EXPECT_TRUE(std::get<std::vector<LXFuzzyMatch>>(*matcher.query(u"Kiribati")).empty());
  // Three edits are allowed, four are not.
  EXPECT_EQ(std::get<std::vector<LXFuzzyMatch>>(*matcher.query(u"Sao Tomexxx")).size(), 1U);
  EXPECT_EQ(std::get<std::vector<LXFuzzyMatch>>(*matcher.query(u"Sao Tomexxxx")).size(), 0U);
}

TEST_F(KXWordcatcherTest, WholeTextModeKeepsTheOrderOfTheSearch) {
  matcher.setOptions(1);
  matcher.setMode(2);
  for (const auto* data : {u"1", u"2", u"3"}) {
    matcher.index_withData(u"linz am rhein", data);
  }
  matcher.index_withData(u"linz", u"4");
  matcher.index_withData(u"Linz am Rhei", u"5");
  matcher.setMode(1);
  const auto result = matcher.query(u"Linz am Rhei");
  std::vector<std::u16string> values;
  for (const auto& match : std::get<std::vector<LXFuzzyMatch>>(*result)) {
    values.push_back(match.value());
  }
  EXPECT_EQ(values, (std::vector<std::u16string>{u"linz am rhein", u"linz am rhei"}))
      << "more data before a smaller distance";
}

TEST_F(KXWordcatcherTest, AMovedFromMatcherIsOneOverNothing) {
  indexTheGoldenOnes();
  KXWordcatcher taken = std::move(matcher);
  EXPECT_EQ(taken.getMode(), 1);
  // NOLINTBEGIN(bugprone-use-after-move,clang-analyzer-cplusplus.Move)
  EXPECT_EQ(matcher.getMode(), 0);
  matcher.setMode(2);
  matcher.index_withData(u"nothing", u"nothing");
  EXPECT_EQ(matcher.query(u"nothing"), std::nullopt);
  matcher.setOptions(1);
  EXPECT_TRUE(std::get<std::vector<LXFuzzyMatch>>(*matcher.query(u"nothing")).empty());
  // NOLINTEND(bugprone-use-after-move,clang-analyzer-cplusplus.Move)
  EXPECT_TRUE(taken.query(u"golden").has_value());
}

// The span query

TEST_F(KXWordcatcherTest, FindsAPhraseInMisspelledText) {
  indexTheGoldenOnes();
  EXPECT_EQ(query(u"a goldan retriver"), (Records{{kPuppy, 4}}));
  EXPECT_EQ(matcher.wordsMatched(), 3);
}

TEST_F(KXWordcatcherTest, WordsThatShareNoPhraseCountAgainstIt) {
  indexTheGoldenOnes();
  // 1 + (2 * 2 + 1) for the empty intersection + 2 for one word too many = 8, above the bound 4.
  EXPECT_EQ(query(u"retriver bridge"), Records{});
  EXPECT_EQ(matcher.wordsMatched(), 2);
}

TEST_F(KXWordcatcherTest, WordsThatFindNothingCountAgainstAPhrase) {
  indexTheGoldenOnes();
  // 1 + ((2 - 1) * 2 + 1) for the missing hit + 2 for the length = 6, above the bound 4.
  EXPECT_EQ(query(u"goldan xyzzy"), Records{});
}

TEST_F(KXWordcatcherTest, PhrasesStayInPlayAfterAWordThatSharesNone) {
  indexTheGoldenOnes();
  // Three hits; nothing is common to the first two words, but the third meets the first one's
  // phrases, which counts once more.
  EXPECT_EQ(query(u"retriever bridge golden"), Records{});
  EXPECT_EQ(matcher.wordsMatched(), 4);
}

TEST_F(KXWordcatcherTest, MissingHitsAreCountedBeforePhrasesAreIntersected) {
  index({{u"golden gate bridge", u"golden gate bridge"}, {u"golden hour", u"golden hour"}});
  // Two hits for three counted words: (3 - 2) * 2 + 1. The intersection's own count comes too late.
  matcher.setWordsMatched(0);
  EXPECT_EQ(recordsOf(matcher.query(u"golden bridge xyzzyx")),
            (Records{{u"golden gate bridge", 3}}));
  EXPECT_EQ(matcher.wordsMatched(), 3);
}

TEST_F(KXWordcatcherTest, ATextWithoutWordsOrHitsAnswersWithNothing) {
  indexTheGoldenOnes();
  EXPECT_EQ(query(u""), std::nullopt);
  EXPECT_EQ(query(u" ... "), std::nullopt);
  EXPECT_EQ(query(u"xyzzy plugh"), std::nullopt);
  EXPECT_EQ(query(u"an ox"), std::nullopt);
}

TEST_F(KXWordcatcherTest, ShortWordsAreLookedUpWhenThereIsNoOther) {
  index({{u"ox an", u"ox an"}, {u"go", u"go"}});
  // N = 2; each word finds its phrase's data; "go" is two edits from "ox" but not from "an".
  const auto found = query(u"an ox");
  ASSERT_TRUE(found.has_value());
  // No word of the phrase is counted in C, so |0 - 2| * 2 = 4 = the bound.
  EXPECT_EQ(*found, (Records{{u"ox an", 4}}));
}

TEST_F(KXWordcatcherTest, EachWordOfTheFallbackPassCounts) {
  index({{u"ox", u"ox"}});
  // "ox" alone: N = 1, and 2 for the uncounted phrase word are the bound. A second short word that
  // brings the same phrase makes N = 2, so that 4 are added and allowed.
  EXPECT_EQ(query(u"ox"), (Records{{u"ox", 2}}));
  EXPECT_EQ(query(u"ox \u4E00"), (Records{{u"ox", 4}}));
}

TEST_F(KXWordcatcherTest, WordsOfThreeUnitsAreLookedUpAndNotCounted) {
  index({{u"red fox", u"red fox"}, {u"red fog", u"red fog"}});
  // N = 0, so only distance 0 survives: "fox" finds "fog" at distance 1.
  EXPECT_EQ(query(u"fox red"), (Records{{u"red fox", 0}}));
}

TEST_F(KXWordcatcherTest, WordsWithTheSamePhrasesContributeOnce) {
  index({{u"golden hour", u"golden hour"}});
  // The second word's distance 1 is never added: 0 for the hits, C = 2 = N.
  EXPECT_EQ(query(u"golden goldan"), (Records{{u"golden hour", 0}}));
  EXPECT_EQ(matcher.wordsMatched(), 2) << "no intersection took place";
  EXPECT_EQ(query(u"goldan golden"), (Records{{u"golden hour", 1}}));
}

TEST_F(KXWordcatcherTest, TheFirstMatchOfTheIndexsOrderFixesAPhrasesDistance) {
  // "banner" carries two data strings and so is listed before "manner", which is nearer to the
  // query.
  index({{u"banner manner", u"banner manner"}, {u"banner", u"banner"}});
  EXPECT_EQ(query(u"manner"), (Records{{u"banner", 1}}))
      << "the long phrase has 1, not 0, and 2 more for its length";
  EXPECT_EQ(query(u"manner manner"), (Records{{u"banner manner", 1}, {u"banner", 3}}));
}

TEST_F(KXWordcatcherTest, HitsAccumulateAcrossQueries) {
  indexTheGoldenOnes();
  matcher.query(u"a goldan retriver");
  const auto once = matcher.wordsMatched();
  matcher.query(u"a goldan retriver");
  EXPECT_EQ(matcher.wordsMatched(), 2 * once);
  // With hits to spare the missing word is not penalised: 1 + 2 for the length = 3.
  matcher.setWordsMatched(100);
  EXPECT_EQ(recordsOf(matcher.query(u"goldan xyzzy")), (Records{{kBridge, 3}, {kPuppy, 3}}));
}

TEST_F(KXWordcatcherTest, AnyCounterOfTheHostIsSafe) {
  indexTheGoldenOnes();
  for (const auto count : {INT64_MIN, INT64_MAX}) {
    matcher.setWordsMatched(count);
    EXPECT_TRUE(matcher.query(u"golden retriever").has_value());
  }
}

TEST_F(KXWordcatcherTest, WordsWithoutDataAreHitsWithoutCandidates) {
  matcher.setMode(2);
  matcher.index_withData(u"golden", std::nullopt);
  matcher.setMode(1);
  EXPECT_EQ(query(u"golden"), std::nullopt);
  EXPECT_EQ(matcher.wordsMatched(), 1);
}

TEST_F(KXWordcatcherTest, AValueWithoutFieldsIsMeasuredWhole) {
  index({{u"vienna woods", u"vienna woods"}, {u"vienna woods", u"vienna woods{ hills trees }"}});
  EXPECT_EQ(query(u"vienna woods"),
            (Records{{u"vienna woods", 0}, {u"vienna woods{ hills trees }", 0}}));
  index({{u"vienna woods", u"vienna woods (hills)"}});
  EXPECT_EQ(query(u"vienna woods"), (Records{{u"vienna woods (hills)", 2}}));
}

TEST_F(KXWordcatcherTest, RecordsOfEqualDistanceComeByValue) {
  index({{u"lake", u"b"}, {u"lake", u"a"}, {u"lake", u"c"}});
  EXPECT_EQ(query(u"lake"), (Records{{u"a", 2}, {u"b", 2}, {u"c", 2}}));
}

TEST_F(KXWordcatcherTest, NumbersAndIdeographsAreWords) {
  index({{u"apollo 1969", u"apollo 1969"}, {u"東京タワー", u"東京タワー"}});
  EXPECT_EQ(query(u"apolo 1969"), (Records{{u"apollo 1969", 1}}));
  EXPECT_TRUE(query(u"タワー").has_value());
}

TEST(KXWordcatchTest, IdentityIsTheValueAlone) {
  const KXWordcatch near(u"golden gate", 0);
  const KXWordcatch far(u"golden gate", 5);
  EXPECT_TRUE(near.isEqual(far));
  EXPECT_EQ(near, far);
  EXPECT_EQ(near.hash(), far.hash());
  EXPECT_FALSE(near.isEqual(KXWordcatch(u"Golden gate", 0)));
  std::unordered_set<KXWordcatch> records = {near};
  EXPECT_FALSE(records.insert(far).second);
  EXPECT_EQ(records.begin()->distance(), 0);
}

TEST(KXWordcatchTest, ValueAndDistanceAreReadAndWritten) {
  KXWordcatch record(u"golden gate", 1);
  record.setValue(u"golden hour");
  record.setDistance(-3);
  EXPECT_EQ(record.value(), u"golden hour");
  EXPECT_EQ(record.distance(), -3);
}

TEST(KXWordcatchTest, DescribesItself) {
  std::ostringstream text;
  text << KXWordcatch(u"golden retriever puppy{ 7 }", 4);
  EXPECT_EQ(text.str(), "{KXWordcatch v:\"golden retriever puppy{ 7 }\", dist: 4}");
}

}  // namespace
}  // namespace wordcatcher
