#include "cli/Arguments.h"

#include <CLI/CLI.hpp>
#include <algorithm>

namespace wordcatcher::cli {

namespace {

constexpr char kShield = '\x01';

bool needsShield(const std::string& argument) {
  return argument.starts_with('[') || argument.starts_with(kShield);
}

std::string unshielded(const std::string& argument) {
  return argument.starts_with(kShield) ? argument.substr(1) : argument;
}

}  // namespace

std::vector<std::string> shieldedArguments(int argc, char** argv) {
  std::vector<std::string> arguments;
  bool optionsEnded = false;
  for (int i = 1; i < argc; ++i) {
    const std::string argument = argv[i];
    if (argument == "--" && !optionsEnded) {
      optionsEnded = true;
    } else {
      arguments.push_back(optionsEnded || needsShield(argument) ? kShield + argument : argument);
    }
  }
  std::reverse(arguments.begin(), arguments.end());
  return arguments;
}

void addArgument(CLI::App& verb, const std::string& name, std::string& value,
                 const std::string& description) {
  addOptionalArgument(verb, name, value, description);
  verb.get_option(name)->required();
}

void addNumber(CLI::App& verb, const std::string& name, std::int64_t& value, std::int64_t largest,
               const std::string& description) {
  verb.add_option(name, value, description)
      ->required()
      ->transform(CLI::Validator(
          [](std::string& argument) {
            argument = unshielded(argument);
            return std::string();
          },
          ""))
      ->check(CLI::Range(std::int64_t{0}, largest))
      ->type_name("NUMBER");
}

void addOptionalArgument(CLI::App& verb, const std::string& name, std::string& value,
                         const std::string& description) {
  const auto take = [&value](const CLI::results_t& results) {
    value = unshielded(results.front());
    return true;
  };
  verb.add_option(name, take, description)->expected(1)->type_name("");
}

void addArguments(CLI::App& verb, const std::string& name, std::vector<std::string>& values,
                  const std::string& description) {
  const auto take = [&values](const CLI::results_t& results) {
    for (const auto& result : results) {
      values.push_back(unshielded(result));
    }
    return true;
  };
  verb.add_option(name, take, description)
      ->expected(0, CLI::detail::expected_max_vector_size)
      ->allow_extra_args()
      ->type_name("");
}

}  // namespace wordcatcher::cli
