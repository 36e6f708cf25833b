#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdint>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <variant>
#include <vector>

#include "cli/Arguments.h"
#include "cli/Failure.h"
#include "cli/IndexDirectory.h"
#include "cli/Modes.h"
#include "cli/Output.h"
#include "cli/Questions.h"
#include "cli/TableLog.h"
#include "cli/Utf8.h"
#include "cli/Verbs.h"
#include "wordcatcher/matcher/KXWordcatcher.h"

namespace wordcatcher::cli {

namespace {

using Json = nlohmann::ordered_json;

constexpr std::int32_t kReading = 1;

constexpr const char* kFooter = R"(
Each match is a line: its distance, a TAB, its value, the nearest first and equally
near ones by their UTF-16 code units. Several TEXTs, and the lines of standard
input, each stand as a heading above their matches. Empty lines count as texts.

--json prints one object a TEXT instead:
  {"query": "...", "matches": [{"value": "...", "distance": 4}]}
"matches" is null when no word of the text finds anything, and empty when what
they find is too far from the text. In text mode a match also has its "data": [...].

In text mode a phrase is found within 3 edits, in phonetic mode when its words sound
like the text's. Give the mode that DIR was indexed in.

Examples:
  wordcatcher query dogs 'a goldan retriver'
  wordcatcher query --json dogs < texts.txt
  wordcatcher query --mode text titles 'the grate gatsby'
  wordcatcher query --mode phonetic names 'Kathryn Shmit')";

struct Arguments {
  std::uint64_t option = 0;
  bool json = false;
  bool verbose = false;
  std::string directory;
  std::vector<std::string> texts;
};

struct Match {
  std::u16string value;
  std::int64_t distance;
  std::optional<std::vector<std::u16string>> data;
};

Match matchOf(const KXWordcatch& record) {
  return {record.value(), record.distance(), std::nullopt};
}

Match matchOf(const LXFuzzyMatch& match) { return {match.value(), match.distance(), match.data()}; }

/// One order for all modes; whole-text queries come in the fuzzy index's own.
void sortMatches(std::vector<Match>& matches) {
  std::sort(matches.begin(), matches.end(), [](const Match& a, const Match& b) {
    return a.distance != b.distance ? a.distance < b.distance : a.value < b.value;
  });
}

std::optional<std::vector<Match>> matchesOf(const std::optional<QueryResult>& result) {
  if (!result) {
    return std::nullopt;
  }
  std::vector<Match> matches;
  std::visit(
      [&matches](const auto& records) {
        for (const auto& record : records) {
          matches.push_back(matchOf(record));
        }
      },
      *result);
  sortMatches(matches);
  return matches;
}

Json jsonOf(const Match& match) {
  Json object = {{"value", toUtf8(match.value)}, {"distance", match.distance}};
  if (match.data) {
    auto& data = object["data"] = Json::array();
    for (const auto& each : *match.data) {
      data.push_back(toUtf8(each));
    }
  }
  return object;
}

std::string jsonLine(const std::string& query, const std::optional<std::vector<Match>>& matches) {
  Json object = {{"query", query}, {"matches", nullptr}};
  if (matches) {
    auto& list = object["matches"] = Json::array();
    for (const auto& match : *matches) {
      list.push_back(jsonOf(match));
    }
  }
  return object.dump() + '\n';
}

std::string plainLines(const std::optional<std::vector<Match>>& matches) {
  std::string lines;
  if (matches) {
    for (const auto& match : *matches) {
      lines += std::to_string(match.distance) + '\t' + toUtf8(match.value) + '\n';
    }
  }
  return lines;
}

ExitCode runQuery(const Arguments& arguments) {
  const IndexDirectory directory(arguments.directory);
  const Questions questions(arguments.texts, !arguments.json);
  const TableLog log(arguments.verbose);
  KXWordcatcher matcher(directory.path(), arguments.option);
  directory.openForReading(log, [&matcher] { matcher.setMode(kReading); });
  return questions.answerEach([&](const InputLine& question, Output& output) {
    matcher.setWordsMatched(0);
    const auto matches = matchesOf(matcher.query(question.text));
    directory.checkLookups(log);
    output.write(arguments.json ? jsonLine(question.utf8, matches) : plainLines(matches));
    return matches && !matches->empty();
  });
}

}  // namespace

void addQueryVerb(CLI::App& program, ChosenVerb& chosen) {
  auto* const verb =
      program.add_subcommand("query", "Find the indexed phrases that occur in texts");
  const auto arguments = std::make_shared<Arguments>();
  addModeOption(*verb, arguments->option);
  verb->add_flag("--json", arguments->json, "Print a JSON object a text");
  verb->add_flag("--verbose", arguments->verbose, "Show the storage log on standard error");
  addArgument(*verb, "DIR", arguments->directory, "The index directory");
  addArguments(*verb, "TEXT", arguments->texts, "Texts; without any, the lines of standard input");
  verb->footer(kFooter);
  verb->callback([arguments, &chosen] { chosen = [arguments] { return runQuery(*arguments); }; });
}

}  // namespace wordcatcher::cli
