#ifndef WORDCATCHER_CLI_ARGUMENTS_H
#define WORDCATCHER_CLI_ARGUMENTS_H

#include <cstdint>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace wordcatcher::cli {

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
