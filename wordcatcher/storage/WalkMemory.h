#ifndef WORDCATCHER_STORAGE_WALKMEMORY_H
#define WORDCATCHER_STORAGE_WALKMEMORY_H

// The memory of those who walk a search image's trees in step with an automaton, which an image
// lends to one after the other: a walk takes some microseconds, of which asking for fresh memory
// would be a tenth.

#include <algorithm>
#include <array>
#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <utility>
#include <vector>

#include "wordcatcher/storage/SearchImageFormat.h"

namespace wordcatcher {

/// What an automaton is made of; one after the other may use the same. Memory: some 60 to 100 bytes
/// for each state.
struct AutomatonMemory {
  /// A state, which stands for a set of states of a pattern.
  struct State {
    std::uint64_t set = 0;
    std::uint64_t wanted = 0;  // the bits, in a tree's sets of children, of labels that can lead on
    std::uint16_t leastRest = UINT16_MAX;  // code units that a word may still have, both capped at
    std::uint16_t mostRest = 0;            // image::kLengthCap
    std::uint32_t distance = 0;            // of a word that ends here, or kNotAccepted
    std::uint32_t depth = 0;
  };

  std::vector<State> states;
  std::vector<State> former;         // while the states that are still needed get new numbers
  std::vector<std::uint32_t> steps;  // a row for each state
  std::vector<std::uint32_t> slots;  // hash table of the states; 0: free

  std::size_t bytes() const noexcept {
    return (states.capacity() + former.capacity()) * sizeof(State) +
           (steps.capacity() + slots.capacity()) * sizeof(std::uint32_t);
  }
};

/// A list that grows and is emptied many times. What is to be added mostly cannot be foretold, so
/// additions need no branch: each element is written behind the last one, and then the end is moved
/// or not.
template <typename Element>
class WalkList {
 public:
  /// Where to write up to so many more.
  Element* roomFor(std::size_t more) {
    if (_size + more > _elements.size()) {
      grow(more);
    }
    return _elements.data() + _size;
  }
  /// Says how far that was done.
  void endAt(const Element* end) noexcept {
    _size = static_cast<std::size_t>(end - _elements.data());
  }
  void add(const Element& element) {
    *roomFor(1) = element;
    ++_size;
  }
  void clear() noexcept { _size = 0; }
  void swap(WalkList& other) noexcept {
    _elements.swap(other._elements);
    std::swap(_size, other._size);
  }
  std::size_t size() const noexcept { return _size; }
  Element* begin() noexcept { return _elements.data(); }
  Element* end() noexcept { return _elements.data() + _size; }
  const Element* begin() const noexcept { return _elements.data(); }
  const Element* end() const noexcept { return _elements.data() + _size; }
  std::size_t bytes() const noexcept { return _elements.capacity() * sizeof(Element); }

 private:
  [[gnu::noinline]] void grow(std::size_t more) {
    _elements.resize(std::max<std::size_t>(64, 2 * (_size + more)));
  }

  std::vector<Element> _elements;
  std::size_t _size = 0;
};

/// What a walk of a tree keeps of the level that it reads and of the next; one walk after the other
/// may use the same.
struct WalkMemory {
  /// A place behind an edge, and the state of the automaton there.
  struct Reached {
    std::uint64_t children;
    std::uint32_t target;
    std::uint32_t state;
  };
  /// An inner place that leads on.
  struct Place {
    std::uint64_t children;  // but for the end of a word
    std::uint32_t first;     // its first child
    std::uint32_t state;
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

  AutomatonMemory automaton;
  WalkList<Reached> reached;
  WalkList<Reached> leaves;
  WalkList<Place> level;
  WalkList<Place> nextLevel;
  WalkList<Ending> endings;
  WalkList<Ending> nextEndings;
  WalkList<Found> found;

  /// Empties all but the automaton.
  void clear() noexcept {
    reached.clear();
    leaves.clear();
    level.clear();
    nextLevel.clear();
    endings.clear();
    nextEndings.clear();
    found.clear();
  }

  std::size_t bytes() const noexcept {
    return automaton.bytes() + reached.bytes() + leaves.bytes() + level.bytes() +
           nextLevel.bytes() + endings.bytes() + nextEndings.bytes() + found.bytes();
  }
};

/// Lends memory to any number of threads at once. None waits for another: who finds nothing there
/// gets fresh memory.
class WalkMemoryPool {
 public:
  WalkMemoryPool() = default;
  ~WalkMemoryPool();
  WalkMemoryPool(const WalkMemoryPool&) = delete;
  WalkMemoryPool& operator=(const WalkMemoryPool&) = delete;

  struct GiveBack {
    WalkMemoryPool* pool;
    void operator()(WalkMemory* memory) const noexcept { pool->giveBack(memory); }
  };
  using Loan = std::unique_ptr<WalkMemory, GiveBack>;

  /// The pool must outlive the loan.
  Loan lend();

 private:
  // What one query in many needs is not kept.
  static constexpr std::size_t kMostBytes = std::size_t{1} << 20U;
  static constexpr std::size_t kPlaces = 8;

  /// Each on a cache line of its own, so that threads do not disturb each other.
  struct alignas(64) Place {
    std::atomic<WalkMemory*> memory = nullptr;
  };

  void giveBack(WalkMemory* memory) noexcept;

  std::array<Place, kPlaces> _places;
};

}  // namespace wordcatcher

#endif
