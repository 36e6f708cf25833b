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

#include "wordcatcher/storage/LeafTails.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/storage/WalkMemory.h"

namespace wordcatcher {

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

  void spendSlots(std::uint64_t count) {
    if (count > _slots) {
      fail("a tree has more branches than places");
    }
    _slots -= count;
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

/// One walk. `Automaton` is a LazyAutomaton or a TableAutomaton; see there for what is accepted.
///
/// Each level takes three passes: over the children of its places, of which those are kept at which
/// the automaton is alive; over these, to tell leaves and places; and over the leaves. So each has
/// few branches, and those that there are can mostly be foretold.
template <typename Automaton>
class BandedWalk {
 public:
  using Pattern = typename Automaton::Pattern;
  using Number = typename Automaton::Number;
  using Level = typename Automaton::Level;

  /// All must live as long as this does; of walks with the same memory one is run after the other.
  BandedWalk(const SearchImage& image, const SearchImage::Tree& tree, bool backward,
             const Pattern& pattern, WalkMemory& memory)
      : _image(image),
        _tree(tree),
        _backward(backward),
        _automaton(pattern, backward, memory.automaton),
        _memory(memory),
        _budget(image, tree) {}

  /// Calls `accept(word, distance, length)` for each word accepted. `start`: of the pattern.
  template <typename Start, typename Accept>
  void run(Start start, Accept accept) {
    begin();
    const TreeSlot& root = _tree.slots[0];
    _memory.level.add({root.children & ~kEnd, root.index(), _automaton.at(0, start)});
    finish(0, accept);
  }

  /// The walk of a query whose first code unit can only be an insertion.
  template <typename Accept>
  void runAfterInsertion(Accept accept) {
    begin();
    const TreeSlot& root = _tree.slots[0];
    reachAll(root.children & ~kEnd, root.index(), _automaton.level(1),
             [state = _automaton.afterInsertion()](std::uint16_t) { return state; });
    sortOut(1);
    goOn();
    finish(1, accept);
  }

 private:
  using TreeSlot = image::TreeSlot;
  static constexpr std::uint64_t kEnd = std::uint64_t{1} << image::kEndBit;
  static constexpr std::uint64_t kRare = std::uint64_t{1} << image::kRareBit;

  /// A word of a leaf that is still to be read: first its place, then itself.
  struct LeafWord {
    std::uint32_t place;
    std::uint32_t word;
    Number state;
    std::size_t depth;
  };
  static constexpr std::size_t kLeafWords = 64;

  /// Bounds the memory for places of which it is not known yet what they are.
  static constexpr std::size_t kSortedAtOnce = 1024;

  void begin() {
    _automaton.begin();
    _memory.clear();
  }

  template <typename Accept>
  void finish(std::size_t depth, Accept& accept) {
    for (; _memory.level.size() + _memory.endings.size() > 0; ++depth) {
      _automaton.enter(depth);
      for (const auto& ending : _memory.endings) {
        readEnding(ending, depth);
      }
      const auto here = _automaton.level(depth);
      const auto next = _automaton.level(depth + 1);
      for (const auto& place : _memory.level) {
        expand(place, depth, here, next);
        if (_memory.reached.size() >= kSortedAtOnce) {
          sortOut(depth + 1);
        }
      }
      sortOut(depth + 1);
      goOn();
      if (_automaton.isLarge()) {
        readLeafWords();
        _automaton.forgetAllBut(_memory.level, depth + 1);
      }
    }
    readLeafWords();
    for (const auto& found : _memory.found) {
      accept(wordAt(found.place), found.distance, found.length);
    }
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

  /// The block of a place's children.
  const TreeSlot* childrenAt(std::size_t first, std::size_t count) const {
    if (first + count > _tree.slots.size()) {
      _image.throwDamaged("a tree leads out of its section");
    }
    return _tree.slots.data() + first;
  }

  void expand(const WalkMemory::Place& place, std::size_t depth, const Level& here,
              const Level& next) {
    const std::uint64_t wanted = place.children & here.wanted(place.state);
    const auto step = [&](std::uint16_t label) {
      return _automaton.next(here, place.state, depth, label);
    };
    if (wanted == place.children) {
      reachAll(place.children, place.first, next, step);
    } else {
      reachSome(place.children, wanted, place.first, next, step);
    }
  }

  /// The places behind the edges to all children.
  template <typename Step>
  void reachAll(std::uint64_t children, std::size_t first, const Level& next, Step step) {
    const std::uint64_t common = children & ~kRare;
    const std::size_t count = bitCount(common);
    _budget.spendSlots(count);
    const TreeSlot* slot = childrenAt(first, count);
    WalkMemory::Reached* end = _memory.reached.roomFor(count);
    for (std::uint64_t bits = common; bits != 0; bits &= bits - 1, ++slot) {
      end = reach(*slot, step(static_cast<std::uint16_t>(std::countr_zero(bits))), next, end);
    }
    _memory.reached.endAt(end);
    if ((children & kRare) != 0) {
      reachRare(first + count, next, step);
    }
  }

  /// The places behind the edges to some of them.
  template <typename Step>
  void reachSome(std::uint64_t children, std::uint64_t wanted, std::size_t first, const Level& next,
                 Step step) {
    const std::uint64_t common = children & ~kRare;
    for (std::uint64_t bits = common & wanted; bits != 0; bits &= bits - 1) {
      const std::size_t child = first + bitCount(common & ((bits & -bits) - 1));
      reachOne(*childrenAt(child, 1), step(static_cast<std::uint16_t>(std::countr_zero(bits))),
               next);
    }
    if ((wanted & kRare) != 0) {
      reachRare(first + bitCount(common), next, step);
    }
  }

  template <typename Step>
  void reachRare(std::size_t child, const Level& next, Step step) {
    for (;; ++child) {
      const TreeSlot& slot = *childrenAt(child, 1);
      if (slot.label < image::kRareBit) {
        _image.throwDamaged("a tree leads out of its section");
      }
      reachOne(slot, step(slot.label), next);
      if (slot.isLastChild()) {
        return;
      }
    }
  }

  void reachOne(const TreeSlot& slot, Number state, const Level& next) {
    _budget.spendSlots(1);
    _memory.reached.endAt(reach(slot, state, next, _memory.reached.roomFor(1)));
  }

  /// A place of the next level is kept if words behind it are of a length that can still be
  /// accepted. None is in the dead state.
  WalkMemory::Reached* reach(const TreeSlot& slot, Number state, const Level& next,
                             WalkMemory::Reached* end) const {
    *end = {slot.children, slot.target, state};
    return end + next.fits(state, slot.shortest, slot.longest);
  }

  /// Adds the places reached to the next level, after so many code units, and reads the leaves.
  void sortOut(std::size_t depth) {
    const std::size_t count = _memory.reached.size();
    WalkMemory::Place* levelEnd = _memory.nextLevel.roomFor(count);
    WalkMemory::Ending* endingsEnd = _memory.nextEndings.roomFor(count);
    WalkMemory::Reached* leavesEnd = _memory.leaves.roomFor(count);
    const auto slots = _tree.slots;
    const auto level = _automaton.level(depth);
    for (const auto& reached : _memory.reached) {
      const std::uint32_t index = reached.target & TreeSlot::kIndex;
      const unsigned isLeaf = reached.target / TreeSlot::kLeaf;
      const auto ends = static_cast<std::uint32_t>(reached.children & kEnd);
      const std::uint64_t wanted = level.wanted(reached.state);
      const unsigned isWanted = (reached.children & wanted) != 0 ? 1 : 0;
      const std::uint32_t distance = level.distance(reached.state);
      const unsigned isAccepted = distance != Automaton::kNotAccepted ? 1 : 0;
      // A leaf's flag makes this more than there are slots.
      const std::uint32_t child = reached.target & (TreeSlot::kLeaf | TreeSlot::kIndex);
      __builtin_prefetch(slots.data() + (child < slots.size() ? child : 0));
      *leavesEnd = reached;
      leavesEnd += isLeaf & (image::mayHold(reached.children, wanted | isAccepted) ? 1 : 0);
      *levelEnd = {reached.children & ~kEnd, index + ends, reached.state};
      levelEnd += isWanted & ~isLeaf;
      *endingsEnd = {index, distance};
      endingsEnd += isAccepted & ends & ~isLeaf;
    }
    _memory.nextLevel.endAt(levelEnd);
    _memory.nextEndings.endAt(endingsEnd);
    _memory.leaves.endAt(leavesEnd);
    _memory.reached.clear();
    for (const auto& leaf : _memory.leaves) {
      readLeaf(leaf, depth);
    }
    _memory.leaves.clear();
  }

  void readEnding(const WalkMemory::Ending& ending, std::size_t length) {
    const TreeSlot& leaf = *childrenAt(ending.slot, 1);
    _budget.spendSlots(1);
    _budget.spendPlaces(leaf.index(), 1);
    addFound(leaf.index(), ending.distance, length);
  }

  void addFound(std::uint32_t place, std::uint32_t distance, std::size_t length) {
    if (!_tree.order.empty()) {
      __builtin_prefetch(&_tree.order[place]);
    }
    _memory.found.add({place, distance, length});
  }

  void readLeaf(const WalkMemory::Reached& leaf, std::size_t depth) {
    const std::uint32_t first = leaf.target & TreeSlot::kIndex;
    const std::uint64_t words = image::leafWords(leaf.children);
    _budget.spendPlaces(first, words);
    if (image::hasTails(leaf.children)) {
      readTails(leaf, depth);
      return;
    }
    for (std::uint64_t i = 0; i < words; ++i) {
      const auto place = static_cast<std::uint32_t>(first + i);
      if (_tree.order.empty()) {
        _image.prefetchOffsetOf(place);
      } else {
        __builtin_prefetch(&_tree.order[place]);
      }
      _leafWords[_leafWordCount++] = {place, 0, leaf.state, depth};
      if (_leafWordCount == kLeafWords) {
        readLeafWords();
      }
    }
  }

  /// The words of a leaf by what its slot says of them.
  void readTails(const WalkMemory::Reached& leaf, std::size_t depth) {
    using Tails = image::LeafTails;
    // Where the automaton was after so many labels, for the words that share them.
    std::array<Number, Tails::kCodes + 1> reached;
    reached[0] = leaf.state;
    std::size_t position = 0;
    std::uint64_t codes = leaf.children & Tails::kAllCodes;
    auto place = leaf.target & TreeSlot::kIndex;
    for (auto words = image::leafWords(leaf.children);; ++place) {
      for (; (codes & Tails::kCodeMask) != 0; codes >>= Tails::kCodeBits, ++position) {
        const auto label = static_cast<std::uint16_t>(codes & Tails::kCodeMask);
        reached[position + 1] = _automaton.nextAnywhere(reached[position], depth + position, label);
        // Amid other words it takes longer to go on behind the label than to read on.
        if (words == 1 && reached[position + 1] == Automaton::kDead) {
          return;
        }
      }
      const std::uint32_t distance =
          _automaton.distanceAnywhere(reached[position], depth + position);
      if (distance != Automaton::kNotAccepted) {
        addFound(place, distance, depth + position);
      }
      if (--words == 0) {
        return;
      }
      codes >>= Tails::kCodeBits;
      const std::size_t shared = codes & Tails::kCodeMask;
      codes >>= Tails::kCodeBits;
      if (shared > position) {
        _image.throwDamaged("a leaf shares more than there is");
      }
      position = shared;
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
    const std::size_t length = labels.size();
    if (length < leaf.depth) {
      return;
    }
    const auto labelAt = [this, &labels, length](std::size_t depth) {
      return _backward ? labels[length - 1 - depth] : labels[depth];
    };
    const std::uint32_t distance =
        _automaton.distanceBehind(leaf.state, leaf.depth, length, labelAt);
    if (distance != Automaton::kNotAccepted) {
      addFound(leaf.place, distance, length);
    }
  }

  const SearchImage& _image;
  const SearchImage::Tree& _tree;
  bool _backward;
  Automaton _automaton;
  WalkMemory& _memory;
  VisitBudget _budget;
  std::array<LeafWord, kLeafWords> _leafWords;
  std::size_t _leafWordCount = 0;
};

}  // namespace wordcatcher

#endif
