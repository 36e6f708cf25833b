#ifndef WORDCATCHER_PYTHON_TEXT_H
#define WORDCATCHER_PYTHON_TEXT_H

#include <pybind11/pybind11.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/matcher/Find.h"

namespace wordcatcher::python {

namespace py = pybind11;

/// The UTF-8 form of a text in which something is looked for. A lone surrogate, which has none,
/// becomes U+FFFD: that separates words, and is one code point as well, so that offsets stay right.
std::string searchedUtf8(const py::str& text);

/// The UTF-8 form of a string that is to be stored, or compared with one that is. Lone surrogates
/// become ill-formed bytes, which the library refuses.
std::string storedUtf8(const py::str& text);

/// The bytes of a path: str, bytes or os.PathLike, as the file system has them.
std::string pathBytes(const py::object& path);

/// The str that Python has for the bytes of a path.
py::str pathText(const std::string& path);

/// Where bytes of a UTF-8 text are, counted in code points. Linear in the text, once.
class CodePoints {
 public:
  explicit CodePoints(std::string_view utf8);

  /// The code points before a byte; those of the whole text for a byte beyond it.
  std::size_t before(std::size_t byte) const noexcept;

  /// The byte at which the character after so many begins.
  std::size_t byteAfter(std::size_t codePoints) const noexcept;

  void convert(FindResult& result) const noexcept;
  void convert(FindExplanation& explanation) const noexcept;

 private:
  // The code points before each byte; nothing for ASCII, where the two counts are the same.
  std::vector<std::size_t> _before;
};

}  // namespace wordcatcher::python

#endif
