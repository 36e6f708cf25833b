#ifndef WORDCATCHER_PYTHON_CONSTRUCTION_H
#define WORDCATCHER_PYTHON_CONSTRUCTION_H

#include <pybind11/pybind11.h>

#include <string>

namespace wordcatcher::python {

namespace py = pybind11;

/// How Python makes objects of a bound class. With pybind11's own two steps, __new__ and __init__,
/// there are objects without a value after the first one, which every method would read as if it
/// were there. Here __new__ makes a whole object or raises, and __init__ does nothing.
template <typename Class>
class Construction {
 public:
  /// `make` takes the arguments of a call of the class and gives the object. Once for each class.
  static py::custom_type_setup by(py::cpp_function make) {
    _make = make.release().ptr();
    return py::custom_type_setup([](PyHeapTypeObject* type) {
      type->ht_type.tp_new = [](PyTypeObject*, PyObject* byPlace, PyObject* byName) {
        return PyObject_Call(_make, byPlace, byName);
      };
      type->ht_type.tp_init = [](PyObject*, PyObject*, PyObject*) { return 0; };
    });
  }

  /// Nobody but the library makes objects of the class: a call of it raises TypeError.
  static py::custom_type_setup refused(const std::string& sentence) {
    return by(py::cpp_function([sentence](const py::args&, const py::kwargs&) -> py::object {
      throw py::type_error(sentence);
    }));
  }

 private:
  // As the module is never unloaded, it lives until the process ends.
  static inline PyObject* _make = nullptr;
};

/// Makes the module's classes, once they are whole, as fixed as those that are built into Python.
/// Otherwise a program could give a class back the __new__ that makes objects without a value, or
/// give an object the class of another kind of value (obj.__class__ = Index).
void fixClasses(const py::module_& module);

}  // namespace wordcatcher::python

#endif
