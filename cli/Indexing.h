#ifndef WORDCATCHER_CLI_INDEXING_H
#define WORDCATCHER_CLI_INDEXING_H

#include <cstdint>
#include <string>
#include <vector>

#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::cli {

/// What an indexing run is told.
struct IndexingTask {
  std::string target;
  std::vector<std::string> files;
  MatchingMode mode;
  bool verbose;
};

/// What it wrote.
struct IndexingReport {
  std::uint64_t phrases = 0;
  std::uint64_t words = 0;
  std::uint64_t bytes = 0;
};

// Both read and check all input before they touch what stands at the target. Failure or Error when
// that cannot be read or the index cannot be written.

/// Writes a search image. A run that fails or is interrupted leaves the target as it was.
IndexingReport indexIntoImage(const IndexingTask& task);

/// Writes the three tables of a classic index. A run that fails or is interrupted leaves nothing
/// that passes for an index.
IndexingReport indexIntoTables(const IndexingTask& task);

}  // namespace wordcatcher::cli

#endif
