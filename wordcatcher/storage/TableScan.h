#ifndef WORDCATCHER_STORAGE_TABLESCAN_H
#define WORDCATCHER_STORAGE_TABLESCAN_H

#include <optional>
#include <string_view>

struct cdb;

namespace wordcatcher {

class TinyCDB;

/// Reads the records of a table one after the other, through the mapping that the table holds from
/// its last opening for reading: it opens nothing and takes no lock. A table that was never read
/// has no records; a damaged one ends where it cannot be followed. The table must neither be opened
/// anew nor destroyed meanwhile.
class TableScan {
 public:
  explicit TableScan(const TinyCDB& table) noexcept;

  /// Key and value are bytes of the mapping, in one piece: the value follows the key.
  struct Record {
    std::string_view key;
    std::string_view value;
  };

  /// The next record in the order of adding; nothing at the end.
  std::optional<Record> next() noexcept;

 private:
  const struct cdb* _cdb;
  unsigned _position;
};

}  // namespace wordcatcher

#endif
