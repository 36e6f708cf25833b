// Every search result against a table of edit distances that knows nothing of automata.

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <algorithm>
#include <map>
#include <set>

#include "EditDistanceYardstick.h"
#include "TestSupport.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

namespace wordcatcher {
namespace {

using testing::reachable;
using testing::searchDistance;
using testing::TemporaryDirectory;

using Entries = std::map<std::u16string, std::set<std::u16string>>;

struct Found {
  std::u16string value;
  std::int64_t distance;
  std::vector<std::u16string> data;

  friend bool operator==(const Found&, const Found&) = default;
};

std::vector<Found> expected(const Entries& entries, std::u16string_view query, std::int64_t k) {
  std::vector<Found> found;
  for (const auto& [value, data] : entries) {
    const auto distance = reachable(value) ? searchDistance(query, value, k) : std::nullopt;
    if (distance) {
      found.push_back({value, *distance, {data.begin(), data.end()}});
    }
  }
  std::sort(found.begin(), found.end(), [](const Found& a, const Found& b) {
    const auto key = [](const Found& entry) {
      return std::make_tuple(-static_cast<std::int64_t>(entry.data.size()), entry.distance,
                             entry.value.size(), entry.value);
    };
    return key(a) < key(b);
  });
  return found;
}

std::vector<Found> actual(LXFuzzyIndex& index, std::u16string_view query, std::int64_t k) {
  std::vector<Found> found;
  for (const auto& match : index.search_withMaxDistance(query, k)) {
    found.push_back({match.value(), match.distance(), match.data()});
  }
  return found;
}

void fill(LXFuzzyIndex& index, const Entries& entries) {
  index.setMode(2);
  for (const auto& [value, data] : entries) {
    index.addString(value);
    for (const auto& entry : data) {
      index.addString_withData(value, entry);
    }
  }
  index.setMode(1);
}

TEST(SearchYardstickTest, EveryWordOfASmallWorldAtEveryDistance) {
  std::vector<std::u16string> words = {u""};
  for (std::size_t first = 0, length = 1; length <= 5; ++length) {
    const std::size_t end = words.size();
    for (; first < end; ++first) {
      for (const char16_t letter : {u'a', u'b', u'c'}) {
        words.push_back(words[first] + letter);
      }
    }
  }
  ASSERT_EQ(words.size(), 364U);
  Entries entries;
  for (std::size_t i = 0; i < words.size(); ++i) {
    for (std::size_t n = 0; n < i % 3; ++n) {
      entries[words[i]].insert(std::u16string(1, static_cast<char16_t>(u'0' + n)));
    }
    entries.try_emplace(words[i]);
  }
  const TemporaryDirectory directory;
  LXFuzzyIndex index(directory.path());
  fill(index, entries);
  std::size_t matches = 0;
  for (const auto& query : words) {
    for (std::int64_t k = -1; k <= 3; ++k) {
      const auto found = actual(index, query, k);
      matches += found.size();
      ASSERT_EQ(found, expected(entries, query, k))
          << std::string(query.begin(), query.end()) << " at " << k;
    }
  }
  EXPECT_GT(matches, 100000U) << "the comparison was not of empty lists";
}

/// Strings over letters that mean something to the automata, letters outside ASCII, and halves and
/// wholes of surrogate pairs.
rc::Gen<std::u16string> anyString() {
  return rc::gen::container<std::u16string>(
      rc::gen::weightedElement<char16_t>({{8, u'a'},
                                          {8, u'b'},
                                          {3, u'*'},
                                          {3, u'_'},
                                          {2, u'é'},
                                          {1, char16_t{0xD83D}},
                                          {1, char16_t{0xDE00}},
                                          {1, u'日'}}));
}

RC_GTEST_PROP(SearchYardstickTest, RandomIndexesAndQueries, ()) {
  const auto strings = *rc::gen::container<std::vector<std::u16string>>(anyString());
  const auto tags =
      *rc::gen::container<std::vector<char>>(strings.size(), rc::gen::inRange('0', '4'));
  Entries entries;
  for (std::size_t i = 0; i < strings.size(); ++i) {
    auto& data = entries[strings[i]];
    if (tags[i] != '3') {
      data.insert(std::u16string(1, static_cast<char16_t>(tags[i])));
    }
  }
  const TemporaryDirectory directory;
  LXFuzzyIndex index(directory.path());
  fill(index, entries);
  for (int i = 0; i < 5; ++i) {
    const auto query = *anyString();
    for (std::int64_t k = -1; k <= 3; ++k) {
      RC_ASSERT(actual(index, query, k) == expected(entries, query, k));
    }
  }
}

}  // namespace
}  // namespace wordcatcher
