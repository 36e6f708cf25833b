#ifndef WORDCATCHER_STORAGE_LXDFA_H
#define WORDCATCHER_STORAGE_LXDFA_H

#include <functional>
#include <optional>
#include <ostream>
#include <set>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>

#include "wordcatcher/storage/LXDFAState.h"
#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {

/// A deterministic automaton in memory: named states, each with at most one edge a symbol. It knows
/// nothing of what names and symbols mean, and no symbol is special. It only grows: states, edges
/// and final marks are added, never removed.
///
/// `Name` is any copyable value with equality, std::hash and a text form (see TextForm.h). Look-ups
/// are constant on average in the number of states. One thread at a time while it is built; a
/// finished automaton may be read by many.
template <typename Name>
class LXDFA {
 public:
  /// An automaton without states.
  LXDFA() = default;
  LXDFA(const LXDFA&) = delete;
  LXDFA& operator=(const LXDFA&) = delete;

  /// Takes over the states; `other` is left without any.
  LXDFA(LXDFA&& other) noexcept {
    _LXstates.swap(other._LXstates);
    std::swap(_LXstart, other._LXstart);
  }

  /// The start state's name; nothing before setStartState().
  std::optional<Name> startState() const {
    return _LXstart == nullptr ? std::nullopt : std::optional<Name>(_LXstart->data());
  }

  /// Makes the state of this name, added if need be, the start state.
  void setStartState(const Name& name) { _LXstart = &_LXaddState(name); }

  /// Marks the state of this name, added if need be, final, for good.
  void addFinalState(const Name& name) { _LXaddState(name).setFinal(true); }

  /// Whether a state of this name exists and is final.
  bool isFinalState(const Name& name) const {
    const auto* state = stateNamed(name);
    return state != nullptr && state->final();
  }

  /// Leads `symbol` from one state to another, adding both if need be. An earlier edge of the
  /// symbol is replaced.
  void addEdge_fromState_toState(std::u16string_view symbol, const Name& from, const Name& to) {
    auto& source = _LXaddState(from);
    source.addEdgeWithSymbol_toState(symbol, _LXaddState(to));
  }

  /// The name of the state that exactly this symbol leads to; nothing when there is no such state
  /// or edge.
  std::optional<Name> followingStateFrom_withSymbol(const Name& from,
                                                    std::u16string_view symbol) const {
    const auto* source = stateNamed(from);
    const auto* target = source == nullptr ? nullptr : source->followingStateWithSymbol(symbol);
    return target == nullptr ? std::nullopt : std::optional<Name>(target->data());
  }

  /// The symbols of the edges that leave a state, ascending by code units; nothing when there is no
  /// such state.
  std::optional<std::set<std::u16string>> edgesFromState(const Name& name) const {
    const auto* state = stateNamed(name);
    return state == nullptr ? std::nullopt : std::optional(state->edges());
  }

  /// The state of this name, or null. Valid as long as the automaton.
  const LXDFAState<Name>* stateNamed(const Name& name) const {
    const auto state = _LXstates.find(name);
    return state == _LXstates.end() ? nullptr : &state->second;
  }

  /// The number of states.
  std::size_t size() const noexcept { return _LXstates.size(); }

  /// Every edge as `"source" --symbol--> "target" `, in braces; the order is not defined.
  std::u16string description() const {
    std::u16string text = u"{ ";
    for (const auto& [name, state] : _LXstates) {
      for (const auto& symbol : state.edges()) {
        text += u'"' + state.description() + u"\" --" + symbol + u"--> \"" +
                state.followingStateWithSymbol(symbol)->description() + u"\" ";
      }
    }
    return text += u'}';
  }

  /// The state of this name, added without edges and not final if there is none.
  LXDFAState<Name>& _LXaddState(const Name& name) {
    return _LXstates.try_emplace(name, name).first->second;
  }

 private:
  std::unordered_map<Name, LXDFAState<Name>> _LXstates;
  LXDFAState<Name>* _LXstart = nullptr;
};

/// Writes the description as UTF-8.
template <typename Name>
std::ostream& operator<<(std::ostream& stream, const LXDFA<Name>& automaton) {
  return writeUtf8(stream, automaton.description());
}

}  // namespace wordcatcher

#endif
