#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <vector>

#include "cli/Answers.h"
#include "cli/Arguments.h"
#include "cli/Failure.h"
#include "cli/Modes.h"
#include "cli/OpenIndex.h"
#include "cli/Output.h"
#include "cli/Questions.h"
#include "cli/Verbs.h"

namespace wordcatcher::cli {

namespace {

using Json = nlohmann::ordered_json;

constexpr const char* kQueryFooter = R"(
Each match is a line: its distance, a TAB, its value, the nearest first and equally
near ones by their UTF-16 code units. Several TEXTs, and the lines of standard
input, each stand as a heading above their matches. Empty lines count as texts.

--json prints one object a TEXT instead:
  {"query": "...", "matches": [{"value": "...", "distance": 4}]}
"matches" is null when no word of the text finds anything, and empty when what
they find is too far from the text. In text mode a match also has its "data": [...].
"truncated": true comes last when the text is too long to be looked at in full;
without --json a note on standard error says so.

In text mode a phrase is found within 3 edits, in phonetic mode when its words sound
like the text's. A search image remembers its mode; the tables in a directory do not,
so give the mode that they were indexed in.

Examples:
  wordcatcher query dogs.wci 'a goldan retriver'
  wordcatcher query --json dogs.wci < texts.txt
  wordcatcher query titles.wci 'the grate gatsby'
  wordcatcher query --mode phonetic names/ 'Kathryn Shmit')";

struct QueryArguments {
  std::optional<MatchingMode> mode;
  bool json = false;
  bool verbose = false;
  std::string index;
  std::vector<std::string> texts;
};

Json jsonOf(const Index::Match& match, MatchingMode mode) {
  Json object = {{"value", match.value}, {"distance", match.distance}};
  if (mode == MatchingMode::wholeText) {
    object["data"] = match.data;
  }
  return object;
}

std::string jsonLine(const std::string& query, const Index::QueryResult& result,
                     MatchingMode mode) {
  Json object = {{"query", query}, {"matches", nullptr}};
  if (result.found) {
    auto& list = object["matches"] = Json::array();
    for (const auto& match : result.matches) {
      list.push_back(jsonOf(match, mode));
    }
  }
  if (result.truncated) {
    object["truncated"] = true;
  }
  return object.dump() + '\n';
}

std::string plainLines(const Index::QueryResult& result) {
  std::string lines;
  for (const auto& match : result.matches) {
    lines += std::to_string(match.distance) + '\t' + match.value + '\n';
  }
  return lines;
}

ExitCode runQuery(const QueryArguments& arguments) {
  const Questions questions(arguments.texts, !arguments.json);
  checkIndexComesFirst(arguments.index, arguments.texts);
  const Index index = openIndex(arguments.index, arguments.mode, arguments.verbose);
  const MatchingMode mode = index.info().mode;
  return questions.answerEach([&](const InputLine& question, Output& output) {
    const auto result = index.query(question.utf8);
    const auto lines = arguments.json ? jsonLine(question.utf8, result, mode) : plainLines(result);
    return writeAnswer(output, result, lines, arguments.json);
  });
}

}  // namespace

void addQueryVerb(CLI::App& program, ChosenVerb& chosen) {
  CLI::App& verb =
      addVerb(program, "query", "Find the indexed phrases that occur in texts", kQueryFooter);
  const auto arguments = std::make_shared<QueryArguments>();
  addModeOption(verb, arguments->mode,
                "the index's own, or " + nameOf(kDefaultMode) + " for a directory");
  addFlag(verb, "--json", arguments->json, "Print a JSON object a text");
  addVerboseFlag(verb, arguments->verbose);
  addArgument(verb, "INDEX", arguments->index,
              "A search image, or the directory of a classic index");
  addTexts(verb, "TEXT", arguments->texts, "Texts");
  whenNamed(verb, chosen, [arguments] { return runQuery(*arguments); });
}

}  // namespace wordcatcher::cli
