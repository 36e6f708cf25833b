#ifndef WORDCATCHER_FUZZY_TABLEAUTOMATON_H
#define WORDCATCHER_FUZZY_TABLEAUTOMATON_H

// The automaton of a query by the table of all queries, for walks of a tree; see LazyAutomaton.h
// for the automata that have no table.

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <span>

#include "wordcatcher/fuzzy/QueryPattern.h"
#include "wordcatcher/fuzzy/SwapTable.h"
#include "wordcatcher/storage/SearchImageFormat.h"
#include "wordcatcher/storage/WalkMemory.h"

namespace wordcatcher {

/// A query for a TableAutomaton.
template <unsigned K>
class TablePattern : public QueryLabels<K, SwapTable<K>::kWindow> {
 public:
  using Table = SwapTable<K>;

  /// The units must live as long as this does. `head` units are limited as the table has it; the
  /// whole query is not limited.
  TablePattern(std::span<const QueryUnit> units, const Table& table, std::size_t head)
      : QueryLabels<K, Table::kWindow>(units),
        _table(table),
        _head(static_cast<std::int64_t>(head)) {}
  TablePattern(std::span<const QueryUnit> units, const Table& table)
      : QueryLabels<K, Table::kWindow>(units), _table(table), _head(Table::kLastStage) {}

  std::uint32_t start() const noexcept { return _table.start(_head); }

  const typename Table::Stage& stageAt(std::size_t depth) const noexcept {
    return _table.stage(_head - static_cast<std::int64_t>(depth));
  }

 private:
  const Table& _table;
  std::int64_t _head;
};

/// See LazyAutomaton.
template <unsigned K>
class TableAutomaton {
  /// The children that are wanted by the columns behind which labels lead on, in two parts, since
  /// that makes fewer; the second one for all children, too.
  static constexpr unsigned kFewColumns = 3;
  static constexpr unsigned kFew = 1U << kFewColumns;
  static_assert(SwapTable<K>::kWindow <= 2 * kFewColumns);
  struct WantedChildren {
    std::array<std::uint64_t, kFew> few;
    std::array<std::uint64_t, SwapTable<K>::kMatchings / kFew + 1> many;

    void make(const TablePattern<K>& pattern, std::size_t depth) noexcept {
      std::array<std::uint64_t, 2 * kFewColumns> of = {};
      for (unsigned column = 0; column < SwapTable<K>::kWindow; ++column) {
        of[column] = pattern.childBits(depth, column);
      }
      // Not one from the other: what was just stored in parts is slow to be read as a whole.
      for (std::size_t columns = 0; columns < few.size(); ++columns) {
        few[columns] = united(of.data(), columns);
      }
      for (std::size_t columns = 0; columns + 1 < many.size(); ++columns) {
        many[columns] = united(of.data() + kFewColumns, columns);
      }
      many.back() = ~(std::uint64_t{1} << image::kEndBit);
    }

   private:
    static std::uint64_t united(const std::uint64_t* sets, std::size_t columns) noexcept {
      return ((columns & 1U) != 0 ? sets[0] : 0) | ((columns & 2U) != 0 ? sets[1] : 0) |
             ((columns & 4U) != 0 ? sets[2] : 0);
    }
  };

 public:
  using Pattern = TablePattern<K>;
  using Table = SwapTable<K>;
  using Number = std::uint32_t;
  static constexpr Number kDead = Table::kDead;
  static constexpr std::uint32_t kNotAccepted = Table::kNotAccepted;

  /// The pattern must live as long as this does.
  TableAutomaton(const Pattern& pattern, bool, AutomatonMemory&) : _pattern(pattern) {}

  void begin() noexcept {}
  void enter(std::size_t depth) noexcept {
    if (depth == 0) {
      _wanted[0].make(_pattern, 0);
    }
    _wanted[(depth + 1) % 2].make(_pattern, depth + 1);
  }

  Number at(std::size_t, Number start) const noexcept { return start; }

  Number nextAnywhere(Number from, std::size_t depth, std::uint16_t label) const noexcept {
    const std::size_t within = std::min(depth, _pattern.length() + K);
    return _pattern.stageAt(depth).next(static_cast<typename Table::Number>(from),
                                        _pattern.labelColumns(within, label));
  }

  /// What is asked of states after so many code units; good until enter().
  class Level {
   public:
    std::uint64_t wanted(Number state) const noexcept {
      const unsigned columns = _stage.states[state].wanted;
      return _wanted->few[columns % kFew] | _wanted->many[columns / kFew];
    }

    /// 1 or 0.
    unsigned fits(Number state, std::uint8_t shortest, std::uint8_t longest) const noexcept {
      const auto& at = _stage.states[state];
      // Below 0 where a word is too long or too short.
      const std::int32_t tooFar =
          (_rest + at.mostRest - shortest) | (longest - _cappedRest - at.leastRest);
      return ~static_cast<std::uint32_t>(tooFar) >> 31U;
    }

    std::uint32_t distance(Number state) const noexcept {
      return _stage.states[state].distances[_column];
    }

   private:
    friend class TableAutomaton;

    typename Table::Stage _stage;
    std::size_t _column;       // of the end of the query, or the last one
    std::int32_t _rest;        // code units that the query has left
    std::int32_t _cappedRest;  // with which no state asks for more than image::kLengthCap
    const WantedChildren* _wanted;
  };
  Level level(std::size_t depth) const noexcept {
    Level level;
    level._stage = _pattern.stageAt(depth);
    level._column = columnAt(depth);
    constexpr std::int64_t kFar = std::int64_t{1} << 29U;
    level._rest = static_cast<std::int32_t>(
        std::clamp(static_cast<std::int64_t>(_pattern.length()) - static_cast<std::int64_t>(depth),
                   -kFar, kFar));
    level._cappedRest = std::min<std::int32_t>(level._rest, image::kLengthCap - K);
    level._wanted = &_wanted[depth % 2];
    return level;
  }

  Number next(const Level& level, Number from, std::size_t depth,
              std::uint16_t label) const noexcept {
    return level._stage.next(static_cast<typename Table::Number>(from),
                             _pattern.labelColumns(depth, label));
  }

  std::uint32_t distanceAnywhere(Number state, std::size_t depth) const noexcept {
    return _pattern.stageAt(depth).states[state].distances[columnAt(depth)];
  }

  template <typename LabelAt>
  std::uint32_t distanceBehind(Number from, std::size_t depth, std::size_t length,
                               LabelAt labelAt) const {
    Number state = from;
    for (; depth < length && state != kDead; ++depth) {
      state = nextAnywhere(state, depth, labelAt(depth));
    }
    return state == kDead ? kNotAccepted : distanceAnywhere(state, depth);
  }

  static constexpr bool isLarge() noexcept { return false; }
  template <typename Places>
  void forgetAllBut(Places&, std::size_t) noexcept {}

 private:
  /// The column of the end of the query, or the last one.
  std::size_t columnAt(std::size_t depth) const noexcept {
    return std::min<std::size_t>(_pattern.length() + K - depth, Table::kColumns);
  }

  const Pattern& _pattern;
  std::array<WantedChildren, 2> _wanted;  // of even and odd depths
};

}  // namespace wordcatcher

#endif
