#include "LiteralSearch.h"

#include <algorithm>
#include <utility>

#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

namespace wordcatcher::testing {

namespace {

constexpr std::u16string_view kAny = u"*";

/// A place in the walk: the state of the query's automaton, and the state of the prefix tree, whose
/// name is the string read so far.
struct WalkItem {
  const LXDFAState<LXIntTupleSet>* query;
  std::u16string prefix;
};

/// The state that a stored symbol leads to: the symbol's own edge wins over "*".
const LXDFAState<LXIntTupleSet>* queryStep(const LXDFAState<LXIntTupleSet>& state,
                                           std::u16string_view symbol) {
  const auto* exact = state.followingStateWithSymbol(symbol);
  return exact != nullptr ? exact : state.followingStateWithSymbol(kAny);
}

/// The least distance of the state's final labels, and `maxDistance` if none is smaller.
std::int64_t distanceOf(const LevenshteinNFA& nfa, const LXIntTupleSet& labels,
                        std::int64_t maxDistance) {
  std::int64_t distance = maxDistance;
  for (const auto& label : labels) {
    if (nfa.isFinalState(label)) {
      distance = std::min(distance, label.distance());
    }
  }
  return distance;
}

/// The order of a search's result: many data strings outrank a small distance, on purpose.
bool ranksBefore(const LXFuzzyMatch& a, const LXFuzzyMatch& b) {
  if (a.data().size() != b.data().size()) {
    return a.data().size() > b.data().size();
  }
  if (a.distance() != b.distance()) {
    return a.distance() < b.distance();
  }
  if (a.value().size() != b.value().size()) {
    return a.value().size() < b.value().size();
  }
  return a.value() < b.value();
}

}  // namespace

std::vector<LXFuzzyMatch> literalSearch(PLXDFA& tree, std::optional<std::u16string_view> query,
                                        std::int64_t maxDistance) {
  std::vector<LXFuzzyMatch> matches;
  if (!query || query->empty()) {
    return matches;
  }
  const LevenshteinNFA nfa =
      LXFuzzyIndex::_LXcreateNFAWithWord_withMaxDistance(*query, maxDistance);
  const LevenshteinDFA dfa = LXFuzzyIndex::_LXcreateDFAFromNFA(nfa);
  std::vector<WalkItem> pending;
  pending.push_back({dfa.stateNamed(*dfa.startState()), tree.startState()});
  while (!pending.empty()) {
    const WalkItem item = std::move(pending.back());
    pending.pop_back();
    for (const auto& symbol : tree.edgesFromState(item.prefix)) {
      // A U+0000 inside an added string leaves an empty symbol behind, which leads nowhere new.
      if (symbol.size() != 1) {
        continue;
      }
      const auto* next = queryStep(*item.query, symbol);
      if (next == nullptr) {
        continue;
      }
      std::u16string prefix = item.prefix + symbol;
      if (next->final() && tree.isFinalState(prefix)) {
        const auto data = tree.dataFor(prefix);
        matches.emplace_back(prefix, distanceOf(nfa, next->data(), maxDistance),
                             std::vector<std::u16string>(data.begin(), data.end()));
      }
      pending.push_back({next, std::move(prefix)});
    }
  }
  std::sort(matches.begin(), matches.end(), &ranksBefore);
  return matches;
}

}  // namespace wordcatcher::testing
