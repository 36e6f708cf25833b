#include "python/Construction.h"

namespace wordcatcher::python {

namespace {

PyObject* refuseObject(PyTypeObject*, PyObject*, PyObject*) {
  PyErr_SetString(PyExc_TypeError, "Only the library makes objects of this class.");
  return nullptr;
}

PyObject* refuseClass(PyTypeObject*, PyObject*, PyObject*) {
  PyErr_SetString(PyExc_TypeError,
                  "No class can be derived from those of wordcatcher; hold an object instead.");
  return nullptr;
}

void fix(PyTypeObject* type) {
  type->tp_flags |= Py_TPFLAGS_IMMUTABLETYPE;
  PyType_Modified(type);
}

/// pybind11's own base and metaclass, which the module shares with no other one (see the
/// CMakeLists.txt): their objects, and those of Python classes derived from them, are no values.
void fixAsRoot(PyTypeObject* type, newfunc refuse) {
  type->tp_new = refuse;
  type->tp_flags &= ~Py_TPFLAGS_BASETYPE;
  fix(type);
}

}  // namespace

void fixClasses(const py::module_& module) {
  for (const auto& [name, value] : module.attr("__dict__").cast<py::dict>()) {
    auto* const type = reinterpret_cast<PyTypeObject*>(value.ptr());
    if (!PyType_Check(value.ptr()) || PyExceptionClass_Check(value.ptr())) {
      continue;
    }
    fix(type);
    fixAsRoot(type->tp_base, &refuseObject);
    fixAsRoot(Py_TYPE(value.ptr()), &refuseClass);
  }
}

}  // namespace wordcatcher::python
