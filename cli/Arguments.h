#ifndef WORDCATCHER_CLI_ARGUMENTS_H
#define WORDCATCHER_CLI_ARGUMENTS_H

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "cli/Verbs.h"

namespace CLI {
class App;
class Option;
}  // namespace CLI

namespace wordcatcher::cli {

// CLI11 takes seconds of each file that includes it, and clang-tidy many more. So the verbs do not:
// they say what they are and take in the words of this header.

/// Adds a verb to the program, or to another verb. `footer` ends its help.
CLI::App& addVerb(CLI::App& parent, const std::string& name, const std::string& description,
                  const std::string& footer);

/// Makes it wrong usage to name the verb without one of its own.
void requireVerb(CLI::App& verb);

/// When the command line names the verb, sets `chosen` to `run`. Both must live until the command
/// line was parsed.
void whenNamed(CLI::App& verb, ChosenVerb& chosen, ChosenVerb run);

/// The same, after a check that may throw.
void whenNamed(CLI::App& verb, ChosenVerb& chosen, ChosenVerb run,
               const std::function<void()>& check);

/// Wrong usage: two options that cannot stand together.
[[noreturn]] void throwExcluded(const std::string& option, const std::string& other);

// What the options set must live until the command line was parsed.

/// Adds an option without a value.
CLI::Option* addFlag(CLI::App& verb, const std::string& name, bool& flag,
                     const std::string& description);

/// Adds --verbose.
void addVerboseFlag(CLI::App& verb, bool& verbose);

/// Adds an option whose value is a number from `least` to `largest`; the help shows what `number`
/// is now as the value without it.
void addNumberOption(CLI::App& verb, const std::string& name, std::int64_t& number,
                     std::int64_t least, std::int64_t largest, const std::string& description,
                     const std::string& type);
void addNumberOption(CLI::App& verb, const std::string& name, unsigned& number, unsigned least,
                     unsigned largest, const std::string& description, const std::string& type);

/// Adds an option whose value is one of several, and is given to `take`.
CLI::Option* addChoice(CLI::App& verb, const std::string& name,
                       const std::vector<std::string>& choices,
                       const std::function<void(const std::string& choice)>& take,
                       const std::string& description, const std::string& type);

/// Makes it wrong usage to give both.
void exclude(CLI::Option* option, CLI::Option* other);

/// The value that the help shows for an option that is not given.
void showDefault(CLI::Option* option, const std::string& value);

/// The command line as the parser is given it, in CLI11's order: the last argument first. CLI11
/// takes "[a, b]" for a list of arguments, and "--" for the end of the verb's own arguments.
/// Neither suits texts, so that texts in brackets and everything after "--" go in with a mark in
/// front.
std::vector<std::string> shieldedArguments(const std::vector<std::string>& arguments);

/// Adds a required positional argument whose value arrives as the user wrote it.
void addArgument(CLI::App& verb, const std::string& name, std::string& value,
                 const std::string& description);

/// The same for one that may be left out.
void addOptionalArgument(CLI::App& verb, const std::string& name, std::string& value,
                         const std::string& description);

/// Adds a required positional argument that is a number from 0 to `largest`.
void addNumber(CLI::App& verb, const std::string& name, std::int64_t& value, std::int64_t largest,
               const std::string& description);

/// Adds a positional argument that may be repeated or left out.
void addArguments(CLI::App& verb, const std::string& name, std::vector<std::string>& values,
                  const std::string& description);

/// Adds the texts that a verb answers: none, or "-" alone, are the lines of standard input, and
/// leave `values` empty. `what` names them: Texts
void addTexts(CLI::App& verb, const std::string& name, std::vector<std::string>& values,
              const std::string& what);

}  // namespace wordcatcher::cli

#endif
