#ifndef WORDCATCHER_MATCHER_NUMBERINDEX_H
#define WORDCATCHER_MATCHER_NUMBERINDEX_H

#include <cstddef>
#include <cstdint>
#include <vector>

namespace wordcatcher {

/// Spreads numbers over all 32 bits by the golden ratio (Knuth, "The Art of Computer Programming",
/// volume 3, section 6.4); the high bits are the best mixed.
inline std::uint32_t hashOfNumber(std::uint32_t number) noexcept {
  constexpr std::uint32_t kGoldenRatio = 0x9E3779B1U;
  const std::uint32_t product = number * kGoldenRatio;
  return product ^ product >> 16U;
}

/// Numbers in the order in which they were met, each once. It lives for one query and mostly holds
/// some dozens, for which the tables of the standard library spend their time on memory. Memory: 16
/// to 32 bytes a number.
class NumberIndex {
 public:
  NumberIndex() : _slots(kFewest) {}

  struct Place {
    std::uint32_t ordinal;  // how many others were met before
    bool isNew;
  };

  /// The place of a number, which is added if it is not there.
  Place insert(std::uint32_t number) {
    if (2 * (std::size_t{_size} + 1) > _slots.size()) {
      grow();
    }
    Slot& slot = slotOf(number);
    const bool isNew = slot.next == 0;
    if (isNew) {
      slot = {number, ++_size};
    }
    return {slot.next - 1, isNew};
  }

  std::uint32_t size() const noexcept { return _size; }

 private:
  struct Slot {
    std::uint32_t number = 0;
    std::uint32_t next = 0;  // the ordinal of what was met next; 0: the slot is free
  };
  static constexpr std::size_t kFewest = 128;

  /// Where a number is, or would be.
  Slot& slotOf(std::uint32_t number) noexcept {
    std::size_t slot = hashOfNumber(number) & (_slots.size() - 1);
    while (_slots[slot].next != 0 && _slots[slot].number != number) {
      slot = (slot + 1) & (_slots.size() - 1);
    }
    return _slots[slot];
  }

  void grow() {
    std::vector<Slot> before(2 * _slots.size());
    before.swap(_slots);
    for (const Slot& slot : before) {
      if (slot.next != 0) {
        slotOf(slot.number) = slot;
      }
    }
  }

  std::vector<Slot> _slots;  // a power of two, at least half of them free
  std::uint32_t _size = 0;
};

}  // namespace wordcatcher

#endif
