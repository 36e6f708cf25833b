#include "wordcatcher/fuzzy/LXNFA.h"

#include <gtest/gtest.h>

#include <sstream>

#include "wordcatcher/fuzzy/LXIntTuple.h"
#include "wordcatcher/fuzzy/LXIntTupleSet.h"

namespace wordcatcher {
namespace {

using Automaton = LXNFA<std::u16string>;
using Names = std::unordered_set<std::u16string>;

TEST(LXIntTupleTest, EqualNumbersMakeEqualTuples) {
  const LXIntTuple tuple(2, 1);
  const LXIntTuple same(2, 1);
  EXPECT_TRUE(tuple.isEqual(same));
  EXPECT_EQ(tuple, same);
  EXPECT_EQ(tuple.hash(), same.hash());
  EXPECT_FALSE(tuple.isEqual(LXIntTuple(1, 2)));
  EXPECT_FALSE(tuple.isEqual(LXIntTuple(2, 2)));
  const LXIntTuple copy = tuple;
  EXPECT_EQ(copy.index(), 2);
  EXPECT_EQ(copy.distance(), 1);
}

TEST(LXIntTupleTest, HashesByThirtyOne) {
  EXPECT_EQ(LXIntTuple(0, 0).hash(), 961U);
  EXPECT_EQ(LXIntTuple(1, 2).hash(), 994U);
  EXPECT_EQ(LXIntTuple(-1, 0).hash(), 930U);
  EXPECT_EQ(
      LXIntTuple(INT64_MAX, INT64_MIN).hash(),
      static_cast<std::uint64_t>(INT64_MAX) * 31 + static_cast<std::uint64_t>(INT64_MIN) + 961);
  EXPECT_EQ(std::hash<LXIntTuple>()(LXIntTuple(1, 2)), 994U);
}

TEST(LXIntTupleTest, IsNotEqualToAnotherClass) {
  struct Derived : LXIntTuple {
    using LXIntTuple::LXIntTuple;
  };
  struct Other {
    std::int64_t index = 2;
    std::int64_t distance = 1;
  };
  EXPECT_TRUE(LXIntTuple(2, 1).isEqual(Derived(2, 1)));
  EXPECT_FALSE(LXIntTuple(2, 1).isEqual(Other()));
}

TEST(LXIntTupleTest, DescribesItself) {
  EXPECT_EQ(LXIntTuple(2, 1).description(), u"(2_1)");
  EXPECT_EQ(LXIntTuple(-7, 0).description(), u"(-7_0)");
  std::ostringstream text;
  text << LXIntTuple(2, 1);
  EXPECT_EQ(text.str(), "(2_1)");
}

TEST(LXIntTupleSetTest, HoldsEachLabelOnceInOrder) {
  LXIntTupleSet labels = {{1, 1}, {0, 1}, {1, 1}};
  EXPECT_EQ(labels.size(), 2U);
  EXPECT_TRUE(labels.insert({1, 0}).second);
  EXPECT_FALSE(labels.insert({1, 0}).second);
  EXPECT_EQ(labels.description(), u"{(0_1), (1_0), (1_1)}");
  EXPECT_EQ(labels, (LXIntTupleSet{{1, 0}, {1, 1}, {0, 1}}));
  EXPECT_EQ(labels.hash(), (LXIntTupleSet{{1, 0}, {1, 1}, {0, 1}}.hash()));
  EXPECT_TRUE(labels.contains({0, 1}));
  EXPECT_EQ(labels.count({5, 5}), 0U);
  EXPECT_TRUE(LXIntTupleSet().empty());
}

TEST(LXNFATest, ClosureOfStatesWithoutEmptyMovesIsThemselves) {
  Automaton automaton;
  automaton.addEdge_fromState_toState(u"x", u"a", u"b");
  EXPECT_EQ(automaton.epsilonStates({u"a"}), Names{u"a"});
  EXPECT_EQ(automaton.epsilonStates({}), Names{});
  EXPECT_EQ(automaton.epsilonStates({u"nowhere"}), Names{u"nowhere"});
}

TEST(LXNFATest, ClosureFollowsEmptyMovesRoundCycles) {
  Automaton automaton;
  automaton.addEdge_fromState_toState(u"_", u"a", u"b");
  automaton.addEdge_fromState_toState(u"_", u"b", u"c");
  automaton.addEdge_fromState_toState(u"_", u"c", u"a");
  automaton.addEdge_fromState_toState(u"x", u"a", u"d");
  automaton.addEdge_fromState_toState(u"*", u"a", u"e");
  EXPECT_EQ(automaton.epsilonStates({u"a"}), (Names{u"a", u"b", u"c"}));
}

TEST(LXNFATest, OneStepFollowsExactlyTheSymbol) {
  Automaton automaton;
  automaton.addEdge_fromState_toState(u"*", u"a", u"b");
  automaton.addEdge_fromState_toState(u"x", u"a", u"c");
  automaton.addEdge_fromState_toState(u"_", u"c", u"d");
  EXPECT_EQ(automaton.followingStatesFrom_withSymbol(u"a", u"x"), Names{u"c"});
  EXPECT_EQ(automaton.followingStatesFrom_withSymbol(u"a", u"y"), Names{});
  EXPECT_EQ(automaton.followingStatesFrom_withSymbol(u"nowhere", u"x"), Names{});
}

TEST(LXNFATest, ASymbolMayLeadToSeveralStates) {
  Automaton automaton;
  automaton.addEdge_fromState_toState(u"x", u"a", u"b");
  automaton.addEdge_fromState_toState(u"x", u"a", u"c");
  EXPECT_EQ(automaton.followingStatesFrom_withSymbol(u"a", u"x"), (Names{u"b", u"c"}));
}

TEST(LXNFATest, TheSameEdgeTwiceIsOneTargetAndOneEntry) {
  Automaton automaton;
  automaton.addEdge_fromState_toState(u"x", u"a", u"b");
  automaton.addEdge_fromState_toState(u"x", u"a", u"b");
  automaton.addFinalState(u"b");
  EXPECT_EQ(automaton.followingStatesFrom_withSymbol(u"a", u"x").size(), 1U);
  EXPECT_EQ(automaton.stateNamed(u"a")->targetsOf(u"x").size(), 2U) << "listed twice all the same";
  EXPECT_EQ(automaton.description(), u"{ \"a\" --x--> \"{<b>}\" }");
}

TEST(LXNFATest, UnknownNamesAreAnsweredAndNotAdded) {
  const Automaton automaton;
  EXPECT_FALSE(automaton.isFinalState(u"a"));
  EXPECT_EQ(automaton.edgesFromState(u"a"), std::nullopt);
  EXPECT_EQ(automaton.startState(), std::nullopt);
  EXPECT_EQ(automaton.size(), 0U);
  EXPECT_EQ(automaton.description(), u"{ }");
}

TEST(LXNFATest, StartStateAndFinalMarks) {
  Automaton automaton;
  automaton.setStartState(u"a");
  EXPECT_EQ(automaton.startState(), u"a");
  EXPECT_FALSE(automaton.isFinalState(u"a"));
  automaton.addFinalState(u"a");
  automaton.addEdge_fromState_toState(u"x", u"a", u"b");
  EXPECT_TRUE(automaton.isFinalState(u"a"));
  EXPECT_EQ(automaton.edgesFromState(u"b"), std::set<std::u16string>{});
  EXPECT_EQ(automaton.edgesFromState(u"a"), std::set<std::u16string>{u"x"});
}

TEST(LXNFAStateTest, HoldsANameEdgesAndAFinalMark) {
  LXNFAState<LXIntTuple> from({3, 0});
  LXNFAState<LXIntTuple> to({3, 1});
  EXPECT_TRUE(from.followingStatesWithSymbol(u"*").empty());
  from.addEdgeWithSymbol_toState(u"*", to);
  from.addEdgeWithSymbol_toState(u"*", to);
  from.addEdgeWithSymbol_toState(u"*", from);
  EXPECT_EQ(from.followingStatesWithSymbol(u"*").size(), 2U);
  EXPECT_EQ(from.edges(), std::set<std::u16string>{u"*"});
  EXPECT_EQ(from.description(), u"(3_0)");
  from.setFinal(true);
  EXPECT_TRUE(from.final());
  EXPECT_EQ(from.description(), u"<(3_0)>");
}

}  // namespace
}  // namespace wordcatcher
