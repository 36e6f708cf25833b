#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <sstream>
#include <stdexcept>

#include "TestSupport.h"

namespace wordcatcher {
namespace {

using testing::outputOf;
using testing::TemporaryDirectory;
using Data = std::vector<std::u16string>;

/// Value, distance and data of each match, in the search's order.
using Rows = std::vector<std::tuple<std::u16string, std::int64_t, Data>>;

Rows rowsOf(const std::vector<LXFuzzyMatch>& matches) {
  Rows rows;
  for (const auto& match : matches) {
    rows.emplace_back(match.value(), match.distance(), match.data());
  }
  return rows;
}

class LXFuzzyIndexTest : public ::testing::Test {
 protected:
  LXFuzzyIndexTest() { index.setMode(2); }

  Rows search(std::optional<std::u16string_view> query, std::int64_t distance) {
    return rowsOf(index.search_withMaxDistance(query, distance));
  }

  void addTheCats() {
    index.addString_withData(u"cat", u"d1");
    index.addString_withData(u"cart", u"d2");
    index.addString_withData(u"at", u"d3");
    index.addString_withData(u"act", u"d4");
    index.addString_withData(u"ca", u"d5");
    index.addString_withData(u"cats", u"d6");
    index.addString_withData(u"cat", u"d7");
    index.addString_withData(u"dog", u"d8");
    index.addString(u"chat");
    index.addString_withData(u"xat", u"d9");
    index.setMode(1);
  }

  TemporaryDirectory directory;
  LXFuzzyIndex index{directory.path()};
};

// Building

TEST_F(LXFuzzyIndexTest, AStringIsAnEdgeACodeUnitAFinalMarkAndItsData) {
  index.addString_withData(u"Cat", u"Felis");
  index.setMode(0);
  EXPECT_EQ(outputOf("cdb -d " + directory.file("edgeTable.tdb")),
            "+0,1:->c\n+1,1:c->a\n+2,1:ca->t\n\n");
  EXPECT_EQ(outputOf("cdb -d " + directory.file("finalTable.tdb")), "+3,1:cat->t\n\n");
  EXPECT_EQ(outputOf("cdb -d " + directory.file("dataTable.tdb")), "+3,5:cat->Felis\n\n");
}

TEST_F(LXFuzzyIndexTest, SharedPrefixesAndRepeatedStringsAreRecordsAgain) {
  index.addString_withData(u"wien", u"a");
  index.addString_withData(u"wies", u"a");
  index.addString_withData(u"wien", u"a");
  index.setMode(1);
  EXPECT_EQ(search(u"wien", 0), (Rows{{u"wien", 0, {u"a"}}}));
  index.setMode(0);
  EXPECT_EQ(outputOf("cdb -s " + directory.file("edgeTable.tdb") + " | head -1"),
            "number of records: 12\n");
  EXPECT_EQ(outputOf("cdb -s " + directory.file("dataTable.tdb") + " | head -1"),
            "number of records: 3\n");
}

TEST_F(LXFuzzyIndexTest, TheEmptyStringIsStoredAndNeverFound) {
  index.addString_withData(u"", u"nothing");
  index.addString_withData(u"a", u"letter");
  index.setMode(1);
  EXPECT_EQ(search(u"a", 3), (Rows{{u"a", 0, {u"letter"}}}));
  index.setMode(0);
  EXPECT_EQ(outputOf("cdb -d " + directory.file("dataTable.tdb")),
            "+0,7:->nothing\n+1,6:a->letter\n\n");
}

TEST_F(LXFuzzyIndexTest, CaseIsNotKept) {
  index.addString_withData(u"ABC", u"upper");
  index.addString_withData(u"abc", u"lower");
  index.setMode(1);
  EXPECT_EQ(search(u"aBc", 0), (Rows{{u"abc", 0, {u"lower", u"upper"}}}));
}

TEST_F(LXFuzzyIndexTest, AStringIsCutByItsLowerCaseForm) {
  // U+0130 is "i" and a combining dot in lower case: two code units.
  index.addString_withData(u"İzmir", u"35");
  index.setMode(1);
  EXPECT_EQ(search(u"i\u0307zmir", 0), (Rows{{u"i\u0307zmir", 0, {u"35"}}}));
  EXPECT_EQ(search(u"İZMİR", 1).size(), 1U) << "one dot more than stored";
}

TEST_F(LXFuzzyIndexTest, WordsOfATextShareItsData) {
  index.addWordsFromString_data(u"New York, NY", u"US-NY");
  index.addWordsFromString_data(u" -- !", u"no word");
  index.setMode(1);
  for (const auto* word : {u"new", u"york", u"ny"}) {
    EXPECT_EQ(search(word, 0), (Rows{{word, 0, {u"US-NY"}}}));
  }
  index.setMode(0);
  EXPECT_EQ(outputOf("cdb -d " + directory.file("dataTable.tdb")),
            "+3,5:new->US-NY\n+4,5:york->US-NY\n+2,5:ny->US-NY\n\n");
}

TEST_F(LXFuzzyIndexTest, DataCanBeAddedToAStringThatHadNone) {
  index.addString(u"linz");
  index.addString_withData(u"linz", u"Donau");
  index.setMode(1);
  EXPECT_EQ(search(u"linz", 0), (Rows{{u"linz", 0, {u"Donau"}}}));
}

TEST_F(LXFuzzyIndexTest, DescribesTheAutomatonOnDisk) {
  std::ostringstream text;
  text << index;
  EXPECT_EQ(text.str().substr(0, 9), "<PLXDFA: ");
}

TEST_F(LXFuzzyIndexTest, ModesArePassedOn) {
  EXPECT_EQ(index.getMode(), 0);
  index.setMode(1);
  EXPECT_EQ(index.getMode(), 1);
  index.setMode(0);
  EXPECT_EQ(index.getMode(), 1);
}

TEST_F(LXFuzzyIndexTest, TheDefaultIndexUsesTheCurrentDirectory) {
  const auto before = std::filesystem::current_path();
  std::filesystem::current_path(directory.path());
  {
    LXFuzzyIndex here;
    here.setMode(2);
    here.addString(u"x");
  }
  std::filesystem::current_path(before);
  EXPECT_TRUE(std::filesystem::exists(directory.file("test_edgeTable.tdb")));
}

// Searching

TEST_F(LXFuzzyIndexTest, FindsTheNeighboursOfCat) {
  addTheCats();
  EXPECT_EQ(search(u"Cat", 1), (Rows{{u"cat", 0, {u"d1", u"d7"}},
                                     {u"ca", 1, {u"d5"}},
                                     {u"xat", 1, {u"d9"}},
                                     {u"cart", 1, {u"d2"}},
                                     {u"cats", 1, {u"d6"}},
                                     {u"chat", 1, {}}}));
  EXPECT_EQ(search(u"Cat", 2), (Rows{{u"cat", 0, {u"d1", u"d7"}},
                                     {u"ca", 1, {u"d5"}},
                                     {u"xat", 1, {u"d9"}},
                                     {u"cart", 1, {u"d2"}},
                                     {u"cats", 1, {u"d6"}},
                                     {u"at", 2, {u"d3"}},
                                     {u"act", 2, {u"d4"}},
                                     {u"chat", 1, {}}}));
}

TEST_F(LXFuzzyIndexTest, NullAndEmptyQueriesFindNothing) {
  addTheCats();
  EXPECT_EQ(search(std::nullopt, 2), Rows{});
  EXPECT_EQ(search(u"", 2), Rows{});
}

TEST_F(LXFuzzyIndexTest, DistanceZeroIsExactAndNegativeFindsNothing) {
  addTheCats();
  EXPECT_EQ(search(u"cat", 0), (Rows{{u"cat", 0, {u"d1", u"d7"}}}));
  EXPECT_EQ(search(u"ct", 0), Rows{});
  EXPECT_EQ(search(u"cat", -1), Rows{});
  EXPECT_EQ(search(u"cat", INT64_MIN), Rows{});
}

TEST_F(LXFuzzyIndexTest, CaseOfTheQueryDoesNotMatter) {
  addTheCats();
  EXPECT_EQ(search(u"CAT", 1), search(u"cat", 1));
  EXPECT_EQ(search(u"cAt", 1), search(u"cat", 1));
}

TEST_F(LXFuzzyIndexTest, ManyDataStringsOutrankASmallDistance) {
  index.addString_withData(u"graz", u"1");
  index.addString_withData(u"gras", u"1");
  index.addString_withData(u"gras", u"2");
  index.setMode(1);
  EXPECT_EQ(search(u"graz", 1), (Rows{{u"gras", 1, {u"1", u"2"}}, {u"graz", 0, {u"1"}}}));
}

TEST_F(LXFuzzyIndexTest, TiesAreInAscendingOrder) {
  for (const auto* word : {u"bad", u"bat", u"bar", u"ban"}) {
    index.addString(word);
  }
  index.setMode(1);
  EXPECT_EQ(search(u"bax", 1),
            (Rows{{u"bad", 1, {}}, {u"ban", 1, {}}, {u"bar", 1, {}}, {u"bat", 1, {}}}));
}

TEST_F(LXFuzzyIndexTest, AStarInTheQueryMatchesAnyOneCharacter) {
  for (const auto* word : {u"cat", u"cut", u"ct", u"coat", u"c*t"}) {
    index.addString(word);
  }
  index.setMode(1);
  EXPECT_EQ(search(u"c*t", 0), (Rows{{u"c*t", 0, {}}, {u"cat", 0, {}}, {u"cut", 0, {}}}));
}

TEST_F(LXFuzzyIndexTest, AnUnderscoreInTheQueryMayBeSkippedAndMatchesNoUnderscore) {
  index.addString(u"cat");
  index.addString(u"c_at");
  index.setMode(1);
  EXPECT_EQ(search(u"c_at", 0), (Rows{{u"cat", 0, {}}}));
  EXPECT_EQ(search(u"c_at", 1), (Rows{{u"cat", 0, {}}, {u"c_at", 1, {}}}));
}

TEST_F(LXFuzzyIndexTest, AStoredStarIsACharacterLikeAnyOther) {
  index.addString(u"a*b");
  index.setMode(1);
  EXPECT_EQ(search(u"axb", 0), Rows{});
  EXPECT_EQ(search(u"axb", 1), (Rows{{u"a*b", 1, {}}}));
}

TEST_F(LXFuzzyIndexTest, TheQueryIsNotSplit) {
  index.addString(u"São Tomé");
  index.setMode(1);
  EXPECT_EQ(search(u"sao tomé", 1), (Rows{{u"são tomé", 1, {}}}));
}

TEST_F(LXFuzzyIndexTest, CharactersOutsideTheBmpAreStoredAndNotFound) {
  index.addString_withData(u"😀", u"grin");
  index.addString_withData(u"a😀", u"grins");
  index.addString_withData(u"a", u"letter");
  index.setMode(1);
  EXPECT_EQ(search(u"😀", 3), (Rows{{u"a", 2, {u"letter"}}}));
  EXPECT_EQ(search(u"a😀", 3), (Rows{{u"a", 2, {u"letter"}}}));
  index.setMode(0);
  EXPECT_EQ(outputOf("cdb -q " + directory.file("dataTable.tdb") + " 😀"), "grin");
}

TEST_F(LXFuzzyIndexTest, AZeroInsideAStringLeavesNoEmptyOrRepeatedMatch) {
  using namespace std::string_view_literals;
  // Stored up to the zero: "a" is final and gets an empty symbol, and "b" follows "a".
  index.addString_withData(u"a\0b"sv, u"zero");
  index.addString_withData(u"ab", u"plain");
  index.setMode(1);
  EXPECT_EQ(search(u"ab", 2), (Rows{{u"ab", 0, {u"plain"}}, {u"a", 1, {u"zero"}}}));
}

TEST_F(LXFuzzyIndexTest, SearchingWithoutTablesFindsNothing) {
  LXFuzzyIndex nowhere(directory.file("missing/"));
  nowhere.setMode(1);
  EXPECT_TRUE(nowhere.search_withMaxDistance(u"cat", 2).empty());
}

TEST_F(LXFuzzyIndexTest, SearchesTablesThatAnotherToolWrote) {
  index.setMode(0);
  testing::writeFile(directory.file("edges"), "+0,1:->o\n+1,1:o->s\n+2,1:os->l\n+3,1:osl->o\n\n");
  testing::writeFile(directory.file("finals"), "+4,1:oslo->t\n+3,1:osl->f\n\n");
  testing::writeFile(directory.file("data"), "+4,2:oslo->NO\n\n");
  outputOf("cdb -c " + directory.file("edgeTable.tdb") + " " + directory.file("edges"));
  outputOf("cdb -c " + directory.file("finalTable.tdb") + " " + directory.file("finals"));
  outputOf("cdb -c " + directory.file("dataTable.tdb") + " " + directory.file("data"));
  index.setMode(1);
  EXPECT_EQ(search(u"olso", 2), (Rows{{u"oslo", 2, {u"NO"}}}));
}

TEST_F(LXFuzzyIndexTest, TablesCutShortNeverCrashASearch) {
  for (const auto* name : {u"Graz", u"Gmunden", u"Gleisdorf"}) {
    index.addString_withData(name, name);
  }
  index.setMode(0);
  for (const auto* name : {"edgeTable.tdb", "finalTable.tdb", "dataTable.tdb"}) {
    const std::string whole = testing::readFile(directory.file(name));
    for (std::size_t length = 0; length < whole.size(); length += length < 2040 ? 8 : 1) {
      testing::writeFile(directory.file(name), whole.substr(0, length));
      LXFuzzyIndex damaged(directory.path());
      damaged.setMode(1);
      for (const auto& match : damaged.search_withMaxDistance(u"graz", 2)) {
        EXPECT_EQ(match.value(), u"graz");
      }
    }
    testing::writeFile(directory.file(name), whole);
  }
}

TEST(LXFuzzyMatchTest, HoldsItsValues) {
  const LXFuzzyMatch match(u"graz", 1, {u"Mur", u"Steiermark"});
  EXPECT_EQ(match.value(), u"graz");
  EXPECT_EQ(match.distance(), 1);
  EXPECT_EQ(match.data(), (Data{u"Mur", u"Steiermark"}));
  EXPECT_EQ(match.description(), u"{ value: graz, distance: 1, data: (Mur, Steiermark) }");
  std::ostringstream text;
  text << match;
  EXPECT_EQ(text.str(), "{ value: graz, distance: 1, data: (Mur, Steiermark) }");
}

TEST(LXFuzzyMatchTest, CannotBeMadeWithoutValues) {
  try {
    const LXFuzzyMatch match;
    FAIL() << "made " << match;
  } catch (const std::logic_error& error) {
    EXPECT_STREQ(error.what(), "Init is not a valid initializer for the class LXFuzzyMatch.");
  }
}

}  // namespace
}  // namespace wordcatcher
