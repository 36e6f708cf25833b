#ifndef WORDCATCHER_FUZZY_LXNFASTATE_H
#define WORDCATCHER_FUZZY_LXNFASTATE_H

#include <functional>
#include <map>
#include <ostream>
#include <set>
#include <string>
#include <string_view>
#include <unordered_set>
#include <utility>
#include <vector>

#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {

/// One state of an LXNFA: a name, a final mark and any number of edges a symbol. Edges refer to
/// states that the automaton owns. One thread at a time.
template <typename Name>
class LXNFAState {
 public:
  /// A state without edges, not final.
  explicit LXNFAState(Name name) : _LXdata(std::move(name)) {}

  /// The state's name.
  const Name& data() const noexcept { return _LXdata; }

  /// Appends `target` to the symbol's targets; a target added twice is listed twice.
  void addEdgeWithSymbol_toState(std::u16string_view symbol, LXNFAState& target) {
    auto edge = _LXinternalEdges.find(symbol);
    if (edge == _LXinternalEdges.end()) {
      edge = _LXinternalEdges.try_emplace(std::u16string(symbol)).first;
    }
    edge->second.push_back(&target);
  }

  /// The symbols of the outgoing edges, ascending by code units.
  std::set<std::u16string> edges() const {
    std::set<std::u16string> symbols;
    for (const auto& edge : _LXinternalEdges) {
      symbols.insert(symbols.end(), edge.first);
    }
    return symbols;
  }

  /// The symbol's targets, each once, in no defined order; empty when it has none.
  std::unordered_set<LXNFAState*> followingStatesWithSymbol(std::u16string_view symbol) const {
    const auto& targets = targetsOf(symbol);
    return {targets.begin(), targets.end()};
  }

  /// The symbol's targets in the order of adding, repetitions included.
  const std::vector<LXNFAState*>& targetsOf(std::u16string_view symbol) const {
    static const std::vector<LXNFAState*> none;
    const auto edge = _LXinternalEdges.find(symbol);
    return edge == _LXinternalEdges.end() ? none : edge->second;
  }

  /// Whether the automaton accepts what leads here.
  bool final() const noexcept { return _final; }

  /// Sets or takes away the final mark.
  void setFinal(bool value) noexcept { _final = value; }

  /// The name's text form, in angle brackets when the state is final.
  std::u16string description() const {
    return _final ? u'<' + textForm(_LXdata) + u'>' : textForm(_LXdata);
  }

 private:
  Name _LXdata;
  std::map<std::u16string, std::vector<LXNFAState*>, std::less<>> _LXinternalEdges;
  bool _final = false;
};

/// Writes the description as UTF-8.
template <typename Name>
std::ostream& operator<<(std::ostream& stream, const LXNFAState<Name>& state) {
  return writeUtf8(stream, state.description());
}

}  // namespace wordcatcher

#endif
