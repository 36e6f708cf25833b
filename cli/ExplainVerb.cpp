#include <memory>
#include <optional>
#include <string>

#include "cli/Arguments.h"
#include "cli/FindArguments.h"
#include "cli/Modes.h"
#include "cli/OpenIndex.h"
#include "cli/Output.h"
#include "cli/Verbs.h"
#include "cli/WaitingNote.h"

namespace wordcatcher::cli {

namespace {

constexpr const char* kExplainFooter = R"(
Tells why "wordcatcher find" gives VALUE its cost for TEXT, word by word, or which
limit keeps it out. VALUE is what is printed for a match, as in "golden retriever{ 7 }".
With --query it tells how the distance of "wordcatcher query" comes about instead,
step by step. The exit code is 0 if VALUE is found and 1 if not.

--json prints one object on one line.

Examples:
  wordcatcher explain dogs.wci 'a goldan retriver' 'golden retriever'
  wordcatcher explain --max-cost 2 dogs.wci 'a goldan retriver' 'golden gate bridge'
  wordcatcher explain --query --json dogs.wci 'a goldan retriver' 'golden retriever')";

struct ExplainArguments {
  FindOptions options;
  std::optional<MatchingMode> mode;
  bool query = false;
  bool json = false;
  bool verbose = false;
  std::string index;
  std::string text;
  std::string value;
};

template <typename Explanation>
ExitCode print(const Explanation& explanation, bool json) {
  Output output;
  output.write(json ? explanation.toJson() + '\n' : explanation.toText());
  output.flush();
  return explanation.isFound ? kMatched : kNoMatch;
}

/// An explanation, for which all values of the index may be looked at.
template <typename Explain>
auto waitedFor(const Explain& explain) {
  const WaitingNote note("Explaining");
  return explain();
}

ExitCode runExplain(const ExplainArguments& arguments) {
  checkIndexComesFirst(arguments.index, {arguments.text, arguments.value});
  const Index index = openIndex(arguments.index, arguments.mode, arguments.verbose);
  return arguments.query
             ? print(waitedFor([&] { return index.explainQuery(arguments.text, arguments.value); }),
                     arguments.json)
             : print(waitedFor([&] {
                       return index.explain(arguments.text, arguments.value, arguments.options);
                     }),
                     arguments.json);
}

}  // namespace

void addExplainVerb(CLI::App& program, ChosenVerb& chosen) {
  CLI::App& verb = addVerb(program, "explain", "Tell why a phrase is found in a text, or why not",
                           kExplainFooter);
  const auto arguments = std::make_shared<ExplainArguments>();
  auto* const query =
      addFlag(verb, "--query", arguments->query, "Explain the distance of \"wordcatcher query\"");
  for (const auto& options :
       {addListOptions(verb, arguments->options), addMatchOptions(verb, arguments->options)}) {
    for (auto* const option : options) {
      exclude(option, query);
    }
  }
  addFlag(verb, "--json", arguments->json, "Print a JSON object");
  addModeOption(verb, arguments->mode,
                "the index's own, or " + nameOf(kDefaultMode) + " for a directory");
  addVerboseFlag(verb, arguments->verbose);
  addArgument(verb, "INDEX", arguments->index,
              "A search image, or the directory of a classic index");
  addArgument(verb, "TEXT", arguments->text, "The text that was searched");
  addArgument(verb, "VALUE", arguments->value, "The value to explain, as a match shows it");
  whenNamed(verb, chosen, [arguments] { return runExplain(*arguments); });
}

}  // namespace wordcatcher::cli
