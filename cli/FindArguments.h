#ifndef WORDCATCHER_CLI_FINDARGUMENTS_H
#define WORDCATCHER_CLI_FINDARGUMENTS_H

#include <vector>

#include "wordcatcher/matcher/Find.h"

namespace CLI {
class App;
class Option;
}  // namespace CLI

namespace wordcatcher::cli {

// Both add options to a verb, for finding as for explaining, and return them; `options` must live
// until the command line was parsed.

/// What counts as a match.
std::vector<CLI::Option*> addMatchOptions(CLI::App& verb, FindOptions& options);

/// Which of the matches are listed.
std::vector<CLI::Option*> addListOptions(CLI::App& verb, FindOptions& options);

}  // namespace wordcatcher::cli

#endif
