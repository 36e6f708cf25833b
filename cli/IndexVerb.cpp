#include <CLI/CLI.hpp>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <iostream>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "cli/Arguments.h"
#include "cli/Failure.h"
#include "cli/IndexDirectory.h"
#include "cli/InputLines.h"
#include "cli/InterruptGuard.h"
#include "cli/LockWatcher.h"
#include "cli/Modes.h"
#include "cli/NewTables.h"
#include "cli/ProgressBar.h"
#include "cli/TableLog.h"
#include "cli/Utf8.h"
#include "cli/Verbs.h"
#include "cli/WordCounter.h"
#include "wordcatcher/matcher/KXWordcatcher.h"

namespace wordcatcher::cli {

namespace {

constexpr std::int32_t kClosed = 0;
constexpr std::int32_t kWriting = 2;

constexpr const char* kFooter = R"(
Input is UTF-8, one phrase a line, optionally followed by a TAB and fields:
  golden retriever<TAB>7
A query then shows the phrase as "golden retriever{ 7 }", and without fields as
"golden retriever". Blank lines are skipped. All input is read and checked before
an index that stands in DIR is replaced. DIR is created if its parent exists.

Examples:
  wordcatcher index dogs names.txt more-names.txt
  cut -f1,3 names.tsv | wordcatcher index dogs
  wordcatcher index --mode text titles titles.txt)";

struct Arguments {
  std::uint64_t option = 0;
  bool verbose = false;
  std::string directory;
  std::vector<std::string> files;
};

/// One phrase and its data string, which begins with it.
struct Phrase {
  std::u16string data;
  std::size_t length;

  std::u16string_view text() const { return std::u16string_view(data).substr(0, length); }
};

Phrase parsePhrase(const InputLine& line, const InputLines& lines) {
  if (line.text.find(u'\0') != std::u16string::npos) {
    throw Failure(lines.place() +
                  " holds a zero byte, at which a table would cut it: give plain UTF-8 text.");
  }
  const std::size_t tab = line.text.find(u'\t');
  const std::u16string phrase = line.text.substr(0, tab);
  if (isBlank(phrase)) {
    throw Failure(lines.place() + " has fields but no phrase: put the phrase before the TAB.");
  }
  const std::u16string fields = tab == std::u16string::npos ? u"" : line.text.substr(tab + 1);
  return {fields.empty() ? phrase : phrase + u"{ " + fields + u" }", phrase.size()};
}

std::vector<Phrase> readPhrases(std::vector<std::string> files) {
  if (files.empty()) {
    files.emplace_back("-");
  }
  std::vector<Phrase> phrases;
  for (const auto& file : files) {
    InputLines lines(file);
    while (const auto line = lines.next()) {
      if (!isBlank(line->text)) {
        phrases.push_back(parsePhrase(*line, lines));
      }
    }
  }
  return phrases;
}

void checkWritten(const IndexDirectory& directory, const TableLog& log) {
  if (!log.failed()) {
    return;
  }
  throw Failure("Cannot write the index in " + quoted(directory.name()) + " (" +
                errorText(log.errorCode()) +
                "): make room there or choose another directory, then index again.");
}

// A matcher that is destroyed finishes its tables, and half-written ones must stay unfinished. So a
// run that fails leaves it here, and the end of the process closes the files.
KXWordcatcher* unfinished = nullptr;

void writeTables(const Arguments& arguments, const IndexDirectory& directory,
                 const std::vector<Phrase>& phrases, NewTables& tables, const TableLog& log) {
  unfinished = new KXWordcatcher(directory.path(), arguments.option);
  {
    const LockWatcher watcher(directory);
    unfinished->setMode(kWriting);
  }
  checkWritten(directory, log);
  tables.startWriting();
  ProgressBar progress(phrases.size());
  for (std::size_t i = 0; i < phrases.size() && !log.failed(); ++i) {
    progress.show(i);
    unfinished->index_withData(phrases[i].text(), phrases[i].data);
  }
  if (!log.failed()) {
    progress.say("Finishing the tables ...");
    unfinished->setMode(kClosed);
  }
  checkWritten(directory, log);
  delete std::exchange(unfinished, nullptr);
}

std::size_t countWords(const std::vector<Phrase>& phrases) {
  WordCounter counter;
  std::size_t words = 0;
  for (const auto& phrase : phrases) {
    words += counter.count(phrase.text());
  }
  return words;
}

std::string counted(std::uint64_t number, const std::string& noun) {
  return std::to_string(number) + ' ' + noun + (number == 1 ? "" : "s");
}

ExitCode runIndex(const Arguments& arguments) {
  const auto start = std::chrono::steady_clock::now();
  const IndexDirectory directory(arguments.directory);
  const auto phrases = readPhrases(arguments.files);
  const std::size_t words = countWords(phrases);
  const TableLog log(arguments.verbose);
  NewTables tables(directory);
  const InterruptGuard guard([&tables] { tables.discardForGood(); });
  tables.prepare();
  writeTables(arguments, directory, phrases, tables, log);
  const std::uint64_t bytes = directory.tableBytes();
  tables.keep();
  const std::chrono::duration<double> seconds = std::chrono::steady_clock::now() - start;
  std::ostringstream report;
  report.precision(2);
  report << std::fixed << "Indexed " << counted(phrases.size(), "phrase") << " ("
         << counted(words, "word") << ") into " << counted(bytes, "byte") << " in "
         << seconds.count() << " s.\n";
  std::cerr << report.str();
  return kMatched;
}

}  // namespace

void addIndexVerb(CLI::App& program, ChosenVerb& chosen) {
  auto* const verb = program.add_subcommand("index", "Write an index of phrases into a directory");
  const auto arguments = std::make_shared<Arguments>();
  addModeOption(*verb, arguments->option);
  verb->add_flag("--verbose", arguments->verbose, "Show the storage log on standard error");
  addArgument(*verb, "DIR", arguments->directory, "The index directory");
  addArguments(*verb, "FILE", arguments->files,
               "Files of phrases, \"-\" for standard input; without any, standard input");
  verb->footer(kFooter);
  verb->callback([arguments, &chosen] { chosen = [arguments] { return runIndex(*arguments); }; });
}

}  // namespace wordcatcher::cli
