// Budgets of Index::find: what they cut off, what they say, and that nothing runs away.

#include <gtest/gtest.h>

#include <algorithm>
#include <ctime>
#include <string>
#include <vector>

#include "FindSupport.h"
#include "MemoryCounter.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using testing::Entries;
using testing::indexOf;
using testing::indexOfPhrases;
using testing::linesOf;
using testing::MemoryCounter;
using testing::unlimited;
using testing::valuesOf;

using Values = std::vector<std::string>;

/// A word so many times.
std::string rowOf(const std::string& word, std::size_t count) {
  std::string row;
  for (; count > 0; --count) {
    row.append(row.empty() ? "" : " ").append(word);
  }
  return row;
}

/// Processor time of an action, which other programs do not add to.
template <typename Action>
double secondsOf(Action action) {
  const std::clock_t begin = std::clock();
  action();
  return static_cast<double>(std::clock() - begin) / CLOCKS_PER_SEC;
}

// Far above what any of these takes, with sanitizers as well, and far below what takes all ways.
constexpr double kManySeconds = 30;

TEST(FindBudgetTest, EveryBudgetOfPostings) {
  Entries entries;
  for (int i = 0; i < 12; ++i) {
    entries.emplace_back(rowOf("lake", 1 + i % 3) + (i % 2 == 0 ? " shore" : " lakeshore"),
                         std::to_string(i));
  }
  const auto index = indexOf(entries);
  for (const std::string text : {"lake lake", "lakes lake shore lake", "lakeshore lake lake"}) {
    FindOptions options = unlimited();
    const auto whole = index.find(text, options);
    EXPECT_FALSE(whole.truncated);
    EXPECT_EQ(whole.matches.size(), 12U);
    bool isWhole = false;
    for (options.maxPostings = 0; !isWhole && options.maxPostings < 10000; ++options.maxPostings) {
      const auto found = index.find(text, options);
      isWhole = !found.truncated;
      EXPECT_TRUE(!isWhole || found == whole) << options.maxPostings;
      for (const auto& match : found.matches) {
        ASSERT_FALSE(match.hits.empty()) << options.maxPostings;
        std::uint64_t edits = 0;
        std::uint64_t words = 0;  // paired, on either side
        for (const auto& hit : match.hits) {
          edits += hit.edits;
          const auto slice = text.substr(hit.begin, hit.end - hit.begin);
          words += 2U + (slice.find(' ') != std::string::npos ? 1 : 0) +
                   (hit.word.find(' ') != std::string::npos ? 1 : 0);
        }
        const auto explained = index.explain(text, match.value);
        EXPECT_EQ(match.cost,
                  edits + 2 * (explained.words.size() + explained.phrase.size() - words))
            << "the cost is that of the hits, with a budget of " << options.maxPostings;
        EXPECT_GE(match.cost, explained.cost);
      }
    }
    EXPECT_TRUE(isWhole);
  }
}

TEST(FindBudgetTest, TellsWhatPostingsWereLeftOut) {
  std::vector<std::string> phrases;
  for (int i = 0; i < 1000; ++i) {
    phrases.push_back("lake " + std::to_string(i));
  }
  const auto index = indexOfPhrases(phrases);
  FindOptions options = unlimited();
  options.maxPostings = 100;
  const auto found = index.find("lake", options);
  EXPECT_TRUE(found.truncated);
  EXPECT_LE(found.matches.size(), 100U);
  EXPECT_GE(found.matches.size(), 50U);
  // The rare word's phrase is met first.
  const auto rare = index.find("lake 77", options);
  ASSERT_FALSE(rare.matches.empty());
  EXPECT_EQ(rare.matches[0].value, "lake 77");
  options.limit = 1;
  EXPECT_FALSE(index.find("lake 77", options).truncated) << "nothing else can be the first";
}

TEST(FindBudgetTest, WordsOfTheText) {
  Index::Options budgets;
  budgets.maxQueryWords = 3;
  const auto index = indexOfPhrases({"Thames", "Severn", "Trent"}, MatchingMode::words, budgets);
  EXPECT_FALSE(index.find("the river thames").truncated);
  const auto found = index.find("a river trent and thames");
  EXPECT_TRUE(found.truncated);
  EXPECT_EQ(valuesOf(found), Values{"Trent"});
  EXPECT_EQ(found.matches[0].cost, 4U) << "what lies beyond costs nothing";
  const auto explained = index.explain("a river trent and thames", "Thames");
  EXPECT_TRUE(explained.truncated);
  EXPECT_FALSE(explained.isFound);
  EXPECT_EQ(explained.words.size(), 3U);
  const auto sounds = indexOfPhrases({"Thames", "Severn"}, MatchingMode::phoneticWords, budgets);
  EXPECT_TRUE(sounds.find("Severn a river Thames").truncated);
}

TEST(FindBudgetTest, LongWords) {
  Index::Options budgets;
  budgets.maxWordUnits = 10;
  for (const auto mode :
       {MatchingMode::words, MatchingMode::wholeText, MatchingMode::phoneticWords}) {
    const auto index = indexOfPhrases({"Mississippi", "Missouri", "Ohio"}, mode, budgets);
    EXPECT_FALSE(index.find("missouri").truncated);
    EXPECT_EQ(index.find("missouri").matches.size(), 1U);
    const auto found = index.find("mississippi");
    EXPECT_TRUE(found.truncated);
    EXPECT_TRUE(found.matches.empty());
  }
  const auto index = indexOfPhrases({"Mississippi", "Ohio"}, MatchingMode::words, budgets);
  const auto found = index.find("mississippi ohio");
  EXPECT_TRUE(found.truncated);
  ASSERT_EQ(valuesOf(found), Values{"Ohio"});
  EXPECT_EQ(found.matches[0].cost, 2U) << "a word of the text that is left over";
  EXPECT_EQ(found.matches[0].begin, 12U);
  // Ten letters that get longer in lower case.
  EXPECT_TRUE(index.find("İİİİİİİİİİ").truncated);
}

TEST(FindBudgetTest, NoMatchesAtAll) {
  const auto index = indexOfPhrases({"Thames", "Severn"});
  FindOptions options;
  options.limit = 0;
  EXPECT_TRUE(index.find("thames", options).matches.empty());
  EXPECT_FALSE(index.find("thames", options).truncated);
  options.overlaps = Overlaps::longest;
  EXPECT_TRUE(index.find("thames", options).matches.empty());
  for (const char* text : {"", " ", "...", "\xFF", "\xE2\x82"}) {
    EXPECT_EQ(index.find(text), FindResult()) << text;
  }
  const auto none = indexOfPhrases({});
  EXPECT_EQ(none.find("thames"), FindResult());
  EXPECT_FALSE(none.explain("thames", "Thames").isStored);
}

TEST(FindBudgetTest, EditLimitsThatAreTooLarge) {
  const auto index = indexOfPhrases({"Thames", "Severn"});
  for (const auto limit :
       {&EditLimits::shortEdits, &EditLimits::mediumEdits, &EditLimits::longEdits,
        &EditLimits::wholeTextEdits, &EditLimits::numberEdits}) {
    FindOptions options;
    options.edits.*limit = EditLimits::kMaxEdits;
    EXPECT_NO_THROW(index.find("thames", options));
    EXPECT_NO_THROW(index.explain("thames", "Thames", options));
    for (const std::uint32_t edits : {EditLimits::kMaxEdits + 1, 256U, UINT32_MAX}) {
      options.edits.*limit = edits;
      for (const bool explains : {true, false}) {
        try {
          if (explains) {
            index.explain("thames", "Thames", options);
          } else {
            index.find("thames", options);
          }
          ADD_FAILURE() << edits;
        } catch (const Error& error) {
          EXPECT_EQ(error.code(), ErrorCode::badInput);
        }
      }
    }
  }
}

TEST(FindBudgetTest, ManyEqualWordsInManyPhrases) {
  Entries entries;
  for (int i = 0; i < 300; ++i) {
    entries.emplace_back(rowOf("buffalo", 1000) + " " + std::to_string(i), std::to_string(i));
  }
  const auto index = indexOf(entries);
  FindResult found;
  MemoryCounter::restartPeak();
  const std::size_t before = MemoryCounter::live();
  const double seconds = secondsOf([&] { found = index.find(rowOf("buffalo", 4096)); });
  EXPECT_LT(seconds, kManySeconds);
  EXPECT_LT(MemoryCounter::peak() - before, 200'000'000U);
  EXPECT_TRUE(found.truncated);
}

TEST(FindBudgetTest, ManyEqualWordsNearManyWords) {
  Entries entries = {{"go-fish", "go-fish"}};
  for (int i = 0; i < 1000; ++i) {
    // A syllable of the Yi, which is a letter amid Latin ones.
    const std::u16string unit(1, static_cast<char16_t>(0xA000 + i));
    entries.emplace_back("buff" + toUtf8(unit).value() + "lo", std::to_string(i));
    entries.emplace_back("white" + toUtf8(unit).value() + "bison", std::to_string(i));
  }
  const auto index = indexOf(entries);
  for (const std::string& words : {rowOf("buffalo", 4000), rowOf("white bison", 2000)}) {
    FindResult found;
    MemoryCounter::restartPeak();
    const std::size_t before = MemoryCounter::live();
    const double seconds = secondsOf([&] { found = index.find("go-fish " + words); });
    EXPECT_LT(seconds, kManySeconds);
    EXPECT_LT(MemoryCounter::peak() - before, 200'000'000U);
    EXPECT_TRUE(found.truncated);
    EXPECT_EQ(found.matches.size(), 10U);
  }
}

TEST(FindBudgetTest, WordsInEachOthersWay) {
  // Every word of the phrases wants the same words of the text, with as much disorder in any order.
  Entries entries;
  for (int i = 0; i < 50; ++i) {
    entries.emplace_back(rowOf("buffalo", 150 + i), std::to_string(i));
  }
  const auto index = indexOf(entries);
  FindOptions options;
  options.maxPostings = 200'000;
  FindResult found;
  const double seconds =
      secondsOf([&] { found = index.find(rowOf("buffalo bison", 150), options); });
  EXPECT_LT(seconds, kManySeconds);
  EXPECT_TRUE(found.truncated);
}

TEST(FindBudgetTest, MemoryIsThatOfTheTextAndTheWordsFound) {
  std::vector<std::string> phrases;
  for (int i = 0; i < 20000; ++i) {
    phrases.push_back("lake " + std::to_string(i));
    phrases.push_back("shore " + std::to_string(i % 5000) + " of " + std::to_string(i));
  }
  const auto index = indexOfPhrases(phrases);
  for (const std::string& text :
       {std::string("lake"), std::string("lake shore of 77"), rowOf("lake shore of", 1000),
        rowOf("a b", 2000), rowOf("zebra", 100000), std::string(1 << 20, 'x')}) {
    MemoryCounter::restartPeak();
    const auto found = index.find(text);
    const std::size_t used = MemoryCounter::peak() - MemoryCounter::live();
    // 20,000 values under each of three words.
    EXPECT_LE(used, 32 * text.size() + 4096 * 256 + 64 * 60000 + 16384 + 16 * 20003 + 40000)
        << text.substr(0, 30) << " of " << text.size() << " bytes";
  }
}

}  // namespace
}  // namespace wordcatcher
