#ifndef WORDCATCHER_FUZZY_LXNFA_H
#define WORDCATCHER_FUZZY_LXNFA_H

#include <functional>
#include <optional>
#include <ostream>
#include <set>
#include <string>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <utility>
#include <vector>

#include "wordcatcher/fuzzy/LXNFAState.h"
#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {

/// A nondeterministic automaton in memory: named states, each with any number of edges a symbol.
/// The symbol "_" is the empty move, and only epsilonStates() takes it for one; "*" is an ordinary
/// symbol here, to which the conversion to a deterministic automaton gives its meaning. It only
/// grows: states, edges and final marks are added, never removed.
///
/// `Name` is any copyable value with equality, std::hash and a text form (see TextForm.h). Look-ups
/// are constant on average in the number of states. One thread at a time while it is built; a
/// finished automaton may be read by many.
template <typename Name>
class LXNFA {
 public:
  /// An automaton without states.
  LXNFA() = default;
  LXNFA(const LXNFA&) = delete;
  LXNFA& operator=(const LXNFA&) = delete;

  /// Takes over the states; `other` is left without any.
  LXNFA(LXNFA&& other) noexcept {
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

  /// Adds an edge, and its two states if need be. The same edge added twice is kept twice.
  void addEdge_fromState_toState(std::u16string_view symbol, const Name& from, const Name& to) {
    auto& source = _LXaddState(from);
    source.addEdgeWithSymbol_toState(symbol, _LXaddState(to));
  }

  /// The names of the states that exactly this symbol leads to in one step; empty when there is no
  /// such state or edge. Neither "*" nor the empty moves are followed.
  std::unordered_set<Name> followingStatesFrom_withSymbol(const Name& from,
                                                          std::u16string_view symbol) const {
    std::unordered_set<Name> names;
    if (const auto* source = stateNamed(from)) {
      for (const auto* target : source->targetsOf(symbol)) {
        names.insert(target->data());
      }
    }
    return names;
  }

  /// The symbols of the edges that leave a state, ascending by code units; nothing when there is no
  /// such state.
  std::optional<std::set<std::u16string>> edgesFromState(const Name& name) const {
    const auto* state = stateNamed(name);
    return state == nullptr ? std::nullopt : std::optional(state->edges());
  }

  /// The given names, known or not, and every state that one or more empty moves lead to from them.
  /// `Set` is any set of names with begin(), end() and an insert() that tells whether the name is
  /// new. Linear in the states and empty moves visited.
  template <typename Set = std::unordered_set<Name>>
  Set epsilonStates(const Set& names) const {
    Set closure;
    std::vector<Name> pending(names.begin(), names.end());
    while (!pending.empty()) {
      const Name name = pending.back();
      pending.pop_back();
      if (!closure.insert(name).second) {
        continue;
      }
      if (const auto* state = stateNamed(name)) {
        for (const auto* target : state->targetsOf(u"_")) {
          pending.push_back(target->data());
        }
      }
    }
    return closure;
  }

  /// The state of this name, or null. Valid as long as the automaton.
  const LXNFAState<Name>* stateNamed(const Name& name) const {
    const auto state = _LXstates.find(name);
    return state == _LXstates.end() ? nullptr : &state->second;
  }

  /// The number of states.
  std::size_t size() const noexcept { return _LXstates.size(); }

  /// Every state and symbol as `"source" --symbol--> "{targets}" `, in braces; the order is not
  /// defined.
  std::u16string description() const {
    std::u16string text = u"{ ";
    for (const auto& [name, state] : _LXstates) {
      for (const auto& symbol : state.edges()) {
        text += u'"' + state.description() + u"\" --" + symbol + u"--> \"" +
                textFormOfSet(state.followingStatesWithSymbol(symbol)) + u"\" ";
      }
    }
    return text += u'}';
  }

  /// The state of this name, added without edges and not final if there is none.
  LXNFAState<Name>& _LXaddState(const Name& name) {
    return _LXstates.try_emplace(name, name).first->second;
  }

 private:
  std::unordered_map<Name, LXNFAState<Name>> _LXstates;
  LXNFAState<Name>* _LXstart = nullptr;
};

/// Writes the description as UTF-8.
template <typename Name>
std::ostream& operator<<(std::ostream& stream, const LXNFA<Name>& automaton) {
  return writeUtf8(stream, automaton.description());
}

}  // namespace wordcatcher

#endif
