#ifndef WORDCATCHER_CLI_VERBNAMES_H
#define WORDCATCHER_CLI_VERBNAMES_H

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace wordcatcher::cli {

/// The arguments with "help VERB" in the form that the parser knows: VERB --help.
std::vector<std::string> withHelpAsOption(std::vector<std::string> arguments);

/// Failure, which suggests the nearest verb, when a word stands where a verb should and is none.
void checkVerbNames(const CLI::App& program, const std::vector<std::string>& arguments);

}  // namespace wordcatcher::cli

#endif
