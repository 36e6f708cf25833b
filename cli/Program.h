#ifndef WORDCATCHER_CLI_PROGRAM_H
#define WORDCATCHER_CLI_PROGRAM_H

#include "cli/Verbs.h"

namespace wordcatcher::cli {

/// What the command says when it is given nothing to do.
extern const char* const kFirstSteps;

/// Gives an empty program its name, its verbs and their help. The command parses with it; its man
/// pages and completions are made from it.
void defineProgram(CLI::App& program, ChosenVerb& chosen);

}  // namespace wordcatcher::cli

#endif
