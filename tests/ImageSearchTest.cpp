// The search of an image against a table of edit distances that knows nothing of automata, and
// against the walk of the literal automaton.

#include "wordcatcher/fuzzy/ImageSearch.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <algorithm>
#include <limits>
#include <map>
#include <set>
#include <string>

#include "EditDistanceYardstick.h"
#include "wordcatcher/storage/SearchImageWriter.h"

namespace wordcatcher {
namespace {

using testing::searchDistance;

/// Words, and how many values each carries.
using Entries = std::map<std::u16string, std::uint32_t>;

struct Found {
  std::u16string value;
  std::int64_t distance;
  std::uint32_t values;

  friend bool operator==(const Found&, const Found&) = default;
};

std::shared_ptr<const SearchImage> imageOf(const Entries& entries) {
  SearchImageWriter writer(0);
  for (const auto& [word, values] : entries) {
    writer.addWord(word);
    for (std::uint32_t i = 0; i < values; ++i) {
      writer.addPosting(word, writer.addValue(std::to_string(i), 0));
    }
  }
  auto image = SearchImage::fromBytes(std::move(writer).finish());
  image->verify();
  return image;
}

std::vector<Found> expected(const Entries& entries, std::u16string_view query, std::int64_t k) {
  std::vector<Found> found;
  for (const auto& [word, values] : entries) {
    if (const auto distance = searchDistance(query, word, k)) {
      found.push_back({word, *distance, values});
    }
  }
  std::sort(found.begin(), found.end(), [](const Found& a, const Found& b) {
    return std::make_tuple(~a.values, a.distance, a.value.size(), a.value) <
           std::make_tuple(~b.values, b.distance, b.value.size(), b.value);
  });
  return found;
}

std::vector<Found> actual(const SearchImage& image, std::u16string_view query, std::int64_t k) {
  std::vector<Found> found;
  for (const auto& hit : searchImage(image, query, k)) {
    found.push_back({image.textOf(hit.word), hit.distance, hit.values});
    EXPECT_EQ(hit.length, found.back().value.size());
  }
  return found;
}

std::vector<std::u16string> wordsUpTo(std::size_t length, std::u16string_view letters) {
  std::vector<std::u16string> words = {u""};
  for (std::size_t first = 0, n = 1; n <= length; ++n) {
    for (const std::size_t end = words.size(); first < end; ++first) {
      for (const char16_t letter : letters) {
        words.push_back(words[first] + letter);
      }
    }
  }
  return words;
}

void compareAll(const Entries& entries, const std::vector<std::u16string>& queries,
                std::int64_t maxDistance, std::size_t leastMatches) {
  const auto image = imageOf(entries);
  std::size_t matches = 0;
  for (const auto& query : queries) {
    for (std::int64_t k = -1; k <= maxDistance; ++k) {
      const auto found = actual(*image, query, k);
      matches += found.size();
      ASSERT_EQ(found, expected(entries, query, k))
          << std::string(query.begin(), query.end()) << " at " << k;
    }
  }
  EXPECT_GE(matches, leastMatches);
}

Entries entriesOf(const std::vector<std::u16string>& words) {
  Entries entries;
  for (std::size_t i = 0; i < words.size(); ++i) {
    if (!words[i].empty()) {
      entries[words[i]] = i % 3;
    }
  }
  return entries;
}

TEST(ImageSearchTest, EveryWordOfASmallWorldAtEveryDistance) {
  const auto words = wordsUpTo(5, u"abc");
  compareAll(entriesOf(words), words, 6, 300000);
}

TEST(ImageSearchTest, EveryQueryOfLettersStarsAndUnderscores) {
  compareAll(entriesOf(wordsUpTo(4, u"ab_*")), wordsUpTo(5, u"ab_*"), 3, 500000);
}

TEST(ImageSearchTest, ManyEditsOfLettersStarsAndUnderscores) {
  // Beyond four edits the search is another.
  compareAll(entriesOf(wordsUpTo(5, u"a_")), wordsUpTo(6, u"a_*"), 7, 200000);
}

TEST(ImageSearchTest, ManyEditsOfLongWords) {
  // Longer than the columns that are kept from word to word, the words alike beyond that length;
  // distances around the greatest that fit into 32 bits, and up to the greatest of all.
  Entries entries;
  const std::u16string head(1600, u'a');
  for (const std::u16string_view tail : {u"", u"b", u"bb", u"bbcc", u"bcb", u"cbbbbbbb"}) {
    entries[head + std::u16string(tail)] = 1;
    entries[u"b" + head + std::u16string(tail)] = 2;
  }
  const auto image = imageOf(entries);
  for (const std::size_t length : {1U, 1598U}) {
    const std::u16string query = std::u16string(length, u'a') + u"bbc";
    for (const std::int64_t k :
         {std::int64_t{5}, std::int64_t{11}, std::int64_t{1700}, std::int64_t{0xFFFFFFFF},
          std::numeric_limits<std::int64_t>::max()}) {
      ASSERT_EQ(actual(*image, query, k), expected(entries, query, k)) << length << " at " << k;
    }
  }
}

TEST(ImageSearchTest, EveryIndexOfAFewWords) {
  // Every set of words of up to 2 letters over two letters, every query of up to 5.
  const auto words = wordsUpTo(2, u"ab");
  const auto queries = wordsUpTo(5, u"ab");
  ASSERT_EQ(words.size(), 7U);
  for (unsigned chosen = 0; chosen < 64; ++chosen) {
    std::vector<std::u16string> some;
    for (unsigned i = 0; i < 6; ++i) {
      if ((chosen >> i & 1U) != 0) {
        some.push_back(words[i + 1]);
      }
    }
    compareAll(entriesOf(some), queries, 3, 0);
  }
}

TEST(ImageSearchTest, AnEmptyImageAnswersWithNothing) {
  compareAll({}, {u"", u"a", u"abcdef"}, 6, 0);
}

TEST(ImageSearchTest, QueriesOfAnyLength) {
  // Around the length from which a query's code units no longer have a table of their own.
  Entries entries;
  std::u16string text;
  for (int i = 0; text.size() < 140; ++i) {
    text += static_cast<char16_t>(u'a' + i * 7 % 26);
    entries[text] = 1;
  }
  std::vector<std::u16string> queries;
  for (std::size_t length = 50; length < 140; length += 3) {
    std::u16string query = text.substr(0, length);
    query[length / 3] = u'-';
    query.insert(length / 2, 1, u'+');
    query.erase(length - 5, 1);
    queries.push_back(query);
  }
  compareAll(entries, queries, 4, 60);
}

/// Words over letters that mean something to the automaton, letters outside ASCII, halves of
/// surrogate pairs, and more letters than have a bit of their own in the trees.
rc::Gen<std::u16string> anyWord() {
  return rc::gen::container<std::u16string>(rc::gen::weightedOneOf<char16_t>(
      {{8, rc::gen::element<char16_t>(u'a', u'b', u'c')},
       {2, rc::gen::element<char16_t>(u'*', u'_', u'é', char16_t{0xD83D}, char16_t{0xDE00})},
       {2, rc::gen::inRange<char16_t>(0x4E00, 0x4E80)}}));
}

RC_GTEST_PROP(ImageSearchTest, RandomIndexesAndQueries, ()) {
  const auto words = *rc::gen::container<std::vector<std::u16string>>(anyWord());
  const auto entries = entriesOf(words);
  const auto image = imageOf(entries);
  for (int i = 0; i < 5; ++i) {
    // A word with a few letters changed is a better question than a random one.
    auto query = words.empty() ? *anyWord() : *rc::gen::elementOf(words) + *anyWord();
    const auto cut = *rc::gen::inRange<std::size_t>(0, query.size() + 1);
    query.erase(cut / 2, cut / 3);
    for (std::int64_t k = -1; k <= 6; ++k) {
      RC_ASSERT(actual(*image, query, k) == expected(entries, query, k));
    }
  }
}

}  // namespace
}  // namespace wordcatcher
