#ifndef WORDCATCHER_CLI_NEWTABLES_H
#define WORDCATCHER_CLI_NEWTABLES_H

#include <array>
#include <cstddef>
#include <mutex>
#include <string>

#include "cli/IndexDirectory.h"

namespace wordcatcher::cli {

/// The directory and table files that an indexing run writes, and how to take them back: unless the
/// run is kept, the directory and the files that it created go away, and tables that stood there
/// before are marked unfinished if it began to write them, so that nothing half-made passes for an
/// index.
///
/// Thread safety: discardForGood() may come from another thread at any time.
class NewTables {
 public:
  /// Touches nothing yet. `directory` must outlive the object.
  explicit NewTables(const IndexDirectory& directory) : _directory(directory) {}

  /// Takes back what was not kept.
  ~NewTables();
  NewTables(const NewTables&) = delete;
  NewTables& operator=(const NewTables&) = delete;

  /// Creates the directory (not its parents) and empty table files where there are none, so that it
  /// is known which ones this run made and that all can be written. Failure if not.
  void prepare();

  /// The library has opened and locked all three tables: their contents are now this run's.
  void startWriting();

  /// Everything was written and stays.
  void keep();

  /// Takes everything back and lets no other call of this object go on: the process is about to
  /// end.
  void discardForGood();

 private:
  enum class Phase { kOpening, kWriting, kKept };

  void createDirectory();
  bool createTable(const std::string& path);
  void discard();
  bool mayRemove(std::size_t table) const;

  const IndexDirectory& _directory;
  std::mutex _mutex;
  Phase _phase = Phase::kOpening;
  bool _createdDirectory = false;
  std::array<bool, IndexDirectory::kTables> _created{};
};

}  // namespace wordcatcher::cli

#endif
