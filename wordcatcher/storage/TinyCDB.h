#ifndef WORDCATCHER_STORAGE_TINYCDB_H
#define WORDCATCHER_STORAGE_TINYCDB_H

#include <cstdint>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <string_view>

#include "wordcatcher/Export.h"

struct cdb;
struct cdb_make;
struct cdb_find;

namespace wordcatcher {

/// One table file of string keys and string values, in the constant-database (cdb) format. A table
/// is written once, in one pass, and read many times afterwards; a key may carry several values.
///
/// A table is driven by its mode: 0 closed, 1 reading, 2 writing. Its life is: construct,
/// setMode(2), any number of setValue_forKey(), setMode(1), any number of valuesFor(). Nothing
/// checks that an operation suits the mode.
///
/// Errors: nothing is returned or thrown; each failure is one line in the log (see LogSink) and the
/// operation carries on. A damaged or truncated file is answered with what can be read of it.
///
/// Growth: the file holds one record an adding call. setMode() out of writing builds the hash
/// tables, in which records of one key collide with each other, so finishing is quadratic in the
/// largest number of records under one key. A file holds at most 4 GiB.
///
/// Locks: an exclusive advisory lock (flock) on the whole file is held while the file is open, in
/// reading as in writing, and opening waits for it. Setting the mode that is already set opens the
/// file a second time and so waits for ever for the table's own lock. On a file system that has no
/// locks the table works without.
///
/// Thread safety: one thread at a time.
class WORDCATCHER_EXPORT TinyCDB {
 public:
  /// A closed table. `path` is UTF-8; the file is not touched.
  explicit TinyCDB(std::string path);

  /// Releases memory only: a table still being written is not finished, and an open file stays open
  /// and locked until the process ends. Call setMode(0) first.
  ~TinyCDB();

  TinyCDB(const TinyCDB&) = delete;
  TinyCDB& operator=(const TinyCDB&) = delete;

  /// Closes what the present mode has open (leaving writing finishes the file) and opens the file
  /// for the new one. Entering writing starts an empty table in a new file (permissions 0666 less
  /// the creation mask) or over the old bytes of an existing one, and refuses a symbolic link;
  /// entering reading maps the file and follows links. A mode other than 0, 1 and 2 is kept and
  /// opens nothing. The mode is taken over also when opening failed.
  void setMode(std::int32_t mode);

  /// 1 once the table has been opened for reading successfully, also after it was closed or
  /// switched to writing again; 0 before. It does not tell the mode last set.
  std::int32_t getMode() const noexcept;

  /// Adds one record; earlier records of the key stay. Valid in mode 2; elsewhere it is a line in
  /// the log. A null string, or one with an unpaired surrogate, which has no UTF-8 form, is not
  /// stored and not logged. Both strings are stored up to their first U+0000.
  void setValue_forKey(std::optional<std::u16string_view> value,
                       std::optional<std::u16string_view> key);

  /// Every distinct value stored under the key, ascending by code units; empty when there is none.
  /// Valid once the table was opened for reading; a table that never was answers with the empty set
  /// and a log line. Also a plain miss may log one. Values that are not UTF-8 are left out. Linear
  /// in the number of records of the key; the key is compared up to its first U+0000.
  std::set<std::u16string> valuesFor(std::u16string_view key);

  /// The file's path.
  const std::string& path() const noexcept;

  /// Takes effect at the next setMode() that opens the file.
  void setPath(std::string path);

 private:
  friend class TableScan;

  void enterWriting();
  void enterReading();
  bool readFoundValue();
  void unmapReadHandle(const struct cdb& handle) noexcept;
  void _allocbuf(std::int32_t size);

  std::int32_t _mode = 0;
  std::int32_t _fileDesc = -1;
  std::unique_ptr<struct cdb> _cdb;
  std::unique_ptr<struct cdb_make> _cdbmake;
  bool _makeStarted = false;
  std::unique_ptr<struct cdb_find> _cdbfind;
  unsigned char* buf = nullptr;
  std::int32_t blen = 0;
  std::string _path;
};

}  // namespace wordcatcher

#endif
