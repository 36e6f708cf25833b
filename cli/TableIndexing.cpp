#include <utility>
#include <vector>

#include "cli/Failure.h"
#include "cli/IndexDirectory.h"
#include "cli/Indexing.h"
#include "cli/InterruptGuard.h"
#include "cli/LockWatcher.h"
#include "cli/NewTables.h"
#include "cli/Phrases.h"
#include "cli/ProgressBar.h"
#include "cli/TableLog.h"
#include "cli/WordCounter.h"
#include "wordcatcher/matcher/KXWordcatcher.h"

namespace wordcatcher::cli {

namespace {

constexpr std::int32_t kClosed = 0;
constexpr std::int32_t kWriting = 2;

// The tables are written in place, so that all input must be known to be good before.
using Phrases = std::vector<PhraseOf<char16_t>>;

void checkWritten(const IndexDirectory& directory, const TableLog& log) {
  if (!log.failed()) {
    return;
  }
  throw Failure("Cannot write the index in " + inQuotes(directory.name()) + " (" +
                errorText(log.errorCode()) +
                "): make room there or choose another directory, then index again.");
}

// A matcher that is destroyed finishes its tables, and half-written ones must stay unfinished. So a
// run that fails leaves it here, and the end of the process closes the files.
KXWordcatcher* unfinished = nullptr;

void writeTables(const IndexingTask& task, const IndexDirectory& directory, const Phrases& phrases,
                 NewTables& tables, const TableLog& log) {
  unfinished = new KXWordcatcher(directory.path(), static_cast<std::uint64_t>(task.mode));
  {
    const LockWatcher watcher(directory);
    unfinished->setMode(kWriting);
  }
  checkWritten(directory, log);
  tables.startWriting();
  ProgressBar progress({.total = phrases.size()});
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

Phrases readPhrases(const IndexingTask& task, IndexingReport& report) {
  WordCounter counter;
  Phrases phrases;
  ProgressBar progress;
  forEachPhrase(task.files, [&](Phrase&& phrase) {
    progress.show(report.phrases++);
    report.words += counter.count(phrase.utf16.text());
    phrases.push_back(std::move(phrase.utf16));
  });
  return phrases;
}

}  // namespace

IndexingReport indexIntoTables(const IndexingTask& task) {
  const IndexDirectory directory(task.target);
  IndexingReport report;
  const Phrases phrases = readPhrases(task, report);
  const TableLog log(task.verbose);
  NewTables tables(directory);
  const InterruptGuard guard([&tables] { tables.discardForGood(); });
  tables.prepare();
  writeTables(task, directory, phrases, tables, log);
  report.bytes = directory.tableBytes();
  tables.keep();
  return report;
}

}  // namespace wordcatcher::cli
