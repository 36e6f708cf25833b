#include <limits>
#include <utility>

#include "python/Bindings.h"
#include "python/Call.h"
#include "python/Lock.h"
#include "python/Names.h"

namespace wordcatcher::python {

namespace {

constexpr std::size_t kNoLimit = std::numeric_limits<std::size_t>::max();

void set(FindOptions& options, const std::string& name, const py::handle& value,
         const std::string& method) {
  if (name == "limit") {
    options.limit = value.is_none() ? kNoLimit : count(value, name);
  } else if (name == "max_cost") {
    options.maxCost = value.is_none() ? std::nullopt : std::optional(count(value, name));
  } else if (name == "min_words") {
    options.minWords = count(value, name, 1);
  } else if (name == "edits") {
    options.edits = value.is_none() ? EditLimits() : value.cast<EditLimits>();
  } else if (name == "transpositions") {
    options.transpositions = value.cast<bool>();
  } else if (name == "overlaps") {
    options.overlaps = overlapsNamed(value.cast<std::string>());
  } else if (name == "max_postings") {
    options.maxPostings = count(value, name);
  } else {
    throw py::type_error(method + "() got an unexpected keyword argument '" + name + "'");
  }
}

}  // namespace

std::uint64_t count(const py::handle& value, const std::string& parameter, std::uint64_t least) {
  const auto number =
      py::reinterpret_steal<py::int_>(callPython([&] { return PyNumber_Index(value.ptr()); }));
  if (!number) {
    PyErr_Clear();
    throw py::type_error(parameter + " is an int");
  }
  const std::uint64_t counted = PyLong_AsUnsignedLongLong(number.ptr());
  if (PyErr_Occurred() != nullptr || counted < least) {
    PyErr_Clear();
    throw py::value_error(parameter + " is from " + std::to_string(least) + " to 2**64 - 1");
  }
  return counted;
}

FindOptions findOptions(const py::kwargs& arguments, const std::string& method) {
  FindOptions options;
  for (const auto& item : arguments) {
    const std::string parameter = parameterName(item.first);
    // Reading it may run Python code, which can reach the dictionary and empty it.
    const auto value = py::reinterpret_borrow<py::object>(item.second);
    try {
      set(options, parameter, value, method);
    } catch (const py::cast_error&) {
      std::string sentence = method;
      sentence.append("() cannot take this as ").append(parameter).append(": ");
      throw py::type_error(sentence.append(callPython([&] { return py::repr(value); })));
    }
  }
  return options;
}

std::string findSignature() {
  const FindOptions options;
  return "limit=" + std::to_string(options.limit) +
         ", max_cost=None, min_words=" + std::to_string(options.minWords) +
         ", edits=None, transpositions=" + (options.transpositions ? "True" : "False") +
         ", overlaps='all', max_postings=" + std::to_string(options.maxPostings);
}

}  // namespace wordcatcher::python
