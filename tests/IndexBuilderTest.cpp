#include "wordcatcher/matcher/IndexBuilder.h"

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <algorithm>
#include <csignal>
#include <filesystem>
#include <set>
#include <sstream>
#include <utility>
#include <vector>

#include "TestSupport.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/matcher/KXWordcatcher.h"
#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {
namespace {

using testing::readFile;
using testing::TemporaryDirectory;
using testing::writeFile;
using Names = std::vector<std::string>;

struct Phrase {
  std::u16string text;
  std::optional<std::u16string> data;
};

const std::vector<Phrase> kPhrases = {
    {u"Trinidad and Tobago", u"Trinidad and Tobago{ TT }"},
    {u"Côte d'Ivoire", u"Côte d'Ivoire{ CI }"},
    {u"São Tomé and Príncipe", u"São Tomé and Príncipe{ ST }"},
    {u"United Arab Emirates", u"United Arab Emirates{ AE }"},
    {u"United States", u"United States{ US }"},
    {u"united states", u"USA"},
    {u"United States", u"United States{ US }"},
    {u"Österreich", std::nullopt},
    {u"TÜRKİYE", u"Türkiye{ TR }"},
    {u"日本", u"日本{ JP }"},
    {u"ΟΔΥΣΣΕΥΣ", u"Odysseus"},
    {u"Sun 😀 Land", u"Sun 😀 Land"},
    {u"new york new york", u""},
    {u"...", u"dots"},
};

std::string utf8(std::u16string_view text) {
  std::ostringstream stream;
  writeUtf8(stream, text);
  return stream.str();
}

void addAll(IndexBuilder& builder, const std::vector<Phrase>& phrases) {
  for (const auto& phrase : phrases) {
    const auto data = phrase.data ? std::optional(utf8(*phrase.data)) : std::nullopt;
    builder.add(utf8(phrase.text), data);
  }
}

template <typename Call>
std::pair<ErrorCode, std::string> errorOf(Call call) {
  try {
    call();
  } catch (const Error& error) {
    return {error.code(), error.what()};
  }
  return {ErrorCode{}, ""};
}

class IndexBuilderTest : public ::testing::Test {
 protected:
  Names names(const std::string& path) const {
    Names found;
    for (const auto& entry : std::filesystem::directory_iterator(path)) {
      found.push_back(entry.path().filename());
    }
    std::sort(found.begin(), found.end());
    return found;
  }

  TemporaryDirectory directory;
  std::string path = directory.file("countries.wci");
};

/// No file may grow beyond so many bytes while this lives: a full disk, for this process.
class FileSizeLimit {
 public:
  explicit FileSizeLimit(rlim_t bytes) : _handler(std::signal(SIGXFSZ, SIG_IGN)) {
    getrlimit(RLIMIT_FSIZE, &_before);
    const rlimit limit = {bytes, _before.rlim_max};
    setrlimit(RLIMIT_FSIZE, &limit);
  }
  ~FileSizeLimit() {
    setrlimit(RLIMIT_FSIZE, &_before);
    (void)std::signal(SIGXFSZ, _handler);
  }
  FileSizeLimit(const FileSizeLimit&) = delete;
  FileSizeLimit& operator=(const FileSizeLimit&) = delete;

 private:
  void (*_handler)(int);
  rlimit _before = {};
};

TEST_F(IndexBuilderTest, CommitWritesOneFileAndEmptiesTheBuilder) {
  IndexBuilder builder(path);
  builder.add("Trinidad and Tobago", "Trinidad and Tobago{ TT }");
  builder.add("TOBAGO", std::nullopt);
  EXPECT_EQ(builder.phraseCount(), 2U);
  EXPECT_EQ(builder.wordCount(), 3U) << "trinidad, and, tobago";
  EXPECT_EQ(names(directory.path()), Names{});
  const auto bytes = builder.commit();
  EXPECT_EQ(bytes, std::filesystem::file_size(path));
  EXPECT_EQ(names(directory.path()), Names{"countries.wci"});
  EXPECT_EQ(builder.phraseCount(), 0U);
  EXPECT_EQ(builder.wordCount(), 0U);
}

TEST_F(IndexBuilderTest, ABuilderMayBeUsedAgainAfterCommit) {
  IndexBuilder builder(path);
  addAll(builder, kPhrases);
  const auto whole = builder.commit();
  const auto empty = builder.commit();
  EXPECT_LT(empty, whole);
  addAll(builder, kPhrases);
  EXPECT_EQ(builder.commit(), whole);
}

TEST_F(IndexBuilderTest, ADroppedBuilderTouchesNothing) {
  writeFile(path, "the old one");
  {
    IndexBuilder builder(path);
    addAll(builder, kPhrases);
  }
  EXPECT_EQ(readFile(path), "the old one");
  EXPECT_EQ(names(directory.path()), Names{"countries.wci"});
}

TEST_F(IndexBuilderTest, AMovedBuilderTakesItsPhrasesAlong) {
  IndexBuilder first(path);
  first.add("United States", "US");
  IndexBuilder second(std::move(first));
  first = IndexBuilder(directory.file("other.wci"));
  EXPECT_EQ(first.phraseCount(), 0U);
  EXPECT_EQ(second.phraseCount(), 1U);
  second.commit();
  EXPECT_EQ(names(directory.path()), Names{"countries.wci"});
}

TEST_F(IndexBuilderTest, EachModeStoresItsOwnKindOfWords) {
  const auto words = [this](MatchingMode mode, std::vector<std::string> phrases) {
    IndexBuilder builder(path, {.mode = mode, .tables = {}});
    for (const auto& phrase : phrases) {
      builder.add(phrase, phrase);
    }
    EXPECT_EQ(builder.phraseCount(), phrases.size());
    return builder.wordCount();
  };
  const std::vector<std::string> names = {"Catherine Smith", "Kathryn Smyth", "SMITH, catherine"};
  EXPECT_EQ(words(MatchingMode::words, names), 4U);
  EXPECT_EQ(words(MatchingMode::wholeText, names), 3U);
  EXPECT_EQ(words(MatchingMode::phoneticWords, names), 2U) << "k0rn and sm0";
  for (const auto mode :
       {MatchingMode::words, MatchingMode::wholeText, MatchingMode::phoneticWords}) {
    EXPECT_EQ(words(mode, {""}), 0U) << "accepted, and never found";
  }
  EXPECT_EQ(words(MatchingMode::words, {"... !"}), 0U);
}

TEST_F(IndexBuilderTest, StringsThatNoIndexCanHoldAreRefusedAndChangeNothing) {
  IndexBuilder builder(path);
  addAll(builder, kPhrases);
  const auto phrases = builder.phraseCount();
  const auto words = builder.wordCount();
  const std::string zero("Graz\0Wien", 9);
  for (const std::string& bad : {std::string("Gr\xE4z"), std::string("Graz\xC3"),
                                 std::string("\xED\xA0\x80"), zero, std::string("\xC0\x80")}) {
    const auto [phraseCode, phraseSentence] = errorOf([&] { builder.add(bad, "Graz"); });
    EXPECT_EQ(phraseCode, ErrorCode::badInput);
    EXPECT_NE(phraseSentence.find("The phrase"), std::string::npos);
    const auto [dataCode, dataSentence] = errorOf([&] { builder.add("Graz", bad); });
    EXPECT_EQ(dataCode, ErrorCode::badInput);
    EXPECT_NE(dataSentence.find("The data string"), std::string::npos);
  }
  EXPECT_EQ(builder.phraseCount(), phrases);
  EXPECT_EQ(builder.wordCount(), words);
}

TEST_F(IndexBuilderTest, AModeThatDoesNotExistIsRefused) {
  const auto [code, sentence] =
      errorOf([this] { IndexBuilder(path, {.mode = static_cast<MatchingMode>(3), .tables = {}}); });
  EXPECT_EQ(code, ErrorCode::badInput);
  EXPECT_NE(sentence, "");
}

TEST_F(IndexBuilderTest, TheFileHasThePermissionsOfANewOne) {
  const mode_t before = umask(027);
  IndexBuilder(path).commit();
  umask(before);
  struct stat status = {};
  ASSERT_EQ(stat(path.c_str(), &status), 0);
  EXPECT_EQ(status.st_mode & 0777U, 0640U);
}

TEST_F(IndexBuilderTest, AFailedCommitKeepsThePhrasesForTheNextTry) {
  const auto path = directory.file("europe/countries.wci");
  IndexBuilder builder(path);
  addAll(builder, kPhrases);
  const auto words = builder.wordCount();
  const auto [code, sentence] = errorOf([&] { builder.commit(); });
  EXPECT_EQ(code, ErrorCode::notWritable);
  EXPECT_NE(sentence.find("create its directory"), std::string::npos);
  EXPECT_EQ(builder.phraseCount(), kPhrases.size());
  EXPECT_EQ(builder.wordCount(), words);
  std::filesystem::create_directory(directory.file("europe"));
  builder.add("Liechtenstein", std::nullopt);
  EXPECT_EQ(builder.phraseCount(), kPhrases.size() + 1) << "more may be added between the tries";
  EXPECT_EQ(builder.wordCount(), words + 1);
  const auto bytes = builder.commit();
  EXPECT_EQ(bytes, std::filesystem::file_size(path));
  EXPECT_EQ(names(directory.file("europe")), Names{"countries.wci"});
}

TEST_F(IndexBuilderTest, AFileThatCannotGrowLeavesTheOldIndex) {
  IndexBuilder builder(path);
  builder.add("Liechtenstein", "FL");
  builder.commit();
  const auto old = readFile(path);
  addAll(builder, kPhrases);
  for (const rlim_t bytes : {0U, 1U, 100U, 1000U, 2000U}) {
    const FileSizeLimit limit(bytes);
    const auto [code, sentence] = errorOf([&] { builder.commit(); });
    EXPECT_EQ(code, ErrorCode::notWritable);
    EXPECT_NE(sentence.find("make room"), std::string::npos);
    EXPECT_TRUE(readFile(path) == old);
    EXPECT_EQ(names(directory.path()), Names{"countries.wci"});
  }
  const auto bytes = builder.commit();
  EXPECT_EQ(bytes, std::filesystem::file_size(path));
}

/// The records of a table file, each once: keys and values.
using Records = std::set<std::pair<std::string, std::string>>;

Records recordsOf(const std::string& path) {
  const auto bytes = readFile(path);
  const auto number = [&bytes](std::size_t at) {
    std::uint32_t value = 0;
    for (std::size_t i = 4; i-- > 0;) {
      value = value << 8U | static_cast<unsigned char>(bytes.at(at + i));
    }
    return value;
  };
  Records records;
  const std::size_t end = number(0);
  for (std::size_t at = 2048; at < end;) {
    const std::size_t key = number(at);
    const std::size_t value = number(at + 4);
    records.emplace(bytes.substr(at + 8, key), bytes.substr(at + 8 + key, value));
    at += 8 + key + value;
  }
  return records;
}

class TableExportTest : public IndexBuilderTest,
                        public ::testing::WithParamInterface<MatchingMode> {};

TEST_P(TableExportTest, HoldsWhatAClassicIndexOfThePhrasesHolds) {
  const auto mode = GetParam();
  const auto classic = directory.file("classic/");
  const auto exported = directory.file("exported/");
  std::filesystem::create_directory(classic);
  std::filesystem::create_directory(exported);
  {
    KXWordcatcher matcher(classic, static_cast<std::uint64_t>(mode));
    matcher.setMode(2);
    for (const auto& phrase : kPhrases) {
      matcher.index_withData(phrase.text, phrase.data);
    }
    matcher.setMode(0);
  }
  IndexBuilder builder(path, {.mode = mode, .tables = exported});
  addAll(builder, kPhrases);
  builder.commit();
  EXPECT_EQ(names(directory.path()), (Names{"classic", "countries.wci", "exported"}));
  for (const auto* table : {"edgeTable.tdb", "finalTable.tdb", "dataTable.tdb"}) {
    const auto expected = recordsOf(classic + table);
    EXPECT_GE(expected.size(), 10U);
    EXPECT_EQ(recordsOf(exported + table), expected) << table;
  }
}

TEST_P(TableExportTest, AnswersAsAClassicIndex) {
  const auto mode = GetParam();
  const auto exported = directory.file("exported/");
  std::filesystem::create_directory(exported);
  IndexBuilder builder(path, {.mode = mode, .tables = exported});
  addAll(builder, kPhrases);
  builder.commit();
  KXWordcatcher matcher(exported, static_cast<std::uint64_t>(mode));
  matcher.setMode(1);
  const auto answer = matcher.query(u"united states");
  ASSERT_TRUE(answer);
  if (mode == MatchingMode::wholeText) {
    const auto& matches = std::get<std::vector<LXFuzzyMatch>>(*answer);
    ASSERT_EQ(matches.size(), 1U);
    EXPECT_EQ(matches[0].data(), (std::vector<std::u16string>{u"USA", u"United States{ US }"}));
  } else {
    const auto& matches = std::get<std::vector<KXWordcatch>>(*answer);
    ASSERT_FALSE(matches.empty());
    EXPECT_EQ(matches[0].distance(), 0);
  }
  matcher.setMode(0);
}

INSTANTIATE_TEST_SUITE_P(Modes, TableExportTest,
                         ::testing::Values(MatchingMode::words, MatchingMode::wholeText,
                                           MatchingMode::phoneticWords));

TEST_F(IndexBuilderTest, TablesThatCannotBeWrittenLeaveTheImageAsItWas) {
  writeFile(path, "the old one");
  const auto tables = directory.file("tables/");
  IndexBuilder builder(path, {.mode = MatchingMode::words, .tables = tables});
  addAll(builder, kPhrases);
  const auto expectRefused = [&](const std::string& reason) {
    const auto [code, sentence] = errorOf([&] { builder.commit(); });
    EXPECT_EQ(code, ErrorCode::notWritable);
    EXPECT_NE(sentence.find(reason), std::string::npos) << sentence;
    EXPECT_NE(sentence.find("Table.tdb"), std::string::npos) << sentence;
    EXPECT_EQ(readFile(path), "the old one");
    EXPECT_EQ(builder.phraseCount(), kPhrases.size());
  };
  expectRefused("No such file or directory");
  std::filesystem::create_directory(tables);
  std::filesystem::create_directory(tables + "finalTable.tdb");
  expectRefused("Is a directory");
  std::filesystem::remove(tables + "finalTable.tdb");
  std::filesystem::remove(tables + "dataTable.tdb");
  std::filesystem::create_symlink("elsewhere", tables + "dataTable.tdb");
  expectRefused("symbolic links");
  std::filesystem::remove(tables + "dataTable.tdb");
  for (const rlim_t bytes : {0U, 2048U, 2500U, 4096U}) {
    const FileSizeLimit limit(bytes);
    expectRefused("does not hold what was written");
  }
  EXPECT_EQ(names(directory.path()), (Names{"countries.wci", "tables"}));
  const auto bytes = builder.commit();
  EXPECT_EQ(bytes, std::filesystem::file_size(path));
  EXPECT_FALSE(recordsOf(tables + "edgeTable.tdb").empty());
}

}  // namespace
}  // namespace wordcatcher
