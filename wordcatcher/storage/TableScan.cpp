#include "wordcatcher/storage/TableScan.h"

#include <cdb.h>

#include "wordcatcher/storage/TableFile.h"
#include "wordcatcher/storage/TinyCDB.h"

namespace wordcatcher {

TableScan::TableScan(const TinyCDB& table) noexcept : _cdb(table._cdb.get()) {
  cdb_seqinit(&_position, _cdb);
}

std::optional<TableScan::Record> TableScan::next() noexcept {
  if (_cdb->cdb_mem == nullptr || _cdb->cdb_fsize < kHeaderBytes || _cdb->cdb_dend < kHeaderBytes) {
    return std::nullopt;
  }
  // A copy, since the sequential calls note the record's place in the handle, as look-ups do.
  struct cdb cursor = *_cdb;
  const unsigned before = _position;
  if (cdb_seqnext(&_position, &cursor) <= 0 || _position <= before) {
    return std::nullopt;
  }
  // The lengths are the file's word: the sums of the library's own checks wrap around.
  const auto* key = static_cast<const char*>(cdb_get(&cursor, cursor.cdb_klen, cursor.cdb_kpos));
  const auto* value = static_cast<const char*>(cdb_get(&cursor, cursor.cdb_vlen, cursor.cdb_vpos));
  if (key == nullptr || value == nullptr) {
    return std::nullopt;
  }
  return Record{{key, cursor.cdb_klen}, {value, cursor.cdb_vlen}};
}

}  // namespace wordcatcher
