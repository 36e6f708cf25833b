// One Index in many threads; to be run under ThreadSanitizer as well.

#include <gtest/gtest.h>

#include <atomic>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "TestSupport.h"
#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher {
namespace {

using testing::TemporaryDirectory;

using Rows = std::vector<std::pair<std::string, std::int64_t>>;

template <typename Result>
Rows rowsOf(const Result& result) {
  Rows rows;
  for (const auto& match : result.matches) {
    rows.emplace_back(match.value, match.distance);
  }
  return rows;
}

void publish(const std::string& path, MatchingMode mode) {
  IndexBuilder builder(path, {.mode = mode, .tables = {}});
  for (const auto* phrase : {"Trinidad and Tobago", "Bosnia and Herzegovina", "Papua New Guinea",
                             "New Zealand", "Catherine Schmidt", "Konrad Zuse"}) {
    builder.add(phrase, phrase);
  }
  builder.commit();
}

// Before any other test has asked: what all queries share is made by one of these threads.
TEST(FirstQueryTest, OfManyThreadsAtOnce) {
  const TemporaryDirectory directory;
  const std::string path = directory.file("names.wci");
  publish(path, MatchingMode::words);
  const Index shared = Index::open(path);
  std::atomic<int> ready = 0;
  std::atomic<int> wrong = 0;
  std::vector<std::thread> readers;
  for (int i = 0; i < 8; ++i) {
    readers.emplace_back([&, i] {
      ++ready;
      while (ready < 8) {
        std::this_thread::yield();
      }
      // Words of one edit and of two, of every length that has an automaton of its own.
      FindOptions options;
      options.transpositions = i % 2 == 0;
      for (const char* text :
           {"Konrat Zsue", "konr zus", "konra zusee", "konraad zu", "koonraad zuse"}) {
        const auto matches = shared.find(text, options).matches;
        wrong += matches.size() == 1 && matches[0].value == "Konrad Zuse" ? 0 : 1;
      }
    });
  }
  for (auto& reader : readers) {
    reader.join();
  }
  EXPECT_EQ(wrong, 0);
}

class IndexThreadsTest : public ::testing::TestWithParam<MatchingMode> {};

TEST_P(IndexThreadsTest, ManyUseOneWhileAnotherPublishes) {
  const TemporaryDirectory directory;
  const std::string path = directory.file("names.wci");
  publish(path, GetParam());
  const Index shared = Index::open(path);
  const std::string text = "Konrad Zuse";
  const Rows found = rowsOf(shared.query(text));
  ASSERT_EQ(found, (Rows{{GetParam() == MatchingMode::wholeText ? "konrad zuse" : text, 0}}));
  const Rows words = rowsOf(shared.search("KNRT", 3));
  const FindResult phrases = shared.find(text);
  ASSERT_EQ(phrases.matches.front().value, "Konrad Zuse");
  const std::string explained = shared.explain(text, "Konrad Zuse").toJson();
  ASSERT_NE(explained.find("\"cost\":0"), std::string::npos);
  std::atomic<bool> stop = false;
  std::atomic<int> wrong = 0;
  std::vector<std::thread> readers;
  readers.reserve(8);
  for (int i = 0; i < 8; ++i) {
    readers.emplace_back([&] {
      for (int n = 0; n < 50 || !stop; ++n) {
        // Copying in many threads is what is tried.
        const Index copy = shared;  // NOLINT(performance-unnecessary-copy-initialization)
        wrong += rowsOf(copy.query(text)) != found ? 1 : 0;
        wrong += rowsOf(Index::open(path).query(text)) != found ? 1 : 0;
        wrong += rowsOf(copy.search("KNRT", 3)) != words ? 1 : 0;
        wrong += copy.find(text) != phrases ? 1 : 0;
        wrong += Index::open(path).find(text) != phrases ? 1 : 0;
        wrong += copy.explain(text, "Konrad Zuse").toJson() != explained ? 1 : 0;
      }
    });
  }
  for (int i = 0; i < 20; ++i) {
    publish(path, GetParam());
    wrong += rowsOf(Index::open(path).query(text)) != found ? 1 : 0;
  }
  stop = true;
  for (auto& reader : readers) {
    reader.join();
  }
  EXPECT_EQ(wrong, 0);
}

INSTANTIATE_TEST_SUITE_P(Modes, IndexThreadsTest,
                         ::testing::Values(MatchingMode::words, MatchingMode::wholeText,
                                           MatchingMode::phoneticWords));

}  // namespace
}  // namespace wordcatcher
