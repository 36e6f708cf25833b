#include "cli/pages/Command.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <array>
#include <regex>
#include <utility>

#include "cli/Joined.h"

namespace wordcatcher::cli {

namespace {

/// CLI11 appends what its checks allow to the name of the value: "WHEN:{auto,never}", or
/// "N:UINT in [1 - 64]".
void readType(const std::string& type, Command::Option& option) {
  static const std::regex kChoices(R"(\{(.*)\})");
  static const std::regex kRange(R"(in \[(\d+) - (\d+)\])");
  std::smatch match;
  option.value = type.substr(0, type.find_first_of(": "));
  if (std::regex_search(type, match, kChoices)) {
    option.choices = CLI::detail::split(match[1], ',');
  } else if (std::regex_search(type, match, kRange)) {
    option.range = match[1].str() + " to " + match[2].str();
  }
}

Command::Option readOption(const CLI::Option& definition) {
  Command::Option option;
  for (const auto& name : definition.get_snames()) {
    option.names.push_back('-' + name);
  }
  for (const auto& name : definition.get_lnames()) {
    option.names.push_back("--" + name);
  }
  if (definition.get_type_size() != 0) {
    readType(definition.get_type_name(), option);
  }
  option.fallback = definition.get_default_str();
  option.description = definition.get_description();
  return option;
}

Command::Argument readArgument(const CLI::Option& definition) {
  return {definition.get_name(true), definition.get_description(), definition.get_required(),
          definition.get_expected_max() > 1};
}

std::string withoutBlankEnds(const std::string& text) {
  const auto begin = text.find_first_not_of('\n');
  return begin == std::string::npos ? ""
                                    : text.substr(begin, text.find_last_not_of('\n') + 1 - begin);
}

}  // namespace

bool Command::Argument::isPath() const {
  constexpr std::array kPaths{"INDEX", "OUT", "FILE"};
  return std::find(kPaths.begin(), kPaths.end(), name) != kPaths.end();
}

std::string Command::joined(const std::string& separator) const {
  return cli::joined(path, separator);
}

Command readCommand(const CLI::App& app, std::vector<std::string> parents) {
  parents.push_back(app.get_name());
  Command command;
  command.summary = withoutBlankEnds(app.get_description());
  command.footer = withoutBlankEnds(app.get_footer());
  for (const auto* const definition : app.get_options()) {
    if (definition->get_positional()) {
      command.arguments.push_back(readArgument(*definition));
    } else {
      command.options.push_back(readOption(*definition));
    }
  }
  for (const auto* const verb : app.get_subcommands([](const CLI::App*) { return true; })) {
    command.verbs.push_back(readCommand(*verb, parents));
  }
  command.path = std::move(parents);
  return command;
}

}  // namespace wordcatcher::cli
