#ifndef WORDCATCHER_STORAGE_STRINGPOOL_H
#define WORDCATCHER_STORAGE_STRINGPOOL_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace wordcatcher {

/// Distinct strings, numbered from 0 in the order in which they came. The characters stand in one
/// block, so that a string costs its characters and about 20 bytes. Adding and finding take
/// constant time beside reading the string. Views end with the next change. At most 2^32 - 2
/// strings.
///
/// For char and char16_t. One thread at a time.
template <typename Char>
class StringPool {
 public:
  using View = std::basic_string_view<Char>;

  std::uint32_t size() const noexcept { return static_cast<std::uint32_t>(_ends.size()); }

  /// Characters of all strings together.
  std::uint64_t characters() const noexcept { return _text.size(); }

  /// The string of a number, which must be below size().
  View operator[](std::uint32_t number) const noexcept {
    const std::uint64_t begin = number == 0 ? 0 : _ends[number - 1];
    return View(_text.data() + begin, _ends[number] - begin);
  }

  std::optional<std::uint32_t> find(View string) const noexcept;

  /// The number of a string, and whether it is new. When memory runs out the pool is as before.
  std::pair<std::uint32_t, bool> insert(View string);

  /// Forgets the strings that came last, so that `size` remain.
  void truncate(std::uint32_t size) noexcept;

 private:
  /// A place of the hash table; most strangers are told apart by the hash without a look at the
  /// characters.
  struct Slot {
    std::uint32_t taken = 0;  // the string's number + 1; 0 when the place is free
    std::uint32_t hash = 0;
  };

  static std::uint32_t hashOf(View string) noexcept;
  std::size_t slotOf(View string, std::uint32_t hash) const noexcept;
  void grow();

  std::basic_string<Char> _text;
  std::vector<std::uint64_t> _ends;
  std::vector<Slot> _slots;  // a power of two of them, at most two thirds taken
};

extern template class StringPool<char>;
extern template class StringPool<char16_t>;

}  // namespace wordcatcher

#endif
