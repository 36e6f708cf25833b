// The memory that a query takes, against the bound that Index.h states.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <random>
#include <string>
#include <string_view>
#include <vector>

#include "MemoryCounter.h"
#include "TestSupport.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"
#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/matcher/IndexBuilder.h"
#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/text/Unicode.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {
namespace {

using testing::MemoryCounter;
using testing::TemporaryDirectory;

// As Index.h states them.
constexpr std::size_t kBytesPerWordUnit = 64;
constexpr std::size_t kBytesPerTextByte = 32;
constexpr std::size_t kBytesPerPosting = 64;
constexpr std::size_t kFixedBytes = 1U << 19U;
constexpr std::size_t kBytesPerIndexWord = 16;
constexpr std::size_t kBytesPerWordOfFind = 512;

/// What a text makes a query look at.
struct Load {
  std::size_t longestWord = 0;  // code units
  std::size_t postings = 0;     // of the words that every word of the text finds
};

Index::Options unbounded() {
  Index::Options options;
  options.maxQueryWords = SIZE_MAX;
  options.maxWordUnits = SIZE_MAX;
  return options;
}

/// An index opened twice: with the default budgets and with ones that cut nothing off.
class Opened {
 public:
  Opened(const std::vector<std::string>& phrases, MatchingMode mode) : _mode(mode) {
    const TemporaryDirectory directory;
    const std::string path = directory.file("phrases.wci");
    IndexBuilder builder(path, {.mode = mode, .tables = {}});
    for (const auto& phrase : phrases) {
      builder.add(phrase, phrase);
    }
    builder.commit();
    open(path);
  }

  Opened(const std::string& path, MatchingMode mode) : _mode(mode) { open(path); }

  void expectWithinBound(const std::string& name, const std::string& text) {
    for (const auto& index : _indexes) {
      MemoryCounter::restartPeak();
      const auto result = index.query(text);
      // What lives at the end is there with the result.
      const std::size_t used = MemoryCounter::peak() - MemoryCounter::live();
      const std::size_t bound = boundOf(index, text);
      EXPECT_LE(used, bound) << name << ": " << text.size() << " bytes, " << result.matches.size()
                             << " matches";
      _mostUsed = std::max(_mostUsed, used);
      expectFindWithinBound(index, name, text, bound);
    }
  }

  /// Words within the edit limits are not more than those within two edits, neighbours swapped
  /// aside.
  void expectFindWithinBound(const Index& index, const std::string& name, const std::string& text,
                             std::size_t boundOfQuery) const {
    FindOptions options;
    options.transpositions = false;
    MemoryCounter::restartPeak();
    const auto result = index.find(text, options);
    const std::size_t used = MemoryCounter::peak() - MemoryCounter::live();
    const std::size_t bound = boundOfQuery + kBytesPerWordOfFind * wordsOf(text);
    EXPECT_LE(used, bound) << name << ": find in " << text.size() << " bytes, "
                           << result.matches.size() << " matches";
  }

  std::size_t mostUsed() const { return _mostUsed; }

 private:
  void open(const std::string& path) {
    _indexes.push_back(Index::open(path, {}, _mode));
    _indexes.push_back(Index::open(path, unbounded(), _mode));
  }

  std::size_t boundOf(const Index& index, const std::string& text) const {
    const Load load = loadOf(index, text);
    const auto info = index.info();
    return kBytesPerWordUnit * load.longestWord + kBytesPerTextByte * text.size() +
           kBytesPerPosting * load.postings + kFixedBytes + kBytesPerIndexWord * info.words;
  }

  static std::size_t wordsOf(const std::string& text) {
    const std::u16string units = decodeUtf8(text);
    WordSegmenter segmenter;
    segmenter.start(units);
    std::size_t words = 1;
    while (segmenter.next()) {
      ++words;
    }
    return words;
  }

  Load loadOf(const Index& index, const std::string& text) const {
    std::u16string units = decodeUtf8(text);
    if (_mode == MatchingMode::wholeText) {
      return {units.size(), postingsOf(index, units, 3)};
    }
    const bool phonetic = _mode == MatchingMode::phoneticWords;
    if (phonetic) {
      units = KXMetaphone().translate(units);
    }
    WordSegmenter segmenter;
    segmenter.start(units);
    Load load;
    while (const auto word = segmenter.next()) {
      load.longestWord = std::max(load.longestWord, word->size());
      load.postings += postingsOf(index, *word, phonetic ? 0 : 2);
    }
    return load;
  }

  static std::size_t postingsOf(const Index& index, std::u16string_view word,
                                std::int64_t distance) {
    std::size_t postings = 0;
    for (const auto& match : index.search(displayUtf8(word), distance).matches) {
      postings += std::max<std::size_t>(match.data.size(), 1);
    }
    return postings;
  }

  MatchingMode _mode;
  std::vector<Index> _indexes;
  std::size_t _mostUsed = 0;
};

std::string repeated(std::string_view piece, std::size_t bytes) {
  std::string text;
  while (text.size() + piece.size() <= bytes) {
    text += piece;
  }
  return text;
}

const std::vector<std::string> kPlaces = {"Trinidad and Tobago",
                                          "Bosnia and Herzegovina",
                                          "Papua New Guinea",
                                          "New Zealand",
                                          "New York",
                                          "Côte d'Ivoire",
                                          "Åland Islands",
                                          "沖縄県",
                                          "an ox",
                                          "Kırklareli"};

class QueryMemoryTest : public ::testing::TestWithParam<MatchingMode> {};

TEST_P(QueryMemoryTest, OfHostileTexts) {
  ASSERT_TRUE(MemoryCounter::countsIcu());
  using namespace std::string_literals;
  Opened places(kPlaces, GetParam());
  for (const std::size_t bytes : {1000U, 10000U, 1U << 17U}) {
    for (const auto& [name, piece] : std::vector<std::pair<std::string, std::string>>{
             {"words", "new zeeland and tobbago "},
             {"one word over and over", "island "},
             {"short words", "a b "},
             {"one long word", "a"},
             {"(ab)^k", "ab"},
             {"long words", std::string(900, 'a') + ' '},
             {"stars", "* a*a*a "},
             {"spaces", " "},
             {"zeros", "\0"s},
             {"ill-formed bytes", "\xFF"},
             {"ill-formed bytes in words", "isl\xC3(and\xE2\x82"},
             {"ideographs", "沖縄県"},
             {"kana", "カタカナ"},
             {"Thai", "ภาษาไทย"},
             {"emoji", "😀"},
             {"accents on one letter", "\xCC\x81"},
             {"capitals that grow", "İ"},
             {"sharp s", "ß"}}) {
      places.expectWithinBound(name, repeated(piece, bytes));
    }
  }
  EXPECT_GT(places.mostUsed(), 1U << 17U) << "a text alone is decoded into as much";
}

TEST_P(QueryMemoryTest, OfOrdinaryTexts) {
  Opened places(kPlaces, GetParam());
  for (const auto* text :
       {"", "ox", "trinidat and tobbago", "holidays in new zeeland", "cote divoire",
        "I went from New York to the Åland Islands, and from there to Papua New Guinea."}) {
    places.expectWithinBound(text, text);
  }
}

TEST_P(QueryMemoryTest, OfWordsThatFindMuch) {
  std::vector<std::string> phrases;
  // Every word within two replaced letters of one word, so that one query finds them all.
  const std::string word = "abcdefgh";
  for (std::size_t i = 0; i < word.size(); ++i) {
    for (std::size_t j = i + 1; j < word.size(); ++j) {
      for (char a = 'a'; a <= 'z'; ++a) {
        for (char b = 'a'; b <= 'z'; ++b) {
          std::string near = word;
          near[i] = a;
          near[j] = b;
          phrases.push_back(near);
        }
      }
    }
  }
  // One word in many phrases, more than are sorted, and many phrases without it.
  for (int i = 0; i < 20000; ++i) {
    phrases.push_back("lake " + std::to_string(i));
    phrases.push_back("shore " + std::to_string(i % 5000) + " of " + std::to_string(i));
  }
  Opened many(phrases, GetParam());
  for (const auto* text : {"abcdefgh", "abcdefgh abcdefgh abcdefgi", "lake", "lake 77", "shore",
                           "shore lake", "lake shore lake shore lake abcdefgh"}) {
    many.expectWithinBound(text, text);
  }
}

TEST_P(QueryMemoryTest, OfManyValues) {
  // More postings than are sorted, of an index with a hundred times as many data strings.
  const TemporaryDirectory directory;
  const std::string path = directory.file("phrases.wci");
  IndexBuilder builder(path, {.mode = GetParam(), .tables = {}});
  for (int i = 0; i < 500000; ++i) {
    builder.add(i % 100 == 0 ? "lake" : "shore", std::to_string(i));
  }
  builder.commit();
  Opened many(path, GetParam());
  many.expectWithinBound("one word", "lake");
  // Words that find nothing put every phrase out of reach, so that nothing is due to the result.
  many.expectWithinBound("no matches", "lake wxwxwxwx zyzyzyzy");
}

TEST_P(QueryMemoryTest, OfAValueWithManyPhrases) {
  const TemporaryDirectory directory;
  const std::string path = directory.file("phrases.wci");
  IndexBuilder builder(path, {.mode = GetParam(), .tables = {}});
  for (int i = 0; i < 100000; ++i) {
    builder.add("lake" + std::to_string(i), "lakes");
  }
  builder.add("new island", "lakes");
  builder.commit();
  Opened many(path, GetParam());
  many.expectWithinBound("two words", "new island");
  std::string words = "new island";
  for (char letter = 'a'; letter <= 'z'; ++letter) {
    words += std::string(" new") + letter + " island" + letter;
  }
  many.expectWithinBound("many words", words);
}

TEST_P(QueryMemoryTest, OfTextsThatRepeatTheWordsOfAPhrase) {
  const TemporaryDirectory directory;
  const std::string path = directory.file("phrases.wci");
  IndexBuilder builder(path, {.mode = GetParam(), .tables = {}});
  builder.add(repeated("duran ", 1500), "many");
  builder.add("duranduran duran", "joined");
  builder.commit();
  Opened duran(path, GetParam());
  duran.expectWithinBound("one word over and over", repeated("duran ", 6000));
  duran.expectWithinBound("two words over and over", repeated("duran durane ", 6000));
}

TEST_P(QueryMemoryTest, OfManyLetters) {
  // Every letter may begin a word, and goes on in more than one way.
  std::vector<std::string> phrases;
  constexpr char16_t kFirstSyllable = 0xAC00;
  constexpr int kSyllables = 5000;
  for (int i = 0; i < kSyllables; ++i) {
    for (int j = 0; j < 20; ++j) {
      const auto first = static_cast<char16_t>(kFirstSyllable + i);
      const auto second = static_cast<char16_t>(kFirstSyllable + (i * 7 + j * 31) % kSyllables);
      phrases.push_back(displayUtf8(std::u16string{first, second, second, first, first}));
    }
  }
  Opened many(phrases, GetParam());
  many.expectWithinBound("syllables", "각나다라마");
  many.expectWithinBound("letters", "abcde");
  many.expectWithinBound("stars", "*****");
}

TEST_P(QueryMemoryTest, OfLongWordsThatAreStored) {
  constexpr std::size_t kLongest = 70000;
  std::mt19937 random(5);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  std::string letters;
  while (letters.size() < kLongest) {
    letters += static_cast<char>('a' + random() % 4);
  }
  for (const std::size_t length : {100U, 1000U, 10000U, 70000U}) {
    const std::string text = letters.substr(0, length);
    const std::vector<std::string> one = {text};
    Opened(one, GetParam()).expectWithinBound("one long word", text);
    // More words than a leaf holds, so that trees are as deep as they are long.
    std::vector<std::string> many;
    for (char letter = 'a'; letter <= 'z'; ++letter) {
      many.push_back(text + letter);
      many.push_back(letter + text);
    }
    Opened(many, GetParam()).expectWithinBound("long words that share much", text);
  }
}

TEST_P(QueryMemoryTest, OfWordsWithoutData) {
  const TemporaryDirectory directory;
  {
    LXFuzzyIndex tables(directory.path());
    tables.setMode(2);
    for (char16_t a = u'a'; a <= u'z'; ++a) {
      for (char16_t b = u'a'; b <= u'z'; ++b) {
        tables.addString(std::u16string{u'l', u'a', a, u'e', b, u's'});
      }
    }
    tables.setMode(0);
  }
  Opened words(directory.path(), GetParam());
  words.expectWithinBound("word", "lakees");
}

INSTANTIATE_TEST_SUITE_P(Modes, QueryMemoryTest,
                         ::testing::Values(MatchingMode::words, MatchingMode::wholeText,
                                           MatchingMode::phoneticWords));

}  // namespace
}  // namespace wordcatcher
