#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>

#include "cli/Arguments.h"
#include "cli/IndexDirectory.h"
#include "cli/Modes.h"
#include "cli/OpenIndex.h"
#include "cli/Output.h"
#include "cli/Verbs.h"

namespace wordcatcher::cli {

namespace {

using Json = nlohmann::ordered_json;

constexpr const char* kInfoFooter = R"(
Prints a line for each: the mode, the phrases added, the distinct words (in text mode
whole phrases, in phonetic mode codes) and data strings, the bytes, the generation,
which each run of "wordcatcher index" makes anew, and the version of the format.

--json prints one object instead:
  {"mode": "words", "phrases": 2, "words": 5, "data": 2, "bytes": 1544,
   "generation": "...", "version": 2}

The tables of a classic index know only their words, data strings and bytes; the rest
is left out, and null in JSON.

Examples:
  wordcatcher info dogs.wci
  wordcatcher info --json dogs.wci)";

struct InfoArguments {
  bool json = false;
  std::string index;
};

Json describe(const std::string& name) {
  const Index::Info info = openIndex(name, std::nullopt, false).info();
  if (namesDirectory(name)) {
    return {{"mode", nullptr},
            {"phrases", nullptr},
            {"words", info.words},
            {"data", info.values},
            {"bytes", IndexDirectory(name).tableBytes()},
            {"generation", nullptr},
            {"version", nullptr}};
  }
  return {{"mode", nameOf(info.mode)}, {"phrases", info.phrases}, {"words", info.words},
          {"data", info.values},       {"bytes", info.bytes},     {"generation", info.generation},
          {"version", info.version}};
}

std::string plainLines(const Json& description) {
  std::string lines;
  for (const auto& [key, value] : description.items()) {
    if (!value.is_null()) {
      lines += key + '\t' + (value.is_string() ? value.get<std::string>() : value.dump()) + '\n';
    }
  }
  return lines;
}

ExitCode runInfo(const InfoArguments& arguments) {
  const Json description = describe(arguments.index);
  Output output;
  output.write(arguments.json ? description.dump() + '\n' : plainLines(description));
  output.flush();
  return kMatched;
}

}  // namespace

void addInfoVerb(CLI::App& program, ChosenVerb& chosen) {
  CLI::App& verb = addVerb(program, "info", "Tell what an index holds", kInfoFooter);
  const auto arguments = std::make_shared<InfoArguments>();
  addFlag(verb, "--json", arguments->json, "Print a JSON object");
  addArgument(verb, "INDEX", arguments->index,
              "A search image, or the directory of a classic index");
  whenNamed(verb, chosen, [arguments] { return runInfo(*arguments); });
}

}  // namespace wordcatcher::cli
