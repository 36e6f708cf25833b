#ifndef WORDCATCHER_FUZZY_BANDEDWALK_H
#define WORDCATCHER_FUZZY_BANDEDWALK_H

// A walk of one tree of a search image in step with a query's automaton.
//
// The walk goes level by level: all places that are alive after d code units are looked at before
// any of d + 1. What a place needs is asked of memory when the place is met and read a level later,
// so that the waits for memory overlap; and all places of a level share what depends on the depth.

#include <algorithm>
#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <span>
#include <utility>
#include <vector>

#include "wordcatcher/fuzzy/BandedAutomaton.h"
#include "wordcatcher/storage/LeafTails.h"
#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher {

template <unsigned K>
std::uint32_t distanceOf(std::uint64_t accepted) {
  return static_cast<std::uint32_t>(std::countr_zero(accepted)) / Band<K>::kColumns;
}

/// What a walk may visit at the most: each slot, each place of a word and each code unit of the
/// words once. More means that the image is no tree, and would make the walk's time or memory grow
/// faster than the image.
class VisitBudget {
 public:
  VisitBudget(const SearchImage& image, const SearchImage::Tree& tree)
      : _image(image),
        _slots(tree.slots.size()),
        _places(image.wordCount()),
        _units(image.unitCount()) {}

  void spendSlot() {
    if (_slots-- == 0) {
      fail("a tree has more branches than places");
    }
  }
  void spendPlaces(std::uint64_t first, std::uint64_t count) {
    if (count > _places || first + count > _image.wordCount()) {
      fail("a tree has more leaves than words");
    }
    _places -= count;
  }
  void spendUnits(std::uint64_t count) {
    if (count > _units) {
      fail("a tree repeats words");
    }
    _units -= count;
  }

 private:
  // Apart, so that the checks are short enough to stand where they are made.
  [[noreturn, gnu::noinline, gnu::cold]] void fail(const char* what) const {
    _image.throwDamaged(what);
  }

  const SearchImage& _image;
  std::uint64_t _slots;
  std::uint64_t _places;
  std::uint64_t _units;
};

/// A list that grows and is emptied many times, where each addition costs no call.
template <typename Element>
class WalkList {
 public:
  void push(const Element& element) {
    if (_size == _elements.size()) {
      grow();
    }
    _elements[_size++] = element;
  }
  void clear() noexcept { _size = 0; }
  bool empty() const noexcept { return _size == 0; }
  void swap(WalkList& other) noexcept {
    _elements.swap(other._elements);
    std::swap(_size, other._size);
  }
  const Element* begin() const noexcept { return _elements.data(); }
  const Element* end() const noexcept { return _elements.data() + _size; }

 private:
  [[gnu::noinline]] void grow() { _elements.resize(std::max<std::size_t>(32, 2 * _size)); }

  std::vector<Element> _elements;
  std::size_t _size = 0;
};

/// What a walk keeps of the level that it reads and of the next; one walk after the other may use
/// the same.
struct WalkMemory {
  /// An inner place that was reached.
  struct Place {
    std::uint64_t states;
    std::uint64_t children;  // but for the end of a word
    std::uint64_t wanted;    // of these, those that can keep the automaton alive
    std::uint32_t first;     // its first child
  };
  /// A word that ends at an inner place: its leaf is the place's first child.
  struct Ending {
    std::uint32_t slot;
    std::uint32_t distance;
  };
  /// A word that was accepted.
  struct Found {
    std::uint32_t place;
    std::uint32_t distance;
    std::size_t length;
  };

  WalkList<Place> level;
  WalkList<Place> nextLevel;
  WalkList<Ending> endings;
  WalkList<Ending> nextEndings;
  WalkList<Found> found;
};

/// With two lanes, a word is accepted when lane 0 accepts it, at the distance in lane 1, if that
/// accepts it, too: forward as from the start; backward so that nothing is left out behind the last
/// code unit read, which is the word's first.
template <unsigned K, unsigned Lanes, typename Pattern = BandedPattern<K, Lanes>>
class BandedWalk {
 public:
  using B = typename Pattern::B;

  BandedWalk(const SearchImage& image, const SearchImage::Tree& tree, bool backward,
             const Pattern& pattern, WalkMemory& memory)
      : _image(image),
        _tree(tree),
        _backward(backward),
        _pattern(pattern),
        _memory(memory),
        _budget(image, tree) {}

  /// Calls `accept(word, distance, length)` for each word accepted.
  template <typename Accept>
  void run(std::uint64_t start, Accept accept) {
    const TreeSlot& root = _tree.slots[0];
    _memory.level.push(
        {start, root.children & ~kEnd, wantedOf(root.children, start, 0), root.index()});
    finish(0, accept);
  }

  /// The walk of a query whose first code unit can only be an insertion.
  template <typename Accept>
  void runAfterInsertion(Accept accept) {
    if constexpr (K > 0) {
      const std::uint64_t inserted =
          B::closed(B::inLanes(std::uint64_t{1} << (B::kColumns + K - 1))) & _pattern.validAt(1);
      const TreeSlot& root = _tree.slots[0];
      forEachChild(root.children & ~kEnd, root.children & ~kEnd, root.index(),
                   [&](std::uint16_t, const TreeSlot& slot) { enter(slot, inserted, 0, 1); });
      goOn();
      finish(1, accept);
    }
  }

 private:
  using TreeSlot = image::TreeSlot;
  static constexpr std::uint64_t kEnd = std::uint64_t{1} << image::kEndBit;
  static constexpr std::uint64_t kRare = std::uint64_t{1} << image::kRareBit;

  /// A word of a leaf that is still to be read: first its place, then itself.
  struct LeafWord {
    std::uint32_t place;
    std::uint32_t word;
    std::size_t depth;
    std::uint64_t states;
    std::uint64_t unclosed;
  };
  static constexpr std::size_t kLeafWords = 64;

  template <typename Accept>
  void finish(std::size_t depth, Accept& accept) {
    for (; !_memory.level.empty() || !_memory.endings.empty(); ++depth) {
      for (const auto& ending : _memory.endings) {
        readEnding(ending, depth);
      }
      for (const auto& place : _memory.level) {
        expand(place, depth);
      }
      goOn();
    }
    readLeafWords();
    for (const auto& found : _memory.found) {
      accept(wordAt(found.place), found.distance, found.length);
    }
    _memory.found.clear();
  }

  void goOn() {
    _memory.level.swap(_memory.nextLevel);
    _memory.nextLevel.clear();
    _memory.endings.swap(_memory.nextEndings);
    _memory.nextEndings.clear();
  }

  // Inline: without the machine's own instruction std::popcount is a call.
  static std::size_t bitCount(std::uint64_t bits) noexcept {
    bits -= (bits >> 1) & 0x5555555555555555;
    bits = (bits & 0x3333333333333333) + ((bits >> 2) & 0x3333333333333333);
    bits = (bits + (bits >> 4)) & 0x0F0F0F0F0F0F0F0F;
    return static_cast<std::size_t>(bits * 0x0101010101010101 >> 56);
  }

  std::uint32_t wordAt(std::uint32_t place) const {
    return _tree.order.empty() ? place : _tree.order[place];
  }

  const TreeSlot& childAt(std::size_t child) const {
    if (child >= _tree.slots.size()) {
      _image.throwDamaged("a tree leads out of its section");
    }
    return _tree.slots[child];
  }

  /// The children of a place that can keep the automaton alive. When only matches do, no other
  /// child is looked at.
  std::uint64_t wantedOf(std::uint64_t children, std::uint64_t states, std::size_t depth) const {
    const std::uint64_t byEdit = _pattern.editedAt(states, depth) & _pattern.validAt(depth + 1);
    return children & ((byEdit & B::kLane) != 0 ? ~kEnd : _pattern.wantedChildren(states, depth));
  }

  /// Calls `visit(label, slot)` for every child in `wanted`.
  template <typename Visit>
  void forEachChild(std::uint64_t children, std::uint64_t wanted, std::size_t first, Visit visit) {
    const std::uint64_t common = children & ~kRare;
    for (std::uint64_t bits = common & wanted; bits != 0; bits &= bits - 1) {
      const auto label = static_cast<unsigned>(std::countr_zero(bits));
      _budget.spendSlot();
      visit(static_cast<std::uint16_t>(label),
            childAt(first + bitCount(common & ((std::uint64_t{1} << label) - 1))));
    }
    if ((wanted & kRare) == 0) {
      return;
    }
    for (std::size_t child = first + bitCount(common);; ++child) {
      const TreeSlot& slot = childAt(child);
      if (slot.label < image::kRareBit) {
        _image.throwDamaged("a tree leads out of its section");
      }
      _budget.spendSlot();
      visit(slot.label, slot);
      if (slot.isLastChild()) {
        return;
      }
    }
  }

  void expand(const WalkMemory::Place& place, std::size_t depth) {
    const std::uint64_t states = place.states;
    const std::uint64_t valid = _pattern.validAt(depth + 1);
    const std::uint64_t byEdit = _pattern.editedAt(states, depth) & valid;
    const auto ahead =
        static_cast<std::int64_t>(_pattern.length()) - static_cast<std::int64_t>(depth) - 1;
    forEachChild(place.children, place.wanted, place.first,
                 [&](std::uint16_t label, const TreeSlot& slot) {
                   const std::uint64_t match = _pattern.matchedAt(states, depth, label);
                   std::uint64_t next = (byEdit | B::closed(match)) & valid;
                   next &= B::kReach.notTooFarAhead[B::reachEntry(ahead - slot.shortest)];
                   if (slot.longest < image::kLengthCap) {
                     next &= B::kReach.notTooFarBehind[B::reachEntry(ahead - slot.longest)];
                   }
                   if ((next & B::kLane) != 0) {
                     enter(slot, next, byEdit | match, depth + 1);
                   }
                 });
  }

  /// A place behind an edge, at which the automaton is in `states`, or `unclosed` when nothing is
  /// left out of the query behind the edge.
  void enter(const TreeSlot& slot, std::uint64_t states, std::uint64_t unclosed,
             std::size_t depth) {
    if (slot.isLeaf()) {
      enterLeaf(slot, states, unclosed, depth);
      return;
    }
    const std::uint64_t wanted = wantedOf(slot.children & ~kEnd, states, depth);
    const std::uint64_t accepted =
        (slot.children & kEnd) != 0 ? acceptedAt(states, unclosed, depth) : 0;
    if ((wanted | accepted) == 0 || slot.index() >= _tree.slots.size()) {
      return;
    }
    __builtin_prefetch(&_tree.slots[slot.index()]);
    if (accepted != 0) {
      _memory.nextEndings.push({slot.index(), distanceOf<K>(accepted)});
    }
    if (wanted != 0) {
      const std::uint32_t ends = slot.children & kEnd;
      _memory.nextLevel.push({states, slot.children & ~kEnd, wanted, slot.index() + ends});
    }
  }

  /// The accepting states at the end of a word, in lane 0.
  std::uint64_t acceptedAt(std::uint64_t states, std::uint64_t unclosed, std::size_t depth) const {
    const std::uint64_t accepting = _pattern.acceptingAt(depth);
    if constexpr (Lanes == 1) {
      return states & accepting;
    } else {
      return (states & accepting & B::kLane) == 0
                 ? 0
                 : ((_backward ? unclosed : states) & accepting) >> B::kLaneBits;
    }
  }

  void readEnding(const WalkMemory::Ending& ending, std::size_t length) {
    const TreeSlot& leaf = childAt(ending.slot);
    _budget.spendSlot();
    _budget.spendPlaces(leaf.index(), 1);
    addFound(leaf.index(), ending.distance, length);
  }

  void addFound(std::uint32_t place, std::uint32_t distance, std::size_t length) {
    if (!_tree.order.empty()) {
      __builtin_prefetch(&_tree.order[place]);
    }
    _memory.found.push({place, distance, length});
  }

  void enterLeaf(const TreeSlot& slot, std::uint64_t states, std::uint64_t unclosed,
                 std::size_t depth) {
    _budget.spendPlaces(slot.index(), image::leafWords(slot));
    if (image::hasTails(slot)) {
      readTails(slot, states, unclosed, depth);
      return;
    }
    for (std::uint64_t i = 0; i < slot.children; ++i) {
      const auto place = static_cast<std::uint32_t>(slot.index() + i);
      if (_tree.order.empty()) {
        _image.prefetchOffsetOf(place);
      } else {
        __builtin_prefetch(&_tree.order[place]);
      }
      _leafWords[_leafWordCount++] = {place, 0, depth, states, unclosed};
      if (_leafWordCount == kLeafWords) {
        readLeafWords();
      }
    }
  }

  /// The words of a leaf by what its slot says of them.
  void readTails(const TreeSlot& leaf, std::uint64_t states, std::uint64_t unclosed,
                 std::size_t depth) {
    using Tails = image::LeafTails;
    // Where the automaton was after so many labels, for the words that share them.
    struct {
      std::uint64_t states;
      std::uint64_t unclosed;
    } reached[Tails::kCodes + 1];
    reached[0] = {states, unclosed};
    std::size_t alive = 0;
    std::size_t length = 0;
    std::uint64_t codes = leaf.children & Tails::kAllCodes;
    const std::uint64_t words = image::leafWords(leaf);
    for (std::uint32_t word = 0; word < words; ++word) {
      std::size_t position = 0;
      if (word > 0) {
        position = codes & Tails::kCodeMask;
        codes >>= Tails::kCodeBits;
        if (position > length) {
          _image.throwDamaged("a leaf shares more than there is");
        }
        alive = std::min(alive, position);
      }
      bool isAlive = position == alive;
      for (; (codes & Tails::kCodeMask) != 0; codes >>= Tails::kCodeBits, ++position) {
        if (isAlive) {
          const auto& from = reached[position];
          const auto label = static_cast<std::uint16_t>(codes & Tails::kCodeMask);
          const std::uint64_t byEdit = _pattern.editedAt(from.states, depth + position);
          const std::uint64_t match = _pattern.matchedAt(from.states, depth + position, label);
          auto& to = reached[position + 1];
          to.unclosed = byEdit | match;
          to.states = (byEdit | B::closed(match)) & _pattern.validAt(depth + position + 1);
          isAlive = (to.states & B::kLane) != 0;
          alive += isAlive ? 1 : 0;
        }
      }
      codes >>= Tails::kCodeBits;
      length = position;
      if (!isAlive) {
        continue;
      }
      const auto& end = reached[position];
      if (const auto accepted = acceptedAt(end.states, end.unclosed, depth + position)) {
        addFound(leaf.index() + word, distanceOf<K>(accepted), depth + position);
      }
    }
  }

  /// What is needed of each word is asked of memory before the first is waited for.
  void readLeafWords() {
    const std::span<LeafWord> leafWords(_leafWords.data(), _leafWordCount);
    _leafWordCount = 0;
    for (auto& leaf : leafWords) {
      leaf.word = wordAt(leaf.place);
      _image.prefetchOffsetOf(leaf.word);
    }
    for (const auto& leaf : leafWords) {
      _image.prefetchLabelsOf(leaf.word);
    }
    for (const auto& leaf : leafWords) {
      readRest(leaf);
    }
  }

  void readRest(const LeafWord& leaf) {
    const auto labels = _image.labelsOf(leaf.word);
    _budget.spendUnits(labels.size());
    if (labels.size() < leaf.depth) {
      return;
    }
    std::uint64_t states = leaf.states;
    std::uint64_t unclosed = leaf.unclosed;
    std::size_t depth = leaf.depth;
    for (; depth < labels.size() && (states & B::kLane) != 0; ++depth) {
      const std::uint16_t label = _backward ? labels[labels.size() - 1 - depth] : labels[depth];
      const std::uint64_t byEdit = _pattern.editedAt(states, depth);
      const std::uint64_t match = _pattern.matchedAt(states, depth, label);
      unclosed = byEdit | match;
      states = (byEdit | B::closed(match)) & _pattern.validAt(depth + 1);
    }
    if (depth < labels.size() || (states & B::kLane) == 0) {
      return;
    }
    if (const std::uint64_t accepted = acceptedAt(states, unclosed, depth)) {
      addFound(leaf.place, distanceOf<K>(accepted), depth);
    }
  }

  const SearchImage& _image;
  const SearchImage::Tree& _tree;
  bool _backward;
  const Pattern& _pattern;
  WalkMemory& _memory;
  VisitBudget _budget;
  std::array<LeafWord, kLeafWords> _leafWords;
  std::size_t _leafWordCount = 0;
};

}  // namespace wordcatcher

#endif
