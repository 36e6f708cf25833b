#ifndef WORDCATCHER_CLI_VERBS_H
#define WORDCATCHER_CLI_VERBS_H

#include <functional>

#include "cli/Failure.h"

namespace CLI {
class App;
}

namespace wordcatcher::cli {

/// The verb that the command line chose, ready to run. It ends with an exit code or throws Failure
/// or another exception whose text is a sentence for the user.
using ChosenVerb = std::function<ExitCode()>;

// Each adds one verb to the program; parsing a command line that names it sets `chosen`. Both must
// live until the command line was parsed.
void addDotVerb(CLI::App& program, ChosenVerb& chosen);
void addEncodeVerb(CLI::App& program, ChosenVerb& chosen);
void addExplainVerb(CLI::App& program, ChosenVerb& chosen);
void addFindVerb(CLI::App& program, ChosenVerb& chosen);
void addIndexVerb(CLI::App& program, ChosenVerb& chosen);
void addInfoVerb(CLI::App& program, ChosenVerb& chosen);
void addQueryVerb(CLI::App& program, ChosenVerb& chosen);
void addSearchVerb(CLI::App& program, ChosenVerb& chosen);
void addVerifyVerb(CLI::App& program, ChosenVerb& chosen);

}  // namespace wordcatcher::cli

#endif
