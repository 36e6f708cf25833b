#ifndef WORDCATCHER_CLI_INDEXDIRECTORY_H
#define WORDCATCHER_CLI_INDEXDIRECTORY_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>

namespace wordcatcher::cli {

class TableLog;

/// The directory of a classic index and its three table files.
class IndexDirectory {
 public:
  static constexpr std::size_t kTables = 3;

  /// `directory` with or without its trailing "/"; Failure if it is empty.
  explicit IndexDirectory(const std::string& directory);

  /// As the user wrote it, for messages.
  const std::string& name() const noexcept { return _name; }

  /// With its trailing "/", as the library wants it.
  const std::string& path() const noexcept { return _path; }

  /// The table files in the order in which the library opens them: edges, data, final states.
  const std::array<std::string, kTables>& tables() const noexcept { return _tables; }

  /// Has `open` open the tables for reading, says so when that waits for another process, and
  /// checks what was opened. Failure if the directory or a table is missing, cannot be read, or is
  /// no finished table.
  void openForReading(const TableLog& log, const std::function<void()>& open) const;

  /// Bytes of the three tables; a longer file's tail that an earlier index left does not count.
  /// Failure if one of them is no finished table.
  std::uint64_t tableBytes() const;

  /// The last of the tables() that this process has open, by its place there. While the library
  /// opens tables, those before it are locked by us.
  std::optional<std::size_t> lastOpenTable() const { return lastTable(false); }

  /// The last of those that this process has open and has not locked: the one whose lock the
  /// library waits for.
  std::optional<std::size_t> awaitedTable() const { return lastTable(true); }

 private:
  void checkReadable() const;
  std::optional<std::size_t> lastTable(bool unlocked) const;

  std::string _name;
  std::string _path;
  std::array<std::string, kTables> _tables;
};

}  // namespace wordcatcher::cli

#endif
