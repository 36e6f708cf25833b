#include <filesystem>
#include <system_error>

#include "cli/Failure.h"
#include "cli/Indexing.h"
#include "cli/InterruptGuard.h"
#include "cli/NewImage.h"
#include "cli/OpenIndex.h"
#include "cli/Phrases.h"
#include "cli/ProgressBar.h"
#include "cli/WaitingNote.h"
#include "cli/WordCounter.h"

namespace wordcatcher::cli {

namespace {

/// Before the input is read, which may take long.
void checkNamesFile(const std::string& target) {
  if (target.empty()) {
    throw Failure("The name of the index is empty: name a file such as \"names.wci\".");
  }
  if (namesDirectory(target)) {
    throw Failure(
        inQuotes(target) +
        " is a directory: name a file such as \"names.wci\", or give --tables to write the "
        "tables of a classic index there.");
  }
  const auto parent = std::filesystem::path(target).parent_path();
  std::error_code unknown;  // what cannot be told now is told when the file is written
  if (!parent.empty() && !std::filesystem::is_directory(parent, unknown)) {
    throw Failure("There is no directory " + inQuotes(parent.string()) +
                  " for the index: create it, or choose another place.");
  }
}

}  // namespace

IndexingReport indexIntoImage(const IndexingTask& task) {
  checkNamesFile(task.target);
  IndexBuilder builder(task.target, {.mode = task.mode, .tables = {}});
  WordCounter counter;
  IndexingReport report;
  ProgressBar progress;
  forEachPhrase(task.files, [&](const Phrase& phrase) {
    progress.show(report.phrases++);
    report.words += counter.count(phrase.utf16.text());
    builder.add(phrase.utf8.text(), phrase.utf8.data);
  });
  progress.say("Writing the index ...");
  NewImage image(task.target);
  const InterruptGuard guard([&image] { image.discardForGood(); });
  const WaitingNote note("Writing the index");
  report.bytes = image.write(builder);
  return report;
}

}  // namespace wordcatcher::cli
