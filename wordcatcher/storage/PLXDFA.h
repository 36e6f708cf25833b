#ifndef WORDCATCHER_STORAGE_PLXDFA_H
#define WORDCATCHER_STORAGE_PLXDFA_H

#include <cstdint>
#include <memory>
#include <optional>
#include <ostream>
#include <set>
#include <string>
#include <string_view>

#include "wordcatcher/Export.h"
#include "wordcatcher/storage/TinyCDB.h"

namespace wordcatcher {

class SearchImage;

/// A deterministic automaton kept on disk in three table files: its edges, its final states and the
/// data strings of its states. It holds the index's prefix tree: a state is named by the symbols
/// that lead to it from the start state "", so an edge's target, being the source's name followed
/// by the symbol, is not stored.
///
/// The files are the path followed directly by "edgeTable.tdb", "finalTable.tdb" and
/// "dataTable.tdb": a directory is given with its trailing "/". docs/index-directory.md shows them
/// byte by byte.
///
/// Modes, locks, errors and thread safety are those of TinyCDB; every lookup reads the whole set of
/// values under its key.
class WORDCATCHER_EXPORT PLXDFA {
 public:
  /// The automaton at the path "test_": three files in the current directory.
  PLXDFA();

  /// A closed automaton; no file is touched.
  explicit PLXDFA(std::string path);

  /// Switches the tables to mode 0: a writing pass is finished and the locks are given back.
  ~PLXDFA();

  PLXDFA(const PLXDFA&) = delete;
  PLXDFA& operator=(const PLXDFA&) = delete;

  /// Switches the edge table, then the data table, then the final-state table. Entering writing
  /// starts all three empty.
  void setMode(std::int32_t mode);

  /// 1 once the edge table has been opened for reading, else 0.
  std::int32_t getMode() const noexcept;

  /// Stores the edge of `symbol` that leaves `from`. `to` must be `from` followed by `symbol`; it
  /// is not stored. The same edge added twice is two records that read back as one.
  void addEdge_fromState_toState(std::u16string_view symbol, std::u16string_view from,
                                 std::u16string_view to);

  /// `state` followed by `symbol` if that edge is stored, else nothing. No symbol is special here.
  std::optional<std::u16string> followingStateFrom_withSymbol(std::u16string_view state,
                                                              std::u16string_view symbol);

  /// Every distinct symbol on the edges that leave `state`, ascending by code units.
  std::set<std::u16string> edgesFromState(std::u16string_view state);

  /// Marks a state final.
  void addFinalState(std::u16string_view state);

  /// Whether the state was marked final.
  bool isFinalState(std::u16string_view state);

  /// Adds one data string to a state.
  void setDataFor_to(std::u16string_view state, std::u16string_view data);

  /// Every distinct data string of the state, ascending by code units.
  std::set<std::u16string> dataFor(std::u16string_view state);

  /// The start state's name, "" unless replaced.
  const std::u16string& startState() const noexcept;

  /// Replaces the start state's name; the tables do not hold it.
  void setStartState(std::u16string_view state);

  /// The path given at construction, or set since.
  const std::string& path() const noexcept;

  /// Replaces the string that path() returns, and nothing else: the tables keep the paths that they
  /// were made with.
  void setPath(std::string path);

  /// The class name and the object's address.
  std::u16string description() const;

 private:
  friend std::shared_ptr<const SearchImage> makeTableImage(const PLXDFA& automaton);

  TinyCDB _edgeTable;
  TinyCDB _dataTable;
  TinyCDB _finalTable;
  std::u16string _startState;
  std::string _path;
};

/// Writes the description as UTF-8.
WORDCATCHER_EXPORT std::ostream& operator<<(std::ostream& stream, const PLXDFA& automaton);

}  // namespace wordcatcher

#endif
