#ifndef WORDCATCHER_CLI_MODES_H
#define WORDCATCHER_CLI_MODES_H

#include <optional>
#include <string>

#include "wordcatcher/matcher/IndexBuilder.h"

namespace CLI {
class App;
}

namespace wordcatcher::cli {

/// The mode of classic tables and of new indexes unless --mode names another.
constexpr MatchingMode kDefaultMode = MatchingMode::words;

/// Adds --mode to a verb. `mode` must live until the command line was parsed; without --mode it
/// stays empty. `withoutIt` says in the help what happens then.
void addModeOption(CLI::App& verb, std::optional<MatchingMode>& mode, const std::string& withoutIt);

/// The name that --mode takes.
std::string nameOf(MatchingMode mode);

}  // namespace wordcatcher::cli

#endif
