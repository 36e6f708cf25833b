#ifndef WORDCATCHER_PYTHON_BINDINGS_H
#define WORDCATCHER_PYTHON_BINDINGS_H

#include <pybind11/pybind11.h>

#include <cstdint>
#include <limits>
#include <string>

#include "wordcatcher/matcher/Find.h"

namespace wordcatcher::python {

namespace py = pybind11;

// The parts of the module, in the order in which they have to be bound.
void bindError(py::module_& module);
void bindResults(py::module_& module);
void bindBuilder(py::module_& module);
void bindIndex(py::module_& module);

/// A docstring from whose first line inspect and help() tell the parameters. The first one of a
/// method is $self, which inspect leaves out.
inline std::string documented(const std::string& signature, const std::string& text) {
  return signature + "\n--\n\n" + text;
}

/// An int from `least` to 2^64 - 1. Throws TypeError for what is no int, ValueError for another.
std::uint64_t count(const py::handle& value, const std::string& parameter, std::uint64_t least = 0);

/// The keyword arguments of find() and of the methods that share them. Throws TypeError for one
/// that there is not, ValueError for a value that it cannot have.
FindOptions findOptions(const py::kwargs& arguments, const std::string& method);

/// The same arguments as docstrings and signatures have them, with their defaults.
std::string findSignature();

}  // namespace wordcatcher::python

#endif
