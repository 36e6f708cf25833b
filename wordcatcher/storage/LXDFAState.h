#ifndef WORDCATCHER_STORAGE_LXDFASTATE_H
#define WORDCATCHER_STORAGE_LXDFASTATE_H

#include <functional>
#include <map>
#include <ostream>
#include <set>
#include <string>
#include <string_view>
#include <utility>

#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {

/// One state of an LXDFA: a name, a final mark and at most one edge a symbol. Edges refer to states
/// that the automaton owns. One thread at a time.
template <typename Name>
class LXDFAState {
 public:
  /// A state without edges, not final.
  explicit LXDFAState(Name name) : _LXdata(std::move(name)) {}

  /// The state's name.
  const Name& data() const noexcept { return _LXdata; }

  /// The state that the edge of exactly this symbol leads to, or null. Logarithmic in the edges.
  LXDFAState* followingStateWithSymbol(std::u16string_view symbol) const {
    const auto edge = _LXinternalEdges.find(symbol);
    return edge == _LXinternalEdges.end() ? nullptr : edge->second;
  }

  /// Leads the symbol to `target`, in place of an earlier target.
  void addEdgeWithSymbol_toState(std::u16string_view symbol, LXDFAState& target) {
    _LXinternalEdges.insert_or_assign(std::u16string(symbol), &target);
  }

  /// The symbols of the outgoing edges, ascending by code units.
  std::set<std::u16string> edges() const {
    std::set<std::u16string> symbols;
    for (const auto& edge : _LXinternalEdges) {
      symbols.insert(symbols.end(), edge.first);
    }
    return symbols;
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
  std::map<std::u16string, LXDFAState*, std::less<>> _LXinternalEdges;
  bool _final = false;
};

/// Writes the description as UTF-8.
template <typename Name>
std::ostream& operator<<(std::ostream& stream, const LXDFAState<Name>& state) {
  return writeUtf8(stream, state.description());
}

}  // namespace wordcatcher

#endif
