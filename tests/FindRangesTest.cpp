// Where matches stand in the text as the host gave it.

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <algorithm>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "FindSupport.h"
#include "RealWords.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using testing::indexOfPhrases;
using testing::unlimited;

/// The pieces of the text that the hits of the first match stand for, and its whole range.
struct Found {
  std::string value;
  std::vector<std::string> hits;
  std::string range;

  friend bool operator==(const Found&, const Found&) = default;
};

std::ostream& operator<<(std::ostream& stream, const Found& found) {
  stream << found.value << ':';
  for (const auto& hit : found.hits) {
    stream << " [" << hit << ']';
  }
  return stream << " in [" << found.range << ']';
}

Found firstIn(const Index& index, std::string_view text) {
  const auto result = index.find(text);
  if (result.matches.empty()) {
    return {};
  }
  const auto& match = result.matches[0];
  Found found;
  found.value = match.value;
  found.range = text.substr(match.begin, match.end - match.begin);
  for (const auto& hit : match.hits) {
    found.hits.emplace_back(text.substr(hit.begin, hit.end - hit.begin));
  }
  return found;
}

TEST(FindRangesTest, LettersThatGrowOrShrinkInLowerCase) {
  const auto index = indexOfPhrases({"İstanbul Boğazı", "Straße des 17. Juni", "ȺȾ Ⱥ", "Kelvin"});
  EXPECT_EQ(firstIn(index, "İİİİ, İstanbul BOĞAZI!"),
            (Found{"İstanbul Boğazı", {"İstanbul", "BOĞAZI"}, "İstanbul BOĞAZI"}));
  EXPECT_EQ(firstIn(index, "ẞ ß: STRAßE DES 17. JUNI"),
            (Found{"Straße des 17. Juni", {"STRAßE", "DES", "17", "JUNI"}, "STRAßE DES 17. JUNI"}));
  EXPECT_EQ(firstIn(index, "ß STRASSE ß"), (Found{"Straße des 17. Juni", {"STRASSE"}, "STRASSE"}));
  EXPECT_EQ(firstIn(index, "Ⱥ ⱥⱦ ⱥ"), (Found{"ȺȾ Ⱥ", {"ⱥⱦ", "ⱥ"}, "ⱥⱦ ⱥ"}));
  EXPECT_EQ(firstIn(index, "\u212Aelvin"), (Found{"Kelvin", {"\u212Aelvin"}, "\u212Aelvin"}));
}

TEST(FindRangesTest, CombiningMarks) {
  const auto index = indexOfPhrases({"Rhône", "cafe\u0301 noir", "Đặng"});
  EXPECT_EQ(firstIn(index, "e\u0301e\u0301 CAFE\u0301 noir."),
            (Found{"cafe\u0301 noir", {"CAFE\u0301", "noir"}, "CAFE\u0301 noir"}));
  // A letter with its mark in one code unit is another letter, and the mark one more.
  EXPECT_EQ(firstIn(index, "caf\u00E9s noir"), (Found{"cafe\u0301 noir", {"noir"}, "noir"}));
  EXPECT_EQ(firstIn(index, "Rho\u0302nes"), Found()) << "three edits";
}

TEST(FindRangesTest, EmojiAndOtherPlanes) {
  const auto index = indexOfPhrases({"coffee cup", "𐐀𐐁𐐂𐐃", "tea"});
  EXPECT_EQ(firstIn(index, "😀☕ coffee 👩‍👩‍👧 cup 🇩🇪"),
            (Found{"coffee cup", {"coffee", "cup"}, "coffee 👩‍👩‍👧 cup"}));
  EXPECT_EQ(firstIn(index, "😀 𐐨𐐩𐐪𐐫"), (Found{"𐐀𐐁𐐂𐐃", {"𐐨𐐩𐐪𐐫"}, "𐐨𐐩𐐪𐐫"}));
  EXPECT_EQ(firstIn(index, "😀tea😀"), (Found{"tea", {"tea"}, "tea"}));
}

TEST(FindRangesTest, TextsWithoutSpaces) {
  const auto index = indexOfPhrases({"沖縄県", "カタカナ", "ภาษาไทย"});
  for (const std::string phrase : {"沖縄県", "カタカナ", "ภาษาไทย"}) {
    const auto found = firstIn(index, "。" + phrase + "。x");
    EXPECT_EQ(found.value, phrase);
    EXPECT_EQ(found.range, phrase);
  }
}

TEST(FindRangesTest, PhrasesWithinSentencesWithoutSpaces) {
  // Where words end is in ICU's dictionaries alone.
  const auto index = indexOfPhrases({"沖縄県", "ภาษาไทย", "旅行"});
  const auto okinawa = firstIn(index, "私は来年沖縄県に行きます");
  EXPECT_EQ(okinawa.value, "沖縄県");
  EXPECT_EQ(okinawa.range, "沖縄県");
  const auto journey = firstIn(index, "我们明天去旅行了");
  EXPECT_EQ(journey, (Found{"旅行", {"旅行"}, "旅行"}));
  const auto thai = firstIn(index, "ฉันรักภาษาไทยมาก");
  EXPECT_EQ(thai, (Found{"ภาษาไทย", {"ภาษา", "ไทย"}, "ภาษาไทย"}));
}

TEST(FindRangesTest, IllFormedBytesSeparateWords) {
  const auto index = indexOfPhrases({"Trinidad and Tobago"});
  EXPECT_EQ(firstIn(index, "\xFF\xE2\x82trinidad\xC3(and\xF0\x9F\x98tobago\xE2"),
            (Found{"Trinidad and Tobago",
                   {"trinidad", "and", "tobago"},
                   "trinidad\xC3(and\xF0\x9F\x98tobago"}));
  const auto result = index.find("tri\xFFnidad");
  for (const auto& match : result.matches) {
    EXPECT_EQ(match.hits.at(0).edits, 1U) << "two words, joined";
  }
}

TEST(FindRangesTest, PunctuationAndApostrophes) {
  const auto index =
      indexOfPhrases({"Côte d'Ivoire", "won-lost", "St. Kitts & Nevis", "U.S. Army"});
  EXPECT_EQ(firstIn(index, "«Côte -- d'Ivoire»"),
            (Found{"Côte d'Ivoire", {"Côte", "d'Ivoire"}, "Côte -- d'Ivoire"}));
  EXPECT_EQ(firstIn(index, "CÔTE D’IVOIRE…"),
            (Found{"Côte d'Ivoire", {"CÔTE", "D’IVOIRE"}, "CÔTE D’IVOIRE"}));
  EXPECT_EQ(firstIn(index, "(WonLost)"), (Found{"won-lost", {"WonLost"}, "WonLost"}));
  EXPECT_EQ(firstIn(index, "(won, lost)"), (Found{"won-lost", {"won", "lost"}, "won, lost"}));
  EXPECT_EQ(firstIn(index, "...st, kitts/nevis..."),
            (Found{"St. Kitts & Nevis", {"st", "kitts", "nevis"}, "st, kitts/nevis"}));
  EXPECT_EQ(firstIn(index, "the U.S.\tarmy"), (Found{"U.S. Army", {"U.S", "army"}, "U.S.\tarmy"}));
}

TEST(FindRangesTest, JoinedWordsHaveTheRangeOfBoth) {
  const auto index = indexOfPhrases({"railway station", "fish and chips"});
  const auto split = firstIn(index, "Rail -- Way station");
  EXPECT_EQ(split, (Found{"railway station", {"Rail -- Way", "station"}, "Rail -- Way station"}));
  const auto joined = index.find("fishand chips").matches;
  ASSERT_EQ(joined.size(), 1U);
  EXPECT_EQ(joined[0].cost, 1U);
  EXPECT_EQ(joined[0].hits[0].word, "fish and");
}

TEST(FindRangesTest, AWrongKeyForTheSpace) {
  const auto index = indexOfPhrases({"railway station", "fish and chips", "oak"});
  const auto joined = index.find("The fishnand chips").matches;
  ASSERT_EQ(joined.size(), 1U);
  EXPECT_EQ(joined[0].cost, 3U) << "one edit and a word left over";
  EXPECT_EQ(joined[0].hits, (std::vector<FoundWord>{{4, 12, "fish and", 1}, {13, 18, "chips", 0}}));
  const auto split = index.find("rai way station").matches;
  ASSERT_EQ(split.size(), 1U);
  EXPECT_EQ(split[0].cost, 1U);
  EXPECT_EQ(split[0].hits, (std::vector<FoundWord>{{0, 7, "railway", 1}, {8, 15, "station", 0}}));
  EXPECT_TRUE(index.find("o k").matches.empty()) << "short words are too many things";
}

TEST(FindRangesTest, ALetterForTheSpaceNeedsTwoEdits) {
  const auto index = indexOfPhrases({"gold fish", "goldxrisch", "omega 6", "a1b2c3d"});
  const auto firstForOneEdit = [&index](std::string_view text, const EditLimits& limits) {
    FindOptions options;
    options.edits = limits;
    const auto matches = index.find(text, options).matches;
    return !matches.empty() && matches[0].cost == 1 ? matches[0].value : "";
  };
  EXPECT_EQ(firstForOneEdit("goldnfish", {}), "gold fish");
  EXPECT_EQ(firstForOneEdit("goldnfish", {2, 5, 0, 1, 1}), "");
  EXPECT_EQ(firstForOneEdit("goldnfish", {2, 9, 0, 0, 2}), "");
  EXPECT_EQ(firstForOneEdit("gold risch", {}), "goldxrisch");
  EXPECT_EQ(firstForOneEdit("gold risch", {2, 5, 0, 0, 1}), "");
  EXPECT_EQ(firstForOneEdit("gold risch", {2, 10, 0, 0, 2}), "");
  // Numbers are no other numbers.
  const EditLimits ofNumbers = {2, 5, 0, 1, 2, 3, 2};
  for (const std::string_view text : {"omegax6", "omega76"}) {
    EXPECT_EQ(firstForOneEdit(text, {}), "");
    EXPECT_EQ(firstForOneEdit(text, ofNumbers), "omega 6");
  }
  for (const std::string_view text : {"a1b c3d", "a1 2c3d"}) {
    EXPECT_EQ(firstForOneEdit(text, {}), "");
    EXPECT_EQ(firstForOneEdit(text, ofNumbers), "a1b2c3d");
  }
}

TEST(FindRangesTest, WholeTextsAreOneHit) {
  const auto index = indexOfPhrases({"Rhône, at Lyon"}, MatchingMode::wholeText);
  EXPECT_EQ(firstIn(index, "rhone at lyon"),
            (Found{"Rhône, at Lyon", {"rhone at lyon"}, "rhone at lyon"}));
  EXPECT_EQ(index.find("rhone at lyon").matches.at(0).cost, 2U);
  EXPECT_TRUE(index.find("at the Rhône, at Lyon").matches.empty());
  EXPECT_TRUE(index.find("").matches.empty());
}

TEST(FindRangesTest, CodesHaveTheRangesOfTheirWords) {
  const auto index = indexOfPhrases({"Catherine Smith", "Peter"}, MatchingMode::phoneticWords);
  EXPECT_EQ(firstIn(index, "Dear «Kathryn», SMYTH!"),
            (Found{"Catherine Smith", {"Kathryn", "SMYTH"}, "Kathryn», SMYTH"}));
  EXPECT_EQ(index.find("Kathryn Smyth").matches.at(0).cost, 0U);
  EXPECT_TRUE(index.find("Petersen").matches.empty()) << "codes are compared exactly";
}

TEST(FindRangesTest, PhrasesFindThemselvesByTheirSound) {
  std::mt19937 random(31);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  std::vector<std::string> phrases = {"Côte d'Ivoire",   "mac donald's", "e.g. Xavier",
                                      "won-lost record", "3rd rail",     "Ng",
                                      "9 to 5"};
  for (const auto& lemma : testing::sample(testing::lemmas(), 1500, random)) {
    phrases.push_back(toUtf8(lemma).value());
  }
  const auto index = indexOfPhrases(phrases, MatchingMode::phoneticWords);
  for (const auto& phrase : phrases) {
    const auto explained = index.explain(phrase, phrase);
    if (!explained.phrase.empty()) {
      ASSERT_EQ(explained.cost, 0U) << explained.toText();
    }
  }
}

RC_GTEST_PROP(FindRangesTest, HitsAreTheWordsOfTheText, ()) {
  static const auto index = indexOfPhrases({"İstanbul Boğazı", "Straße", "cafe\u0301 noir",
                                            "沖縄県", "Côte d'Ivoire", "won-lost", "tea", "ȺȾ"});
  const auto piece = rc::gen::element<std::string>(
      "İstanbul", "BOĞAZI", "STRAẞE", "straße", "CAFE\u0301", "noir", "沖縄県", "côte", "d'ivoire",
      "d’ivoire", "won", "lost", "wonlost", "TEA", "ⱥⱦ", " ", " ", " ", "-", "'", "\u0301", "😀",
      "\xFF", "\xE2\x82", "İ", "ß", ".");
  std::string text;
  for (const auto& each : *rc::gen::container<std::vector<std::string>>(piece)) {
    text += each;
  }
  for (const auto& match : index.find(text, unlimited()).matches) {
    RC_ASSERT(match.begin == match.hits.front().begin);
    RC_ASSERT(match.end == match.hits.back().end);
    std::size_t last = 0;
    for (const auto& hit : match.hits) {
      RC_ASSERT(last <= hit.begin);
      RC_ASSERT(hit.begin < hit.end);
      RC_ASSERT(hit.end <= text.size());
      last = hit.end;
      const auto slice = fromUtf8(std::string_view(text).substr(hit.begin, hit.end - hit.begin));
      if (hit.edits == 0) {
        RC_ASSERT(slice.has_value());
        RC_ASSERT(toUtf8(toLower(*slice)) == hit.word);
      }
    }
  }
}

}  // namespace
}  // namespace wordcatcher
