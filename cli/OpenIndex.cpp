#include "cli/OpenIndex.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <exception>
#include <iostream>

#include "cli/Failure.h"
#include "cli/IndexDirectory.h"
#include "cli/Modes.h"
#include "cli/ProgressBar.h"
#include "cli/TableLog.h"
#include "cli/WaitingNote.h"

namespace wordcatcher::cli {

namespace {

Index openTables(const std::string& name, MatchingMode mode, bool verbose) {
  const IndexDirectory directory(name);
  const TableLog log(verbose);
  const WaitingNote note("Reading " + name);
  std::optional<Index> index;
  directory.openForReading(log, [&] { index = Index::open(directory.path(), {}, mode); });
  return *index;
}

bool isIndex(const std::string& name) {
  struct stat status {};
  if (stat(name.c_str(), &status) != 0) {
    return false;
  }
  try {
    if (S_ISDIR(status.st_mode)) {
      IndexDirectory(name).tableBytes();
    } else {
      Index::open(name);
    }
    return true;
  } catch (const std::exception&) {
    return false;
  }
}

Index openImage(const std::string& name, std::optional<MatchingMode> mode) {
  auto index = Index::open(name);
  const MatchingMode remembered = index.info().mode;
  if (mode && *mode != remembered) {
    throw Failure(inQuotes(name) + " was indexed in the mode " + nameOf(remembered) + ", not " +
                  nameOf(*mode) + ": leave --mode out, or index the phrases again in that mode.");
  }
  return index;
}

}  // namespace

bool namesDirectory(const std::string& name) {
  struct stat status {};
  return name.ends_with('/') || (stat(name.c_str(), &status) == 0 && S_ISDIR(status.st_mode));
}

Index openIndex(const std::string& name, std::optional<MatchingMode> mode, bool verbose) {
  if (name.empty()) {
    throw Failure("The name of the index is empty: give a file or a directory.");
  }
  return namesDirectory(name) ? openTables(name, mode.value_or(kDefaultMode), verbose)
                              : openImage(name, mode);
}

void checkIndexComesFirst(const std::string& name, const std::vector<std::string>& others) {
  if (access(name.c_str(), F_OK) == 0) {
    return;
  }
  const auto index = std::find_if(others.begin(), others.end(), isIndex);
  if (index != others.end()) {
    throw Failure("There is no index at " + inQuotes(name) + ", but " + inQuotes(*index) +
                  " is one: give the INDEX first.");
  }
}

void noteTruncated() {
  const Index::Options limits;
  std::cerr
      << ProgressBar::lineStart() +
             std::string(
                 "wordcatcher: a text was not looked at in full, being beyond the limits of ") +
             std::to_string(limits.maxQueryWords) + " words and " +
             std::to_string(limits.maxWordUnits) + " letters a word: give it in shorter pieces.\n"
      << std::flush;
}

}  // namespace wordcatcher::cli
