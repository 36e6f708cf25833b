// The index's search against the walk of the literal automaton through the same tables, whoever
// wrote them.

#include "LiteralSearch.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <fstream>
#include <sstream>

#include "TestSupport.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

namespace wordcatcher {
namespace {

using testing::literalSearch;
using testing::outputOf;
using testing::TemporaryDirectory;
using testing::writeFile;

std::string described(const std::vector<LXFuzzyMatch>& matches) {
  std::ostringstream text;
  for (const auto& match : matches) {
    text << match << '\n';
  }
  return text.str();
}

/// What both make of one query; the tables are open to one reader at a time.
std::pair<std::string, std::string> bothAnswers(const std::string& path,
                                                const std::vector<std::u16string>& queries,
                                                std::int64_t maxDistance) {
  std::pair<std::string, std::string> answers;
  {
    PLXDFA tree(path);
    tree.setMode(1);
    for (const auto& query : queries) {
      // The search lower-cases; these queries are in lower case.
      answers.first += described(literalSearch(tree, query, maxDistance));
    }
  }
  LXFuzzyIndex index(path);
  index.setMode(1);
  for (const auto& query : queries) {
    answers.second += described(index.search_withMaxDistance(query, maxDistance));
  }
  return answers;
}

/// One record as the cdb tool reads it.
std::string record(std::string_view key, std::string_view value) {
  std::ostringstream text;
  text << '+' << key.size() << ',' << value.size() << ':' << key << "->" << value << '\n';
  return text.str();
}

TEST(LiteralSearchTest, RealNamesAtEveryDistance) {
  const TemporaryDirectory directory;
  {
    LXFuzzyIndex index(directory.path());
    index.setMode(2);
    for (const auto* name : {u"Trinidad and Tobago", u"Bosnia and Herzegovina", u"Côte d'Ivoire",
                             u"São Tomé and Príncipe", u"Papua New Guinea", u"New Zealand",
                             u"Åland Islands", u"İzmir", u"Kırklareli", u"沖縄県", u"Łódzkie"}) {
      index.addString_withData(name, name);
      index.addWordsFromString_data(name, name);
    }
  }
  const std::vector<std::u16string> queries = {
      u"and",      u"trinidat", u"ilands",     u"new",    u"zeeland",
      u"sao tome", u"izmir",    u"i\u0307mir", u"沖縄",   u"herzegowina",
      u"*",        u"n_w",      u"_new",       u"g**nea", u"\U0001F600a"};
  for (std::int64_t k = -1; k <= 4; ++k) {
    const auto [literal, fast] = bothAnswers(directory.path(), queries, k);
    EXPECT_EQ(fast, literal) << k;
    EXPECT_EQ(literal.empty(), k < 0);
  }
}

RC_GTEST_PROP(LiteralSearchTest, AnyTablesThatAnotherToolWrote, ()) {
  // States and symbols at random: edges that lead nowhere, final states that nothing leads to,
  // symbols of several characters, marks that are not "t", data of unknown states.
  const auto state =
      rc::gen::map(rc::gen::container<std::vector<std::string>>(
                       rc::gen::element<std::string>("a", "b", "é", "_")),
                   [](const std::vector<std::string>& parts) {
                     std::string name;
                     for (const auto& part : parts) {
                       name += part;
                     }
                     return name.substr(0, name.find_last_not_of('\xC3') + 1).substr(0, 12);
                   });
  const auto symbol = rc::gen::weightedElement<std::string>(
      {{6, "a"}, {6, "b"}, {4, "é"}, {2, "_"}, {1, "ab"}, {1, ""}, {1, "😀"}, {1, "\xFF"}});
  std::string edges;
  std::string finals;
  std::string data;
  for (int i = 0; i < 60; ++i) {
    const auto from = *rc::gen::resize(4, state);
    edges += record(from, *symbol);
    finals += record(*rc::gen::resize(4, state),
                     *rc::gen::weightedElement<std::string>({{5, "t"}, {1, "f"}}));
    data +=
        record(*rc::gen::resize(4, state), *rc::gen::element<std::string>("1", "2", "\xFF", ""));
  }
  for (const auto* letter : {"a", "b", "é"}) {
    edges += record("", letter);
    finals += record(letter, "t");
  }
  const TemporaryDirectory directory;
  for (const auto& [name, records] :
       {std::pair("edge", edges), std::pair("final", finals), std::pair("data", data)}) {
    writeFile(directory.file("records"), records + "\n");
    outputOf("cdb -c " + directory.file(name) + "Table.tdb " + directory.file("records"));
  }
  for (const std::int64_t k : {0, 1, 3}) {
    const auto [literal, fast] =
        bothAnswers(directory.path(), {u"a", u"ab", u"bab", u"éa", u"b_a"}, k);
    RC_ASSERT(fast == literal);
  }
}

TEST(LiteralSearchTest, AnswersAreThoseOfTheLastOpening) {
  const TemporaryDirectory directory;
  LXFuzzyIndex index(directory.path());
  index.setMode(2);
  index.addString(u"graz");
  index.setMode(1);
  EXPECT_EQ(index.search_withMaxDistance(u"graz", 0).size(), 1U);
  index.setMode(0);
  EXPECT_EQ(index.search_withMaxDistance(u"graz", 0).size(), 1U) << "closing forgets nothing";
  index.setMode(2);
  index.addString(u"linz");
  index.setMode(1);
  EXPECT_EQ(index.search_withMaxDistance(u"graz", 0).size(), 0U);
  EXPECT_EQ(index.search_withMaxDistance(u"linz", 0).size(), 1U);
}

}  // namespace
}  // namespace wordcatcher
