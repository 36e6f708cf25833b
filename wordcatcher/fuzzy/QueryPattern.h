#ifndef WORDCATCHER_FUZZY_QUERYPATTERN_H
#define WORDCATCHER_FUZZY_QUERYPATTERN_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/storage/SearchImageFormat.h"

namespace wordcatcher {

/// A code unit of a query: the label that it has in an image (0: no word holds it), or any one.
struct QueryUnit {
  std::uint16_t label = 0;
  bool any = false;

  bool matches(std::uint16_t other) const noexcept { return any || (label == other && other != 0); }
};

/// Those of a text in which no sign has a meaning of its own.
inline std::vector<QueryUnit> unitsOf(const SearchImage& image, std::u16string_view text) {
  std::vector<QueryUnit> units;
  units.reserve(text.size());
  for (const char16_t unit : text) {
    units.push_back({.label = image.labelOf(unit)});
  }
  return units;
}

/// How many edits the code units at the head of a query may be passed with. What stands at their
/// border, code units inserted behind the last of them and its swap with the next, counts as theirs
/// or as nobody's.
struct HeadLimit {
  std::size_t units = 0;
  unsigned edits = 0;
  bool holdsBorder = false;
};

/// The halves of a query for two walks that begin at either end: of at most K edits the first half
/// with its border has at most kInFirst, or the second without it at most kInSecond.
template <unsigned K>
struct Halves {
  static constexpr unsigned kInFirst = K / 2;
  static constexpr unsigned kInSecond = K - kInFirst - 1;

  /// The code units of the first half. The half that allows more edits is the longer one.
  static constexpr std::size_t first(std::size_t length) noexcept {
    return (length + kInFirst - kInSecond) / 2;
  }
};

/// Which code units of a query stand where, as the automata within K edits want to know it. Column
/// c after d code units of a word stands for d + c - K code units of the query; a step looks at
/// those behind the first `Window` columns. Linear in the query to make.
template <unsigned K, unsigned Window>
class QueryLabels {
 public:
  static constexpr unsigned kWindow = Window;

  /// The units must live as long as this does.
  explicit QueryLabels(std::span<const QueryUnit> units) : _units(units) {
    if (units.size() + Window <= 64) {
      for (std::size_t p = 0; p < units.size(); ++p) {
        const std::uint64_t bit = std::uint64_t{1} << (p + K);
        if (units[p].any) {
          _any |= bit;
        } else if (units[p].label != 0 && units[p].label < image::kRareBit) {
          _table[units[p].label] |= bit;
        }
      }
      _hasTable = true;
    }
  }
  QueryLabels(const QueryLabels&) = delete;
  QueryLabels& operator=(const QueryLabels&) = delete;

  std::size_t length() const noexcept { return _units.size(); }

  /// Bit c: whether the query has that label behind column c, after at most length() + K code
  /// units; nowhere for 0.
  std::uint64_t labelColumns(std::size_t depth, std::uint16_t label) const noexcept {
    return _hasTable && label < image::kRareBit
               ? (_table[label] >> depth) & kRow
               : columnsWhere(depth, [label](const QueryUnit& unit) {
                   return !unit.any && unit.label == label && label != 0;
                 });
  }

  /// Bit c: whether a label matches behind column c.
  std::uint64_t matching(std::size_t depth, std::uint16_t label) const noexcept {
    return labelColumns(depth, label) | anyColumns(depth);
  }

  /// The bits, in a tree's sets of children, of the labels that match behind a column.
  std::uint64_t childBits(std::size_t depth, unsigned column) const noexcept {
    const QueryUnit unit = unitAt(depth, column);
    return unit.any ? ~(std::uint64_t{1} << image::kEndBit) : image::childBit(unit.label);
  }

 protected:
  ~QueryLabels() = default;

 private:
  static constexpr std::uint64_t kRow = (std::uint64_t{1} << Window) - 1;

  QueryUnit unitAt(std::size_t depth, unsigned column) const noexcept {
    const std::size_t p = depth + column - K;  // before the query it wraps around
    return p < _units.size() ? _units[p] : QueryUnit{};
  }

  std::uint64_t anyColumns(std::size_t depth) const noexcept {
    return _hasTable ? (_any >> depth) & kRow
                     : columnsWhere(depth, [](const QueryUnit& unit) { return unit.any; });
  }

  template <typename Is>
  std::uint64_t columnsWhere(std::size_t depth, Is is) const noexcept {
    std::uint64_t columns = 0;
    for (unsigned column = 0; column < Window; ++column) {
      columns |= std::uint64_t{is(unitAt(depth, column))} << column;
    }
    return columns;
  }

  std::span<const QueryUnit> _units;
  // For queries that fit: bit p + K of a label's row says that it is the query's code unit p.
  std::uint64_t _table[image::kRareBit] = {};
  std::uint64_t _any = 0;  // likewise for those that match any
  bool _hasTable = false;
};

/// What the automata of a query within K edits know of it: beside its labels, which sets of states
/// may be after so many code units of a word. Linear in the query to make.
template <unsigned K, unsigned Window>
class QueryPattern : public QueryLabels<K, Window> {
 public:
  /// The states that may be, and those at the end of the query, after at most length() + K + 1 code
  /// units.
  std::uint64_t validAt(std::size_t depth) const noexcept { return _states[depth].valid; }
  std::uint64_t acceptingAt(std::size_t depth) const noexcept { return _states[depth].accepting; }

  /// Those of them to which replacing or leaving out a code unit of the query may lead.
  std::uint64_t passedAt(std::size_t depth) const noexcept { return _states[depth].passed; }

 protected:
  /// Per depth, see validAt() and passedAt().
  struct Allowed {
    std::uint64_t valid;
    std::uint64_t passed;
  };

  /// The units must live as long as this does. `starts`: bit 0 of each row of states that a query
  /// can end in. `allowedOf(inside, before)` gives the states that may be of those in the columns
  /// `inside`; `before(p)` gives the columns of less than p code units of the query.
  template <typename AllowedOf>
  QueryPattern(std::span<const QueryUnit> units, std::uint64_t starts, AllowedOf allowedOf)
      : QueryLabels<K, Window>(units) {
    const std::size_t depths = units.size() + K + 2;
    if (depths > _fewStates.size()) {
      _manyStates.resize(depths);
      _states = _manyStates.data();
    }
    const auto length = static_cast<std::int64_t>(units.size());
    for (std::size_t depth = 0; depth < depths; ++depth) {
      const auto before = [shift = static_cast<std::int64_t>(depth) - static_cast<std::int64_t>(K)](
                              std::int64_t p) { return below(p - shift); };
      const std::uint64_t inside = before(length + 1) & ~before(0);
      const Allowed allowed = allowedOf(inside, before);
      _states[depth] = {allowed.valid, allowed.passed, (inside & ~before(length)) * starts};
    }
  }
  ~QueryPattern() = default;

 private:
  static constexpr std::int64_t kColumns = 2 * K + 1;

  /// Per depth.
  struct States {
    std::uint64_t valid;
    std::uint64_t passed;
    std::uint64_t accepting;
  };

  static std::uint64_t below(std::int64_t column) noexcept {
    return column <= 0 ? 0 : (std::uint64_t{1} << (column < kColumns ? column : kColumns)) - 1;
  }

  std::array<States, 48> _fewStates;
  std::vector<States> _manyStates;
  States* _states = _fewStates.data();
};

}  // namespace wordcatcher

#endif
