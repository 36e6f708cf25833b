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

void addRepeated(CLI::App& verb, const std::string& name, const CLI::callback_t& take,
                 const std::string& description) {
  verb.add_option(name, take, description)
      ->expected(0, CLI::detail::expected_max_vector_size)
      ->allow_extra_args()
      ->type_name("");
}

}  // namespace

std::vector<std::string> shieldedArguments(const std::vector<std::string>& arguments) {
  std::vector<std::string> shielded;
  bool optionsEnded = false;
  for (const auto& argument : arguments) {
    if (argument == "--" && !optionsEnded) {
      optionsEnded = true;
    } else {
      shielded.push_back(optionsEnded || needsShield(argument) ? kShield + argument : argument);
    }
  }
  std::reverse(shielded.begin(), shielded.end());
  return shielded;
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
  addRepeated(verb, name, take, description);
}

void addTexts(CLI::App& verb, const std::string& name, std::vector<std::string>& values,
              const std::string& what) {
  const auto take = [&values](const CLI::results_t& results) {
    // Behind "--" it has a shield, and is a text like any other.
    if (results != CLI::results_t{"-"}) {
      for (const auto& result : results) {
        values.push_back(unshielded(result));
      }
    }
    return true;
  };
  addRepeated(verb, name, take,
              what + "; without any, or with \"-\" alone, the lines of standard input");
}

}  // namespace wordcatcher::cli
