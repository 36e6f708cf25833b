// Index::find against the literal judging of every phrase: every small question of small indexes,
// and real words.

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "FindSupport.h"
#include "LiteralFind.h"
#include "RealWords.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using testing::edited;
using testing::Entries;
using testing::indexOf;
using testing::linesOf;
using testing::LiteralFind;
using testing::misspelled;
using testing::unlimited;

/// All rows of up to `most` of these words, with spaces between.
std::vector<std::string> allRows(const std::vector<std::string>& words, std::size_t most) {
  std::vector<std::string> rows = {""};
  for (std::size_t begin = 0, length = 1; length <= most; ++length) {
    const std::size_t end = rows.size();
    for (; begin < end; ++begin) {
      for (const auto& word : words) {
        rows.push_back(rows[begin].empty() ? word : rows[begin] + ' ' + word);
      }
    }
  }
  rows.erase(rows.begin());
  return rows;
}

/// An index, and the literal judge of the same phrases.
class Both {
 public:
  explicit Both(const Entries& entries, MatchingMode mode = MatchingMode::words)
      : _index(indexOf(entries, mode)), _literal(mode) {
    for (const auto& [phrase, value] : entries) {
      _literal.add(phrase, value);
      _values.push_back(value);
    }
  }

  const Index& index() const { return _index; }

  /// Compares the whole lists; the literal one.
  std::vector<FoundPhrase> expectSame(const std::string& text, const FindOptions& options) const {
    auto expected = _literal.findAll(text, options);
    const auto found = _index.find(text, options);
    EXPECT_FALSE(found.truncated) << text;
    EXPECT_EQ(found.matches == expected, true)
        << text << describe(options) << difference(found.matches, expected);
    return expected;
  }

  /// Of a list known to be right, each limit gives the beginning.
  void expectBeginnings(const std::string& text, FindOptions options,
                        const std::vector<FoundPhrase>& all) const {
    for (std::size_t limit = 0; limit <= all.size() + 1; ++limit) {
      options.limit = limit;
      const auto found = _index.find(text, options);
      const auto size = std::min(limit, all.size());
      EXPECT_EQ(found.matches.size() == size &&
                    std::equal(found.matches.begin(), found.matches.end(), all.begin()),
                true)
          << text << describe(options) << " and limit " << limit << difference(found.matches, all);
    }
  }

  /// explain() tells of each value what the list tells.
  void expectExplained(const std::string& text, const FindOptions& options,
                       const std::vector<FoundPhrase>& all) const {
    for (const auto& value : _values) {
      const auto explained = _index.explain(text, value, options);
      const auto match = std::find_if(all.begin(), all.end(), [&value](const FoundPhrase& each) {
        return each.value == value;
      });
      ASSERT_TRUE(explained.isStored);
      ASSERT_EQ(explained.isFound, match != all.end()) << text << " for " << value;
      ASSERT_EQ(explained.objections.empty(), explained.isFound) << text << " for " << value;
      if (explained.isFound) {
        ASSERT_EQ(explained.cost, match->cost) << text << " for " << value;
        ASSERT_TRUE(explained.pairs == match->hits) << text << " for " << value;
      }
      ASSERT_EQ(explained.cost,
                explained.edits + 2 * (explained.missing.size() + explained.surplus.size()))
          << text << " for " << value;
    }
  }

 private:
  /// The first match that is another.
  static std::string difference(const std::vector<FoundPhrase>& found,
                                const std::vector<FoundPhrase>& expected) {
    auto foundLines = linesOf(found);
    auto expectedLines = linesOf(expected);
    foundLines.emplace_back("no more");
    expectedLines.emplace_back("no more");
    std::size_t i = 0;
    while (i + 1 < std::min(foundLines.size(), expectedLines.size()) &&
           foundLines[i] == expectedLines[i]) {
      ++i;
    }
    return "; at " + std::to_string(i) + " it finds\n  " + foundLines[i] + "\ninstead of\n  " +
           expectedLines[i];
  }

  static std::string describe(const FindOptions& options) {
    const auto& edits = options.edits;
    return " with edits " + std::to_string(edits.shortEdits) + ' ' +
           std::to_string(edits.mediumEdits) + ' ' + std::to_string(edits.longEdits) + ' ' +
           std::to_string(edits.wholeTextEdits) + ", of numbers " +
           std::to_string(edits.numberEdits) + ", for words up to " +
           std::to_string(edits.shortLength) + ' ' + std::to_string(edits.mediumLength) +
           (options.transpositions ? ", swaps" : "") + ", at least " +
           std::to_string(options.minWords) + " words, at most " +
           (options.maxCost ? std::to_string(*options.maxCost) : "any cost");
  }

  Index _index;
  LiteralFind _literal;
  std::vector<std::string> _values;
};

Entries asEntries(const std::vector<std::string>& phrases) {
  Entries entries;
  for (const auto& phrase : phrases) {
    entries.emplace_back(phrase, phrase);
  }
  return entries;
}

std::vector<FindOptions> manyOptions() {
  std::vector<FindOptions> many;
  for (const bool transpositions : {true, false}) {
    for (const EditLimits& edits :
         {EditLimits(), EditLimits{2, 5, 0, 0, 0, 0}, EditLimits{1, 2, 0, 1, 1},
          EditLimits{2, 5, 1, 1, 2}, EditLimits{1, 2, 1, 2, 3}, EditLimits{2, 5, 3, 3, 3, 3, 2},
          // Longer words may have fewer.
          EditLimits{1, 2, 2, 1, 0}, EditLimits{2, 4, 1, 3, 2}}) {
      FindOptions options = unlimited();
      options.transpositions = transpositions;
      options.edits = edits;
      many.push_back(options);
    }
  }
  return many;
}

TEST(FindYardstickTest, EveryTextOverAFewWordsInAllPhrasesOverThem) {
  // Words that are near one another, swapped, the joined form of others, and the same twice.
  const Both all(asEntries(allRows({"a", "ab", "ba", "aab"}, 3)));
  const auto texts = allRows({"a", "b", "ab", "ba", "aba"}, 3);
  const auto options = manyOptions();
  std::size_t matches = 0;
  for (std::size_t i = 0; i < texts.size() && !HasFailure(); ++i) {
    // A third of the sets of options for each text, and all of them for the short texts.
    for (std::size_t o = 0; o < options.size(); ++o) {
      if (texts[i].size() <= 5 || o % 3 == i % 3) {
        matches += all.expectSame(texts[i], options[o]).size();
      }
    }
  }
  EXPECT_GT(matches, 10000U) << "the comparison was not of empty lists";
}

TEST(FindYardstickTest, EveryWordBesideStoredOnesOfEveryLength) {
  std::vector<std::string> letters = {""};
  for (std::size_t i = 0; letters[i].size() < 8; ++i) {
    letters.push_back(letters[i] + 'a');
    letters.push_back(letters[i] + 'b');
  }
  std::vector<std::string> stored;
  std::vector<std::string> texts(letters.begin() + 1, letters.end());
  for (std::size_t i = 1; i < letters.size(); ++i) {
    if (letters[i].size() < 4 || i % 5 == 0) {
      stored.push_back(letters[i]);
    }
  }
  const Both all(asEntries(stored));
  const auto options = manyOptions();
  std::mt19937 random(46);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  std::size_t matches = 0;
  for (std::size_t i = 0; i < texts.size() && !HasFailure(); ++i) {
    matches += all.expectSame(texts[i], unlimited()).size();
    for (int some = 0; some < 4; ++some) {
      matches += all.expectSame(texts[i], options[random() % options.size()]).size();
    }
  }
  EXPECT_GT(matches, 5000U) << "the comparison was not of empty lists";
}

TEST(FindYardstickTest, LongerTexts) {
  const Both all(asEntries({"a", "b", "ab", "ba", "a b", "b a", "a a", "b ab", "ab a", "a b a",
                            "b b a", "ab ab", "ba a b", "a a a", "b a b"}));
  const auto texts = allRows({"a", "b", "ab"}, 5);
  const auto options = manyOptions();
  for (std::size_t i = 0; i < texts.size() && !HasFailure(); ++i) {
    all.expectSame(texts[i], options[i % options.size()]);
  }
}

TEST(FindYardstickTest, EveryLimitGivesTheFirstOfAll) {
  const Both all(asEntries(allRows({"a", "ab", "ba"}, 2)));
  for (const auto& text : allRows({"a", "b", "ab"}, 3)) {
    for (const auto& options : {manyOptions()[0], manyOptions()[3], manyOptions()[11]}) {
      all.expectBeginnings(text, options, all.expectSame(text, options));
    }
    if (HasFailure()) {
      return;
    }
  }
}

TEST(FindYardstickTest, EveryLimitWhereAPhraseHoldsSeveralNearWords) {
  // "Stone" is as near to "stove" as to "store". The phrase that holds both is paired by the more
  // frequent one, so it comes behind those of the rarer one, whose list it stands first in.
  Entries entries = {{"stove store", "both"}};
  const auto add = [&entries](const std::string& word, std::size_t count, std::size_t length) {
    for (std::size_t i = 0; i < count; ++i) {
      const std::string other(length, static_cast<char>('f' + i));
      entries.emplace_back(word + ' ' + other, word + ' ' + other);
    }
  };
  add("shone", 4, 4);
  add("store", 2, 9);
  add("stove", 5, 5);
  const Both both(entries);
  for (const std::string text : {"stone", "a stone", "stone age stone"}) {
    const auto all = both.expectSame(text, unlimited());
    EXPECT_EQ(all.size(), entries.size()) << text;
    both.expectBeginnings(text, unlimited(), all);
  }
}

TEST(FindYardstickTest, EveryBoundOfCostAndWords) {
  const Both all(asEntries(allRows({"a", "ab", "ba"}, 2)));
  for (const auto& text : allRows({"a", "b", "ba"}, 2)) {
    for (std::size_t minWords = 0; minWords <= 3; ++minWords) {
      for (std::uint64_t maxCost = 0; maxCost <= 8; ++maxCost) {
        FindOptions options = unlimited();
        options.edits.shortEdits = 1;
        options.minWords = minWords;
        options.maxCost = maxCost;
        const auto found = all.expectSame(text, options);
        all.expectBeginnings(text, options, found);
        all.expectExplained(text, options, found);
      }
    }
    if (HasFailure()) {
      return;
    }
  }
}

TEST(FindYardstickTest, ExplainsEveryValueAsItIsFound) {
  const Both all(asEntries(allRows({"a", "ab", "ba"}, 2)));
  const auto options = manyOptions();
  const auto texts = allRows({"a", "b", "ab"}, 3);
  for (std::size_t i = 0; i < texts.size() && !HasFailure(); ++i) {
    const auto& chosen = options[i % options.size()];
    all.expectExplained(texts[i], chosen, all.expectSame(texts[i], chosen));
  }
}

/// Up to so many words.
rc::Gen<std::string> rowsOf(const rc::Gen<std::string>& word, std::size_t most) {
  return rc::gen::map(
      rc::gen::resize(static_cast<int>(most), rc::gen::container<std::vector<std::string>>(word)),
      [](const std::vector<std::string>& words) {
        std::string row;
        for (const auto& each : words) {
          row += (row.empty() ? "" : " ") + each;
        }
        return row;
      });
}

/// A name like those that people ask for, of few letters, so that much is near to much.
rc::Gen<std::string> anyRow(std::size_t most) {
  const auto word =
      rc::gen::element<std::string>("a", "b", "ab", "ba", "abc", "bac", "abcab", "abcba", "cab",
                                    "bc", "12", "a1", "a12", "É", "abé");
  return rowsOf(word, most);
}

rc::Gen<FindOptions> anyOptions() {
  return rc::gen::exec([] {
    FindOptions options = unlimited();
    options.transpositions = *rc::gen::arbitrary<bool>();
    options.minWords = *rc::gen::weightedElement<std::size_t>({{4, 1}, {1, 0}, {1, 2}, {1, 3}});
    if (*rc::gen::arbitrary<bool>()) {
      options.maxCost = *rc::gen::inRange<std::uint64_t>(0, 10);
    }
    const auto edits = rc::gen::inRange<std::uint32_t>(0, EditLimits::kMaxEdits + 1);
    const auto length = rc::gen::inRange<std::size_t>(0, 6);
    options.edits = {*length, *length, *edits, *edits, *edits, *edits, *edits};
    return options;
  });
}

/// Values of several phrases, asked with texts. Counts the matches.
bool holdsForAny(MatchingMode mode, const rc::Gen<std::string>& phrases,
                 const rc::Gen<std::string>& texts, std::size_t& matches) {
  return rc::check([&] {
    Entries entries;
    const auto count = *rc::gen::inRange(0, 12);
    for (int i = 0; i < count; ++i) {
      entries.emplace_back(*phrases, std::string(1, "VWXYZ"[*rc::gen::inRange(0, 5)]));
    }
    const Both both(entries, mode);
    for (int i = 0; i < 6; ++i) {
      const auto text = *texts;
      const auto options = *anyOptions();
      const auto all = both.expectSame(text, options);
      both.expectBeginnings(text, options, all);
      both.expectExplained(text, options, all);
      matches += all.size();
    }
    RC_ASSERT(!::testing::Test::HasFailure());
  });
}

TEST(FindYardstickTest, WordsWithDigits) {
  const Both all(asEntries(allRows({"a", "a1", "1a", "12", "a12"}, 2)));
  std::size_t matches = 0;
  for (const auto& text : allRows({"a", "1", "12", "a2", "a12", "ab1"}, 2)) {
    for (std::uint32_t numberEdits = 0; numberEdits <= EditLimits::kMaxEdits; ++numberEdits) {
      for (const EditLimits& edits : {EditLimits(), EditLimits{1, 2, 1, 2, 3}}) {
        FindOptions options = unlimited();
        options.edits = edits;
        options.edits.numberEdits = numberEdits;
        const auto found = all.expectSame(text, options);
        all.expectExplained(text, options, found);
        matches += found.size();
      }
    }
    if (HasFailure()) {
      return;
    }
  }
  EXPECT_GT(matches, 1000U) << "the comparison was not of empty lists";
}

/// A row of words that sound alike in groups, or have no sound, or more codes than one.
rc::Gen<std::string> anySounds(std::size_t most) {
  const auto word =
      rc::gen::element<std::string>("Catherine", "Kathryn", "thorn", "tarn", "knee", "nie",
                                    "Xavier", "the", "U.S", "d’Ivoire", "h", "a1", "É", "沖");
  return rowsOf(word, most);
}

TEST(FindYardstickTest, Codes) {
  std::size_t matches = 0;
  EXPECT_TRUE(holdsForAny(MatchingMode::phoneticWords, anySounds(4), anySounds(5), matches));
  EXPECT_GT(matches, 0U) << "the comparison was not of empty lists";
}

TEST(FindYardstickTest, EveryTextOverAFewSounds) {
  // Two words of one sound, others of one code that begins as theirs, and one without any.
  const Both all(asEntries(allRows({"Kathryn", "car", "carts", "h"}, 3)),
                 MatchingMode::phoneticWords);
  std::size_t matches = 0;
  for (const auto& text : allRows({"Catherine", "core", "Kathryn", "h", "carts"}, 3)) {
    const auto found = all.expectSame(text, unlimited());
    all.expectBeginnings(text, unlimited(), found);
    matches += found.size();
    if (HasFailure()) {
      return;
    }
  }
  EXPECT_GT(matches, 1000U) << "the comparison was not of empty lists";
}

TEST(FindYardstickTest, ValuesOfSeveralPhrases) {
  std::size_t matches = 0;
  EXPECT_TRUE(holdsForAny(MatchingMode::words, anyRow(4), anyRow(5), matches));
  EXPECT_GT(matches, 0U) << "the comparison was not of empty lists";
}

TEST(FindYardstickTest, WholeTexts) {
  std::size_t matches = 0;
  EXPECT_TRUE(holdsForAny(MatchingMode::wholeText, anyRow(2), anyRow(2), matches));
  EXPECT_GT(matches, 0U) << "the comparison was not of empty lists";
}

std::string asUtf8(const std::u16string& text) { return toUtf8(text).value(); }

/// Terms of two words and more, and some of their words.
std::vector<std::u16string> someTerms(std::size_t count, std::mt19937& random) {
  std::vector<std::u16string> terms;
  for (const auto& lemma : testing::lemmas()) {
    if (lemma.find(u' ') != std::u16string::npos) {
      terms.push_back(lemma);
    }
  }
  auto chosen = testing::sample(terms, count, random);
  const auto others = testing::sample(testing::lemmas(), count / 3, random);
  chosen.insert(chosen.end(), others.begin(), others.end());
  return chosen;
}

/// As people write: two words joined, or one in two, also by a wrong key.
std::string joinedOrSplit(std::u16string text, std::mt19937& random) {
  const std::size_t space = text.find(u' ');
  const bool isReplaced = random() % 2 == 0;
  if (space != std::u16string::npos && random() % 2 == 0) {
    text.replace(space, 1, isReplaced ? u"n" : u"");
  } else if (text.size() > 4) {
    text.replace(1 + random() % (text.size() - 1), isReplaced ? 1 : 0, u" ");
  }
  return asUtf8(text);
}

TEST(FindYardstickTest, RealTerms) {
  std::mt19937 random(7);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  const auto terms = someTerms(900, random);
  Entries entries;
  for (const auto& term : terms) {
    entries.emplace_back(asUtf8(term), asUtf8(term) + "{ " + std::to_string(term.size()) + " }");
  }
  const Both both(entries);
  std::size_t matches = 0;
  for (int i = 0; i < 150 && !HasFailure(); ++i) {
    const auto& term = terms[random() % terms.size()];
    const std::string text =
        i % 4 == 3 ? joinedOrSplit(term, random) : asUtf8(misspelled(term, terms, random));
    FindOptions options = unlimited();
    options.transpositions = i % 3 != 0;
    if (i % 10 == 9) {
      options.edits = {0, 3, 0, 2, 3, 3};
    }
    const auto all = both.expectSame(text, options);
    matches += all.size();
    for (const std::size_t limit : {1U, 2U, 5U, 10U, 40U}) {
      options.limit = limit;
      const auto found = both.index().find(text, options).matches;
      EXPECT_TRUE(found.size() == std::min(limit, all.size()) &&
                  std::equal(found.begin(), found.end(), all.begin()))
          << text << " with limit " << limit;
    }
  }
  EXPECT_GT(matches, 2000U) << "the comparison was not of empty lists";
}

}  // namespace
}  // namespace wordcatcher
