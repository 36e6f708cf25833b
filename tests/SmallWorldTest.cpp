// Every small question of every kind of small index, against the walk of the literal automaton.
//
// That walk judges each stored word by itself: what it finds in an index is what it finds in the
// index of all words of the world, less the words that the index does not hold. So it runs once
// over all words, for every question, and each index is held to its part of the answers.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <map>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "LiteralSearch.h"
#include "TestSupport.h"
#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/storage/SearchImageWriter.h"

namespace wordcatcher {
namespace {

using testing::literalSearch;
using testing::TemporaryDirectory;

constexpr std::int64_t kLeastDistance = -1;
constexpr std::int64_t kMostDistance = 3;
constexpr std::size_t kLongestWord = 4;
constexpr std::size_t kLongestQuery = 6;  // from there on a search goes by halves

std::vector<std::u16string> wordsUpTo(std::size_t length) {
  std::vector<std::u16string> words = {u""};
  for (std::size_t i = 0; words[i].size() < length; ++i) {
    words.push_back(words[i] + u'a');
    words.push_back(words[i] + u'b');
  }
  words.erase(words.begin());
  return words;
}

/// All queries, and those of up to four letters with "*" or "_" beside or in place of each letter.
std::vector<std::u16string> allQueries() {
  const auto plain = wordsUpTo(kLongestQuery);
  std::set<std::u16string> queries(plain.begin(), plain.end());
  for (const auto& query : wordsUpTo(kLongestWord)) {
    for (const char16_t special : {u'*', u'_'}) {
      for (std::size_t place = 0; place <= query.size(); ++place) {
        auto inserted = query;
        inserted.insert(place, 1, special);
        queries.insert(inserted);
        if (place < query.size()) {
          auto replaced = query;
          replaced[place] = special;
          queries.insert(replaced);
        }
      }
    }
  }
  return {queries.begin(), queries.end()};
}

/// A word of the world, with how many edits away; words by their place in the world.
struct Found {
  std::size_t word;
  std::int64_t distance;

  friend bool operator==(const Found&, const Found&) = default;
};

/// An index of some words of the world: ascending places.
using Places = std::vector<std::size_t>;

class SmallWorldTest : public ::testing::Test {
 protected:
  /// As many data strings as the order of results needs to differ from that of the words.
  static std::size_t dataOf(std::size_t word) { return word % 3; }

  static void SetUpTestSuite() {
    words = wordsUpTo(kLongestWord);
    std::sort(words.begin(), words.end());
    ASSERT_EQ(words.size(), 30U);
    for (std::size_t word = 0; word < words.size(); ++word) {
      wordAt[words[word]] = word;
    }
    queries = allQueries();
    Places whole(words.size());
    for (std::size_t word = 0; word < words.size(); ++word) {
      whole[word] = word;
    }
    answers = literalAnswers(whole);
  }

  /// What the literal walk finds through tables of these words, for every question.
  static std::vector<std::vector<Found>> literalAnswers(const Places& index) {
    const TemporaryDirectory directory;
    PLXDFA tree(directory.path());
    tree.setMode(2);
    for (const std::size_t place : index) {
      const std::u16string_view word = words[place];
      for (std::size_t i = 0; i < word.size(); ++i) {
        tree.addEdge_fromState_toState(word.substr(i, 1), word.substr(0, i), word.substr(0, i + 1));
      }
      tree.addFinalState(word);
      for (std::size_t data = 0; data < dataOf(place); ++data) {
        tree.setDataFor_to(word, std::u16string(1, static_cast<char16_t>(u'0' + data)));
      }
    }
    tree.setMode(1);
    std::vector<std::vector<Found>> all;
    for (const auto& query : queries) {
      for (std::int64_t k = kLeastDistance; k <= kMostDistance; ++k) {
        auto& found = all.emplace_back();
        for (const auto& match : literalSearch(tree, query, k)) {
          EXPECT_EQ(match.data().size(), dataOf(wordAt.at(match.value())));
          found.push_back({wordAt.at(match.value()), match.distance()});
        }
      }
    }
    return all;
  }

  /// The part of the world's answers that lies in an index.
  static std::vector<Found> partOf(const std::vector<Found>& found, const Places& index) {
    std::uint32_t held = 0;
    for (const std::size_t word : index) {
      held |= std::uint32_t{1} << word;
    }
    std::vector<Found> part;
    std::copy_if(found.begin(), found.end(), std::back_inserter(part),
                 [held](const Found& entry) { return (held >> entry.word & 1U) != 0; });
    return part;
  }

  static std::shared_ptr<const SearchImage> imageOf(const Places& index) {
    SearchImageWriter writer(0);
    for (const std::size_t word : index) {
      writer.addWord(words[word]);
      for (std::size_t data = 0; data < dataOf(word); ++data) {
        writer.addPosting(words[word], writer.addValue(std::to_string(data), 0));
      }
    }
    return SearchImage::fromBytes(std::move(writer).finish());
  }

  /// Asks every question of an index; the number of words found.
  static std::size_t compare(const Places& index) {
    const auto image = imageOf(index);
    std::size_t matches = 0;
    auto answer = answers.begin();
    for (const auto& query : queries) {
      for (std::int64_t k = kLeastDistance; k <= kMostDistance; ++k, ++answer) {
        std::vector<Found> found;
        for (const auto& hit : searchImage(*image, query, k)) {
          // An image holds its words in the order of the world.
          found.push_back({index[hit.word], hit.distance});
        }
        matches += found.size();
        EXPECT_EQ(found == partOf(*answer, index), true)
            << std::string(query.begin(), query.end()) << " at " << k << " of " << index.size()
            << " words, the first " << std::string(words[index[0]].begin(), words[index[0]].end());
      }
    }
    return matches;
  }

  /// `size` different words.
  static Places randomIndex(std::mt19937& random, std::size_t size) {
    std::set<std::size_t> chosen;
    while (chosen.size() < size) {
      chosen.insert(random() % words.size());
    }
    return {chosen.begin(), chosen.end()};
  }

  static std::vector<std::u16string> words;
  static std::map<std::u16string, std::size_t> wordAt;
  static std::vector<std::u16string> queries;
  static std::vector<std::vector<Found>> answers;  // by query, then distance
};

std::vector<std::u16string> SmallWorldTest::words;
std::map<std::u16string, std::size_t> SmallWorldTest::wordAt;
std::vector<std::u16string> SmallWorldTest::queries;
std::vector<std::vector<Found>> SmallWorldTest::answers;

TEST_F(SmallWorldTest, ThePartOfAnIndexIsWhatTheWalkFindsInIt) {
  std::mt19937 random(1);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  for (const std::size_t size : {1U, 3U, 12U}) {
    const Places index = randomIndex(random, size);
    const auto found = literalAnswers(index);
    ASSERT_EQ(found.size(), answers.size());
    for (std::size_t i = 0; i < found.size(); ++i) {
      ASSERT_EQ(found[i] == partOf(answers[i], index), true) << i << " of " << size << " words";
    }
  }
}

TEST_F(SmallWorldTest, AllWordsAtOnce) {
  Places whole(words.size());
  for (std::size_t word = 0; word < words.size(); ++word) {
    whole[word] = word;
  }
  EXPECT_GT(compare(whole), 16000U) << "the comparison was not of empty lists";
}

TEST_F(SmallWorldTest, EveryWordAndEveryPair) {
  std::size_t matches = 0;
  for (std::size_t first = 0; first < words.size(); ++first) {
    matches += compare({first});
    for (std::size_t second = first + 1; second < words.size() && !HasFailure(); ++second) {
      matches += compare({first, second});
    }
  }
  EXPECT_GT(matches, 400000U);
}

TEST_F(SmallWorldTest, ManyTriples) {
  std::mt19937 random(3);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  for (int i = 0; i < 500 && !HasFailure(); ++i) {
    compare(randomIndex(random, 3));
  }
}

TEST_F(SmallWorldTest, ManyIndexesOfAnySize) {
  std::mt19937 random(4);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  for (int i = 0; i < 2000 && !HasFailure(); ++i) {
    compare(randomIndex(random, 4 + random() % 26));
  }
}

}  // namespace
}  // namespace wordcatcher
