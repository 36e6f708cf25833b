#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <vector>

#include "cli/AnswerStream.h"
#include "cli/Arguments.h"
#include "cli/Failure.h"
#include "cli/FindArguments.h"
#include "cli/Highlight.h"
#include "cli/Modes.h"
#include "cli/OpenIndex.h"
#include "cli/Substitutes.h"
#include "cli/Verbs.h"

namespace wordcatcher::cli {

namespace {

using Json = nlohmann::ordered_json;

constexpr unsigned kMostThreads = 64;

constexpr const char* kFindFooter = R"(
Each match is a line: its cost, a TAB, its value, a TAB, and where it is in the text:
begin-end in bytes from 0, the end being behind its last byte. The best match comes
first. Its cost is the edits of its words, and 2 for each word that only the text or
only the phrase has. Several TEXTs, and the lines of standard input, each stand as a
heading above their matches. Empty lines count as texts.

On a terminal the text is always shown, the words that were found in it in colour:
green as stored, yellow with edits. NO_COLOR in the environment turns that off.

--json prints one object a TEXT instead:
  {"query": "...", "matches": [{"value": "...", "cost": 2, "begin": 2, "end": 17,
   "hits": [{"begin": 2, "end": 8, "word": "...", "edits": 1}]}], "truncated": false}
"truncated" tells whether the text was not looked at in full; without --json a note
on standard error does.

A text need not be UTF-8: what is not UTF-8 in it separates words. JSON must be, so
there "query" has the character U+001A in place of each such byte. It is one byte
too, so that the numbers count the bytes of the text and those of "query" alike.

The lines of standard input are answered in their order, each before the next one
comes. --threads lets several be answered at once; not more than a few lines are
read ahead.

Examples:
  wordcatcher find dogs.wci 'my goldan retriver at the golden gate bridge'
  wordcatcher find --json --threads 4 dogs.wci < texts.txt > found.jsonl
  wordcatcher find --overlaps longest --min-words 2 --limit 3 dogs.wci < texts.txt
  wordcatcher find --max-cost 4 --edits 0,0,1 dogs.wci 'golden gatt brigde')";

struct FindArguments {
  FindOptions options;
  std::optional<MatchingMode> mode;
  unsigned threads = 1;
  std::string color = "auto";
  bool highlight = false;
  bool json = false;
  bool verbose = false;
  std::string index;
  std::vector<std::string> texts;

  bool colored() const {
    return !json && (highlight || color == "always" || (color == "auto" && wantsColor()));
  }
};

Json jsonOf(const FoundPhrase& match) {
  Json hits = Json::array();
  for (const auto& hit : match.hits) {
    hits.push_back(
        Json{{"begin", hit.begin}, {"end", hit.end}, {"word", hit.word}, {"edits", hit.edits}});
  }
  return {{"value", match.value},
          {"cost", match.cost},
          {"begin", match.begin},
          {"end", match.end},
          {"hits", std::move(hits)}};
}

std::string jsonLine(const std::string& text, const FindResult& result) {
  Json matches = Json::array();
  for (const auto& match : result.matches) {
    matches.push_back(jsonOf(match));
  }
  const Json object = {{"query", withSubstitutes(text)},
                       {"matches", std::move(matches)},
                       {"truncated", result.truncated}};
  return object.dump(-1, ' ', false, Json::error_handler_t::replace) + '\n';
}

std::string plainLines(const FindResult& result) {
  std::string lines;
  for (const auto& match : result.matches) {
    lines += std::to_string(match.cost) + '\t' + match.value + '\t' + std::to_string(match.begin) +
             '-' + std::to_string(match.end) + '\n';
  }
  return lines;
}

std::string truncationNote(const FindOptions& options) {
  const Index::Options limits;
  return "wordcatcher: a text was not looked at in full, being beyond the limits of " +
         std::to_string(limits.maxQueryWords) + " words, " + std::to_string(limits.maxWordUnits) +
         " letters a word and " + std::to_string(options.maxPostings) +
         " phrases: give it in shorter pieces, or give a larger --max-postings.";
}

TextAnswer answerTo(const std::string& text, const FindResult& result,
                    const FindArguments& arguments) {
  const bool matched = !result.matches.empty();
  if (arguments.json) {
    return {jsonLine(text, result), "", matched};
  }
  std::string heading;
  if (arguments.colored()) {
    heading = highlighted(text, result) + '\n';
  } else if (arguments.texts.size() != 1) {
    heading = text + '\n';
  }
  return {heading + plainLines(result),
          result.truncated ? truncationNote(arguments.options) : std::string(), matched};
}

ExitCode runFind(const FindArguments& arguments) {
  checkIndexComesFirst(arguments.index, arguments.texts);
  const Index index = openIndex(arguments.index, arguments.mode, arguments.verbose);
  return answerInOrder(
      arguments.texts,
      [&](const std::string& text) {
        return answerTo(text, index.find(text, arguments.options), arguments);
      },
      arguments.threads);
}

void addOutputOptions(CLI::App& verb, FindArguments& arguments) {
  auto* const json = addFlag(verb, "--json", arguments.json, "Print a JSON object a text");
  auto* const color = addChoice(
      verb, "--color", {"auto", "always", "never"},
      [&arguments](const std::string& when) { arguments.color = when; },
      "Whether to show the text with its found words in colour", "WHEN");
  showDefault(color, arguments.color);
  auto* const highlight =
      addFlag(verb, "--highlight", arguments.highlight, "The same as --color always");
  exclude(highlight, color);
  exclude(highlight, json);
  addNumberOption(verb, "--threads", arguments.threads, 1, kMostThreads,
                  "Texts that are answered at once", "N");
}

}  // namespace

void addFindVerb(CLI::App& program, ChosenVerb& chosen) {
  CLI::App& verb = addVerb(program, "find", "Find the phrases that texts hold, the best ones first",
                           kFindFooter);
  const auto arguments = std::make_shared<FindArguments>();
  addListOptions(verb, arguments->options);
  addMatchOptions(verb, arguments->options);
  addOutputOptions(verb, *arguments);
  addModeOption(verb, arguments->mode,
                "the index's own, or " + nameOf(kDefaultMode) + " for a directory");
  addVerboseFlag(verb, arguments->verbose);
  addArgument(verb, "INDEX", arguments->index,
              "A search image, or the directory of a classic index");
  addTexts(verb, "TEXT", arguments->texts, "Texts");
  whenNamed(
      verb, chosen, [arguments] { return runFind(*arguments); },
      [arguments] {
        if (arguments->json && arguments->color == "always") {
          throwExcluded("--json", "--color always");
        }
      });
}

}  // namespace wordcatcher::cli
