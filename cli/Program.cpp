#include "cli/Program.h"

#include <CLI/CLI.hpp>
#include <string>

#include "wordcatcher/Version.h"

namespace wordcatcher::cli {

namespace {

constexpr const char* kSummary =
    "Finds stored phrases in free text, tolerating spelling mistakes\n";

constexpr const char* kFooter = R"(
Exit codes: 0 matches were found (or the index was written or is whole, or codes or a
graph were printed), 1 nothing matched, 2 wrong usage or a failure.

Examples:
  printf 'golden retriever\ngolden gate bridge\n' | wordcatcher index dogs.wci
  wordcatcher find dogs.wci 'my goldan retriver at the golden gate bridge'
  wordcatcher explain dogs.wci 'a goldan retriver' 'golden retriever'
  wordcatcher query dogs.wci 'a goldan retriver'
  wordcatcher search --max-distance 1 dogs.wci bridg
  wordcatcher info dogs.wci
  wordcatcher encode 'Catherine Schmidt'
  wordcatcher dot tree dogs.wci | dot -Tsvg > dogs.svg
"wordcatcher help VERB" tells more about a verb, as "wordcatcher VERB --help" does.)";

/// The heading above them in the help.
void callThemVerbs(CLI::App& program) {
  for (auto* const verb : program.get_subcommands([](const CLI::App*) { return true; })) {
    verb->group("Verbs");
    callThemVerbs(*verb);
  }
}

}  // namespace

const char* const kFirstSteps =
    R"(Wordcatcher finds stored phrases in free text, tolerating spelling mistakes. Try:

  printf 'golden retriever\ngolden gate bridge\n' | wordcatcher index dogs.wci
  wordcatcher find dogs.wci 'a goldan retriver'
  wordcatcher explain dogs.wci 'a goldan retriver' 'golden gate bridge'

"wordcatcher --help" lists what else there is: query, search, info, verify, encode, dot.
)";

void defineProgram(CLI::App& program, ChosenVerb& chosen) {
  program.name("wordcatcher");
  program.description(kSummary);
  program.set_version_flag("--version", std::string("wordcatcher ") + versionString,
                           "Print the version and exit");
  program.require_subcommand(1);
  // What CLI11 calls a subcommand is a verb here; its own verbs inherit the formatter.
  program.get_formatter()->label("SUBCOMMAND", "VERB");
  program.footer(kFooter);
  addIndexVerb(program, chosen);
  addFindVerb(program, chosen);
  addExplainVerb(program, chosen);
  addQueryVerb(program, chosen);
  addSearchVerb(program, chosen);
  addInfoVerb(program, chosen);
  addVerifyVerb(program, chosen);
  addEncodeVerb(program, chosen);
  addDotVerb(program, chosen);
  callThemVerbs(program);
}

}  // namespace wordcatcher::cli
