#include "wordcatcher/fuzzy/ImageSearch.h"

#include <algorithm>
#include <bit>
#include <iterator>
#include <limits>
#include <ranges>
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

/// What a walk may visit at the most: each place once. More means that the image is no tree.
class VisitBudget {
 public:
  explicit VisitBudget(const SearchImage& image, const SearchImage::Tree& tree)
      : _image(image), _slots(tree.slots.size()), _places(image.wordCount()) {}

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

 private:
  const SearchImage& _image;
  std::uint64_t _slots;
  std::uint64_t _places;
};

std::uint32_t wordAt(const SearchImage::Tree& tree, std::uint64_t place) {
  return tree.order.empty() ? static_cast<std::uint32_t>(place) : tree.order[place];
}

void checkSlot(const SearchImage& image, const SearchImage::Tree& tree, std::size_t slot) {
  if (slot >= tree.slots.size()) {
    image.throwDamaged("a tree leads out of its section");
  }
}

/// Calls `visit(label, child)` for every child of a place whose bit is in `wanted`; the child for
/// the end of a word has label 0.
template <typename Visit>
void forEachChild(const SearchImage& image, const SearchImage::Tree& tree, const TreeSlot& parent,
                  std::uint64_t wanted, Visit visit) {
  const std::uint64_t common = parent.children & ~(std::uint64_t{1} << image::kRareBit);
  std::size_t child = parent.index();
  if ((common & ~wanted) == 0) {
    for (std::uint64_t bits = common; bits != 0; bits &= bits - 1, ++child) {
      checkSlot(image, tree, child);
      visit(static_cast<std::uint16_t>(std::countr_zero(bits)), child);
    }
  } else {
    for (std::uint64_t bits = common & wanted; bits != 0; bits &= bits - 1) {
      const std::uint64_t lower = (bits & -bits) - 1;
      const std::size_t at = child + static_cast<unsigned>(std::popcount(common & lower));
      checkSlot(image, tree, at);
      visit(static_cast<std::uint16_t>(std::countr_zero(bits)), at);
    }
  }
  if ((parent.children & wanted & ~common) == 0) {
    return;
  }
  for (child = parent.index() + static_cast<unsigned>(std::popcount(common));; ++child) {
    if (child >= tree.slots.size() || tree.slots[child].label < image::kRareBit) {
      image.throwDamaged("a tree leads out of its section");
    }
    visit(tree.slots[child].label, child);
    if (tree.slots[child].isLastChild()) {
      return;
    }
  }
}

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
      forEachChild(_image, _tree, _tree.slots[0], ~(std::uint64_t{1} << image::kEndBit),
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

  template <typename Accept>
  void expand(const TreeSlot& place, std::uint64_t states, std::size_t depth, Accept& accept) {
    _budget.spendSlot();
    constexpr std::uint64_t kEnd = std::uint64_t{1} << image::kEndBit;
    // When only matches keep the automaton alive, no other child is looked at.
    const typename BandedPattern<K>::Fork fork(_pattern, states, depth);
    std::uint64_t wanted = fork.other() != 0 ? ~kEnd : _pattern.wantedChildren(states, depth);
    if ((states & _pattern.acceptingAt(depth)) != 0) {
      wanted |= kEnd;
    }
    const auto ahead =
        static_cast<std::int64_t>(_pattern.length()) - static_cast<std::int64_t>(depth) - 1;
    forEachChild(_image, _tree, place, wanted, [&](std::uint16_t label, std::size_t child) {
      const TreeSlot& slot = _tree.slots[child];
      if (label == 0) {
        _budget.spendPlaces(slot.index(), 1);
        accept(wordAt(_tree, slot.index()), states & _pattern.acceptingAt(depth));
        return;
      }
      std::uint64_t next = fork.step(label);
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
      if (!_tree.order.empty()) {
        __builtin_prefetch(&_tree.order[place]);
      } else {
        _image.prefetchOffsetOf(static_cast<std::uint32_t>(place));
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
    const std::span<LeafWord> leafWords(_leafWords, _leafWordCount);
    _leafWordCount = 0;
    if (!_tree.order.empty()) {
      for (auto& leaf : leafWords) {
        leaf.word = _tree.order[leaf.word];
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
  std::uint64_t readRest(std::uint32_t word, std::uint64_t states, std::size_t depth) const {
    const auto labels = _image.labelsOf(word);
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
  LeafWord _leafWords[kLeafWords];
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

  /// In order; a word that was found twice once.
  std::vector<WordHit> take() && {
    const auto key = [](const WordHit& hit) {
      return std::make_tuple(~hit.values, hit.distance, hit.length, hit.word);
    };
    std::sort(_hits.begin(), _hits.end(),
              [&key](const WordHit& a, const WordHit& b) { return key(a) < key(b); });
    _hits.erase(std::unique(_hits.begin(), _hits.end()), _hits.end());
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

/// Any number of edits: one column of the table of edit distances for each code unit of the path.
class ColumnWalk {
 public:
  ColumnWalk(const SearchImage& image, std::u16string_view query, std::int64_t maxDistance)
      : _image(image), _query(query), _maxDistance(maxDistance), _budget(image, image.forward()) {
    for (const char16_t unit : query) {
      _units.push_back({.label = image.labelOf(unit), .any = unit == kAny});
    }
    _columns.emplace_back(query.size() + 1, kUnreachable);
    _columns[0][0] = 0;
  }

  void run(HitList& hits) {
    _pending.push_back({0, 0, 0});
    while (!_pending.empty()) {
      const Item item = _pending.back();
      _pending.pop_back();
      const TreeSlot& slot = _image.forward().slots[item.slot];
      if (item.depth > 0 && !read(item.label, item.depth)) {
        continue;
      }
      if (item.depth > 0 && slot.isLeaf()) {
        readLeaf(slot, item.depth, hits);
      } else {
        expand(slot, item.depth, hits);
      }
    }
  }

 private:
  static constexpr std::int64_t kUnreachable = std::numeric_limits<std::int64_t>::max() / 2;

  struct Item {
    std::size_t slot;
    std::size_t depth;
    std::uint16_t label;
  };

  /// Makes the column at `depth`; false when nothing in it is within the distance.
  bool read(std::uint16_t label, std::size_t depth) {
    if (_columns.size() <= depth) {
      _columns.emplace_back(_query.size() + 1);
    }
    const auto& before = _columns[depth - 1];
    auto& column = _columns[depth];
    column[0] = before[0] + 1;
    std::int64_t least = column[0];
    for (std::size_t i = 1; i < column.size(); ++i) {
      const bool emptyMove = _query[i - 1] == kEmptyMove;
      const bool equal = !emptyMove && _units[i - 1].matches(label);
      column[i] = std::min(
          {before[i - 1] + (equal ? 0 : 1), before[i] + 1, column[i - 1] + (emptyMove ? 0 : 1)});
      least = std::min(least, column[i]);
    }
    return least <= _maxDistance;
  }

  void expand(const TreeSlot& place, std::size_t depth, HitList& hits) {
    _budget.spendSlot();
    forEachChild(_image, _image.forward(), place, ~std::uint64_t{0},
                 [&](std::uint16_t label, std::size_t child) {
                   if (label != 0) {
                     _pending.push_back({child, depth + 1, label});
                     return;
                   }
                   const std::uint64_t at = _image.forward().slots[child].index();
                   _budget.spendPlaces(at, 1);
                   accept(wordAt(_image.forward(), at), depth, hits);
                 });
  }

  void readLeaf(const TreeSlot& slot, std::size_t depth, HitList& hits) {
    _budget.spendPlaces(slot.index(), slot.children);
    for (std::uint64_t place = slot.index(); place < slot.index() + slot.children; ++place) {
      const std::uint32_t word = wordAt(_image.forward(), place);
      const auto labels = _image.labelsOf(word);
      std::size_t read = depth;
      while (read < labels.size() && this->read(labels[read], read + 1)) {
        ++read;
      }
      if (read == labels.size()) {
        accept(word, read, hits);
      }
    }
  }

  void accept(std::uint32_t word, std::size_t depth, HitList& hits) const {
    const std::int64_t distance = _columns[depth].back();
    if (depth > 0 && distance <= _maxDistance) {
      hits.add(word, static_cast<std::uint32_t>(distance));
    }
  }

  const SearchImage& _image;
  std::u16string_view _query;
  std::int64_t _maxDistance;
  VisitBudget _budget;
  std::vector<QueryUnit> _units;
  std::vector<std::vector<std::int64_t>> _columns;
  std::vector<Item> _pending;
};

}  // namespace

std::vector<WordHit> searchImage(const SearchImage& image, std::u16string_view query,
                                 std::int64_t maxDistance) {
  HitList hits(image);
  if (query.empty() || maxDistance < 0) {
    return {};
  }
  if (maxDistance > kMaxBandedDistance) {
    ColumnWalk(image, query, maxDistance).run(hits);
    return std::move(hits).take();
  }
  const Query units = prepared(image, query);
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
