#include <chrono>
#include <iostream>
#include <memory>
#include <optional>
#include <sstream>
#include <string>
#include <vector>

#include "cli/Arguments.h"
#include "cli/Counted.h"
#include "cli/Failure.h"
#include "cli/Indexing.h"
#include "cli/Modes.h"
#include "cli/Verbs.h"

namespace wordcatcher::cli {

namespace {

constexpr const char* kIndexFooter = R"(
Input is UTF-8, one phrase a line, optionally followed by a TAB and fields:
  golden retriever<TAB>7
A query then shows the phrase as "golden retriever{ 7 }", and without fields as
"golden retriever". Blank lines are skipped.

OUT, by custom a name in .wci, becomes one file: a search image. It takes the place
of an older one in one step when all is written, so that a run that fails or is
interrupted leaves the old one whole, and those who read it are not disturbed.

With --tables OUT is a directory, created if its parent exists, and gets the three
tables of a classic index. They are written in place, after all input was checked.

Examples:
  wordcatcher index dogs.wci names.txt more-names.txt
  cut -f1,3 names.tsv | wordcatcher index dogs.wci
  wordcatcher index --mode text titles.wci titles.txt
  wordcatcher index --tables dogs names.txt)";

struct IndexArguments {
  std::optional<MatchingMode> mode;
  bool tables = false;
  bool verbose = false;
  std::string target;
  std::vector<std::string> files;
};

ExitCode runIndex(const IndexArguments& arguments) {
  const auto start = std::chrono::steady_clock::now();
  const IndexingTask task{arguments.target, arguments.files, arguments.mode.value_or(kDefaultMode),
                          arguments.verbose};
  const IndexingReport done = arguments.tables ? indexIntoTables(task) : indexIntoImage(task);
  const std::chrono::duration<double> seconds = std::chrono::steady_clock::now() - start;
  std::ostringstream report;
  report.precision(2);
  report << std::fixed << "Indexed " << counted(done.phrases, "phrase") << " ("
         << counted(done.words, "word") << ") into " << counted(done.bytes, "byte") << " in "
         << seconds.count() << " s.\n";
  std::cerr << report.str();
  return kMatched;
}

}  // namespace

void addIndexVerb(CLI::App& program, ChosenVerb& chosen) {
  CLI::App& verb = addVerb(program, "index", "Write an index of phrases", kIndexFooter);
  const auto arguments = std::make_shared<IndexArguments>();
  addModeOption(verb, arguments->mode, nameOf(kDefaultMode));
  addFlag(verb, "--tables", arguments->tables, "Write the tables of a classic index");
  addVerboseFlag(verb, arguments->verbose);
  addArgument(verb, "OUT", arguments->target, "The index to write");
  addArguments(verb, "FILE", arguments->files,
               "Files of phrases, \"-\" for standard input; without any, standard input");
  whenNamed(verb, chosen, [arguments] { return runIndex(*arguments); });
}

}  // namespace wordcatcher::cli
