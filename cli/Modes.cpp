#include "cli/Modes.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <array>
#include <string>
#include <vector>

namespace wordcatcher::cli {

namespace {

struct Mode {
  const char* name;
  std::uint64_t option;
  const char* summary;
};

constexpr std::array kModes{
    Mode{"words", 0, "a phrase is indexed and found by its words"},
    Mode{"text", 1, "a phrase is one string, spaces and punctuation included"},
    Mode{"phonetic", 2, "a phrase is indexed and found by how its words sound"},
};

std::vector<std::string> names() {
  std::vector<std::string> all(kModes.size());
  std::transform(kModes.begin(), kModes.end(), all.begin(),
                 [](const Mode& mode) { return mode.name; });
  return all;
}

std::string description() {
  std::string text = "What is matched; the same for indexing and for querying.";
  for (const auto& mode : kModes) {
    text += std::string("\n") + mode.name + ": " + mode.summary;
  }
  return text + "\nDefault: " + kModes.front().name;
}

std::uint64_t optionOf(const std::string& name) {
  const auto* const mode = std::find_if(kModes.begin(), kModes.end(),
                                        [&name](const Mode& each) { return each.name == name; });
  return mode->option;
}

}  // namespace

void addModeOption(CLI::App& verb, std::uint64_t& option) {
  option = kModes.front().option;
  verb.add_option_function<std::string>(
          "--mode", [&option](const std::string& name) { option = optionOf(name); }, description())
      ->check(CLI::IsMember(names()))
      ->type_name("MODE");
}

}  // namespace wordcatcher::cli
