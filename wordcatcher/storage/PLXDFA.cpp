#include "wordcatcher/storage/PLXDFA.h"

#include <sstream>
#include <utility>

#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {

namespace {

constexpr const char* kDefaultPath = "test_";
constexpr std::u16string_view kFinalMark = u"t";

}  // namespace

PLXDFA::PLXDFA() : PLXDFA(kDefaultPath) {}

PLXDFA::PLXDFA(std::string path)
    : _edgeTable(path + "edgeTable.tdb"),
      _dataTable(path + "dataTable.tdb"),
      _finalTable(path + "finalTable.tdb"),
      _path(std::move(path)) {}

PLXDFA::~PLXDFA() { setMode(0); }

void PLXDFA::setMode(std::int32_t mode) {
  _edgeTable.setMode(mode);
  _dataTable.setMode(mode);
  _finalTable.setMode(mode);
}

std::int32_t PLXDFA::getMode() const noexcept { return _edgeTable.getMode(); }

void PLXDFA::addEdge_fromState_toState(std::u16string_view symbol, std::u16string_view from,
                                       std::u16string_view /*to*/) {
  _edgeTable.setValue_forKey(symbol, from);
}

std::optional<std::u16string> PLXDFA::followingStateFrom_withSymbol(std::u16string_view state,
                                                                    std::u16string_view symbol) {
  if (!edgesFromState(state).contains(std::u16string(symbol))) {
    return std::nullopt;
  }
  return std::u16string(state).append(symbol);
}

std::set<std::u16string> PLXDFA::edgesFromState(std::u16string_view state) {
  return _edgeTable.valuesFor(state);
}

void PLXDFA::addFinalState(std::u16string_view state) {
  _finalTable.setValue_forKey(kFinalMark, state);
}

bool PLXDFA::isFinalState(std::u16string_view state) {
  return _finalTable.valuesFor(state).contains(std::u16string(kFinalMark));
}

void PLXDFA::setDataFor_to(std::u16string_view state, std::u16string_view data) {
  _dataTable.setValue_forKey(data, state);
}

std::set<std::u16string> PLXDFA::dataFor(std::u16string_view state) {
  return _dataTable.valuesFor(state);
}

const std::u16string& PLXDFA::startState() const noexcept { return _startState; }

void PLXDFA::setStartState(std::u16string_view state) { _startState = state; }

const std::string& PLXDFA::path() const noexcept { return _path; }

void PLXDFA::setPath(std::string path) { _path = std::move(path); }

std::u16string PLXDFA::description() const {
  std::ostringstream text;
  text << "<PLXDFA: " << static_cast<const void*>(this) << '>';
  const std::string ascii = text.str();
  return {ascii.begin(), ascii.end()};
}

std::ostream& operator<<(std::ostream& stream, const PLXDFA& automaton) {
  return writeUtf8(stream, automaton.description());
}

}  // namespace wordcatcher
