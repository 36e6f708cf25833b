// Explanations of costs and distances: as a struct, as JSON and in words.

#include <gtest/gtest.h>

#include <algorithm>
#include <nlohmann/json.hpp>
#include <random>
#include <string>
#include <vector>

#include "FindSupport.h"
#include "RealWords.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using nlohmann::json;
using testing::Entries;
using testing::indexOf;
using testing::indexOfPhrases;

using Values = std::vector<std::string>;

Values wordsOf(const FindExplanation& explained) {
  Values words;
  for (const auto& word : explained.phrase) {
    words.push_back(word.word);
  }
  return words;
}

Index places() {
  return indexOf(Entries{{"Trinidad and Tobago", "Trinidad and Tobago{ TT }"},
                         {"Bosnia and Herzegovina", "Bosnia and Herzegovina{ BA }"},
                         {"New Zealand", "New Zealand{ NZ }"},
                         {"Aotearoa", "New Zealand{ NZ }"},
                         {"...", "Nothing"},
                         {"Route 66", "Route 66"}});
}

/// The JSON form holds all that the struct holds.
void expectSameInJson(const FindExplanation& explained) {
  const std::string line = explained.toJson();
  EXPECT_EQ(line.find('\n'), std::string::npos);
  const json object = json::parse(line);
  EXPECT_EQ(object.size(), 13U);
  EXPECT_EQ(object.at("text"), explained.text);
  EXPECT_EQ(object.at("value"), explained.value);
  EXPECT_EQ(object.at("isStored"), explained.isStored);
  EXPECT_EQ(object.at("isFound"), explained.isFound);
  EXPECT_EQ(object.at("truncated"), explained.truncated);
  json phrase = json::array();
  for (const auto& word : explained.phrase) {
    phrase.push_back(
        {{"word", word.word}, {"lengthLimit", word.lengthLimit}, {"limit", word.limit}});
  }
  EXPECT_EQ(object.at("phrase"), phrase);
  EXPECT_EQ(object.at("missing"), json(explained.missing));
  EXPECT_EQ(object.at("surplus"), json(explained.surplus));
  EXPECT_EQ(object.at("objections"), json(explained.objections));
  EXPECT_EQ(object.at("edits"), explained.edits);
  EXPECT_EQ(object.at("cost"), explained.cost);
  json words = json::array();
  for (const auto& word : explained.words) {
    json comparisons = json::array();
    for (const auto& other : word.comparisons) {
      comparisons.push_back({{"word", other.word},
                             {"edits", other.edits},
                             {"limit", other.limit},
                             {"within", other.within}});
    }
    words.push_back({{"begin", word.begin},
                     {"end", word.end},
                     {"word", word.word},
                     {"written", word.written},
                     {"isLookedUp", word.isLookedUp},
                     {"comparisons", comparisons}});
  }
  EXPECT_EQ(object.at("words"), words);
  json pairs = json::array();
  for (const auto& pair : explained.pairs) {
    pairs.push_back(
        {{"begin", pair.begin}, {"end", pair.end}, {"word", pair.word}, {"edits", pair.edits}});
  }
  EXPECT_EQ(object.at("pairs"), pairs);
}

TEST(ExplainTest, TellsWhatAPhraseCosts) {
  const auto explained = places().explain("to Trinidat, in tobagoo", "Trinidad and Tobago{ TT }");
  EXPECT_TRUE(explained.isStored);
  EXPECT_TRUE(explained.isFound);
  EXPECT_FALSE(explained.truncated);
  EXPECT_EQ(wordsOf(explained), (Values{"trinidad", "and", "tobago"}));
  for (std::size_t i = 0; i < 3; ++i) {
    EXPECT_EQ(explained.phrase[i].limit, i == 1 ? 1U : 2U) << "as long as it is";
    EXPECT_EQ(explained.phrase[i].lengthLimit, explained.phrase[i].limit);
  }
  EXPECT_EQ(explained.pairs,
            (std::vector<FoundWord>{{3, 11, "trinidad", 1}, {16, 23, "tobago", 1}}));
  EXPECT_EQ(explained.missing, Values{"and"});
  EXPECT_EQ(explained.surplus, (Values{"to", "in"}));
  EXPECT_EQ(explained.edits, 2U);
  EXPECT_EQ(explained.cost, 8U);
  EXPECT_TRUE(explained.objections.empty());
  ASSERT_EQ(explained.words.size(), 4U);
  const auto& word = explained.words[1];
  EXPECT_EQ(word.begin, 3U);
  EXPECT_EQ(word.end, 11U);
  EXPECT_EQ(word.word, "trinidat");
  EXPECT_EQ(word.written, "") << "it is no code";
  EXPECT_TRUE(word.isLookedUp);
  ASSERT_EQ(word.comparisons.size(), 3U);
  EXPECT_EQ(word.comparisons[0].word, "trinidad");
  EXPECT_EQ(word.comparisons[0].edits, 1U);
  EXPECT_EQ(word.comparisons[0].limit, 2U);
  EXPECT_TRUE(word.comparisons[0].within);
  EXPECT_EQ(word.comparisons[1].word, "and");
  EXPECT_EQ(word.comparisons[1].edits, 6U);
  EXPECT_EQ(word.comparisons[1].limit, 1U);
  EXPECT_FALSE(word.comparisons[1].within);
  expectSameInJson(explained);
}

TEST(ExplainTest, InWords) {
  EXPECT_EQ(places().explain("zeeland and new", "New Zealand{ NZ }").toText(),
            "Text:   zeeland and new\n"
            "Value:  New Zealand{ NZ }\n"
            "Phrase: new (up to 1 edit), zealand (up to 2 edits)\n"
            "  zeeland: new 6, zealand 1 (near)\n"
            "  and: new 3, zealand 4\n"
            "  new: new 0 (near), zealand 6\n"
            "Paired: zeeland with zealand, 1 edit\n"
            "Paired: new with new, 0 edits\n"
            "Missing from the text: none\n"
            "Left over in the text: and\n"
            "Cost: 3 = 1 edit + 2 x 0 missing + 2 x 1 left over\n");
}

TEST(ExplainTest, TellsOfThePhraseThatFitsBest) {
  const auto index = places();
  EXPECT_EQ(wordsOf(index.explain("aotearoa", "New Zealand{ NZ }")), Values{"aotearoa"});
  EXPECT_EQ(wordsOf(index.explain("zealand", "New Zealand{ NZ }")), (Values{"new", "zealand"}));
  FindOptions two;
  two.minWords = 2;
  EXPECT_FALSE(index.explain("aotearoa", "New Zealand{ NZ }", two).isFound);
  EXPECT_EQ(index.explain("aotearoa new zealand", "New Zealand{ NZ }", two).cost, 2U);
}

TEST(ExplainTest, TellsWhatWasJoined) {
  const auto index = indexOf(Entries{{"won-lost", "won-lost"}, {"railway", "railway"}});
  const auto joined = index.explain("wonlost", "won-lost");
  EXPECT_EQ(joined.pairs, (std::vector<FoundWord>{{0, 7, "won lost", 1}}));
  EXPECT_EQ(joined.cost, 1U);
  EXPECT_TRUE(joined.missing.empty());
  EXPECT_NE(joined.toText().find("Paired: wonlost with won lost, 1 edit\n"), std::string::npos);
  const auto wrongKey = index.explain("wonvlost", "won-lost");
  EXPECT_EQ(wrongKey.pairs, (std::vector<FoundWord>{{0, 8, "won lost", 1}}));
  EXPECT_EQ(wrongKey.cost, 1U);
  EXPECT_TRUE(wrongKey.isFound);
  const auto split = index.explain("a rail way", "railway");
  EXPECT_EQ(split.pairs, (std::vector<FoundWord>{{2, 10, "railway", 1}}));
  EXPECT_EQ(split.surplus, Values{"a"});
  expectSameInJson(split);
}

TEST(ExplainTest, TellsOfABudgetThatCutThePairing) {
  std::string phrase;
  std::string text = "golden";
  for (int i = 0; i < 20; ++i) {
    phrase += "golden goldan goldin ";
    text += " goldon goldon goldon";
  }
  const auto index = indexOf(Entries{{phrase, "long"}, {"golden gate", "short"}});
  for (const std::uint64_t postings : {100, 2000, 2'000'000}) {
    FindOptions options;
    options.maxPostings = postings;
    ASSERT_TRUE(index.find(text, options).truncated);
    const auto explained = index.explain(text, "long", options);
    EXPECT_TRUE(explained.truncated) << postings;
    EXPECT_NE(explained.toText().find("A budget was used up"), std::string::npos);
    for (const auto& objection : explained.objections) {
      EXPECT_NE(objection.find("budget"), std::string::npos) << objection;
    }
    EXPECT_EQ(explained.isFound, explained.objections.empty());
    expectSameInJson(explained);
  }
  EXPECT_TRUE(index.explain(text, "short").truncated) << "as the list is that it stands in";
  EXPECT_FALSE(index.explain("golden gate", "short").truncated);
}

/// What an absent value is told about: some words of each sentence.
void expectAbsent(const FindExplanation& explained, const Values& reasons) {
  EXPECT_FALSE(explained.isFound);
  ASSERT_EQ(explained.objections.size(), reasons.size()) << explained.toText();
  for (std::size_t i = 0; i < reasons.size(); ++i) {
    EXPECT_NE(explained.objections[i].find(reasons[i]), std::string::npos)
        << explained.objections[i];
    EXPECT_NE(explained.toText().find("Not found: " + explained.objections[i] + '\n'),
              std::string::npos);
  }
  expectSameInJson(explained);
}

TEST(ExplainTest, TellsWhyAPhraseIsAbsent) {
  const auto index = places();
  const auto far = index.explain("tribidax bosmian", "Route 66");
  EXPECT_TRUE(far.isStored);
  EXPECT_EQ(far.cost, 8U);
  expectAbsent(far, {"None of its words is near enough"});
  expectAbsent(index.explain("nothing", "Nothing"), {"holds no word"});
  expectAbsent(index.explain("route 67", "Bosnia and Herzegovina{ BA }"), {"None"});
  FindOptions options;
  options.maxCost = 3;
  const auto dear = index.explain("zealand in winter", "New Zealand{ NZ }", options);
  EXPECT_EQ(dear.cost, 6U);
  expectAbsent(dear, {"cost of 6 is more than the greatest allowed, 3"});
  options.maxCost.reset();
  options.minWords = 2;
  expectAbsent(index.explain("zealand", "New Zealand{ NZ }", options),
               {"Only 1 of its words is in the text, and at least 2 must be"});
  options.maxCost = 0;
  options.minWords = 3;
  expectAbsent(index.explain("new zealan", "New Zealand{ NZ }", options),
               {"Only 2 of its words are", "cost of 1 "});
}

TEST(ExplainTest, TellsWhyAMatchIsNotListed) {
  const auto index = indexOf(Entries{{"New York", "New York"},
                                     {"York", "York"},
                                     {"York Minster", "York Minster"},
                                     {"York Minster School", "York Minster School"}});
  const std::string text = "new york minster";
  FindOptions options;
  options.limit = 3;
  expectAbsent(index.explain(text, "York", options),
               {"not among the first 3 in order, which is the limit: its place is 4."});
  options.limit = 4;
  EXPECT_TRUE(index.explain(text, "York", options).isFound);
  options.overlaps = Overlaps::noSub;
  expectAbsent(index.explain(text, "York", options), {"within the larger one"});
  EXPECT_TRUE(index.explain(text, "New York", options).isFound);
  options.limit = 1;
  expectAbsent(index.explain(text, "York", options), {"within the larger one"});
  EXPECT_TRUE(index.explain(text, "New York", options).isFound);
  expectAbsent(index.explain(text, "York Minster", options),
               {"not among the first 1 in order, which is the limit: its place is 2."});
  options.limit = 4;
  options.overlaps = Overlaps::longest;
  EXPECT_TRUE(index.explain(text, "York Minster", options).isFound);
  expectAbsent(index.explain(text, "New York", options), {"overlaps that of another match"});
  expectAbsent(index.explain(text, "York", options), {"overlaps that of another match"});
  options.limit = 0;
  expectAbsent(index.explain(text, "York Minster", options), {"not among the first 0"});
}

TEST(ExplainTest, TellsOfTheBudgetOfPostings) {
  const auto index = indexOf(
      Entries{{"Lake Geneva", "Geneva"}, {"Lake Como", "Como"}, {"Lake Constance", "Constance"}});
  FindOptions options;
  options.maxPostings = 2;
  const auto found = index.find("lake", options);
  ASSERT_TRUE(found.truncated);
  std::size_t listed = 0;
  for (const std::string value : {"Geneva", "Como", "Constance"}) {
    const auto explained = index.explain("lake", value, options);
    const bool isListed = std::any_of(found.matches.begin(), found.matches.end(),
                                      [&](const auto& match) { return match.value == value; });
    listed += isListed ? 1 : 0;
    EXPECT_EQ(explained.isFound, isListed) << value;
    if (!isListed) {
      expectAbsent(explained, {"budget of postings"});
    }
  }
  EXPECT_LT(listed, 3U);
}

TEST(ExplainTest, TheBudgetMayHideThePlace) {
  const auto index = indexOfPhrases({"Lake", "Lake Como", "Lake Geneva", "Lake Constance"});
  FindOptions options;
  options.limit = 1;
  options.maxPostings = 2;
  ASSERT_FALSE(index.find("lake", options).truncated);
  std::size_t hidden = 0;
  for (const std::string value : {"Lake Como", "Lake Geneva", "Lake Constance"}) {
    const auto explained = index.explain("lake", value, options);
    expectAbsent(explained, {"not among the first 1 in order, which is the limit"});
    hidden +=
        explained.objections[0].find("does not suffice to tell its place") != std::string::npos ? 1
                                                                                                : 0;
  }
  EXPECT_EQ(hidden, 2U) << "of three, one more can be looked at";
}

TEST(ExplainTest, AValueThatIsNotExactIsNamedAsFindPrintsIt) {
  const auto index = places();
  const auto explained = index.explain("trinidad", "Trinidad and Tobago");
  EXPECT_FALSE(explained.isStored);
  expectAbsent(explained, {"The index holds no such data string; give one just as find prints it, "
                           "such as \"Trinidad and Tobago{ TT }\"."});
  expectAbsent(index.explain("zealand", "new zeland{ GB }"), {"\"New Zealand{ NZ }\""});
  for (const std::string value : {"Xyzzyx", "", "..."}) {
    const auto strange = index.explain("trinidad", value);
    EXPECT_FALSE(strange.isStored);
    expectAbsent(strange, {"give one just as find prints it."});
  }
  const auto texts = indexOf(Entries{{"Baker Street", "B{ 1 }"}}, MatchingMode::wholeText);
  expectAbsent(texts.explain("x", "baker streat"), {"such as \"B{ 1 }\""});
  const auto sounds = indexOf(Entries{{"Catherine", "C{ 1 }"}}, MatchingMode::phoneticWords);
  expectAbsent(sounds.explain("x", "Kathryn"), {"such as \"C{ 1 }\""});
}

TEST(ExplainTest, NumbersAreNotNear) {
  const auto explained = places().explain("route 67", "Route 66");
  ASSERT_EQ(explained.words.size(), 2U);
  const auto& number = explained.words[1];
  EXPECT_EQ(explained.phrase.at(1).limit, 0U);
  EXPECT_EQ(explained.phrase.at(1).lengthLimit, 0U) << "nothing is near so short a word";
  EXPECT_EQ(number.comparisons.at(1).edits, 1U);
  EXPECT_FALSE(number.comparisons.at(1).within);
  EXPECT_EQ(explained.cost, 4U);
}

TEST(ExplainTest, TellsThatADigitKeepsWordsApart) {
  const auto index = indexOfPhrases({"covid19 vaccine", "b2b"});
  const auto stored = index.explain("covidy", "covid19 vaccine");
  ASSERT_EQ(stored.words.size(), 1U);
  EXPECT_EQ(stored.phrase.at(0).limit, 0U);
  EXPECT_EQ(stored.phrase.at(0).lengthLimit, 2U);
  EXPECT_EQ(stored.words[0].comparisons.at(0).edits, 2U);
  EXPECT_EQ(stored.words[0].comparisons.at(0).limit, 0U);
  EXPECT_EQ(stored.words[0].comparisons.at(1).limit, 2U);
  EXPECT_NE(stored.toText().find("Phrase: covid19 (up to 0 edits as it holds a digit), vaccine (up "
                                 "to 2 edits)\n"
                                 "  covidy: covid19 2 (words with a digit must be the same), "
                                 "vaccine 6\n"),
            std::string::npos)
      << stored.toText();
  expectAbsent(stored, {"None",
                        "A word that holds a digit must be the same, and \"covidy\" is 2 "
                        "edits from \"covid19\"."});
  const auto given = index.explain("b2c", "b2b");
  EXPECT_EQ(given.words.at(0).comparisons.at(0).limit, 0U);
  EXPECT_EQ(given.phrase.at(0).lengthLimit, 1U);
  EXPECT_NE(given.toText().find("  b2c: b2b 1 (words with a digit must be the same)\n"),
            std::string::npos)
      << given.toText();
  expectAbsent(given, {"None", R"("b2c" is 1 edit from "b2b".)"});
  // The text's digit counts as the stored one does.
  const auto plain = indexOfPhrases({"covidx", "b2b sales"});
  const auto only = plain.explain("covid1", "covidx");
  EXPECT_EQ(only.phrase.at(0).limit, 2U);
  EXPECT_EQ(only.words.at(0).comparisons.at(0).limit, 0U);
  expectAbsent(only, {"None", R"("covid1" is 1 edit from "covidx".)"});
  // It says so only where that is the reason: two edits are too many for a word of three letters.
  const auto far = plain.explain("b33", "b2b sales");
  EXPECT_EQ(far.words.at(0).comparisons.at(0).edits, 2U);
  EXPECT_NE(far.toText().find("Phrase: b2b (up to 0 edits as it holds a digit), sales (up to 1 "
                              "edit)\n  b33: b2b 2, sales 5\n"),
            std::string::npos)
      << far.toText();
  expectAbsent(far, {"None"});
  const auto second = indexOfPhrases({"vaccine b2b"}).explain("b33", "vaccine b2b");
  EXPECT_NE(second.toText().find("  b33: vaccine 7, b2b 2\n"), std::string::npos)
      << second.toText();
  expectAbsent(second, {"None"});
  EXPECT_TRUE(index.explain("covidy vaccine", "covid19 vaccine").isFound);
  expectAbsent(index.explain("covid", "b2b"), {"None"});
  FindOptions dear;
  dear.maxCost = 0;
  expectAbsent(index.explain("b2b b2c", "b2b", dear), {"cost"});
  expectAbsent(indexOfPhrases({"b2b b2c"}).explain("b2b", "b2b b2c", dear), {"cost"});
}

TEST(ExplainTest, TellsOfTheEditsOfNumbers) {
  const auto index = indexOfPhrases({"covid19 vaccine", "b2b"});
  FindOptions options;
  options.edits.numberEdits = 1;
  const auto found = index.explain("b2c", "b2b", options);
  EXPECT_EQ(found.cost, 1U);
  EXPECT_EQ(found.phrase.at(0).limit, 1U);
  EXPECT_NE(found.toText().find("Phrase: b2b (up to 1 edit)\n  b2c: b2b 1 (near)\n"),
            std::string::npos);
  const auto far = index.explain("covidy", "covid19 vaccine", options);
  EXPECT_EQ(far.words.at(0).comparisons.at(0).limit, 1U);
  EXPECT_NE(far.toText().find("covid19 2 (words with a digit: up to 1 edit), "), std::string::npos);
  expectAbsent(far, {"None", "may have up to 1 edit, and \"covidy\" is 2 edits from"});
  options.edits.numberEdits = 3;
  EXPECT_EQ(index.explain("b2c", "b2b", options).phrase.at(0).limit, 1U) << "no more than others";
  EXPECT_EQ(index.explain("covidy", "covid19 vaccine", options).cost, 4U);
}

TEST(ExplainTest, ComparesAsManyWordsAsTheBudgetAllows) {
  std::string text;
  std::string phrase;
  for (int i = 0; i < 400; ++i) {
    text += "tarn ";
    phrase += "tree ";
  }
  const auto index = indexOfPhrases({phrase, "tree"});
  const auto explained = index.explain(text + "tree", phrase);
  EXPECT_TRUE(explained.truncated);
  EXPECT_TRUE(explained.isFound) << "what is compared for people does not count";
  std::size_t comparisons = 0;
  for (const auto& word : explained.words) {
    comparisons += word.comparisons.size();
    EXPECT_TRUE(word.isLookedUp);
  }
  EXPECT_EQ(explained.words.size(), 401U);
  EXPECT_EQ(comparisons, FindExplanation::kMaxSteps / FindExplanation::kComparisonSteps);
  EXPECT_EQ(explained.words.front().comparisons.size(), 400U);
  EXPECT_TRUE(explained.words.back().comparisons.empty());
  EXPECT_NE(explained.toText().find("  tree: ... (beyond the budget)\n"), std::string::npos);
  expectSameInJson(explained);
  EXPECT_FALSE(index.explain(text, "tree").truncated);
}

TEST(ExplainTest, ComparingLongWordsTakesMoreOfTheBudget) {
  Index::Options budgets;
  budgets.maxWordUnits = 5000;
  const std::string tree(4096, 't');
  const auto index = indexOfPhrases({tree, tree + " tree"}, MatchingMode::words, budgets);
  EXPECT_FALSE(index.explain(tree, tree).truncated) << "just as much as there is";
  const auto explained = index.explain(tree, tree + " tree");
  EXPECT_TRUE(explained.truncated);
  EXPECT_EQ(explained.words.at(0).comparisons.size(), 1U);
  EXPECT_EQ(explained.missing, Values{"tree"});
}

TEST(ExplainTest, NothingIsComparedBehindWhatIsBeyondTheBudget) {
  Index::Options budgets;
  budgets.maxWordUnits = 5000;
  const std::string tree(4000, 't');
  const std::string phrase = tree + ' ' + tree;
  const auto index = indexOfPhrases({phrase}, MatchingMode::words, budgets);
  const auto explained = index.explain(tree + " tree", phrase);
  EXPECT_TRUE(explained.truncated);
  EXPECT_EQ(explained.words.at(0).comparisons.size(), 1U);
  EXPECT_TRUE(explained.words.at(1).comparisons.empty()) << "there would be room for it";
}

TEST(ExplainTest, SwapsCountAsTheOptionSays) {
  FindOptions options;
  EXPECT_EQ(places().explain("tobgao", "Trinidad and Tobago{ TT }", options).edits, 1U);
  options.transpositions = false;
  const auto plain = places().explain("tobgao", "Trinidad and Tobago{ TT }", options);
  EXPECT_EQ(plain.edits, 2U);
  EXPECT_EQ(plain.words.at(0).comparisons.at(2).edits, 2U);
}

TEST(ExplainTest, HostsStringsThatAreNotUtf8) {
  const auto explained = places().explain("tobago\xFF", "\xC3(");
  EXPECT_EQ(explained.text, "tobago\xFF");
  EXPECT_EQ(json::parse(explained.toJson()).at("text"), "tobago\uFFFD");
  EXPECT_EQ(json::parse(places().explainQuery("\xFF", "\xC3").toJson()).at("text"), "\uFFFD");
}

TEST(ExplainTest, WordsThatAreTooLong) {
  Index::Options budgets;
  budgets.maxWordUnits = 10;
  const auto index =
      indexOf(Entries{{"Mississippi Delta", "Mississippi Delta"}}, MatchingMode::words, budgets);
  const auto explained = index.explain("mississippi delta", "Mississippi Delta");
  EXPECT_TRUE(explained.truncated);
  EXPECT_TRUE(explained.isFound);
  EXPECT_EQ(explained.missing, Values{"mississippi"});
  EXPECT_EQ(explained.surplus, Values{"mississippi"});
  EXPECT_EQ(explained.words.at(0).begin, 0U);
  EXPECT_EQ(explained.words.at(0).end, 11U);
  EXPECT_TRUE(explained.words.at(0).comparisons.empty());
  EXPECT_NE(explained.toText().find("  mississippi, not looked up\n"), std::string::npos);
  EXPECT_NE(explained.toText().find("A budget was used up"), std::string::npos);
  expectSameInJson(explained);
}

TEST(ExplainTest, OtherModes) {
  const auto whole =
      indexOf(Entries{{"12 Baker Street", "A"}, {"Baker Street", "B"}}, MatchingMode::wholeText);
  const auto explained = whole.explain("12 baker streat", "A");
  EXPECT_TRUE(explained.isFound);
  EXPECT_EQ(wordsOf(explained), Values{"12 baker street"});
  EXPECT_EQ(explained.phrase.at(0).limit, 3U);
  EXPECT_EQ(explained.cost, 1U);
  EXPECT_TRUE(explained.words.at(0).comparisons.at(0).within);
  EXPECT_EQ(whole.find("baker street").matches.at(0).value, "B");
  EXPECT_EQ(whole.find("baker street").matches.at(1).value, "A") << "a digit is but a letter here";
  const auto sounds =
      indexOf(Entries{{"Catherine", "C"}, {"Peter", "P"}}, MatchingMode::phoneticWords);
  const auto code = sounds.explain("dear Kathryn", "C");
  EXPECT_TRUE(code.isFound);
  EXPECT_EQ(wordsOf(code), Values{"k0rn"});
  EXPECT_EQ(code.words.at(1).word, "k0rn");
  EXPECT_EQ(code.phrase.at(0).limit, 0U);
  EXPECT_EQ(code.words.at(1).begin, 5U);
  EXPECT_EQ(code.words.at(1).written, "Kathryn");
  EXPECT_EQ(code.surplus, Values{"dear (tr)"});
  expectSameInJson(code);
  EXPECT_EQ(code.toText(),
            "Text:   dear Kathryn\n"
            "Value:  C\n"
            "Phrase: k0rn (up to 0 edits)\n"
            "  dear (tr): k0rn 3\n"
            "  Kathryn (k0rn): k0rn 0 (near)\n"
            "Paired: Kathryn with k0rn, 0 edits\n"
            "Missing from the text: none\n"
            "Left over in the text: dear (tr)\n"
            "Cost: 2 = 0 edits + 2 x 0 missing + 2 x 1 left over\n");
  expectAbsent(sounds.explain("Kathryn", "P"), {"None"});
}

/// The explanation of a distance tells what query() tells.
void expectAsQuery(const Index& index, const std::string& text, const Values& values) {
  const auto result = index.query(text);
  for (const auto& value : values) {
    const auto explained = index.explainQuery(text, value);
    const auto match =
        std::find_if(result.matches.begin(), result.matches.end(), [&](const Index::Match& each) {
          return each.value == value ||
                 std::find(each.data.begin(), each.data.end(), value) != each.data.end();
        });
    const bool isFound = match != result.matches.end();
    ASSERT_EQ(explained.isFound, isFound) << text << " for " << value << explained.toText();
    ASSERT_EQ(explained.truncated, result.truncated);
    ASSERT_TRUE(explained.isStored);
    ASSERT_FALSE(explained.steps.empty()) << text << " for " << value;
    ASSERT_EQ(explained.steps.back().distance, explained.distance) << explained.toText();
    if (isFound) {
      ASSERT_EQ(explained.distance, match->distance) << explained.toText();
      ASSERT_LE(explained.distance, explained.bound) << explained.toText();
    }
    const json object = json::parse(explained.toJson());
    ASSERT_EQ(object.size(), 8U);
    ASSERT_EQ(object.at("text"), text);
    ASSERT_EQ(object.at("value"), value);
    ASSERT_EQ(object.at("isStored"), explained.isStored);
    ASSERT_EQ(object.at("isFound"), explained.isFound);
    ASSERT_EQ(object.at("truncated"), explained.truncated);
    ASSERT_EQ(object.at("distance"), explained.distance);
    ASSERT_EQ(object.at("bound"), explained.bound);
    ASSERT_EQ(object.at("steps").size(), explained.steps.size());
    for (std::size_t i = 0; i < explained.steps.size(); ++i) {
      ASSERT_EQ(object.at("steps")[i].at("sentence"), explained.steps[i].sentence);
      ASSERT_EQ(object.at("steps")[i].at("distance"), explained.steps[i].distance);
      ASSERT_NE(explained.toText().find(std::to_string(i + 1) + ". " + explained.steps[i].sentence),
                std::string::npos);
    }
  }
}

class ExplainQueryTest : public ::testing::TestWithParam<MatchingMode> {};

TEST_P(ExplainQueryTest, AgreesWithTheQuery) {
  std::mt19937 random(51);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  Entries entries;
  Values values;
  std::vector<std::u16string> terms;
  for (const auto& lemma : testing::sample(testing::lemmas(), 60000, random)) {
    // Terms that share words, so that the words of a text have candidates in common.
    if (lemma.find(u" tree") != std::u16string::npos || lemma.find(u"red ") == 0 ||
        lemma.find(u" of ") != std::u16string::npos) {
      const std::string phrase = toUtf8(lemma).value();
      terms.push_back(lemma);
      values.push_back(phrase + "{ " + std::to_string(values.size() % 7) + " }");
      entries.emplace_back(phrase, values.back());
    }
    if (terms.size() == 120) {
      break;
    }
  }
  ASSERT_EQ(terms.size(), 120U);
  const auto index = indexOf(entries, GetParam());
  for (int i = 0; i < 60 && !HasFailure(); ++i) {
    auto text = testing::misspelled(terms[random() % terms.size()], terms, random);
    if (i % 5 == 0) {
      text += u' ' + testing::misspelled(terms[random() % terms.size()], terms, random);
    }
    expectAsQuery(index, toUtf8(text).value(), values);
  }
  for (const char* text : {"", "a", "of", "xyzzyx", "tree", "red of the", "\u00E9"}) {
    expectAsQuery(index, text, values);
  }
}

TEST_P(ExplainQueryTest, AgreesWithTheQueryThatIsCutOff) {
  Index::Options budgets;
  budgets.maxQueryWords = 3;
  budgets.maxWordUnits = 8;
  const Values values = {"Mississippi Delta", "Delta Wing", "New Orleans Delta"};
  const auto index = indexOfPhrases(values, GetParam(), budgets);
  for (const char* text :
       {"mississippi delta", "the delta of new orleans", "delta wing", "delta"}) {
    expectAsQuery(index, text, values);
  }
}

TEST_P(ExplainQueryTest, OfAValueThatIsNotThere) {
  const auto index = indexOfPhrases({"Delta Wing"}, GetParam());
  const auto explained = index.explainQuery("delta wing", "Delta Winx");
  EXPECT_FALSE(explained.isStored);
  EXPECT_FALSE(explained.isFound);
  ASSERT_EQ(explained.steps.size(), 1U);
  EXPECT_EQ(explained.steps[0].sentence,
            "The index holds no such data string; give one just as find prints it, such as \"Delta "
            "Wing\".");
  EXPECT_NE(explained.toText().find("1. The index holds no such data string; "), std::string::npos);
}

INSTANTIATE_TEST_SUITE_P(Modes, ExplainQueryTest,
                         ::testing::Values(MatchingMode::words, MatchingMode::wholeText,
                                           MatchingMode::phoneticWords));

TEST(ExplainQueryTextTest, InWords) {
  const auto explained = places().explainQuery("trinidat tobago", "Trinidad and Tobago{ TT }");
  EXPECT_TRUE(explained.isFound);
  EXPECT_NE(
      explained.toText().find("\"trinidat\" is near 1 stored word; \"trinidad\", 1 edit away, "
                              "carries the value.\n"),
      std::string::npos)
      << explained.toText();
  EXPECT_NE(explained.toText().find("so this one is."), std::string::npos);
}

TEST(ExplainQueryTextTest, OfWholeTexts) {
  const auto index = indexOfPhrases({"Baker Street"}, MatchingMode::wholeText);
  const auto sentence = [&index](const std::string& text) {
    return index.explainQuery(text, "Baker Street").steps.at(0).sentence;
  };
  EXPECT_EQ(sentence("baker streat"),
            "The stored text \"baker street\" carries the value and is 1 edit from this one.");
  EXPECT_EQ(sentence("bakor streat"),
            "The stored text \"baker street\" carries the value and is 2 edits from this one.");
  EXPECT_EQ(sentence("park lane"),
            "No stored text that carries the value is within 3 edits of this one.");
}

TEST(ExplainQueryTextTest, CodesAreComparedExactly) {
  const auto index = indexOfPhrases({"Trinidad and Tobago", "Bosnia and Herzegovina"},
                                    MatchingMode::phoneticWords);
  const auto explained =
      index.explainQuery("trinitad hertsegowina tomorrow", "Trinidad and Tobago");
  EXPECT_FALSE(explained.isFound);
  const std::string text = explained.toText();
  for (const std::string sentence :
       {"\"TRNTT\" is near 1 stored code; \"trntt\", 0 edits away, carries the value.\n",
        "1 stored code fewer than counted codes were found, which adds 1, however many there are, "
        "as "
        "codes are compared exactly.\n",
        "The phrase counts 2 words, the text 2 codes, which adds 0: where codes are compared "
        "exactly, "
        "lengths count nothing.\n",
        "The distance is 1; values up to 0 are listed, as codes are compared exactly, so this one "
        "is "
        "not.\n"}) {
    EXPECT_NE(text.find(sentence), std::string::npos) << sentence << text;
  }
}

}  // namespace
}  // namespace wordcatcher
