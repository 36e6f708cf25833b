#include <CLI/CLI.hpp>
#include <cstdint>
#include <memory>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "cli/Arguments.h"
#include "cli/Failure.h"
#include "cli/IndexDirectory.h"
#include "cli/Output.h"
#include "cli/Questions.h"
#include "cli/TableLog.h"
#include "cli/Utf8.h"
#include "cli/Verbs.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

namespace wordcatcher::cli {

namespace {

using Json = nlohmann::ordered_json;

constexpr std::int32_t kReading = 1;
constexpr std::int64_t kDefaultDistance = 2;

// What the newer interface takes as well: more edits than that make any word near any other.
constexpr std::int64_t kLargestDistance = 16;

constexpr const char* kDataSeparator = " | ";

constexpr const char* kFooter = R"(
Finds the stored words (in text mode, the whole phrases) that are within K edits of a
WORD, those with more data first, then the nearer, the shorter. Each match is a line:
its value, a TAB, its distance, a TAB, its data strings joined by " | ". Several
WORDs, and the lines of standard input, each stand as a heading above their matches.

--json prints one object a WORD instead:
  {"word": "...", "matches": [{"value": "...", "distance": 1, "data": ["..."]}]}

Examples:
  wordcatcher search dogs goldan
  wordcatcher search --max-distance 1 --json dogs goldan retriver
  wordcatcher search dogs < words.txt)";

struct Arguments {
  std::int64_t maxDistance = kDefaultDistance;
  bool json = false;
  bool verbose = false;
  std::string directory;
  std::vector<std::string> words;
};

std::vector<std::string> dataOf(const LXFuzzyMatch& match) {
  std::vector<std::string> data;
  for (const auto& each : match.data()) {
    data.push_back(toUtf8(each));
  }
  return data;
}

std::string jsonLine(const std::string& word, const std::vector<LXFuzzyMatch>& matches) {
  Json list = Json::array();
  for (const auto& match : matches) {
    list.push_back(Json{
        {"value", toUtf8(match.value())}, {"distance", match.distance()}, {"data", dataOf(match)}});
  }
  return Json{{"word", word}, {"matches", list}}.dump() + '\n';
}

std::string plainLines(const std::vector<LXFuzzyMatch>& matches) {
  std::string lines;
  for (const auto& match : matches) {
    lines += toUtf8(match.value()) + '\t' + std::to_string(match.distance()) + '\t' +
             CLI::detail::join(dataOf(match), kDataSeparator) + '\n';
  }
  return lines;
}

ExitCode runSearch(const Arguments& arguments) {
  const IndexDirectory directory(arguments.directory);
  const Questions questions(arguments.words, !arguments.json);
  const TableLog log(arguments.verbose);
  LXFuzzyIndex index(directory.path());
  directory.openForReading(log, [&index] { index.setMode(kReading); });
  return questions.answerEach([&](const InputLine& question, Output& output) {
    const auto matches = index.search_withMaxDistance(question.text, arguments.maxDistance);
    directory.checkLookups(log);
    output.write(arguments.json ? jsonLine(question.utf8, matches) : plainLines(matches));
    return !matches.empty();
  });
}

}  // namespace

void addSearchVerb(CLI::App& program, ChosenVerb& chosen) {
  auto* const verb = program.add_subcommand("search", "Look words up in the fuzzy index itself");
  const auto arguments = std::make_shared<Arguments>();
  verb->add_option("--max-distance", arguments->maxDistance, "Edits that a match may need")
      ->check(CLI::Range(std::int64_t{0}, kLargestDistance))
      ->type_name("K in [0 - " + std::to_string(kLargestDistance) + "]")
      ->capture_default_str();
  verb->add_flag("--json", arguments->json, "Print a JSON object a word");
  verb->add_flag("--verbose", arguments->verbose, "Show the storage log on standard error");
  addArgument(*verb, "DIR", arguments->directory, "The index directory");
  addArguments(*verb, "WORD", arguments->words, "Words; without any, the lines of standard input");
  verb->footer(kFooter);
  verb->callback([arguments, &chosen] { chosen = [arguments] { return runSearch(*arguments); }; });
}

}  // namespace wordcatcher::cli
