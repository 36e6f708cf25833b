#ifndef WORDCATCHER_CLI_PAGES_COMMAND_H
#define WORDCATCHER_CLI_PAGES_COMMAND_H

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace wordcatcher::cli {

/// What the parser's definitions say about a verb, or about the program itself, in the terms of its
/// man page and its completions.
struct Command {
  struct Option {
    std::vector<std::string> names;    ///< with their dashes: -h, --help
    std::string value;                 ///< what its value is called; empty for a flag
    std::vector<std::string> choices;  ///< the values that there are, if they are few
    std::string range;                 ///< "0 to 16", or empty
    std::string fallback;              ///< the value without it, or empty
    std::string description;           ///< of one line or several
  };

  struct Argument {
    std::string name;
    std::string description;
    bool required = false;
    bool repeated = false;

    /// Whether it names a file or a directory.
    bool isPath() const;
  };

  std::vector<std::string> path;  ///< wordcatcher, dot, nfa
  std::string summary;
  std::string footer;
  std::vector<Option> options;
  std::vector<Argument> arguments;
  std::vector<Command> verbs;

  /// The path's words with something between.
  std::string joined(const std::string& separator) const;
};

/// Reads the definitions of a program and of all of its verbs.
Command readCommand(const CLI::App& app, std::vector<std::string> parents = {});

// The pages. Each is the whole content of a file.
std::string manPage(const Command& command);
std::string bashCompletion(const Command& program);
std::string zshCompletion(const Command& program);

}  // namespace wordcatcher::cli

#endif
