// Phonetic word mode from end to end: phrases indexed and found by the sound of their words.

#include <gtest/gtest.h>

#include <initializer_list>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "TestSupport.h"
#include "wordcatcher/matcher/KXWordcatcher.h"

namespace wordcatcher {
namespace {

using testing::TemporaryDirectory;
using Records = std::vector<std::pair<std::u16string, std::int64_t>>;

constexpr std::uint64_t kWordMode = 0;
constexpr std::uint64_t kPhoneticMode = 2;

class PhoneticModeTest : public ::testing::Test {
 protected:
  PhoneticModeTest() {
    matcher.setMode(2);
    for (const char16_t* phrase : {u"Catherine Schmidt{ 1 }", u"Stephen Phillips{ 2 }",
                                   u"Catherine Phillips of Gnosall{ 3 }", u"thigh{ 4 }"}) {
      const std::u16string_view data = phrase;
      matcher.index_withData(data.substr(0, data.find(u'{')), data);
    }
    matcher.setMode(1);
  }

  /// One query judged by itself.
  std::optional<Records> query(std::u16string_view text) {
    matcher.setWordsMatched(0);
    const auto result = matcher.query(text);
    if (!result) {
      return std::nullopt;
    }
    Records records;
    for (const auto& record : std::get<std::vector<KXWordcatch>>(*result)) {
      records.emplace_back(record.value(), record.distance());
    }
    return records;
  }

  TemporaryDirectory directory;
  KXWordcatcher matcher{directory.path(), kPhoneticMode};
};

TEST_F(PhoneticModeTest, PhrasesAreFoundByTheirSound) {
  EXPECT_EQ(query(u"Kathryn Shmit"), (Records{{u"Catherine Schmidt{ 1 }", 0}}));
  EXPECT_EQ(query(u"Stefan Filips"), (Records{{u"Stephen Phillips{ 2 }", 0}}));
  EXPECT_EQ(query(u"KATHRYN  SHMIT!"), (Records{{u"Catherine Schmidt{ 1 }", 0}}));
}

TEST_F(PhoneticModeTest, EveryPhraseOfASoundIsFoundAndSurplusWordsOfItCostNothing) {
  EXPECT_EQ(query(u"Kathryn"),
            (Records{{u"Catherine Phillips of Gnosall{ 3 }", 0}, {u"Catherine Schmidt{ 1 }", 0}}));
  EXPECT_EQ(query(u"Filips Kathryn"), (Records{{u"Catherine Phillips of Gnosall{ 3 }", 0}}));
}

TEST_F(PhoneticModeTest, AWordThatIsNotFoundTakesAllPhrasesAway) {
  // SPLN is counted and finds nothing: one hit too few, and 1 is beyond the bound of 0.
  EXPECT_EQ(query(u"Kathryn Zebulon"), Records{});
}

TEST_F(PhoneticModeTest, WordsOfDifferentPhrasesTakeAllPhrasesAway) {
  EXPECT_EQ(query(u"Shmit Stefan"), Records{});
}

TEST_F(PhoneticModeTest, CodesMustMatchExactly) {
  // KTRN is one edit from K0RN.
  EXPECT_EQ(query(u"Katrin"), std::nullopt);
}

TEST_F(PhoneticModeTest, TextsWithoutCodesFindNothing) {
  EXPECT_EQ(query(u""), std::nullopt);
  EXPECT_EQ(query(u"__ 1984"), std::nullopt);
}

TEST_F(PhoneticModeTest, ACodeOfOneDigitIsAWord) {
  // Both are 0, the sound of TH.
  EXPECT_EQ(query(u"thee"), (Records{{u"thigh{ 4 }", 0}}));
  // It is too short to count beside longer codes.
  EXPECT_EQ(query(u"the Kathryn Shmit"), (Records{{u"Catherine Schmidt{ 1 }", 0}}));
}

TEST_F(PhoneticModeTest, APhoneticQueryForbidsEditsFromThenOn) {
  matcher.setOptions(kWordMode);
  EXPECT_NE(query(u"k0rm"), std::nullopt);
  matcher.setOptions(kPhoneticMode);
  EXPECT_EQ(query(u""), std::nullopt);
  matcher.setOptions(kWordMode);
  EXPECT_EQ(query(u"k0rm"), std::nullopt);
  EXPECT_EQ(query(u"k0rn"),
            (Records{{u"Catherine Phillips of Gnosall{ 3 }", 0}, {u"Catherine Schmidt{ 1 }", 0}}));
}

TEST_F(PhoneticModeTest, EarlierHitsStandInForMissingOnes) {
  EXPECT_EQ(query(u"Kathryn Zebulon"), Records{});
  // The counter holds a hit of the query before.
  const auto result = matcher.query(u"Kathryn Zebulon");
  ASSERT_TRUE(result);
  EXPECT_EQ(std::get<std::vector<KXWordcatch>>(*result).size(), 2U);
}

}  // namespace
}  // namespace wordcatcher
