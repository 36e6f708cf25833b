// The Levenshtein automaton of a word and its deterministic form.
//
// A label (i, e) of the nondeterministic automaton means: i code units of the word are accounted
// for, at a cost of e edits. Reading the word's next code unit moves to (i + 1, e); an extra code
// unit moves to (i, e + 1), a missing one to (i + 1, e + 1) without reading, a different one to
// (i + 1, e + 1). A string is accepted at distance e when it can be read to (n, e).
//
// The deterministic form names its states by sets of labels (subset construction: Rabin and Scott,
// "Finite automata and their decision problems", 1959). Since "*" stands for any symbol, the labels
// that "*" leads to belong to every other symbol's target as well, so that one edge, the symbol's
// own or else "*", decides each step.

#include <set>
#include <string>
#include <unordered_set>
#include <vector>

#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

namespace wordcatcher {

namespace {

constexpr std::u16string_view kAny = u"*";
constexpr std::u16string_view kEmptyMove = u"_";

std::set<std::u16string> symbolsOf(const LevenshteinNFA& nfa, const LXIntTupleSet& state) {
  std::set<std::u16string> symbols;
  for (const auto& label : state) {
    if (auto edges = nfa.edgesFromState(label)) {
      symbols.merge(*edges);
    }
  }
  symbols.erase(std::u16string(kEmptyMove));
  return symbols;
}

bool holdsFinalLabel(const LevenshteinNFA& nfa, const LXIntTupleSet& state) {
  for (const auto& label : state) {
    if (nfa.isFinalState(label)) {
      return true;
    }
  }
  return false;
}

}  // namespace

LevenshteinNFA LXFuzzyIndex::_LXcreateNFAWithWord_withMaxDistance(std::u16string_view word,
                                                                  std::int64_t maxDistance) {
  LevenshteinNFA nfa;
  nfa.setStartState({0, 0});
  const auto length = static_cast<std::int64_t>(word.size());
  for (std::int64_t i = 0; i < length; ++i) {
    const auto symbol = word.substr(static_cast<std::size_t>(i), 1);
    for (std::int64_t e = 0; e <= maxDistance; ++e) {
      nfa.addEdge_fromState_toState(symbol, {i, e}, {i + 1, e});
      if (e < maxDistance) {
        nfa.addEdge_fromState_toState(kAny, {i, e}, {i, e + 1});
        nfa.addEdge_fromState_toState(kEmptyMove, {i, e}, {i + 1, e + 1});
        nfa.addEdge_fromState_toState(kAny, {i, e}, {i + 1, e + 1});
      }
    }
    // The end of the word is added after every position: the targets' lists hold each end edge
    // `length` times, which nothing that works on sets can see.
    for (std::int64_t e = 0; e <= maxDistance; ++e) {
      if (e < maxDistance) {
        nfa.addEdge_fromState_toState(kAny, {length, e}, {length, e + 1});
      }
      nfa.addFinalState({length, e});
    }
  }
  return nfa;
}

LXIntTupleSet LXFuzzyIndex::_LXcreateFollowingState_withState_withSymbol(
    const LevenshteinNFA& nfa, const LXIntTupleSet& state, std::u16string_view symbol) {
  LXIntTupleSet following;
  for (const auto& label : state) {
    const auto targets = nfa.followingStatesFrom_withSymbol(label, symbol);
    following.insert(targets.begin(), targets.end());
  }
  return following;
}

LevenshteinDFA LXFuzzyIndex::_LXcreateDFAFromNFA(const LevenshteinNFA& nfa) {
  LevenshteinDFA dfa;
  // Not closed under empty moves: a string that only lacks the word's first character must not come
  // out one edit cheaper than the other paths allow.
  const LXIntTupleSet start = {*nfa.startState()};
  dfa.setStartState(start);
  std::vector<LXIntTupleSet> pending = {start};
  std::unordered_set<LXIntTupleSet> visited;
  while (!pending.empty()) {
    const LXIntTupleSet state = std::move(pending.back());
    pending.pop_back();
    if (!visited.insert(state).second) {
      continue;
    }
    const auto symbols = symbolsOf(nfa, state);
    const auto anyTargets = symbols.contains(std::u16string(kAny))
                                ? _LXcreateFollowingState_withState_withSymbol(nfa, state, kAny)
                                : LXIntTupleSet();
    for (const auto& symbol : symbols) {
      auto target = _LXcreateFollowingState_withState_withSymbol(nfa, state, symbol);
      target.insert(anyTargets.begin(), anyTargets.end());
      target = nfa.epsilonStates(target);
      if (holdsFinalLabel(nfa, target)) {
        dfa.addFinalState(target);
      }
      dfa.addEdge_fromState_toState(symbol, state, target);
      pending.push_back(std::move(target));
    }
  }
  return dfa;
}

}  // namespace wordcatcher
