// What overlaps, and what an edit does to the order.

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "FindSupport.h"
#include "RealWords.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using testing::Entries;
using testing::indexOf;
using testing::indexOfPhrases;
using testing::linesOf;
using testing::unlimited;
using testing::valuesOf;

using Values = std::vector<std::string>;

Values find(const Index& index, const std::string& text, Overlaps overlaps) {
  FindOptions options = unlimited();
  options.overlaps = overlaps;
  return valuesOf(index.find(text, options));
}

TEST(OverlapsTest, OfANameWithinANameAndOneThatBeginsInIt) {
  const auto index = indexOfPhrases({"New York", "York", "York Minster School", "New York City"});
  const std::string text = "new york minster school";
  FindOptions options = unlimited();
  options.minWords = 1;
  options.maxCost = 6;
  // Ranges: York Minster School 4-23, New York 0-8, York 4-8, New York City 0-8.
  EXPECT_EQ(valuesOf(index.find(text, options)),
            (Values{"York Minster School", "New York", "New York City", "York"}));
  options.overlaps = Overlaps::noSub;
  EXPECT_EQ(valuesOf(index.find(text, options)),
            (Values{"York Minster School", "New York", "New York City"}));
  options.overlaps = Overlaps::longest;
  EXPECT_EQ(valuesOf(index.find(text, options)), (Values{"York Minster School"}));
}

TEST(OverlapsTest, OfEquallyLongOnesTheFirstInOrder) {
  const auto index = indexOf(Entries{{"Springfield", "Springfield, Ohio"},
                                     {"Springfield", "Springfield, Illinois"},
                                     {"Springfeld", "Springfeld, Bavaria"}});
  const std::string text = "in springfield today";
  EXPECT_EQ(find(index, text, Overlaps::all),
            (Values{"Springfield, Illinois", "Springfield, Ohio", "Springfeld, Bavaria"}));
  EXPECT_EQ(find(index, text, Overlaps::noSub), find(index, text, Overlaps::all))
      << "none lies within a larger one";
  EXPECT_EQ(find(index, text, Overlaps::longest), (Values{"Springfield, Illinois"}));
}

bool overlap(const FoundPhrase& a, const FoundPhrase& b) {
  return a.begin < b.end && b.begin < a.end;
}

std::vector<FoundPhrase> withoutSubranges(const std::vector<FoundPhrase>& all) {
  std::vector<FoundPhrase> kept;
  for (const auto& match : all) {
    const bool lies = std::any_of(all.begin(), all.end(), [&match](const FoundPhrase& other) {
      return other.begin <= match.begin && match.end <= other.end &&
             other.end - other.begin > match.end - match.begin;
    });
    if (!lies) {
      kept.push_back(match);
    }
  }
  return kept;
}

/// Again and again the longest that overlaps none of those taken; of several the first in order.
std::vector<FoundPhrase> longestOnes(const std::vector<FoundPhrase>& all) {
  std::vector<std::size_t> taken;
  for (;;) {
    std::size_t best = all.size();
    for (std::size_t i = 0; i < all.size(); ++i) {
      const bool isFree = std::none_of(taken.begin(), taken.end(), [&](std::size_t other) {
        return other == i || overlap(all[i], all[other]);
      });
      if (isFree &&
          (best == all.size() || all[i].end - all[i].begin > all[best].end - all[best].begin)) {
        best = i;
      }
    }
    if (best == all.size()) {
      break;
    }
    taken.push_back(best);
  }
  std::sort(taken.begin(), taken.end());
  std::vector<FoundPhrase> kept;
  for (const std::size_t i : taken) {
    kept.push_back(all[i]);
  }
  return kept;
}

std::string anyRow(std::size_t most, std::mt19937& random) {
  std::string row;
  for (std::size_t words = 1 + random() % most; words > 0; --words) {
    row.append(row.empty() ? "" : " ").append(1 + random() % 3, "abcd"[random() % 4]);
  }
  return row;
}

TEST(OverlapsTest, AreWhatTheirNamesSay) {
  std::mt19937 random(41);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  for (int i = 0; i < 60 && !HasFailure(); ++i) {
    Entries entries;
    for (std::size_t phrases = 1 + random() % 12; phrases > 0; --phrases) {
      entries.emplace_back(anyRow(3, random), std::to_string(phrases));
    }
    const auto index = indexOf(entries);
    for (int question = 0; question < 20; ++question) {
      const auto text = anyRow(8, random);
      FindOptions options = unlimited();
      const auto all = index.find(text, options).matches;
      for (const auto overlaps : {Overlaps::noSub, Overlaps::longest}) {
        options.overlaps = overlaps;
        auto expected = overlaps == Overlaps::noSub ? withoutSubranges(all) : longestOnes(all);
        options.limit = SIZE_MAX;
        EXPECT_EQ(linesOf(index.find(text, options).matches), linesOf(expected)) << text;
        options.limit = 2;
        expected.resize(std::min<std::size_t>(expected.size(), 2));
        EXPECT_EQ(linesOf(index.find(text, options).matches), linesOf(expected)) << text;
      }
    }
  }
}

/// The place of a value among the matches, or behind them all.
std::size_t rankOf(const Index& index, const std::string& text, const std::string& value) {
  const auto values = valuesOf(index.find(text, unlimited()));
  return static_cast<std::size_t>(std::find(values.begin(), values.end(), value) - values.begin());
}

std::vector<std::string> realTerms(std::size_t count, std::mt19937& random) {
  std::vector<std::string> terms;
  for (const auto& lemma : testing::sample(testing::lemmas(), count, random)) {
    terms.push_back(toUtf8(lemma).value());
  }
  return terms;
}

std::string edited(const std::string& text, std::mt19937& random) {
  return toUtf8(testing::edited(fromUtf8(text).value(), random)).value();
}

/// The words of a text beside those of a phrase, whose first one belongs to the text's word
/// `firstWord`.
struct Beside {
  std::uint64_t cost;
  std::vector<std::uint64_t> edits;  // between words of one place
  bool isCrossed = false;            // whether words of different places may be paired, or joined

  Beside(const FindExplanation& explained, std::size_t firstWord) : cost(explained.cost) {
    for (std::size_t i = 0; i < explained.words.size(); ++i) {
      const auto& others = explained.words[i].comparisons;
      for (std::size_t j = 0; j < others.size(); ++j) {
        if (i == firstWord + j) {
          edits.push_back(others[j].edits);
        } else {
          isCrossed = isCrossed || others[j].within;
        }
      }
    }
    for (const auto& pair : explained.pairs) {
      const std::string inText = explained.text.substr(pair.begin, pair.end - pair.begin);
      isCrossed = isCrossed || (inText + pair.word).find(' ') != std::string::npos;
    }
  }
};

TEST(FindOrderTest, AnEditNeverImprovesAPhrase) {
  std::mt19937 random(42);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  const auto terms = realTerms(600, random);
  const auto index = indexOfPhrases(terms);
  std::size_t compared = 0;
  std::size_t farther = 0;
  for (int i = 0; i < 1500 && !HasFailure(); ++i) {
    const auto& phrase = terms[random() % terms.size()];
    const auto& exact = terms[random() % terms.size()];
    if (phrase == exact) {
      continue;
    }
    // The text holds both; then its words of the one get edits, one after the other.
    const auto textOf = [&](const std::string& other) {
      return i % 2 == 0 ? other + ' ' + exact : exact + ' ' + other;
    };
    const auto besideIn = [&](const std::string& other) {
      const auto explained = index.explain(textOf(other), phrase);
      return Beside(explained, i % 2 == 0 ? 0 : explained.words.size() - explained.phrase.size());
    };
    const auto isBehind = [&](const std::string& other) {
      return rankOf(index, textOf(other), exact) < rankOf(index, textOf(other), phrase);
    };
    const std::size_t words = index.explain(textOf(phrase), phrase).words.size();
    std::string before = phrase;
    for (int edit = 0; edit < 5; ++edit) {
      const std::string after = edited(before, random);
      if (index.explain(textOf(after), phrase).words.size() != words) {
        break;  // a word more or less is more than an edit
      }
      const Beside near = besideIn(before);
      const Beside far = besideIn(after);
      bool isFarther = true;
      for (std::size_t word = 0; word < far.edits.size(); ++word) {
        isFarther = isFarther && far.edits[word] >= near.edits[word];
      }
      // What undoes an edit, brings a word near another or joins it, is no mistake more.
      if (isFarther && !near.isCrossed && !far.isCrossed) {
        EXPECT_GE(far.cost, near.cost) << textOf(after) << " after " << textOf(before);
        EXPECT_TRUE(isBehind(after) || !isBehind(before))
            << phrase << " and " << exact << " in " << textOf(after) << " after " << before;
        ++compared;
        farther += far.cost > near.cost ? 1 : 0;
      }
      before = after;
    }
  }
  EXPECT_GT(compared, 2000U);
  EXPECT_GT(farther, 1000U);
}

TEST(FindOrderTest, AMistakeThatMakesAWordLongerDoesNotMakeItNearer) {
  const auto index = indexOfPhrases({"abcdef ghi", "mno", "ab"});
  const auto first = [&index](const std::string& text) { return valuesOf(index.find(text)).at(0); };
  EXPECT_EQ(index.explain("abcdx ghi mno", "abcdef ghi").edits, 2U);
  EXPECT_EQ(first("abcdx ghi mno"), "abcdef ghi");
  EXPECT_EQ(index.explain("abcdxy ghi mno", "abcdef ghi").edits, 2U);
  EXPECT_EQ(first("abcdxy ghi mno"), "abcdef ghi");
  EXPECT_EQ(first("abcdxyz ghi mno"), "mno") << "which is an edit more";
  EXPECT_TRUE(index.explain("abx mno", "ab").pairs.empty());
}

TEST(FindOrderTest, ThePhraseThatTheEditsMakeComesFirst) {
  std::mt19937 random(43);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  auto phrases = realTerms(300, random);
  std::vector<std::pair<std::string, std::string>> pairs;  // a phrase, and one with an edit
  for (int i = 0; i < 200; ++i) {
    const auto& phrase = phrases[random() % 300];
    const auto other = edited(phrase, random);
    if (other != phrase) {
      pairs.emplace_back(phrase, other);
      phrases.push_back(other);
    }
  }
  const auto index = indexOfPhrases(phrases);
  for (const auto& [phrase, other] : pairs) {
    // Words may differ in nothing but punctuation.
    if (index.explain(other, phrase).cost == 0) {
      continue;
    }
    EXPECT_LT(rankOf(index, other, other), rankOf(index, other, phrase));
    EXPECT_LT(rankOf(index, phrase, phrase), rankOf(index, phrase, other));
    EXPECT_EQ(index.explain(phrase, phrase).cost, 0U);
  }
}

TEST(FindOrderTest, WordsInOrderComeBeforeWordsOutOfOrder) {
  const auto index = indexOfPhrases({"Keuka Lake", "Lake Keuka", "Lake of Keuka"});
  // By value, and by length, the others would come first.
  EXPECT_EQ(valuesOf(index.find("keuka our lake")),
            (Values{"Keuka Lake", "Lake Keuka", "Lake of Keuka"}));
  EXPECT_EQ(valuesOf(index.find("lake our keuka")),
            (Values{"Lake Keuka", "Keuka Lake", "Lake of Keuka"}));
  EXPECT_EQ(valuesOf(index.find("lake keuka")),
            (Values{"Lake Keuka", "Keuka Lake", "Lake of Keuka"}));
}

TEST(FindOrderTest, TheFirstLetterIsAsAnyOther) {
  const auto index = indexOfPhrases({"Liechtenstein", "Switzerland"});
  for (const std::string text :
       {"iechtenstein", "Xiechtenstein", "xLiechtenstein", "Liechtenstei", "iLechtenstein"}) {
    const auto matches = index.find(text).matches;
    ASSERT_EQ(valuesOf(index.find(text)), Values{"Liechtenstein"}) << text;
    EXPECT_EQ(matches[0].cost, 1U) << text;
  }
  FindOptions plain;
  plain.transpositions = false;
  EXPECT_EQ(index.find("iLechtenstein", plain).matches.at(0).cost, 2U);
}

TEST(FindOrderTest, TheDefaultLimitsOfWords) {
  const auto index = indexOfPhrases({"ox", "oxen", "oxygen", "covid19", "covidx"});
  const auto cost = [&index](const std::string& text, const std::string& value) {
    const auto explained = index.explain(text, value);
    return explained.isFound ? std::optional(explained.cost) : std::nullopt;
  };
  EXPECT_EQ(cost("ox", "ox"), 0U);
  EXPECT_EQ(cost("oy", "ox"), std::nullopt);
  EXPECT_EQ(cost("oxe", "ox"), std::nullopt) << "however long the text's word is";
  EXPECT_EQ(cost("oxe", "oxen"), 1U);
  EXPECT_EQ(cost("oxne", "oxen"), 1U);
  EXPECT_EQ(cost("axan", "oxen"), std::nullopt);
  EXPECT_EQ(cost("oxenic", "oxen"), std::nullopt);
  EXPECT_EQ(cost("oxyn", "oxygen"), 2U) << "however short the text's word is";
  EXPECT_EQ(cost("oxy", "oxygen"), std::nullopt);
  EXPECT_EQ(cost("oxygenic", "oxygen"), 2U);
  EXPECT_EQ(cost("oxygenica", "oxygen"), std::nullopt);
  EXPECT_EQ(cost("covid19", "covid19"), 0U);
  EXPECT_EQ(cost("covid18", "covid19"), std::nullopt);
  EXPECT_EQ(cost("covidy", "covid19"), std::nullopt);
  EXPECT_EQ(cost("covid1", "covidx"), std::nullopt);
}

}  // namespace
}  // namespace wordcatcher
