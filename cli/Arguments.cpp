#include "cli/Arguments.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <utility>

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

template <typename Number>
void addRanged(CLI::App& verb, const std::string& name, Number& number, Number least,
               Number largest, const std::string& description, const std::string& type) {
  verb.add_option(name, number, description)
      ->check(CLI::Range(least, largest))
      ->type_name(type)
      ->capture_default_str();
}

}  // namespace

CLI::App& addVerb(CLI::App& parent, const std::string& name, const std::string& description,
                  const std::string& footer) {
  CLI::App& verb = *parent.add_subcommand(name, description);
  verb.footer(footer);
  return verb;
}

void requireVerb(CLI::App& verb) { verb.require_subcommand(1); }

void whenNamed(CLI::App& verb, ChosenVerb& chosen, ChosenVerb run) {
  verb.callback([&chosen, run = std::move(run)] { chosen = run; });
}

void whenNamed(CLI::App& verb, ChosenVerb& chosen, ChosenVerb run,
               const std::function<void()>& check) {
  verb.callback([&chosen, check, run = std::move(run)] {
    check();
    chosen = run;
  });
}

void throwExcluded(const std::string& option, const std::string& other) {
  throw CLI::ExcludesError(option, other);
}

CLI::Option* addFlag(CLI::App& verb, const std::string& name, bool& flag,
                     const std::string& description) {
  return verb.add_flag(name, flag, description);
}

void addVerboseFlag(CLI::App& verb, bool& verbose) {
  addFlag(verb, "--verbose", verbose, "Show the tables' storage log on standard error");
}

void addNumberOption(CLI::App& verb, const std::string& name, std::int64_t& number,
                     std::int64_t least, std::int64_t largest, const std::string& description,
                     const std::string& type) {
  addRanged(verb, name, number, least, largest, description, type);
}

void addNumberOption(CLI::App& verb, const std::string& name, unsigned& number, unsigned least,
                     unsigned largest, const std::string& description, const std::string& type) {
  addRanged(verb, name, number, least, largest, description, type);
}

CLI::Option* addChoice(CLI::App& verb, const std::string& name,
                       const std::vector<std::string>& choices,
                       const std::function<void(const std::string& choice)>& take,
                       const std::string& description, const std::string& type) {
  return verb.add_option_function<std::string>(name, take, description)
      ->check(CLI::IsMember(choices))
      ->type_name(type);
}

void exclude(CLI::Option* option, CLI::Option* other) { option->excludes(other); }

void showDefault(CLI::Option* option, const std::string& value) { option->default_str(value); }

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
