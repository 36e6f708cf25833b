#include "wordcatcher/matcher/Index.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "TestSupport.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"
#include "wordcatcher/matcher/KXWordcatcher.h"

namespace wordcatcher {
namespace {

using testing::TemporaryDirectory;
using testing::writeFile;

/// Value, distance and data of each match.
using Rows = std::vector<std::tuple<std::string, std::int64_t, std::vector<std::string>>>;

Rows rowsOf(const Index::QueryResult& result) {
  Rows rows;
  for (const auto& match : result.matches) {
    rows.emplace_back(match.value, match.distance, match.data);
  }
  return rows;
}

Rows rowsOf(const Index::SearchResult& result) {
  Rows rows;
  for (const auto& match : result.matches) {
    rows.emplace_back(match.value, match.distance, match.data);
  }
  return rows;
}

ErrorCode codeOf(const std::function<void()>& call) {
  try {
    call();
  } catch (const Error& error) {
    EXPECT_GT(std::string(error.what()).size(), 20U) << "a sentence, not a word";
    return error.code();
  }
  ADD_FAILURE() << "nothing was thrown";
  return ErrorCode{};
}

const std::vector<std::string> kPhrases = {"Trinidad and Tobago{ TT }",
                                           "Bosnia and Herzegovina{ BA }",
                                           "Papua New Guinea{ PG }",
                                           "New Zealand{ NZ }",
                                           "New York{ US-NY }",
                                           "Côte d'Ivoire{ CI }",
                                           "São Tomé and Príncipe{ ST }",
                                           "Åland Islands{ AX }",
                                           "Łódzkie{ PL-10 }",
                                           "an ox",
                                           "Catherine Schmidt",
                                           "Konrad Zuse"};

std::string phraseOf(const std::string& value) { return value.substr(0, value.find("{ ")); }

class IndexTest : public ::testing::TestWithParam<MatchingMode> {
 protected:
  std::string build(MatchingMode mode) {
    std::string path = directory.file("names.wci");
    IndexBuilder builder(path, {.mode = mode, .tables = directory.path()});
    for (const auto& value : kPhrases) {
      builder.add(phraseOf(value), value);
    }
    builder.commit();
    return path;
  }

  std::string buildWords() { return build(MatchingMode::words); }

  TemporaryDirectory directory;
};

std::u16string utf16(const std::string& text) { return std::filesystem::path(text).u16string(); }

std::string utf8(const std::u16string& text) {
  const auto bytes = std::filesystem::path(text).u8string();
  return {bytes.begin(), bytes.end()};
}

TEST_P(IndexTest, AnswersAsAFreshClassicMatcherDoes) {
  const std::string path = build(GetParam());
  const Index image = Index::open(path);
  const Index tables = Index::open(directory.path(), {}, GetParam());
  std::size_t found = 0;
  for (const std::string text :
       {"", "trinidat and tobbago", "new zeeland", "new", "papua niu guinea", "cote divoire",
        "sao tome", "an ox", "Kathryn Shmit", "xyzzy plugh", "bosnja", "Lodzkie", "New Yorc"}) {
    KXWordcatcher matcher(directory.path(), static_cast<std::uint64_t>(GetParam()));
    matcher.setMode(1);
    const auto classic = matcher.query(utf16(text));
    matcher.setMode(0);
    Rows expected;
    if (classic && GetParam() == MatchingMode::wholeText) {
      for (const auto& match : std::get<std::vector<LXFuzzyMatch>>(*classic)) {
        std::vector<std::string> data;
        for (const auto& each : match.data()) {
          data.push_back(utf8(each));
        }
        expected.emplace_back(utf8(match.value()), match.distance(), data);
      }
      std::sort(expected.begin(), expected.end(), [](const auto& a, const auto& b) {
        return std::tie(std::get<1>(a), std::get<0>(a)) < std::tie(std::get<1>(b), std::get<0>(b));
      });
    } else if (classic) {
      for (const auto& record : std::get<std::vector<KXWordcatch>>(*classic)) {
        expected.emplace_back(utf8(record.value()), record.distance(), std::vector<std::string>());
      }
    }
    for (const auto& index : {image, tables}) {
      const auto result = index.query(text);
      EXPECT_EQ(rowsOf(result), expected) << text;
      EXPECT_EQ(result.found, classic.has_value()) << text;
      EXPECT_FALSE(result.truncated);
    }
    found += expected.size();
  }
  EXPECT_GT(found, 1U);
}

INSTANTIATE_TEST_SUITE_P(Modes, IndexTest,
                         ::testing::Values(MatchingMode::words, MatchingMode::wholeText,
                                           MatchingMode::phoneticWords));

class WordIndexTest : public IndexTest {};

INSTANTIATE_TEST_SUITE_P(Words, WordIndexTest, ::testing::Values(MatchingMode::words));

TEST_P(WordIndexTest, SearchAnswersAsTheFuzzyIndexDoes) {
  const Index image = Index::open(buildWords());
  LXFuzzyIndex classic(directory.path());
  classic.setMode(1);
  for (const std::string word : {"new", "Zeeland", "ISLANDS", "d'ivoire", "", "n*w", "_new"}) {
    for (const std::int64_t k : {-1, 0, 1, 2, 3, 5}) {
      Rows expected;
      for (const auto& match : classic.search_withMaxDistance(utf16(word), k)) {
        std::vector<std::string> data;
        for (const auto& each : match.data()) {
          data.push_back(utf8(each));
        }
        expected.emplace_back(utf8(match.value()), match.distance(), data);
      }
      EXPECT_EQ(rowsOf(image.search(word, k)), expected) << word << ' ' << k;
    }
  }
}

TEST_P(WordIndexTest, FindsCharactersOutsideTheBmp) {
  const std::string path = directory.file("emoji.wci");
  IndexBuilder builder(path, {.mode = MatchingMode::wholeText, .tables = {}});
  builder.add("party 🎉 time", "party");
  builder.commit();
  const Index index = Index::open(path);
  EXPECT_EQ(rowsOf(index.query("party 🎉 time")), (Rows{{"party 🎉 time", 0, {"party"}}}));
  EXPECT_EQ(rowsOf(index.search("party  time", 2)), (Rows{{"party 🎉 time", 2, {"party"}}}))
      << "two code units";
  EXPECT_EQ(rowsOf(index.search("party 🎈 time", 1)), (Rows{{"party 🎉 time", 1, {"party"}}}))
      << "the two differ in their second code unit only";
}

TEST_P(WordIndexTest, IllFormedBytesSeparateWords) {
  const Index index = Index::open(buildWords());
  EXPECT_EQ(rowsOf(index.query("new\xFFzealand")), rowsOf(index.query("new zealand")));
  EXPECT_EQ(rowsOf(index.query("new\xC3\x28zealand\xE2\x82")), rowsOf(index.query("new zealand")));
  EXPECT_EQ(codeOf([&] { index.search("zea\xFFland", 2); }), ErrorCode::badInput);
}

TEST_P(WordIndexTest, ZerosAndControlCharactersSeparateWords) {
  using namespace std::string_literals;
  const Index index = Index::open(buildWords());
  EXPECT_EQ(rowsOf(index.query("new\0zealand\0"s)), rowsOf(index.query("new zealand")));
}

TEST_P(WordIndexTest, BudgetsCutAndSaySo) {
  const std::string path = buildWords();
  const Index index = Index::open(path, {.maxQueryWords = 2, .maxWordUnits = 10});
  EXPECT_FALSE(index.query("new zealand").truncated);
  const auto cut = index.query("new zealand guinea");
  EXPECT_TRUE(cut.truncated);
  EXPECT_EQ(rowsOf(cut), rowsOf(index.query("new zealand")));
  EXPECT_TRUE(index.query("new zealandzealand").truncated);
  EXPECT_TRUE(index.search("zealandzealand", 2).truncated);
  EXPECT_TRUE(index.search("zealandzealand", 2).matches.empty());
  EXPECT_EQ(codeOf([&] { index.search("new", 17); }), ErrorCode::badInput);
  const std::string whole = directory.file("whole.wci");
  IndexBuilder builder(whole, {.mode = MatchingMode::wholeText, .tables = {}});
  builder.add("new zealand", "NZ");
  builder.commit();
  const Index texts = Index::open(whole, {.maxQueryWords = 2, .maxWordUnits = 10});
  EXPECT_TRUE(texts.query("new zealand").truncated);
}

TEST_P(WordIndexTest, WhatCannotBeOpenedIsASentence) {
  const std::string path = buildWords();
  EXPECT_EQ(codeOf([&] { Index::open(directory.file("missing.wci")); }), ErrorCode::notFound);
  EXPECT_EQ(codeOf([&] { Index::open(directory.file("missing/names.wci")); }), ErrorCode::notFound);
  std::filesystem::create_directory(directory.file("empty"));
  EXPECT_EQ(codeOf([&] { Index::open(directory.file("empty")); }), ErrorCode::notFound);
  EXPECT_EQ(codeOf([&] { Index::open(directory.file("edgeTable.tdb")); }), ErrorCode::notAnIndex);
  writeFile(directory.file("finalTable.tdb"), "short");
  EXPECT_EQ(codeOf([&] { Index::open(directory.path()); }), ErrorCode::notAnIndex);
  const std::string bytes = testing::readFile(path);
  writeFile(path, bytes.substr(0, bytes.size() - 1));
  EXPECT_EQ(codeOf([&] { Index::open(path); }), ErrorCode::damaged);
}

TEST_P(WordIndexTest, TheSentenceOfWhatCannotBeOpenedSaysWhatToDo) {
  buildWords();
  std::filesystem::create_directory(directory.file("empty"));
  std::filesystem::create_directory(directory.file("short"));
  for (const std::string table : {"edgeTable.tdb", "dataTable.tdb", "finalTable.tdb"}) {
    writeFile(directory.file("short/" + table), "short");
  }
  for (const std::string& name :
       {std::string("missing.wci"), std::string("empty"), std::string("short"),
        std::string("edgeTable.tdb"), std::string(300, 'n')}) {
    try {
      Index::open(directory.file(name));
      ADD_FAILURE() << name << " was opened";
    } catch (const Error& error) {
      const std::string sentence = error.what();
      EXPECT_NE(sentence.find("; "), std::string::npos) << sentence;
      EXPECT_TRUE(sentence.ends_with('.')) << sentence;
    }
  }
}

TEST_P(WordIndexTest, ACopySurvivesAFileThatShrinks) {
  const std::string path = buildWords();
  const Index index = Index::open(path, {.load = Index::Load::copy});
  std::filesystem::resize_file(path, 0);
  EXPECT_EQ(rowsOf(index.query("new zeeland")).size(), 1U);
  index.verify();
}

TEST_P(WordIndexTest, TablesAreLockedOnlyWhileTheyAreRead) {
  buildWords();
  const Index index = Index::open(directory.path());
  LXFuzzyIndex writer(directory.path());
  writer.setMode(2);  // would wait for ever
  writer.setMode(0);
  EXPECT_EQ(rowsOf(index.query("new zeeland")).size(), 1U);
}

TEST_P(WordIndexTest, InfoTellsWhatIsThere) {
  const std::string path = buildWords();
  const auto info = Index::open(path).info();
  EXPECT_EQ(info.mode, MatchingMode::words);
  EXPECT_EQ(info.phrases, kPhrases.size());
  EXPECT_EQ(info.values, kPhrases.size());
  EXPECT_EQ(info.words, 24U);
  EXPECT_EQ(info.bytes, std::filesystem::file_size(path));
  EXPECT_EQ(info.generation.size(), 32U);
  EXPECT_EQ(info.version, 2U);
  buildWords();
  EXPECT_NE(Index::open(path).info().generation, info.generation);
}

TEST_P(WordIndexTest, VerifyFindsAChangedByte) {
  const std::string path = buildWords();
  Index::open(path).verify();
  std::string bytes = testing::readFile(path);
  bytes[bytes.size() - 20] ^= 1;
  writeFile(path, bytes);
  const Index index = Index::open(path);
  EXPECT_EQ(codeOf([&] { index.verify(); }), ErrorCode::damaged);
}

}  // namespace
}  // namespace wordcatcher
