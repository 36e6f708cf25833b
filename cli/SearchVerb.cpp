#include <cstdint>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <vector>

#include "cli/Answers.h"
#include "cli/Arguments.h"
#include "cli/Failure.h"
#include "cli/Joined.h"
#include "cli/OpenIndex.h"
#include "cli/Output.h"
#include "cli/Questions.h"
#include "cli/Verbs.h"

namespace wordcatcher::cli {

namespace {

using Json = nlohmann::ordered_json;

constexpr std::int64_t kDefaultDistance = 2;

// What the library takes: more edits than that make any word near any other.
constexpr std::int64_t kFarthest = 16;

constexpr const char* kDataSeparator = " | ";

constexpr const char* kSearchFooter = R"(
Finds the stored words (in text mode, the whole phrases) that are within K edits of a
WORD, those with more data first, then the nearer, the shorter. Each match is a line:
its value, a TAB, its distance, a TAB, its data strings joined by " | ". Several
WORDs, and the lines of standard input, each stand as a heading above their matches.

--json prints one object a WORD instead:
  {"word": "...", "matches": [{"value": "...", "distance": 1, "data": ["..."]}]}
"truncated": true comes last when the WORD is too long to be looked up; without
--json a note on standard error says so.

Examples:
  wordcatcher search dogs.wci goldan
  wordcatcher search --max-distance 1 --json dogs.wci goldan retriver
  wordcatcher search dogs.wci < words.txt)";

struct SearchArguments {
  std::int64_t maxDistance = kDefaultDistance;
  bool json = false;
  bool verbose = false;
  std::string index;
  std::vector<std::string> words;
};

std::string jsonLine(const std::string& word, const Index::SearchResult& result) {
  Json list = Json::array();
  for (const auto& match : result.matches) {
    list.push_back(
        Json{{"value", match.value}, {"distance", match.distance}, {"data", match.data}});
  }
  Json object = {{"word", word}, {"matches", list}};
  if (result.truncated) {
    object["truncated"] = true;
  }
  return object.dump() + '\n';
}

std::string plainLines(const Index::SearchResult& result) {
  std::string lines;
  for (const auto& match : result.matches) {
    lines += match.value + '\t' + std::to_string(match.distance) + '\t' +
             joined(match.data, kDataSeparator) + '\n';
  }
  return lines;
}

ExitCode runSearch(const SearchArguments& arguments) {
  const Questions questions(arguments.words, !arguments.json);
  checkIndexComesFirst(arguments.index, arguments.words);
  const Index index = openIndex(arguments.index, std::nullopt, arguments.verbose);
  return questions.answerEach([&](const InputLine& question, Output& output) {
    const auto result = index.search(question.utf8, arguments.maxDistance);
    const auto lines = arguments.json ? jsonLine(question.utf8, result) : plainLines(result);
    return writeAnswer(output, result, lines, arguments.json);
  });
}

}  // namespace

void addSearchVerb(CLI::App& program, ChosenVerb& chosen) {
  CLI::App& verb =
      addVerb(program, "search", "Look words up in the fuzzy index itself", kSearchFooter);
  const auto arguments = std::make_shared<SearchArguments>();
  addNumberOption(verb, "--max-distance", arguments->maxDistance, 0, kFarthest,
                  "Edits that a match may need", "K in [0 - " + std::to_string(kFarthest) + "]");
  addFlag(verb, "--json", arguments->json, "Print a JSON object a word");
  addVerboseFlag(verb, arguments->verbose);
  addArgument(verb, "INDEX", arguments->index,
              "A search image, or the directory of a classic index");
  addTexts(verb, "WORD", arguments->words, "Words");
  whenNamed(verb, chosen, [arguments] { return runSearch(*arguments); });
}

}  // namespace wordcatcher::cli
