#include "python/Call.h"

#include <algorithm>

namespace wordcatcher::python {

namespace {

/// As in "find(text, *, ...)".
std::string shown(const Parameters& parameters) {
  std::string text;
  for (std::size_t i = 0; i < parameters.names.size(); ++i) {
    text += (i > 0 ? ", " : "") + parameters.names[i] + (i < parameters.required ? "" : "=...");
  }
  return parameters.method + '(' + text + (parameters.options ? ", *, ...)" : ")");
}

[[noreturn]] void refuse(const Parameters& parameters, const std::string& reason) {
  throw py::type_error(shown(parameters) + ' ' + reason);
}

void checkCount(const Parameters& parameters, std::size_t given) {
  const std::size_t most = parameters.names.size();
  if (given > most) {
    refuse(parameters, "takes " + std::to_string(most) +
                           (most == 1 ? " argument by place, not " : " arguments by place, not ") +
                           std::to_string(given) +
                           (parameters.options ? "; give options by name, such as limit=3" : ""));
  }
}

}  // namespace

Call::Call(const Parameters& parameters, const py::args& byPlace, const py::kwargs& byName) {
  const auto& names = parameters.names;
  checkCount(parameters, byPlace.size());
  for (std::size_t i = 0; i < byPlace.size(); ++i) {
    _arguments[py::str(names[i])] = byPlace[i];
  }
  for (const auto& [key, value] : byName) {
    const std::string name = parameterName(key);
    if (std::find(names.begin(), names.end(), name) == names.end()) {
      if (!parameters.options) {
        refuse(parameters, "got an unexpected keyword argument '" + name + "'");
      }
      _options[key] = value;
    } else if (_arguments.contains(key)) {
      refuse(parameters, "is given " + name + " twice");
    } else {
      _arguments[key] = value;
    }
  }
  for (std::size_t i = 0; i < parameters.required; ++i) {
    if (!_arguments.contains(names[i])) {
      refuse(parameters, "lacks its argument " + names[i]);
    }
  }
}

py::object Call::get(const std::string& name, const py::object& otherwise) const {
  return _arguments.contains(name) ? py::object(_arguments[py::str(name)]) : otherwise;
}

py::str Call::text(const std::string& name) const {
  const py::object value = get(name, py::none());
  if (!py::isinstance<py::str>(value)) {
    throw py::type_error(name + " is a str, not " + typeName(value));
  }
  return py::reinterpret_borrow<py::str>(value);
}

py::kwargs Call::options() const { return _options; }

std::string parameterName(const py::handle& name) {
  const auto bytes = py::reinterpret_steal<py::bytes>(
      PyUnicode_AsEncodedString(name.ptr(), "utf-8", "backslashreplace"));
  if (!bytes) {
    throw py::error_already_set();
  }
  return std::string(bytes);
}

std::string typeName(const py::handle& object) {
  return py::type::handle_of(object).attr("__name__").cast<std::string>();
}

}  // namespace wordcatcher::python
