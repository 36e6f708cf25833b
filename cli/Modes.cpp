#include "cli/Modes.h"

#include <algorithm>
#include <array>
#include <string>
#include <vector>

#include "cli/Arguments.h"

namespace wordcatcher::cli {

namespace {

struct Mode {
  const char* name;
  MatchingMode mode;
  const char* summary;
};

constexpr std::array kModes{
    Mode{"words", MatchingMode::words, "a phrase is indexed and found by its words"},
    Mode{"text", MatchingMode::wholeText,
         "a phrase is one string, spaces and punctuation included"},
    Mode{"phonetic", MatchingMode::phoneticWords,
         "a phrase is indexed and found by how its words sound"},
};

std::vector<std::string> names() {
  std::vector<std::string> all(kModes.size());
  std::transform(kModes.begin(), kModes.end(), all.begin(),
                 [](const Mode& mode) { return mode.name; });
  return all;
}

std::string description(const std::string& withoutIt) {
  std::string text = "How phrases are stored and found.";
  for (const auto& mode : kModes) {
    text += std::string("\n") + mode.name + ": " + mode.summary;
  }
  return text + "\nDefault: " + withoutIt;
}

MatchingMode modeNamed(const std::string& name) {
  const auto* const mode = std::find_if(kModes.begin(), kModes.end(),
                                        [&name](const Mode& each) { return each.name == name; });
  return mode->mode;
}

}  // namespace

void addModeOption(CLI::App& verb, std::optional<MatchingMode>& mode,
                   const std::string& withoutIt) {
  addChoice(
      verb, "--mode", names(), [&mode](const std::string& name) { mode = modeNamed(name); },
      description(withoutIt), "MODE");
}

std::string nameOf(MatchingMode mode) {
  const auto* const found = std::find_if(kModes.begin(), kModes.end(),
                                         [mode](const Mode& each) { return each.mode == mode; });
  return found->name;
}

}  // namespace wordcatcher::cli
