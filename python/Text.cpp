#include "python/Text.h"

#include <algorithm>

#include "python/Lock.h"

namespace wordcatcher::python {

namespace {

bool isContinuation(char byte) { return (static_cast<unsigned char>(byte) & 0xC0U) == 0x80; }

/// Surrogates are U+D800 to U+DFFF: ED A0 80 to ED BF BF, where well-formed UTF-8 has nothing.
void replaceSurrogates(std::string& utf8) {
  constexpr std::string_view kReplacement = "\xEF\xBF\xBD";
  for (std::size_t at = utf8.find('\xED'); at != std::string::npos; at = utf8.find('\xED', at)) {
    if (static_cast<unsigned char>(utf8[at + 1]) >= 0xA0) {
      utf8.replace(at, kReplacement.size(), kReplacement);
    }
    at += kReplacement.size();
  }
}

/// PyUnicode_AsUTF8AndSize would keep the UTF-8 form with the str as long as it lives.
std::string encoded(const py::str& text) {
  if (PyUnicode_READY(text.ptr()) != 0) {
    throw py::error_already_set();
  }
  if (PyUnicode_IS_ASCII(text.ptr()) != 0) {
    return {static_cast<const char*>(PyUnicode_DATA(text.ptr())),
            static_cast<std::size_t>(PyUnicode_GET_LENGTH(text.ptr()))};
  }
  const auto bytes = py::reinterpret_steal<py::bytes>(
      PyUnicode_AsEncodedString(text.ptr(), "utf-8", "surrogatepass"));
  if (!bytes) {
    throw py::error_already_set();
  }
  return std::string(bytes);
}

template <typename Range>
void convertRange(const CodePoints& codePoints, Range& range) {
  range.begin = codePoints.before(range.begin);
  range.end = codePoints.before(range.end);
}

}  // namespace

std::string searchedUtf8(const py::str& text) {
  std::string utf8 = encoded(text);
  replaceSurrogates(utf8);
  return utf8;
}

std::string storedUtf8(const py::str& text) { return encoded(text); }

std::string pathBytes(const py::object& path) {
  PyObject* bytes = nullptr;
  if (callPython([&] { return PyUnicode_FSConverter(path.ptr(), &bytes); }) == 0) {
    throw py::error_already_set();
  }
  return std::string(py::reinterpret_steal<py::bytes>(bytes));
}

py::str pathText(const std::string& path) {
  auto text = py::reinterpret_steal<py::str>(
      PyUnicode_DecodeFSDefaultAndSize(path.data(), static_cast<py::ssize_t>(path.size())));
  if (!text) {
    throw py::error_already_set();
  }
  return text;
}

CodePoints::CodePoints(std::string_view utf8) {
  if (std::none_of(utf8.begin(), utf8.end(),
                   [](char byte) { return static_cast<unsigned char>(byte) >= 0x80; })) {
    return;
  }
  _before.reserve(utf8.size() + 1);
  std::size_t count = 0;
  for (const char byte : utf8) {
    // A byte inside a character has the character's own number before it.
    _before.push_back(isContinuation(byte) ? count - 1 : count);
    count += isContinuation(byte) ? 0 : 1;
  }
  _before.push_back(count);
}

std::size_t CodePoints::before(std::size_t byte) const noexcept {
  return _before.empty() ? byte : _before[std::min(byte, _before.size() - 1)];
}

std::size_t CodePoints::byteAfter(std::size_t codePoints) const noexcept {
  if (_before.empty()) {
    return codePoints;
  }
  const auto byte = std::lower_bound(_before.begin(), _before.end(), codePoints);
  return static_cast<std::size_t>(byte - _before.begin());
}

void CodePoints::convert(FindResult& result) const noexcept {
  for (auto& match : result.matches) {
    convertRange(*this, match);
    for (auto& word : match.hits) {
      convertRange(*this, word);
    }
  }
}

void CodePoints::convert(FindExplanation& explanation) const noexcept {
  for (auto& word : explanation.words) {
    convertRange(*this, word);
  }
  for (auto& word : explanation.pairs) {
    convertRange(*this, word);
  }
}

}  // namespace wordcatcher::python
