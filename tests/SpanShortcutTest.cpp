// The shortcut against the query that looks up every word, which SpanQueryTest holds to the steps.

#include "wordcatcher/matcher/SpanShortcut.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <utility>

#include "wordcatcher/matcher/SpanQuery.h"
#include "wordcatcher/storage/SearchImageWriter.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using Words = std::vector<std::u16string>;

/// What was compared, so that a test can tell that it compared something.
struct Tally {
  std::size_t asked = 0;
  std::size_t answered = 0;      // by the shortcut
  std::size_t withRecords = 0;   // of those
  std::size_t withNothing = 0;   // of those: no word brought any value
  std::size_t withoutMatch = 0;  // of those: values, but none within the bound
  std::size_t truncated = 0;     // of those
};

std::u16string joined(const Words& words) {
  std::u16string text;
  for (const auto& word : words) {
    text += word + u' ';
  }
  return text;
}

/// An image of phrases whose values are named as they are added.
class World {
 public:
  World() : _writer(0) {}

  void add(const Words& phrase, const std::string& value, std::uint32_t countedWords) {
    std::vector<std::uint32_t> numbers;
    numbers.reserve(phrase.size());
    for (const auto& word : phrase) {
      numbers.push_back(_writer.addWord(word));
    }
    _writer.addPhrase(numbers, _writer.addValue(value, countedWords));
  }

  void addWithoutValue(const std::u16string& word) { _writer.addWord(word); }

  void close() { _image = SearchImage::fromBytes(_writer.finish()); }

  /// Whether the shortcut answers, if it does, as the query does.
  bool agrees(const std::u16string& text, const SpanQueryLimits& limits) {
    ++tally.asked;
    const auto answer = SpanShortcut(*_image, _segmenter, limits).run(text);
    if (!answer) {
      return true;
    }
    std::int64_t wordsMatched = 0;
    SpanQuery query(*_image, _segmenter, limits, wordsMatched);
    const auto scored = query.run(text);
    ++tally.answered;
    tally.withNothing += scored ? 0 : 1;
    tally.withRecords += scored && !scored->empty() ? 1 : 0;
    tally.withoutMatch += scored && scored->empty() ? 1 : 0;
    tally.truncated += answer->truncated ? 1 : 0;
    return answer->scored == scored && answer->truncated == query.truncated();
  }

  Tally tally;

 private:
  SearchImageWriter _writer;
  std::shared_ptr<const SearchImage> _image;
  WordSegmenter _segmenter;
};

SpanQueryLimits limitsOf(std::int64_t editDistance, std::size_t maxWords = SIZE_MAX,
                         std::size_t maxWordUnits = SIZE_MAX) {
  return {editDistance, 2, 3, maxWords, maxWordUnits};
}

/// Words of one to six letters, most of them within two edits of many others.
const Words kClose = {u"a",   u"b",     u"ab",    u"ba",    u"xy",    u"aab",    u"aba",    u"bab",
                      u"xyz", u"abab",  u"abba",  u"baba",  u"gold",  u"golden", u"goldan", u"gate",
                      u"old", u"abaab", u"babab", u"xyzzy", u"plugh", u"1906"};

/// Words that have nothing in common, and the signs with a meaning of their own.
const Words kApart = {u"gold",  u"bridge",   u"retriever", u"puppy", u"an",     u"ox",
                      u"river", u"mountain", u"a_b",       u"shore", u"häuser", u"brigde"};

void add(Tally& all, const Tally& more) {
  all.asked += more.asked;
  all.answered += more.answered;
  all.withRecords += more.withRecords;
  all.withNothing += more.withNothing;
  all.withoutMatch += more.withoutMatch;
  all.truncated += more.truncated;
}

/// Random phrases and texts of some words; half of the texts are phrases, a quarter of their words
/// misspelled.
Tally compareRandomly(const Words& vocabulary, std::uint32_t seed) {
  std::mt19937 random(seed);
  const auto some = [&](std::size_t most) {
    Words words(1 + random() % most);
    for (auto& word : words) {
      word = vocabulary[random() % vocabulary.size()];
    }
    return words;
  };
  Tally all;
  for (int round = 0; round < 1500; ++round) {
    World world;
    std::vector<Words> phrases;
    const std::size_t count = 1 + random() % 12;
    for (std::size_t i = 0; i < count; ++i) {
      phrases.push_back(some(4));
      // Some values have several phrases, some a count that is none of their words'.
      world.add(phrases.back(), std::to_string(random() % (count + 2)), random() % 5);
    }
    for (std::size_t i = random() % 4; i > 0; --i) {
      world.addWithoutValue(some(1).front());
    }
    world.close();
    for (int i = 0; i < 12; ++i) {
      Words words = random() % 2 == 0 ? phrases[random() % phrases.size()] : some(5);
      if (random() % 3 == 0) {
        words.push_back(some(1).front());
      }
      for (auto& word : words) {
        if (random() % 4 == 0) {
          word.insert(random() % (word.size() + 1), 1, u'x');
        }
      }
      const auto limits =
          limitsOf(random() % 3 == 0 ? 0 : 2, random() % 5 == 0 ? random() % 4 : SIZE_MAX,
                   random() % 5 == 0 ? random() % 6 : SIZE_MAX);
      const std::u16string text = joined(words);
      EXPECT_TRUE(world.agrees(text, limits))
          << "round " << round << ": " << displayUtf8(text) << " at " << limits.editDistance;
    }
    add(all, world.tally);
  }
  return all;
}

/// Every way of answering was compared, and often.
void expectMuch(const Tally& tally) {
  EXPECT_GT(tally.answered, tally.asked / 2);
  EXPECT_GT(tally.withRecords, tally.asked / 10);
  EXPECT_GT(tally.withNothing, tally.asked / 10);
  EXPECT_GT(tally.withoutMatch, tally.asked / 10);
  EXPECT_GT(tally.truncated, tally.asked / 10);
}

TEST(SpanShortcutTest, WordsNearEachOtherAnswerTheSame) { expectMuch(compareRandomly(kClose, 7)); }

TEST(SpanShortcutTest, WordsFarApartAnswerTheSame) { expectMuch(compareRandomly(kApart, 8)); }

TEST(SpanShortcutTest, EveryTextOfEveryPairOfPhrases) {
  const Words words = {u"ab", u"bab", u"abab", u"golden"};
  std::vector<Words> texts = {{}};
  for (std::size_t i = 0; texts[i].size() < 3; ++i) {
    for (const auto& word : words) {
      texts.push_back(texts[i]);
      texts.back().push_back(word);
    }
  }
  const auto phrasesEnd =
      std::find_if(texts.begin(), texts.end(), [](const Words& text) { return text.size() == 3; });
  const std::vector<Words> phrases(texts.begin() + 1, phrasesEnd);
  ASSERT_EQ(phrases.size(), 20U);
  Tally all;
  for (std::size_t first = 0; first < phrases.size(); ++first) {
    for (std::size_t second = first; second < phrases.size(); ++second) {
      World world;
      world.add(phrases[first], "first", 1);
      world.add(phrases[second], "second", 2);
      world.close();
      for (const auto& text : texts) {
        for (const std::int64_t editDistance : {0, 2}) {
          EXPECT_TRUE(world.agrees(joined(text), limitsOf(editDistance)))
              << displayUtf8(joined(phrases[first])) << "and "
              << displayUtf8(joined(phrases[second])) << "in " << displayUtf8(joined(text)) << "at "
              << editDistance;
        }
      }
      add(all, world.tally);
    }
  }
  EXPECT_GT(all.answered, all.asked / 2);
  EXPECT_GT(all.withRecords, all.asked / 10);
}

TEST(SpanShortcutTest, AValueOfVeryManyPhrasesIsLeftToTheQuery) {
  World world;
  for (char16_t a = u'a'; a <= u'z'; ++a) {
    for (char16_t b = u'a'; b <= u'z'; ++b) {
      for (char16_t c = u'a'; c <= u'z'; ++c) {
        world.add({{u'l', u'a', u'k', u'e', a, b, c}}, "lakes", 1);
      }
    }
  }
  world.add({u"golden", u"bridge"}, "lakes", 2);
  world.add({u"riverside", u"gate"}, "river", 2);
  world.close();
  EXPECT_TRUE(world.agrees(u"golden bridge", limitsOf(2)));
  EXPECT_EQ(world.tally.answered, 0U);
  EXPECT_TRUE(world.agrees(u"riverside", limitsOf(2)));
  EXPECT_EQ(world.tally.answered, 1U);
}

}  // namespace
}  // namespace wordcatcher
