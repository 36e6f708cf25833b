#ifndef WORDCATCHER_PYTHON_RECORD_H
#define WORDCATCHER_PYTHON_RECORD_H

#include <pybind11/pybind11.h>

#include <concepts>
#include <cstddef>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "python/Construction.h"

namespace wordcatcher::python {

namespace py = pybind11;

// Python objects are made of a record's fields when they are asked for, so that a result of many
// matches costs little until somebody looks at it.

inline py::object toPython(bool value) { return py::bool_(value); }

template <std::integral Integer>
py::object toPython(Integer value) {
  return py::int_(value);
}

/// Classic tables hold whatever bytes they were given.
inline py::object toPython(const std::string& utf8) {
  auto text = py::reinterpret_steal<py::str>(
      PyUnicode_DecodeUTF8(utf8.data(), static_cast<py::ssize_t>(utf8.size()), "replace"));
  if (!text) {
    throw py::error_already_set();
  }
  return text;
}

template <typename Struct>
requires std::is_class_v<Struct> py::object toPython(const Struct& value) {
  return py::cast(value);
}

template <typename Item>
py::object toPython(const std::vector<Item>& items) {
  py::tuple tuple(items.size());
  for (std::size_t i = 0; i < items.size(); ++i) {
    tuple[i] = toPython(items[i]);
  }
  return tuple;
}

template <typename Value>
void fromPython(py::handle object, Value& value) {
  value = object.cast<Value>();
}

template <typename Item>
void fromPython(py::handle object, std::vector<Item>& items) {
  for (const py::handle item : object.cast<py::tuple>()) {
    fromPython(item, items.emplace_back());
  }
}

/// Throws ValueError when a pickle is not of so many parts.
void checkPickle(const py::tuple& parts, std::size_t count);

/// Throws ValueError for a pickle whose parts are not what they should be.
[[noreturn]] void refusePickle();

/// Lets objects be pickled and copied, as the parts that `take` gives and that `make` takes. They
/// are made anew by a function of the package, not from an object that has no value yet.
template <typename Class, typename Take, typename Make>
void definePickle(py::class_<Class>& type, Take take, Make make) {
  type.def("__reduce__", [take](const py::object& self) {
    return py::make_tuple(py::module_::import("wordcatcher").attr("_unpickled"),
                          py::make_tuple(py::type::of(self), take(self.cast<const Class&>())));
  });
  type.def_static("_unpickled", [make](const py::tuple& parts) {
    try {
      return make(parts);
    } catch (const py::cast_error&) {
      refusePickle();
    }
  });
}

template <typename Struct, typename Value>
struct Field {
  const char* name;
  Value Struct::*member;
  const char* doc;
};

template <typename Struct, typename Value>
Field(const char*, Value Struct::*, const char*) -> Field<Struct, Value>;

/// Binds a struct as an immutable Python class, whose objects are made as `construction` says: its
/// fields are properties; it is compared, hashed, shown, pickled and matched by them.
template <typename Struct, typename... Values>
py::class_<Struct> bindRecord(py::module_& module, const char* name, const char* doc,
                              const py::custom_type_setup& construction,
                              Field<Struct, Values>... fields) {
  py::class_<Struct> type(module, name, py::is_final(), construction, doc);
  const auto values = [fields...](const Struct& self) {
    return py::make_tuple(toPython(self.*fields.member)...);
  };
  (type.def_property_readonly(
       fields.name, [fields](const Struct& self) { return toPython(self.*fields.member); },
       fields.doc),
   ...);
  type.attr("__match_args__") = py::make_tuple(fields.name...);
  type.def("__repr__", [values, names = std::vector<std::string>{fields.name...},
                        name = std::string(name)](const Struct& self) {
    const py::tuple shown = values(self);
    std::string text = name + '(';
    for (std::size_t i = 0; i < names.size(); ++i) {
      text += (i > 0 ? ", " : "") + names[i] + '=' + std::string(py::repr(shown[i]));
    }
    return text + ')';
  });
  type.def("__eq__", [values](const Struct& self, const py::object& other) -> py::object {
    if (!py::isinstance<Struct>(other)) {
      return py::reinterpret_borrow<py::object>(Py_NotImplemented);
    }
    return py::bool_(values(self).equal(values(other.cast<const Struct&>())));
  });
  type.def("__hash__", [values](const Struct& self) { return py::hash(values(self)); });
  definePickle(type, values, [fields...](const py::tuple& parts) {
    checkPickle(parts, sizeof...(Values));
    Struct value{};
    std::size_t at = 0;
    (fromPython(parts[at++], value.*fields.member), ...);
    return value;
  });
  return type;
}

/// The same for a struct that only the library makes.
template <typename Struct, typename... Values>
py::class_<Struct> bindRecord(py::module_& module, const char* name, const char* doc,
                              Field<Struct, Values>... fields) {
  const std::string sentence =
      "A wordcatcher." + std::string(name) + " is what an index answers; no program makes one.";
  return bindRecord(module, name, doc, Construction<Struct>::refused(sentence), fields...);
}

/// Lets a bound struct with `matches` be used as a sequence of them.
template <typename Result>
void bindSequence(py::class_<Result>& type) {
  type.def("__len__", [](const Result& self) { return self.matches.size(); });
  type.def("__iter__", [](const Result& self) { return py::iter(toPython(self.matches)); });
  type.def("__getitem__", [](const Result& self, py::ssize_t index) {
    const auto size = static_cast<py::ssize_t>(self.matches.size());
    if (index < -size || index >= size) {
      throw py::index_error("There is no match of that number.");
    }
    return toPython(self.matches[static_cast<std::size_t>(index < 0 ? index + size : index)]);
  });
  type.def("__getitem__", [](const Result& self, const py::slice& slice) -> py::object {
    return toPython(self.matches)[slice];
  });
}

}  // namespace wordcatcher::python

#endif
