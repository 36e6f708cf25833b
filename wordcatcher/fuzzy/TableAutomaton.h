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

  typename Table::Stage stageAt(std::size_t depth) const noexcept {
    return _table.stage(_head - static_cast<std::int64_t>(depth));
  }

 private:
  const Table& _table;
  std::int64_t _head;
};

/// See LazyAutomaton.
template <unsigned K>
class TableAutomaton {
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
      _levels[0].make(_pattern, 0);
    }
    _levels[(depth + 1) % 2].make(_pattern, depth + 1);
  }

  Number at(std::size_t, Number start) const noexcept { return start; }

  Number next(Number from, std::size_t depth, std::uint16_t label) const noexcept {
    return _levels[depth % 2].stage.next(static_cast<typename Table::Number>(from),
                                         _pattern.labelColumns(depth, label));
  }
  Number nextAnywhere(Number from, std::size_t depth, std::uint16_t label) const noexcept {
    const std::size_t within = std::min(depth, _pattern.length() + K);
    return _pattern.stageAt(depth).next(static_cast<typename Table::Number>(from),
                                        _pattern.labelColumns(within, label));
  }

  std::uint64_t wanted(Number state, std::size_t depth) const noexcept {
    const Level& level = _levels[depth % 2];
    return level.wanted[level.stage.states[state].wanted];
  }

  bool fits(Number state, std::size_t depth, std::uint8_t shortest,
            std::uint8_t longest) const noexcept {
    const Level& level = _levels[depth % 2];
    const auto& at = level.stage.states[state];
    return (static_cast<int>(shortest <= level.rest + at.mostRest) &
            static_cast<int>(longest >= level.cappedRest + at.leastRest)) != 0;
  }

  std::uint32_t distance(Number state, std::size_t depth) const noexcept {
    return _levels[depth % 2].stage.states[state].distances[_levels[depth % 2].column];
  }
  std::uint32_t distanceAnywhere(Number state, std::size_t depth) const noexcept {
    return _pattern.stageAt(depth).states[state].distances[columnAt(_pattern, depth)];
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
  static std::size_t columnAt(const Pattern& pattern, std::size_t depth) noexcept {
    return std::min<std::size_t>(pattern.length() + K - depth, Table::kColumns);
  }

  /// What the places after so many code units have in common.
  struct Level {
    typename Table::Stage stage;
    std::size_t column;
    std::int32_t rest;        // code units that the query has left
    std::int32_t cappedRest;  // with which no state asks for more than image::kLengthCap
    std::array<std::uint64_t, Table::kMatchings + 1> wanted;  // children, by columns

    void make(const Pattern& pattern, std::size_t depth) noexcept {
      constexpr std::int64_t kFar = std::int64_t{1} << 30U;
      stage = pattern.stageAt(depth);
      column = columnAt(pattern, depth);
      rest = static_cast<std::int32_t>(
          std::clamp(static_cast<std::int64_t>(pattern.length()) - static_cast<std::int64_t>(depth),
                     -kFar, kFar));
      cappedRest = std::min<std::int32_t>(rest, image::kLengthCap - K);
      wanted[0] = 0;
      for (unsigned bit = 0; bit < Table::kWindow; ++bit) {
        const std::uint64_t children = pattern.childBits(depth, bit);
        const std::size_t count = std::size_t{1} << bit;
        for (std::size_t columns = 0; columns < count; ++columns) {
          wanted[count + columns] = wanted[columns] | children;
        }
      }
      wanted[Table::kMatchings] = ~(std::uint64_t{1} << image::kEndBit);
    }
  };

  const Pattern& _pattern;
  std::array<Level, 2> _levels;
};

}  // namespace wordcatcher

#endif
