#include "wordcatcher/fuzzy/ImageSearch.h"

#include <algorithm>
#include <iterator>
#include <limits>
#include <optional>
#include <span>

#include "wordcatcher/fuzzy/BandedAutomaton.h"
#include "wordcatcher/fuzzy/BandedWalk.h"
#include "wordcatcher/fuzzy/LazyAutomaton.h"

namespace wordcatcher {

namespace {

constexpr char16_t kAnyUnit = u'*';
constexpr char16_t kEmptyUnit = u'_';

template <unsigned K, unsigned Lanes>
using Walk = BandedWalk<LazyAutomaton<K, Lanes, BandedPattern<K, Lanes>>>;

/// Beyond this many edits the rows no longer fit into 64 bits.
constexpr std::int64_t kMaxBandedDistance = 4;

/// Queries shorter than this are walked whole: their halves are too short to rule much out.
template <unsigned K>
constexpr std::size_t kMinSplitLength = 3 + std::min(K, 3U);

/// A lower-cased query in an image's labels.
struct Query {
  std::vector<QueryUnit> units;
  bool beginsWithEmptyMove = false;
};

/// "_" may be left out at no cost and matches nothing, so it is left out here: replacing it is the
/// same as inserting at its place. But nothing can be left out before the first code unit is read,
/// so that where a query begins with it, the first code unit of every word is an insertion.
Query prepared(const SearchImage& image, std::u16string_view text) {
  Query query;
  query.beginsWithEmptyMove = !text.empty() && text.front() == kEmptyUnit;
  for (const char16_t unit : text) {
    if (unit == kAnyUnit) {
      query.units.push_back({.any = true});
    } else if (unit != kEmptyUnit) {
      query.units.push_back({.label = image.labelOf(unit)});
    }
  }
  return query;
}

/// Collects hits, and puts them into the order of a search.
class HitList {
 public:
  explicit HitList(const SearchImage& image) : _image(image) {}

  void add(std::uint32_t word, std::uint32_t distance, std::size_t length) {
    _image.prefetchPostingsOf(word);
    _hits.push_back({word, distance, static_cast<std::uint32_t>(length), 0});
  }

  /// In order; a word that was found twice once. All their values are at most all postings, so that
  /// a caller may read them without a budget of its own.
  std::vector<WordHit> take() && {
    std::uint64_t values = 0;
    for (WordHit& hit : _hits) {
      hit.values = static_cast<std::uint32_t>(_image.postingsOf(hit.word).size());
    }
    std::sort(_hits.begin(), _hits.end(), precedes);
    _hits.erase(std::unique(_hits.begin(), _hits.end()), _hits.end());
    for (const WordHit& hit : _hits) {
      values += hit.values;
    }
    if (values > _image.postingCount()) {
      _image.throwDamaged("posting lists overlap");
    }
    if (_hits.size() > _image.wordCount()) {
      _image.throwDamaged("its trees do not have the same words");
    }
    return std::move(_hits);
  }

 private:
  static bool precedes(const WordHit& a, const WordHit& b) {
    const auto more = [](const WordHit& hit) {
      return std::uint64_t{~hit.values} << 32U | hit.distance;
    };
    const auto rest = [](const WordHit& hit) {
      return std::uint64_t{hit.length} << 32U | hit.word;
    };
    return more(a) != more(b) ? more(a) < more(b) : rest(a) < rest(b);
  }

  const SearchImage& _image;
  std::vector<WordHit> _hits;
};

/// The distance of a word by the whole automaton, or nothing beyond K.
template <unsigned K>
std::optional<std::uint32_t> judge(const SearchImage& image, const BandedPattern<K>& pattern,
                                   std::uint32_t word) {
  std::uint64_t states = pattern.start();
  const auto labels = image.labelsOf(word);
  for (std::size_t depth = 0; depth < labels.size() && states != 0; ++depth) {
    states = pattern.step(states, depth, labels[depth]);
  }
  const std::uint64_t accepted = states == 0 ? 0 : states & pattern.acceptingAt(labels.size());
  return accepted == 0 ? std::nullopt : std::optional(Band<K>::distanceOf(accepted));
}

/// Of K edits at least one half of the query carries few: K / 2 in the first or the rest less one
/// in the second, where what is inserted between them counts as in the first. Two walks, each with
/// few edits in the half that it reads first, meet every word within K edits and visit far fewer
/// places than one walk that allows all edits everywhere. They meet some at a greater cost than
/// need be, and some that the automaton does not accept, since it cannot leave out the head of the
/// query. So the whole automaton goes along in a lane of its own; where there is no room for it,
/// each word is judged by itself.
template <unsigned K>
void searchByHalves(const SearchImage& image, const Query& query, HitList& hits) {
  constexpr unsigned kLanes = 2 * Band<K>::kLaneBits <= 64 ? 2 : 1;
  const std::size_t length = query.units.size();
  const std::size_t half = Halves<K>::first(length);
  const std::vector<QueryUnit> reversed(query.units.rbegin(), query.units.rend());
  const BandedPattern<K, kLanes> first(query.units, {half, Halves<K>::kInFirst, true});
  const BandedPattern<K, kLanes> second(reversed, {length - half, Halves<K>::kInSecond, false});
  const auto memory = image.lendWalkMemory();
  Walk<K, kLanes> forward(image, image.forward(), false, first, *memory);
  Walk<K, kLanes> backward(image, image.backward(), true, second, *memory);
  if constexpr (kLanes == 2) {
    const auto accept = [&hits](std::uint32_t word, std::uint32_t distance, std::size_t size) {
      hits.add(word, distance, size);
    };
    forward.run(first.start(), accept);
    backward.run(second.closedStart(), accept);
  } else {
    const BandedPattern<K> whole(query.units, {0, K});
    const auto accept = [&](std::uint32_t word, std::uint32_t, std::size_t size) {
      if (const auto distance = judge<K>(image, whole, word)) {
        hits.add(word, *distance, size);
      }
    };
    forward.run(first.start(), accept);
    backward.run(second.closedStart(), accept);
  }
}

template <unsigned K>
void searchBanded(const SearchImage& image, const Query& query, HitList& hits) {
  if (K > 0 && query.units.size() >= kMinSplitLength<K> && !query.beginsWithEmptyMove) {
    if constexpr (K > 0) {
      searchByHalves<K>(image, query, hits);
    }
    return;
  }
  const BandedPattern<K> pattern(query.units, {0, K});
  const auto memory = image.lendWalkMemory();
  Walk<K, 1> walk(image, image.forward(), false, pattern, *memory);
  const auto accept = [&hits](std::uint32_t word, std::uint32_t distance, std::size_t size) {
    hits.add(word, distance, size);
  };
  if (!query.beginsWithEmptyMove) {
    walk.run(pattern.start(), accept);
  } else if constexpr (K > 0) {
    walk.runAfterInsertion(accept);
  }
}

/// Any number of edits: the words one after the other, by a table of edit distances with one column
/// for each code unit of the word. Of a column only the rows near its depth are kept, since all
/// others cost too much; of a word only the columns behind what it shares with the word before are
/// made.
class ColumnSearch {
 public:
  ColumnSearch(const SearchImage& image, const Query& query, std::int64_t maxDistance)
      : _image(image),
        _query(query),
        _maxDistance(
            std::min<std::uint64_t>(static_cast<std::uint64_t>(maxDistance), kUnreachable - 1)) {
    const std::uint64_t rows = std::min<std::uint64_t>(query.units.size(), 2 * _maxDistance) + 1;
    _kept = 1 + kKeptCells / rows;
    _columns.resize(_kept + 2);
    _columns[0].costs = {0};
  }

  void run(HitList& hits) {
    for (std::uint32_t word = 0; word < _image.wordCount(); ++word) {
      const auto labels = _image.labelsOf(word);
      const std::size_t length = _query.units.size();
      if (std::max(labels.size(), length) - std::min(labels.size(), length) <= _maxDistance &&
          read(labels)) {
        hits.add(word, columnAt(labels.size()).costAt(length), labels.size());
      }
    }
  }

 private:
  static constexpr std::uint32_t kUnreachable = std::numeric_limits<std::uint32_t>::max();
  static constexpr std::size_t kKeptCells = 1U << 14U;

  /// The costs of the query's first `first`, first + 1 ... code units.
  struct Column {
    std::uint64_t first = 0;
    std::vector<std::uint32_t> costs;

    std::uint32_t costAt(std::uint64_t row) const {
      return row < first || row - first >= costs.size() ? kUnreachable : costs[row - first];
    }
  };

  /// The columns up to a depth are kept for the next word, those beyond take turns.
  Column& columnAt(std::size_t depth) {
    return _columns[depth < _kept ? depth : _kept + depth % 2];
  }

  /// Reads a word; false when it is beyond the distance.
  bool read(const SearchImage::Labels& labels) {
    std::size_t shared = 0;
    while (shared < labels.size() && shared < _last.size() && labels[shared] == _last[shared]) {
      ++shared;
    }
    if (shared == _last.size() && _lastIsBeyond) {
      return false;
    }
    std::size_t depth = std::min(shared, _kept - 1);
    bool within = true;
    while (depth < labels.size() && within) {
      within = readOne(labels[depth], depth + 1);
      ++depth;
    }
    _last = labels.subspan(0, depth);
    _lastIsBeyond = !within;
    return within && !labels.empty() &&
           columnAt(labels.size()).costAt(_query.units.size()) <= _maxDistance;
  }

  /// Makes the column at `depth`; false when nothing in it is within the distance.
  bool readOne(std::uint16_t label, std::size_t depth) {
    const Column& before = columnAt(depth - 1);
    Column& column = columnAt(depth);
    column.first = depth > _maxDistance ? depth - _maxDistance : 0;
    const std::uint64_t end =
        std::min<std::uint64_t>(_query.units.size(), depth + _maxDistance) + 1;
    column.costs.resize(end > column.first ? end - column.first : 0);
    const bool onlyInserted = depth == 1 && _query.beginsWithEmptyMove;
    std::uint32_t least = kUnreachable;
    std::uint32_t missing = kUnreachable;
    std::uint32_t read =
        column.first > 0 && !onlyInserted ? before.costAt(column.first - 1) : kUnreachable;
    for (std::uint64_t row = column.first; row < end; ++row) {
      const bool equal = row > 0 && _query.units[row - 1].matches(label);
      const std::uint32_t inserted = before.costAt(row);
      const std::uint32_t cost =
          std::min({equal ? read : oneMore(read), oneMore(inserted), missing});
      column.costs[row - column.first] = cost;
      least = std::min(least, cost);
      missing = oneMore(cost);
      read = onlyInserted ? kUnreachable : inserted;
    }
    return least <= _maxDistance;
  }

  static std::uint32_t oneMore(std::uint32_t cost) {
    return cost == kUnreachable ? cost : cost + 1;
  }

  const SearchImage& _image;
  const Query& _query;
  std::uint64_t _maxDistance;
  std::size_t _kept = 0;
  std::vector<Column> _columns;
  // What the columns were made of: a word, or the head of one at which nothing was within reach.
  SearchImage::Labels _last;
  bool _lastIsBeyond = false;
};

}  // namespace

std::vector<WordHit> searchImage(const SearchImage& image, std::u16string_view query,
                                 std::int64_t maxDistance) {
  HitList hits(image);
  if (query.empty() || maxDistance < 0) {
    return {};
  }
  const Query units = prepared(image, query);
  if (maxDistance > kMaxBandedDistance) {
    ColumnSearch(image, units, maxDistance).run(hits);
    return std::move(hits).take();
  }
  switch (maxDistance) {
    case 0:
      searchBanded<0>(image, units, hits);
      break;
    case 1:
      searchBanded<1>(image, units, hits);
      break;
    case 2:
      searchBanded<2>(image, units, hits);
      break;
    case 3:
      searchBanded<3>(image, units, hits);
      break;
    default:
      searchBanded<4>(image, units, hits);
      break;
  }
  return std::move(hits).take();
}

}  // namespace wordcatcher
