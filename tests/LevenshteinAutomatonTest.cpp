#include <gtest/gtest.h>

#include <map>
#include <tuple>

#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

namespace wordcatcher {
namespace {

using Targets = std::unordered_set<LXIntTuple>;
using Symbols = std::set<std::u16string>;

LevenshteinNFA nfaOf(std::u16string_view word, std::int64_t distance) {
  return LXFuzzyIndex::_LXcreateNFAWithWord_withMaxDistance(word, distance);
}

LevenshteinDFA dfaOf(std::u16string_view word, std::int64_t distance) {
  return LXFuzzyIndex::_LXcreateDFAFromNFA(nfaOf(word, distance));
}

/// The edges of an automaton by kind, counted as often as they were added.
struct EdgeCounts {
  std::size_t match = 0;
  std::size_t edit = 0;
  std::size_t end = 0;
};

EdgeCounts countEdges(const LevenshteinNFA& nfa, std::int64_t length, std::int64_t distance) {
  EdgeCounts counts;
  for (std::int64_t i = 0; i <= length; ++i) {
    for (std::int64_t e = 0; e <= distance; ++e) {
      const auto* state = nfa.stateNamed({i, e});
      for (const auto& symbol : state->edges()) {
        const std::size_t added = state->targetsOf(symbol).size();
        if (i == length) {
          counts.end += added;
        } else if (symbol == u"*" || symbol == u"_") {
          counts.edit += added;
        } else {
          counts.match += added;
        }
      }
    }
  }
  return counts;
}

TEST(LevenshteinNFATest, BuildsTheEdgesOfCat) {
  const auto nfa = nfaOf(u"cat", 1);
  EXPECT_EQ(nfa.size(), 8U);
  EXPECT_EQ(nfa.startState(), LXIntTuple(0, 0));
  const std::vector<std::tuple<LXIntTuple, std::u16string, Targets>> expected = {
      {{0, 0}, u"c", {{1, 0}}},         {{0, 0}, u"*", {{0, 1}, {1, 1}}}, {{0, 0}, u"_", {{1, 1}}},
      {{0, 1}, u"c", {{1, 1}}},         {{3, 0}, u"*", {{3, 1}}},         {{1, 0}, u"a", {{2, 0}}},
      {{1, 0}, u"*", {{1, 1}, {2, 1}}}, {{1, 0}, u"_", {{2, 1}}},         {{1, 1}, u"a", {{2, 1}}},
      {{2, 0}, u"t", {{3, 0}}},         {{2, 0}, u"*", {{2, 1}, {3, 1}}}, {{2, 0}, u"_", {{3, 1}}},
      {{2, 1}, u"t", {{3, 1}}}};
  std::map<LXIntTuple, Symbols> symbols;
  for (const auto& [from, symbol, targets] : expected) {
    EXPECT_EQ(nfa.followingStatesFrom_withSymbol(from, symbol), targets)
        << from << " by " << std::string(symbol.begin(), symbol.end());
    symbols[from].insert(symbol);
  }
  for (std::int64_t i = 0; i <= 3; ++i) {
    for (std::int64_t e = 0; e <= 1; ++e) {
      EXPECT_EQ(nfa.edgesFromState({i, e}), symbols[LXIntTuple(i, e)]) << LXIntTuple(i, e);
      EXPECT_EQ(nfa.isFinalState({i, e}), i == 3) << LXIntTuple(i, e);
    }
  }
  EXPECT_EQ(nfa.stateNamed({3, 0})->targetsOf(u"*").size(), 3U)
      << "the end edge is added once a position";
}

TEST(LevenshteinNFATest, CountsOfStatesAndEdges) {
  for (const std::u16string word : {u"ulm", u"vienna", u"klagenfurt"}) {
    for (std::int64_t k = 0; k <= 3; ++k) {
      const auto n = static_cast<std::int64_t>(word.size());
      const auto nfa = nfaOf(word, k);
      const auto counts = countEdges(nfa, n, k);
      EXPECT_EQ(nfa.size(), static_cast<std::size_t>((n + 1) * (k + 1)));
      EXPECT_EQ(counts.match, static_cast<std::size_t>(n * (k + 1)));
      EXPECT_EQ(counts.edit, static_cast<std::size_t>(3 * n * k));
      EXPECT_EQ(counts.end, static_cast<std::size_t>(n * k));
    }
  }
}

TEST(LevenshteinNFATest, AnEmptyWordOrANegativeDistanceLeavesTheStartStateAlone) {
  for (const auto& nfa : {nfaOf(u"", 2), nfaOf(u"cat", -1), nfaOf(u"cat", INT64_MIN)}) {
    EXPECT_EQ(nfa.size(), 1U);
    EXPECT_EQ(nfa.startState(), LXIntTuple(0, 0));
    EXPECT_EQ(nfa.edgesFromState({0, 0}), Symbols{});
    EXPECT_FALSE(nfa.isFinalState({0, 0}));
  }
}

TEST(LevenshteinNFATest, NoDistanceMakesAChain) {
  const auto nfa = nfaOf(u"cat", 0);
  EXPECT_EQ(nfa.size(), 4U);
  EXPECT_EQ(nfa.edgesFromState({0, 0}), Symbols{u"c"});
  EXPECT_EQ(nfa.edgesFromState({3, 0}), Symbols{});
  EXPECT_TRUE(nfa.isFinalState({3, 0}));
}

TEST(LevenshteinNFATest, StarAndUnderscoreAreNotEscaped) {
  const auto nfa = nfaOf(u"a*_", 0);
  EXPECT_EQ(nfa.followingStatesFrom_withSymbol({1, 0}, u"*"), (Targets{{2, 0}}));
  EXPECT_EQ(nfa.followingStatesFrom_withSymbol({2, 0}, u"_"), (Targets{{3, 0}}));
}

TEST(LevenshteinNFATest, ACharacterOutsideTheBmpIsTwoPositions) {
  EXPECT_EQ(nfaOf(u"😀", 1).size(), 6U);
}

TEST(LevenshteinDFATest, ConvertsCatToElevenStates) {
  const auto dfa = dfaOf(u"cat", 1);
  const LXIntTupleSet s0 = {{0, 0}};
  const LXIntTupleSet s1 = {{0, 1}, {1, 1}};
  const LXIntTupleSet s2 = {{0, 1}, {1, 0}, {1, 1}, {2, 1}};
  const LXIntTupleSet s3 = {{1, 1}, {2, 1}};
  const LXIntTupleSet s4 = {{1, 1}, {2, 0}, {2, 1}, {3, 1}};
  const LXIntTupleSet s5 = {{1, 1}, {2, 1}, {3, 1}};
  const LXIntTupleSet s6 = {{2, 1}};
  const LXIntTupleSet s7 = {{3, 1}};
  const LXIntTupleSet s8 = {{2, 1}, {3, 1}};
  const LXIntTupleSet s9 = {{2, 1}, {3, 0}, {3, 1}};
  const LXIntTupleSet s10 = {{1, 1}};
  struct Row {
    LXIntTupleSet state;
    bool final;
    std::map<std::u16string, LXIntTupleSet> edges;
  };
  const std::vector<Row> rows = {{s0, false, {{u"c", s2}, {u"*", s1}}},
                                 {s1, false, {{u"c", s10}, {u"a", s6}}},
                                 {s2, false, {{u"c", s3}, {u"a", s4}, {u"t", s5}, {u"*", s3}}},
                                 {s3, false, {{u"a", s6}, {u"t", s7}}},
                                 {s4, true, {{u"a", s8}, {u"t", s9}, {u"*", s8}}},
                                 {s5, true, {{u"a", s6}, {u"t", s7}}},
                                 {s6, false, {{u"t", s7}}},
                                 {s7, true, {}},
                                 {s8, true, {{u"t", s7}}},
                                 {s9, true, {{u"t", s7}, {u"*", s7}}},
                                 {s10, false, {{u"a", s6}}}};
  EXPECT_EQ(dfa.size(), rows.size());
  EXPECT_EQ(dfa.startState(), s0);
  for (const auto& row : rows) {
    EXPECT_EQ(dfa.isFinalState(row.state), row.final) << row.state;
    Symbols symbols;
    for (const auto& [symbol, target] : row.edges) {
      symbols.insert(symbol);
      EXPECT_EQ(dfa.followingStateFrom_withSymbol(row.state, symbol), target) << row.state;
    }
    EXPECT_EQ(dfa.edgesFromState(row.state), symbols) << row.state;
  }
}

TEST(LevenshteinDFATest, NoDistanceMakesAChain) {
  const auto dfa = dfaOf(u"cat", 0);
  EXPECT_EQ(dfa.size(), 4U);
  EXPECT_EQ(dfa.edgesFromState({{0, 0}}), Symbols{u"c"});
  EXPECT_EQ(dfa.edgesFromState({{1, 0}}), Symbols{u"a"});
  EXPECT_EQ(dfa.edgesFromState({{2, 0}}), Symbols{u"t"});
  EXPECT_EQ(dfa.edgesFromState({{3, 0}}), Symbols{});
  EXPECT_FALSE(dfa.isFinalState({{2, 0}}));
  EXPECT_TRUE(dfa.isFinalState({{3, 0}}));
}

TEST(LevenshteinDFATest, AnAutomatonWithoutEdgesKeepsItsStartStateAlone) {
  for (const auto& dfa : {dfaOf(u"", 2), dfaOf(u"cat", -1)}) {
    EXPECT_EQ(dfa.size(), 1U);
    EXPECT_EQ(dfa.startState(), (LXIntTupleSet{{0, 0}}));
    EXPECT_EQ(dfa.edgesFromState({{0, 0}}), Symbols{});
    EXPECT_FALSE(dfa.isFinalState({{0, 0}}));
  }
}

TEST(LevenshteinDFATest, TheStartStateIsNeitherClosedNorFinal) {
  const auto dfa = dfaOf(u"a", 1);
  EXPECT_EQ(dfa.startState(), (LXIntTupleSet{{0, 0}}));
  EXPECT_FALSE(dfa.isFinalState({{0, 0}})) << "its closure would hold the final (1, 1)";
}

TEST(LevenshteinDFATest, AStateWithoutEditsLeftHasNoAnyEdge) {
  const auto dfa = dfaOf(u"graz", 2);
  const auto spent = dfa.edgesFromState({{3, 2}});
  ASSERT_TRUE(spent.has_value());
  EXPECT_EQ(*spent, Symbols{u"z"});
}

TEST(LevenshteinDFATest, EdgesOfASymbolHoldWhatTheAnyEdgeHolds) {
  const auto dfa = dfaOf(u"salzburg", 2);
  std::size_t compared = 0;
  std::vector<LXIntTupleSet> pending = {*dfa.startState()};
  std::unordered_set<LXIntTupleSet> seen;
  while (!pending.empty()) {
    const auto state = pending.back();
    pending.pop_back();
    if (!seen.insert(state).second) {
      continue;
    }
    const auto any = dfa.followingStateFrom_withSymbol(state, u"*");
    const auto symbols = dfa.edgesFromState(state);
    EXPECT_FALSE(symbols->contains(u"_"));
    for (const auto& symbol : *symbols) {
      const auto target = dfa.followingStateFrom_withSymbol(state, symbol);
      EXPECT_FALSE(target->empty());
      for (const auto& label : any ? *any : LXIntTupleSet()) {
        EXPECT_TRUE(target->contains(label));
        ++compared;
      }
      pending.push_back(*target);
    }
  }
  EXPECT_GT(compared, 100U);
  EXPECT_EQ(seen.size(), dfa.size());
}

TEST(LevenshteinDFATest, OneStepTakesNoClosureAndNoAnyEdges) {
  const auto nfa = nfaOf(u"cat", 1);
  EXPECT_EQ(LXFuzzyIndex::_LXcreateFollowingState_withState_withSymbol(nfa, {{0, 0}, {1, 0}}, u"c"),
            (LXIntTupleSet{{1, 0}}));
  EXPECT_EQ(LXFuzzyIndex::_LXcreateFollowingState_withState_withSymbol(nfa, {{0, 0}, {1, 0}}, u"*"),
            (LXIntTupleSet{{0, 1}, {1, 1}, {2, 1}}));
  EXPECT_EQ(LXFuzzyIndex::_LXcreateFollowingState_withState_withSymbol(nfa, {}, u"c"),
            LXIntTupleSet());
}

TEST(LevenshteinDFATest, ACharacterOutsideTheBmpCostsTwoEdits) {
  const auto accepts = [](const LevenshteinDFA& dfa, std::u16string_view text) {
    auto state = dfa.startState();
    for (std::size_t i = 0; i < text.size() && state; ++i) {
      const auto exact = dfa.followingStateFrom_withSymbol(*state, text.substr(i, 1));
      state = exact ? exact : dfa.followingStateFrom_withSymbol(*state, u"*");
    }
    return state && dfa.isFinalState(*state);
  };
  EXPECT_FALSE(accepts(dfaOf(u"a\U0001F600b", 1), u"ab"));
  EXPECT_TRUE(accepts(dfaOf(u"a\U0001F600b", 2), u"ab"));
  EXPECT_FALSE(accepts(dfaOf(u"ab", 1), u"a\U0001F600b"));
  EXPECT_TRUE(accepts(dfaOf(u"ab", 2), u"a\U0001F600b"));
}

TEST(LevenshteinDFATest, TheAutomatonOfAWholeText) {
  // Every code unit another: no two positions share a symbol. The counts are those of this
  // construction: a change of it shows in them.
  std::u16string text;
  for (char16_t unit = 0x4E00; text.size() < 111; ++unit) {
    text += unit;
  }
  const auto dfa = dfaOf(text, 3);
  std::size_t edges = 0;
  std::vector<LXIntTupleSet> pending = {*dfa.startState()};
  std::unordered_set<LXIntTupleSet> seen;
  while (!pending.empty()) {
    const auto state = pending.back();
    pending.pop_back();
    if (seen.insert(state).second) {
      const auto symbols = *dfa.edgesFromState(state);
      edges += symbols.size();
      for (const auto& symbol : symbols) {
        pending.push_back(*dfa.followingStateFrom_withSymbol(state, symbol));
      }
    }
  }
  EXPECT_EQ(dfa.size(), 6888U);
  EXPECT_EQ(edges, 40901U);
}

TEST(LevenshteinDFATest, ALongTextIsBuilt) {
  std::u16string text;
  for (int i = 0; text.size() < 1000; ++i) {
    text += u"Donaudampfschifffahrtsgesellschaft ";
    text += static_cast<char16_t>(u'a' + i % 26);
  }
  text.resize(1000);
  EXPECT_GT(dfaOf(text, 3).size(), 50000U);
}

}  // namespace
}  // namespace wordcatcher
