#ifndef WORDCATCHER_TESTS_MEMORYCOUNTER_H
#define WORDCATCHER_TESTS_MEMORYCOUNTER_H

#include <cstddef>

namespace wordcatcher::testing {

/// Counts every byte that a program allocates, once its source is linked into it: those of operator
/// new, which it replaces, and those of ICU, which takes other functions before its first use. One
/// thread at a time.
class MemoryCounter {
 public:
  static std::size_t live() noexcept;  ///< bytes asked for and not given back
  static std::size_t peak() noexcept;  ///< the most that ever lived since restartPeak()
  static void restartPeak() noexcept;

  /// Whether ICU took the functions.
  static bool countsIcu() noexcept;
};

}  // namespace wordcatcher::testing

#endif
