#include "wordcatcher/storage/LXDFA.h"

#include <gtest/gtest.h>

#include <sstream>

#include "wordcatcher/fuzzy/LXIntTupleSet.h"

namespace wordcatcher {
namespace {

using Automaton = LXDFA<std::u16string>;
using Symbols = std::set<std::u16string>;

TEST(LXDFATest, UnknownNamesAreAnsweredAndNotAdded) {
  const Automaton automaton;
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"wien", u"x"), std::nullopt);
  EXPECT_FALSE(automaton.isFinalState(u"wien"));
  EXPECT_EQ(automaton.edgesFromState(u"wien"), std::nullopt);
  EXPECT_EQ(automaton.size(), 0U);
}

TEST(LXDFATest, ANewAutomatonHasNoStartState) {
  Automaton automaton;
  EXPECT_EQ(automaton.startState(), std::nullopt);
  automaton.setStartState(u"wien");
  EXPECT_EQ(automaton.startState(), u"wien");
  automaton.setStartState(u"graz");
  EXPECT_EQ(automaton.startState(), u"graz");
  EXPECT_EQ(automaton.size(), 2U) << "the earlier start state stays";
}

TEST(LXDFATest, AStateWithoutEdgesHasAnEmptySetOfSymbols) {
  Automaton automaton;
  automaton.addFinalState(u"wien");
  EXPECT_EQ(automaton.edgesFromState(u"wien"), Symbols{});
}

TEST(LXDFATest, AnEdgeMayLeadBackToItsState) {
  Automaton automaton;
  automaton.addEdge_fromState_toState(u"x", u"ring", u"ring");
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"ring", u"x"), u"ring");
  EXPECT_EQ(automaton.size(), 1U);
}

TEST(LXDFATest, TheLastEdgeOfASymbolWins) {
  Automaton automaton;
  automaton.addEdge_fromState_toState(u"x", u"a", u"b");
  automaton.addEdge_fromState_toState(u"x", u"a", u"c");
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"a", u"x"), u"c");
  EXPECT_EQ(automaton.edgesFromState(u"a"), Symbols{u"x"});
}

TEST(LXDFATest, LookUpIsExact) {
  Automaton automaton;
  automaton.addEdge_fromState_toState(u"*", u"a", u"b");
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"a", u"x"), std::nullopt);
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"a", u"*"), u"b");
}

TEST(LXDFATest, EdgesLeaveFinalMarksAlone) {
  Automaton automaton;
  automaton.addFinalState(u"a");
  automaton.addEdge_fromState_toState(u"x", u"a", u"b");
  automaton.addEdge_fromState_toState(u"y", u"b", u"a");
  EXPECT_TRUE(automaton.isFinalState(u"a"));
  EXPECT_FALSE(automaton.isFinalState(u"b"));
}

TEST(LXDFATest, DescribesEveryEdge) {
  Automaton automaton;
  EXPECT_EQ(automaton.description(), u"{ }");
  automaton.addEdge_fromState_toState(u"x", u"a", u"b");
  automaton.addFinalState(u"b");
  EXPECT_EQ(automaton.description(), u"{ \"a\" --x--> \"<b>\" }");
  std::ostringstream text;
  text << automaton;
  EXPECT_EQ(text.str(), "{ \"a\" --x--> \"<b>\" }");
}

TEST(LXDFATest, SetsOfLabelsAreNamesByContent) {
  LXDFA<LXIntTupleSet> automaton;
  automaton.addEdge_fromState_toState(u"c", {{0, 0}}, {{1, 0}, {0, 1}});
  automaton.addFinalState({{0, 1}, {1, 0}});
  EXPECT_TRUE(automaton.isFinalState({{1, 0}, {0, 1}}));
  EXPECT_EQ(automaton.size(), 2U);
  EXPECT_EQ(automaton.description(), u"{ \"{(0_0)}\" --c--> \"<{(0_1), (1_0)}>\" }");
}

TEST(LXDFATest, AMovedFromAutomatonIsEmpty) {
  Automaton automaton;
  automaton.setStartState(u"a");
  const Automaton taken = std::move(automaton);
  EXPECT_EQ(taken.startState(), u"a");
  // NOLINTBEGIN(bugprone-use-after-move,clang-analyzer-cplusplus.Move)
  EXPECT_EQ(automaton.startState(), std::nullopt);
  EXPECT_EQ(automaton.size(), 0U);
  // NOLINTEND(bugprone-use-after-move,clang-analyzer-cplusplus.Move)
}

TEST(LXDFAStateTest, HoldsANameEdgesAndAFinalMark) {
  LXDFAState<std::u16string> from(u"from");
  LXDFAState<std::u16string> to(u"to");
  EXPECT_EQ(from.data(), u"from");
  EXPECT_FALSE(from.final());
  EXPECT_EQ(from.followingStateWithSymbol(u"x"), nullptr);
  from.addEdgeWithSymbol_toState(u"x", to);
  EXPECT_EQ(from.followingStateWithSymbol(u"x"), &to);
  EXPECT_EQ(from.edges(), Symbols{u"x"});
  EXPECT_EQ(from.description(), u"from");
  from.setFinal(true);
  EXPECT_EQ(from.description(), u"<from>");
  from.setFinal(false);
  EXPECT_FALSE(from.final());
}

}  // namespace
}  // namespace wordcatcher
