// Words near another one against the textbook table: every small question of small images, long
// words, and more letters than have a bit of their own.

#include "wordcatcher/fuzzy/NearWords.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <random>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "LiteralFind.h"
#include "wordcatcher/fuzzy/EditDistance.h"
#include "wordcatcher/storage/SearchImageWriter.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using testing::literalEdits;

constexpr std::uint32_t kMostEdits = 3;

std::vector<std::u16string> wordsUpTo(std::size_t length, std::u16string_view letters) {
  std::vector<std::u16string> words = {u""};
  for (std::size_t i = 0; words[i].size() < length; ++i) {
    for (const char16_t letter : letters) {
      words.push_back(words[i] + letter);
    }
  }
  words.erase(words.begin());
  return words;
}

/// An image of some words, ascending as in the image.
class Words {
 public:
  explicit Words(const std::vector<std::u16string>& words)
      : Words(std::set<std::u16string>(words.begin(), words.end())) {}

  explicit Words(const std::set<std::u16string>& words) : _words(words.begin(), words.end()) {
    SearchImageWriter writer(0);
    for (const auto& word : _words) {
      writer.addWord(word);
    }
    _image = SearchImage::fromBytes(writer.finish());
  }

  const std::vector<std::u16string>& all() const { return _words; }

  /// Compares every answer about one word; the number of words that the table finds.
  std::size_t expectNear(std::u16string_view query) const {
    std::size_t matches = 0;
    for (const bool swaps : {true, false}) {
      std::vector<std::uint64_t> edits;
      for (const auto& word : _words) {
        edits.push_back(literalEdits(query, word, swaps));
      }
      for (std::uint32_t most = 0; most <= kMostEdits; ++most) {
        matches += expectNear(query, edits, {most}, swaps);
        // From lengths of which all such words are to those that none is of.
        for (std::size_t longer = 0; most > 0 && longer <= 2 * most + 2; ++longer) {
          const std::size_t fromLength =
              query.size() + longer - std::min<std::size_t>(query.size(), most);
          expectNear(query, edits, {most, fromLength}, swaps);
        }
      }
    }
    return matches;
  }

  std::vector<NearWord> near(std::u16string_view query, std::uint32_t most) const {
    return nearWords(*_image, query, {most}, true);
  }

  void expectExact(std::u16string_view query) const {
    const auto found = exactWord(*_image, query);
    const auto expected = std::lower_bound(_words.begin(), _words.end(), query);
    if (expected != _words.end() && *expected == query) {
      EXPECT_TRUE(found.has_value() && _words[*found] == query) << displayUtf8(query);
    } else {
      EXPECT_FALSE(found.has_value()) << displayUtf8(query);
    }
  }

  /// The number of ways to write the word as two, some unit of it standing for the space or none.
  std::size_t expectJoined(const std::u16string& query) const {
    std::size_t ways = 0;
    for (const Seam most : {Seam::none, Seam::unit}) {
      std::set<std::pair<std::u16string, std::u16string>> expected;
      for (const Seam seam : {Seam::none, most}) {
        const std::size_t gap = seam == Seam::unit ? 1 : 0;
        for (std::size_t length = 1; length + gap < query.size(); ++length) {
          const auto head = query.substr(0, length);
          const auto tail = query.substr(length + gap);
          if (has(head) && has(tail)) {
            expected.emplace(head, tail);
          }
        }
      }
      std::set<std::pair<std::u16string, std::u16string>> found;
      const auto joined = wordsJoinedIn(*_image, query, most);
      for (const JoinedWords& each : joined) {
        found.emplace(_image->textOf(each.head), _image->textOf(each.tail));
      }
      EXPECT_EQ(found.size(), joined.size()) << "each once: " << displayUtf8(query);
      EXPECT_TRUE(found == expected) << displayUtf8(query);
      ways += expected.size();
    }
    return ways;
  }

  /// The number of words that are two others and a unit between them.
  std::size_t expectBetween(std::u16string_view head, std::u16string_view tail) const {
    std::vector<std::u16string> expected;
    for (const auto& word : _words) {
      if (word.size() == head.size() + 1 + tail.size() && word.starts_with(head) &&
          word.ends_with(tail)) {
        expected.push_back(word);
      }
    }
    std::vector<std::u16string> found;
    for (const std::uint32_t word : wordsWithUnitBetween(*_image, head, tail)) {
      found.emplace_back(_image->textOf(word));
    }
    std::sort(found.begin(), found.end());
    EXPECT_TRUE(found == expected) << displayUtf8(head) << " and " << displayUtf8(tail);
    return expected.size();
  }

 private:
  std::size_t expectNear(std::u16string_view query, const std::vector<std::uint64_t>& edits,
                         NearLimit limit, bool swaps) const {
    std::vector<NearWord> expected;
    for (std::uint32_t i = 0; i < _words.size(); ++i) {
      const std::size_t length = _words[i].size();
      const bool isShort = limit.edits > 0 && length < limit.fromLength;
      if (edits[i] <= limit.edits - (isShort ? 1U : 0U)) {
        expected.push_back(
            {i, static_cast<std::uint32_t>(edits[i]), static_cast<std::uint32_t>(length)});
      }
    }
    EXPECT_TRUE(nearWords(*_image, query, limit, swaps) == expected)
        << displayUtf8(query) << " within " << limit.edits << " from length " << limit.fromLength
        << (swaps ? " with" : " without") << " swaps of " << _words.size() << " words";
    return expected.size();
  }

  bool has(const std::u16string& word) const {
    return std::binary_search(_words.begin(), _words.end(), word);
  }

  std::vector<std::u16string> _words;
  std::shared_ptr<const SearchImage> _image;
};

/// All words of two letters, and one in three of those with the third.
Words smallWorld() {
  std::mt19937 random(11);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  auto words = wordsUpTo(5, u"ab");
  for (const auto& word : wordsUpTo(5, u"abc")) {
    if (random() % 3 == 0) {
      words.push_back(word);
    }
  }
  return Words(words);
}

TEST(EditDistanceTest, IsThatOfTheTextbook) {
  for (const auto& a : wordsUpTo(4, u"abc")) {
    for (const auto& b : wordsUpTo(3, u"abc")) {
      for (const bool swaps : {true, false}) {
        ASSERT_EQ(editDistance(a, b, swaps), literalEdits(a, b, swaps));
        ASSERT_EQ(editDistance(b, a, swaps), literalEdits(a, b, swaps));
      }
    }
  }
  // A swap's letters are not edited again, so this is no swap and an insertion.
  EXPECT_EQ(editDistance(u"ca", u"abc", true), 3U);
  EXPECT_EQ(editDistance(u"", u"ab", true), 2U);
}

TEST(NearWordsTest, EveryWordOfThreeLetters) {
  const Words world = smallWorld();
  std::size_t matches = 0;
  for (const auto& query : wordsUpTo(5, u"abc")) {
    matches += world.expectNear(query);
    if (HasFailure()) {
      return;
    }
  }
  EXPECT_GT(matches, 100000U) << "the comparison was not of empty lists";
}

TEST(NearWordsTest, WordsLongEnoughToBeReadFromBothEnds) {
  const Words world(wordsUpTo(9, u"ab"));
  const auto queries = wordsUpTo(10, u"ab");
  std::size_t matches = 0;
  for (std::size_t i = 0; i < queries.size() && !HasFailure(); ++i) {
    if (i % 7 == 0) {
      matches += world.expectNear(queries[i]);
    }
  }
  EXPECT_GT(matches, 100000U);
}

TEST(NearWordsTest, EveryImageOfAFewWords) {
  std::mt19937 random(12);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  const auto words = wordsUpTo(8, u"abc");
  for (int i = 0; i < 300 && !HasFailure(); ++i) {
    std::vector<std::u16string> some;
    for (std::size_t count = 1 + random() % 4; count > 0; --count) {
      some.push_back(words[random() % words.size()]);
    }
    const Words few(some);
    for (int question = 0; question < 20; ++question) {
      few.expectNear(words[random() % words.size()]);
    }
    for (const auto& word : few.all()) {
      few.expectExact(word);
      few.expectJoined(word);
      for (std::size_t gap = 0; gap < word.size(); ++gap) {
        EXPECT_GE(few.expectBetween(word.substr(0, gap), word.substr(gap + 1)), 1U);
      }
    }
    for (auto near : few.all()) {
      near[random() % near.size()] = u'b';
      std::swap(near[random() % near.size()], near.back());
      few.expectNear(near);
    }
  }
}

/// A word with so many edits of each kind here and there.
std::u16string withEdits(std::u16string word, int edits, std::u16string_view letters,
                         std::mt19937& random) {
  for (; edits > 0 && word.size() > 1; --edits) {
    const std::size_t place = random() % (word.size() - 1);
    switch (random() % 4) {
      case 0:
        word.insert(place, 1, letters[random() % letters.size()]);
        break;
      case 1:
        word.erase(place, 1);
        break;
      case 2:
        word[place] = letters[random() % letters.size()];
        break;
      default:
        std::swap(word[place], word[place + 1]);
    }
  }
  return word;
}

TEST(NearWordsTest, AHundredThousandLetters) {
  // Too long for the table of the textbook, and for any walk that is not linear in the word.
  std::mt19937 random(14);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  std::u16string word;
  while (word.size() < 100'000) {
    word += static_cast<char16_t>(u'a' + random() % 20);
  }
  std::vector<std::u16string> words = {word};
  std::vector<std::uint32_t> edits = {0};
  for (const std::size_t place : {std::size_t{0}, word.size() / 2, word.size() - 1}) {
    auto other = word;
    other[place] = u'x';
    words.push_back(other);
    edits.push_back(1);
    other.insert(word.size() / 2, 1, u'y');
    words.push_back(other);
    edits.push_back(2);
    other.erase(word.size() - 10, 1);
    words.push_back(other);
    edits.push_back(3);
  }
  const Words world(words);
  for (std::uint32_t most = 0; most <= kMostEdits; ++most) {
    std::vector<std::uint32_t> expected;
    for (const auto& each : world.all()) {
      const auto place = std::find(words.begin(), words.end(), each) - words.begin();
      if (edits[static_cast<std::size_t>(place)] <= most) {
        expected.push_back(edits[static_cast<std::size_t>(place)]);
      }
    }
    std::vector<std::uint32_t> found;
    for (const auto& near : world.near(word, most)) {
      found.push_back(near.edits);
    }
    EXPECT_EQ(found, expected) << most;
  }
}

TEST(NearWordsTest, LongWords) {
  std::mt19937 random(13);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  std::vector<std::u16string> words;
  for (const std::size_t length : {30U, 44U, 54U, 59U, 62U, 63U, 64U, 65U, 66U, 128U, 300U}) {
    for (const std::u16string_view letters : {u"ab", u"abcdefghij"}) {
      std::u16string word;
      while (word.size() < length) {
        word += letters[random() % letters.size()];
      }
      words.push_back(word);
      words.push_back(withEdits(word, 2, letters, random));
      words.push_back(withEdits(word, 4, letters, random));
    }
  }
  const Words world(words);
  std::size_t matches = 0;
  for (std::size_t i = 0; i < words.size() && !HasFailure(); ++i) {
    matches += world.expectNear(words[i]);
    world.expectExact(words[i]);
    if (i % 3 == 0) {
      matches += world.expectNear(withEdits(words[i], 3, u"abz", random));
    }
  }
  EXPECT_GT(matches, 500U);
}

TEST(NearWordsTest, MoreLettersThanHaveABitOfTheirOwn) {
  std::mt19937 random(14);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  std::u16string letters;
  for (char16_t letter = 0; letter < 100; ++letter) {
    letters += static_cast<char16_t>(0x4E00 + 5 * letter);
  }
  std::vector<std::u16string> words;
  for (int i = 0; i < 400; ++i) {
    std::u16string word;
    for (std::size_t length = 1 + random() % 10; length > 0; --length) {
      // The first letters are frequent, the last ones rare.
      word += letters[random() % (1 + random() % letters.size())];
    }
    words.push_back(word);
    words.push_back(withEdits(word, 2, letters, random));
  }
  const Words world(words);
  std::size_t matches = 0;
  for (int i = 0; i < 120 && !HasFailure(); ++i) {
    // One letter is in no word.
    const auto query = withEdits(words[random() % words.size()], static_cast<int>(random() % 4),
                                 letters + u"!", random);
    matches += world.expectNear(query);
    world.expectExact(query);
    world.expectJoined(query);
  }
  EXPECT_GT(matches, 5000U);
}

TEST(NearWordsTest, NoWordsAtAll) {
  const Words none(std::vector<std::u16string>{});
  for (const std::u16string_view query : {u"", u"a", u"abcdefghijklmnop"}) {
    none.expectExact(query);
    none.expectJoined(std::u16string(query));
    none.expectBetween(query, query);
  }
  none.expectNear(u"a");
  none.expectNear(u"abcdefghijklmnop");
  const Words some(std::vector<std::u16string>{u"a", u"ab"});
  some.expectExact(u"");
  some.expectJoined(u"");
}

TEST(NearWordsTest, SignsOfSearchesHaveNoMeaning) {
  const Words world(std::vector<std::u16string>{u"oder", u"o_er", u"o*er", u"*", u"elbe"});
  for (const std::u16string_view query : {u"o*er", u"o_er", u"_oder", u"*", u"_", u"****"}) {
    world.expectNear(query);
  }
}

TEST(ExactWordTest, EveryWordOfThreeLetters) {
  const Words world = smallWorld();
  for (const auto& query : wordsUpTo(6, u"abc")) {
    world.expectExact(query);
    if (HasFailure()) {
      return;
    }
  }
}

TEST(WordsJoinedInTest, EveryWordOfThreeLetters) {
  const Words world = smallWorld();
  std::size_t ways = 0;
  for (const auto& query : wordsUpTo(7, u"abc")) {
    ways += world.expectJoined(query);
    if (HasFailure()) {
      return;
    }
  }
  EXPECT_GT(ways, 3000U);
}

TEST(WordsJoinedInTest, AsManyWaysAsThereAre) {
  std::vector<std::u16string> words;
  for (std::size_t length = 1; length <= 200; ++length) {
    words.emplace_back(length, u'a');
  }
  const Words world(words);
  EXPECT_EQ(world.expectJoined(std::u16string(150, u'a')), 149U + 149U + 148U);
}

TEST(WordsWithUnitBetweenTest, EveryTwoWordsOfThreeLetters) {
  const Words world = smallWorld();
  const auto parts = wordsUpTo(4, u"abc");
  std::size_t words = 0;
  for (const auto& head : parts) {
    for (const auto& tail : parts) {
      words += world.expectBetween(head, tail);
    }
    if (HasFailure()) {
      return;
    }
  }
  EXPECT_GT(words, 300U);
  // A letter that no word has, on either side, and nothing on either side.
  for (const auto& part : parts) {
    world.expectBetween(part + u'!', u"a");
    world.expectBetween(u"a", u'!' + part);
    world.expectBetween(part, u"");
    world.expectBetween(u"", part);
  }
}

TEST(WordsWithUnitBetweenTest, OfMoreLettersThanHaveABitOfTheirOwn) {
  std::vector<std::u16string> words;
  for (char16_t unit = 0x4E00; unit < 0x4E00 + 200; ++unit) {
    words.push_back(std::u16string(u"go") + unit + u"fish");
    words.push_back(std::u16string(u"go") + unit);
    words.push_back(std::u16string(1, unit) + u"go");
    words.push_back(unit % 2 == 0 ? std::u16string(u"elbe") + unit : u"elbe");
  }
  const Words world(words);
  EXPECT_EQ(world.expectBetween(u"go", u"fish"), 200U);
  EXPECT_EQ(world.expectBetween(u"", u"go"), 200U);
  EXPECT_EQ(world.expectBetween(u"elbe", u""), 100U);
  EXPECT_EQ(world.expectBetween(u"g", u"\x4E01"), 1U);
}

}  // namespace
}  // namespace wordcatcher
