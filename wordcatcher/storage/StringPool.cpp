#include "wordcatcher/storage/StringPool.h"

#include <algorithm>

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace wordcatcher {

namespace {

constexpr std::size_t kFirstSlots = 16;

}  // namespace

template <typename Char>
std::uint32_t StringPool<Char>::hashOf(View string) noexcept {
  return static_cast<std::uint32_t>(XXH3_64bits(string.data(), string.size() * sizeof(Char)));
}

/// The place where the string stands, or the free one where it belongs.
template <typename Char>
std::size_t StringPool<Char>::slotOf(View string, std::uint32_t hash) const noexcept {
  const std::size_t mask = _slots.size() - 1;
  std::size_t place = hash & mask;
  while (_slots[place].taken != 0 &&
         (_slots[place].hash != hash || (*this)[_slots[place].taken - 1] != string)) {
    place = (place + 1) & mask;
  }
  return place;
}

template <typename Char>
std::optional<std::uint32_t> StringPool<Char>::find(View string) const noexcept {
  if (_slots.empty()) {
    return std::nullopt;
  }
  const Slot slot = _slots[slotOf(string, hashOf(string))];
  return slot.taken == 0 ? std::nullopt : std::optional(slot.taken - 1);
}

template <typename Char>
std::pair<std::uint32_t, bool> StringPool<Char>::insert(View string) {
  if (_slots.size() < kFirstSlots || _ends.size() >= _slots.size() / 3 * 2) {
    grow();
  }
  const std::uint32_t hash = hashOf(string);
  Slot& slot = _slots[slotOf(string, hash)];
  if (slot.taken != 0) {
    return {slot.taken - 1, false};
  }
  // The end first gets its room, then the text: nothing is half done when memory runs out.
  if (_ends.size() == _ends.capacity()) {
    _ends.reserve(std::max(kFirstSlots, _ends.size() * 2));
  }
  _text.append(string);
  _ends.push_back(_text.size());
  slot = {size(), hash};
  return {slot.taken - 1, true};
}

template <typename Char>
void StringPool<Char>::truncate(std::uint32_t size) noexcept {
  // The string that came last stands on no other string's way through the table, so its place can
  // simply be freed; and so on backwards.
  while (this->size() > size) {
    const View last = (*this)[this->size() - 1];
    _slots[slotOf(last, hashOf(last))] = {};
    _text.resize(_text.size() - last.size());
    _ends.pop_back();
  }
}

template <typename Char>
void StringPool<Char>::grow() {
  std::vector<Slot> slots(std::max(kFirstSlots, _slots.size() * 2));
  const std::size_t mask = slots.size() - 1;
  // In the order of numbers, on which truncate() relies.
  std::vector<std::uint32_t> hashes(size());
  for (const Slot slot : _slots) {
    if (slot.taken != 0) {
      hashes[slot.taken - 1] = slot.hash;
    }
  }
  for (std::uint32_t number = 0; number < hashes.size(); ++number) {
    std::size_t place = hashes[number] & mask;
    while (slots[place].taken != 0) {
      place = (place + 1) & mask;
    }
    slots[place] = {number + 1, hashes[number]};
  }
  _slots = std::move(slots);
}

template class StringPool<char>;
template class StringPool<char16_t>;

}  // namespace wordcatcher
