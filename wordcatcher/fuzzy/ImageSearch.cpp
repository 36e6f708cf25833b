#include "wordcatcher/fuzzy/ImageSearch.h"

#include <algorithm>
#include <array>
#include <bit>
#include <iterator>
#include <limits>
#include <span>
#include <tuple>

#include "wordcatcher/fuzzy/BandedAutomaton.h"

namespace wordcatcher {

namespace {

using image::TreeSlot;

constexpr char16_t kAny = u'*';
constexpr char16_t kEmptyMove = u'_';

/// Beyond this many edits the rows no longer fit into 64 bits.
constexpr std::int64_t kMaxBandedDistance = 4;

/// Below this length the two halves of a query are too short to rule anything out.
constexpr std::size_t kMinSplitLength = 6;

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
  query.beginsWithEmptyMove = !text.empty() && text.front() == kEmptyMove;
  for (const char16_t unit : text) {
    if (unit == kAny) {
      query.units.push_back({.any = true});
    } else if (unit != kEmptyMove) {
      query.units.push_back({.label = image.labelOf(unit)});
    }
  }
  return query;
}

/// What a walk may visit at the most: each slot, each place of a word and each code unit of the
/// words once. More means that the image is no tree, and would make the walk's time or memory grow
/// faster than the image.
class VisitBudget {
 public:
  explicit VisitBudget(const SearchImage& image, const SearchImage::Tree& tree)
      : _image(image),
        _slots(tree.slots.size()),
        _places(image.wordCount()),
        _units(image.unitCount()) {}

  void spendSlot() {
    if (_slots-- == 0) {
      _image.throwDamaged("a tree has more branches than places");
    }
  }
  void spendPlaces(std::uint64_t first, std::uint64_t count) {
    if (count > _places || first + count > _image.wordCount()) {
      _image.throwDamaged("a tree has more leaves than words");
    }
    _places -= count;
  }
  void spendUnits(std::uint64_t count) {
    if (count > _units) {
      _image.throwDamaged("a tree repeats words");
    }
    _units -= count;
  }

 private:
  const SearchImage& _image;
  std::uint64_t _slots;
  std::uint64_t _places;
  std::uint64_t _units;
};

/// A walk of one tree in step with a query's automaton; collects the words that it accepts.
template <unsigned K>
class BandedWalk {
 public:
  BandedWalk(const SearchImage& image, const SearchImage::Tree& tree, bool backward,
             const BandedPattern<K>& pattern)
      : _image(image), _tree(tree), _backward(backward), _pattern(pattern), _budget(image, tree) {}

  template <typename Accept>
  void run(std::uint64_t start, Accept accept) {
    expand(_tree.slots[0], start, 0, accept);
    finish(accept);
  }

  /// The walk of a query whose first code unit can only be an insertion.
  template <typename Accept>
  void runAfterInsertion(Accept accept) {
    if constexpr (K > 0) {
      const std::uint64_t inserted =
          Band<K>::closed(std::uint64_t{1} << (Band<K>::kColumns + K - 1)) & _pattern.validAt(1);
      forEachChild(_tree.slots[0], ~(std::uint64_t{1} << image::kEndBit),
                   [&](std::uint16_t, std::size_t child) { enter(child, inserted, 1, accept); });
      finish(accept);
    }
  }

 private:
  struct Item {
    std::uint32_t slot;
    std::uint32_t depth;
    std::uint64_t states;
  };

  /// A word of a leaf that is still to be read: first its place, then itself.
  struct LeafWord {
    std::uint32_t word;
    std::uint32_t depth;
    std::uint64_t states;
  };
  static constexpr std::size_t kLeafWords = 64;

  template <typename Accept>
  void finish(Accept& accept) {
    while (!_pending.empty()) {
      const Item item = _pending.back();
      _pending.pop_back();
      expand(_tree.slots[item.slot], item.states, item.depth, accept);
    }
    readLeafWords(accept);
  }

  std::uint32_t wordAt(std::uint64_t place) const {
    return _tree.order.empty() ? static_cast<std::uint32_t>(place) : _tree.order[place];
  }

  /// Calls `visit(label, child)` for every child of a place whose bit is in `wanted`; the child for
  /// the end of a word has label 0.
  template <typename Visit>
  void forEachChild(const TreeSlot& parent, std::uint64_t wanted, Visit visit) {
    const std::uint64_t common = parent.children & ~(std::uint64_t{1} << image::kRareBit);
    // Counting along costs less than counting the bits before each wanted one.
    std::size_t child = parent.index();
    for (std::uint64_t bits = common; (bits & wanted) != 0; bits &= bits - 1, ++child) {
      const auto label = static_cast<unsigned>(std::countr_zero(bits));
      if ((wanted >> label & 1U) == 0) {
        continue;
      }
      if (child >= _tree.slots.size()) {
        _image.throwDamaged("a tree leads out of its section");
      }
      _budget.spendSlot();
      visit(static_cast<std::uint16_t>(label), child);
    }
    if ((parent.children & wanted & ~common) == 0) {
      return;
    }
    for (child = parent.index() + static_cast<unsigned>(std::popcount(common));; ++child) {
      if (child >= _tree.slots.size() || _tree.slots[child].label < image::kRareBit) {
        _image.throwDamaged("a tree leads out of its section");
      }
      _budget.spendSlot();
      visit(_tree.slots[child].label, child);
      if (_tree.slots[child].isLastChild()) {
        return;
      }
    }
  }

  template <typename Accept>
  void expand(const TreeSlot& place, std::uint64_t states, std::size_t depth, Accept& accept) {
    constexpr std::uint64_t kEnd = std::uint64_t{1} << image::kEndBit;
    // When only matches keep the automaton alive, no other child is looked at.
    const std::uint64_t byEdit = _pattern.stepByEdit(states, depth);
    std::uint64_t wanted = byEdit != 0 ? ~kEnd : _pattern.wantedChildren(states, depth);
    if ((states & _pattern.acceptingAt(depth)) != 0) {
      wanted |= kEnd;
    }
    const auto ahead =
        static_cast<std::int64_t>(_pattern.length()) - static_cast<std::int64_t>(depth) - 1;
    forEachChild(place, wanted, [&](std::uint16_t label, std::size_t child) {
      const TreeSlot& slot = _tree.slots[child];
      if (label == 0) {
        _budget.spendPlaces(slot.index(), 1);
        const std::uint32_t word = wordAt(slot.index());
        _budget.spendUnits(_image.labelsOf(word).size());
        accept(word, states & _pattern.acceptingAt(depth));
        return;
      }
      std::uint64_t next = byEdit | _pattern.stepByMatch(states, depth, label);
      next &= Band<K>::kReach.notTooFarAhead[Band<K>::reachEntry(ahead - slot.shortest)];
      if (slot.longest < image::kLengthCap) {
        next &= Band<K>::kReach.notTooFarBehind[Band<K>::reachEntry(ahead - slot.longest)];
      }
      if (next != 0) {
        enter(child, next, depth + 1, accept);
      }
    });
  }

  template <typename Accept>
  void enter(std::size_t child, std::uint64_t states, std::size_t depth, Accept& accept) {
    const TreeSlot& slot = _tree.slots[child];
    if (!slot.isLeaf()) {
      if (slot.index() < _tree.slots.size()) {
        __builtin_prefetch(&_tree.slots[slot.index()]);
      }
      _pending.push_back(
          {static_cast<std::uint32_t>(child), static_cast<std::uint32_t>(depth), states});
      return;
    }
    _budget.spendPlaces(slot.index(), slot.children);
    for (std::uint64_t place = slot.index(); place < slot.index() + slot.children; ++place) {
      if (_tree.order.empty()) {
        _image.prefetchOffsetOf(static_cast<std::uint32_t>(place));
      } else {
        __builtin_prefetch(&_tree.order[place]);
      }
      _leafWords[_leafWordCount++] = {static_cast<std::uint32_t>(place),
                                      static_cast<std::uint32_t>(depth), states};
      if (_leafWordCount == kLeafWords) {
        readLeafWords(accept);
      }
    }
  }

  /// What is needed of each word is asked of memory before the first is waited for.
  template <typename Accept>
  void readLeafWords(Accept& accept) {
    const std::span<LeafWord> leafWords(_leafWords.data(), _leafWordCount);
    _leafWordCount = 0;
    if (!_tree.order.empty()) {
      for (auto& leaf : leafWords) {
        leaf.word = wordAt(leaf.word);
        _image.prefetchOffsetOf(leaf.word);
      }
    }
    for (const auto& leaf : leafWords) {
      _image.prefetchLabelsOf(leaf.word);
    }
    for (const auto& leaf : leafWords) {
      if (const std::uint64_t accepted = readRest(leaf.word, leaf.states, leaf.depth)) {
        accept(leaf.word, accepted);
      }
    }
  }

  /// The accepting states after the rest of a word.
  std::uint64_t readRest(std::uint32_t word, std::uint64_t states, std::size_t depth) {
    const auto labels = _image.labelsOf(word);
    _budget.spendUnits(labels.size());
    for (; depth < labels.size() && states != 0; ++depth) {
      states = _pattern.step(states, depth,
                             _backward ? labels[labels.size() - 1 - depth] : labels[depth]);
    }
    return depth < labels.size() ? 0 : states & _pattern.acceptingAt(labels.size());
  }

  const SearchImage& _image;
  const SearchImage::Tree& _tree;
  bool _backward;
  const BandedPattern<K>& _pattern;
  VisitBudget _budget;
  std::vector<Item> _pending;
  std::array<LeafWord, kLeafWords> _leafWords;
  std::size_t _leafWordCount = 0;
};

/// Collects hits, and puts them into the order of a search.
class HitList {
 public:
  explicit HitList(const SearchImage& image) : _image(image) {}

  void add(std::uint32_t word, std::uint32_t distance) {
    _hits.push_back({word, distance, static_cast<std::uint32_t>(_image.labelsOf(word).size()),
                     static_cast<std::uint32_t>(_image.postingsOf(word).size())});
  }

  /// In order; a word that was found twice once. All their values are at most all postings, so that
  /// a caller may read them without a budget of its own.
  std::vector<WordHit> take() && {
    const auto key = [](const WordHit& hit) {
      return std::make_tuple(~hit.values, hit.distance, hit.length, hit.word);
    };
    std::sort(_hits.begin(), _hits.end(),
              [&key](const WordHit& a, const WordHit& b) { return key(a) < key(b); });
    _hits.erase(std::unique(_hits.begin(), _hits.end()), _hits.end());
    std::uint64_t values = 0;
    for (const WordHit& hit : _hits) {
      values += hit.values;
    }
    if (values > _image.postingCount()) {
      _image.throwDamaged("posting lists overlap");
    }
    return std::move(_hits);
  }

 private:
  const SearchImage& _image;
  std::vector<WordHit> _hits;
};

/// The distance of a word by the whole automaton, or nothing beyond K.
template <unsigned K>
std::uint64_t judge(const SearchImage& image, const BandedPattern<K>& pattern, std::uint32_t word) {
  std::uint64_t states = pattern.start();
  const auto labels = image.labelsOf(word);
  for (std::size_t depth = 0; depth < labels.size() && states != 0; ++depth) {
    states = pattern.step(states, depth, labels[depth]);
  }
  return states == 0 ? 0 : states & pattern.acceptingAt(labels.size());
}

template <unsigned K>
std::uint32_t distanceOf(std::uint64_t accepted) {
  return static_cast<std::uint32_t>(std::countr_zero(accepted)) / Band<K>::kColumns;
}

/// Of K edits at least one half of the query carries few: K / 2 in the first or the rest less one
/// in the second. Two walks, each with few edits in the half that it reads first, meet every word
/// within K edits and visit far fewer places than one walk that allows all edits everywhere. They
/// meet some at a greater cost than need be, and some that the automaton does not accept, since
/// it cannot leave out the head of the query; so each word is judged by itself.
template <unsigned K>
void searchByHalves(const SearchImage& image, const Query& query, HitList& hits) {
  const std::size_t length = query.units.size();
  constexpr unsigned kInFirst = K / 2;
  constexpr unsigned kInSecond = K - kInFirst - 1;
  const std::vector<QueryUnit> reversed(query.units.rbegin(), query.units.rend());
  const BandedPattern<K> whole(query.units, 0, K);
  const BandedPattern<K> first(query.units, length / 2, kInFirst);
  const BandedPattern<K> second(reversed, length - length / 2, kInSecond);
  const auto judged = [&](std::uint32_t word, std::uint64_t) {
    if (const std::uint64_t accepted = judge<K>(image, whole, word)) {
      hits.add(word, distanceOf<K>(accepted));
    }
  };
  BandedWalk<K>(image, image.forward(), false, first).run(first.start(), judged);
  BandedWalk<K>(image, image.backward(), true, second).run(second.closedStart(), judged);
}

template <unsigned K>
void searchBanded(const SearchImage& image, const Query& query, HitList& hits) {
  if (K > 0 && query.units.size() >= kMinSplitLength && !query.beginsWithEmptyMove) {
    if constexpr (K > 0) {
      searchByHalves<K>(image, query, hits);
    }
    return;
  }
  const BandedPattern<K> pattern(query.units, 0, K);
  BandedWalk<K> walk(image, image.forward(), false, pattern);
  const auto accept = [&hits](std::uint32_t word, std::uint64_t accepted) {
    hits.add(word, distanceOf<K>(accepted));
  };
  if (query.beginsWithEmptyMove) {
    walk.runAfterInsertion(accept);
  } else {
    walk.run(pattern.start(), accept);
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
        hits.add(word, columnAt(labels.size()).costAt(length));
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
  bool read(std::span<const std::uint16_t> labels) {
    const auto parted = std::mismatch(labels.begin(), labels.end(), _last.begin(), _last.end());
    const auto shared = static_cast<std::size_t>(parted.first - labels.begin());
    if (shared == _last.size() && _lastIsBeyond) {
      return false;
    }
    std::size_t depth = std::min(shared, _kept - 1);
    bool within = true;
    while (depth < labels.size() && within) {
      within = readOne(labels[depth], depth + 1);
      ++depth;
    }
    _last = labels.first(depth);
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
  std::span<const std::uint16_t> _last;
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
