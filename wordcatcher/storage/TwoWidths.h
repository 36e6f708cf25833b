#ifndef WORDCATCHER_STORAGE_TWOWIDTHS_H
#define WORDCATCHER_STORAGE_TWOWIDTHS_H

#include <cstddef>

namespace wordcatcher {

/// Numbers of a section whose elements have one of two widths, whichever its image needs. A view;
/// nothing is checked.
template <typename Narrow, typename Wide>
class TwoWidths {
 public:
  TwoWidths() = default;
  TwoWidths(const std::byte* data, std::size_t size, bool wide)
      : _data(data), _size(size), _wide(wide) {}

  std::size_t size() const noexcept { return _size; }
  bool empty() const noexcept { return _size == 0; }
  const std::byte* addressOf(std::size_t index) const noexcept {
    return _data + index * (_wide ? sizeof(Wide) : sizeof(Narrow));
  }
  Wide operator[](std::size_t index) const noexcept {
    return _wide ? reinterpret_cast<const Wide*>(_data)[index]
                 : reinterpret_cast<const Narrow*>(_data)[index];
  }
  TwoWidths subspan(std::size_t first, std::size_t count) const noexcept {
    return {addressOf(first), count, _wide};
  }

 private:
  const std::byte* _data = nullptr;
  std::size_t _size = 0;
  bool _wide = false;
};

}  // namespace wordcatcher

#endif
