#include "python/Bindings.h"
#include "python/Names.h"
#include "python/Record.h"
#include "wordcatcher/Error.h"

namespace wordcatcher::python {

namespace {

constexpr const char* kErrorDoc =
    R"(What went wrong with an index, as a sentence that says what to do.

The attribute code tells a program what it is about:

"not_found"     There is no such file or directory.
"not_readable"  The file exists and cannot be read or mapped.
"not_writable"  The target cannot be written; what stood there is whole.
"not_an_index"  The file is something else, or of a version that cannot be read.
"damaged"       The file was an index and is cut short or altered.
"bad_input"     A phrase, a text or an option that cannot be taken.
"too_large"     More than the format can count.)";

/// As the module is never unloaded, the class lives until the process ends.
PyObject* errorClass = nullptr;

void raise(const Error& error) {
  try {
    const py::object exception =
        py::handle(errorClass)(toPython(std::string(static_cast<const char*>(error.what()))));
    exception.attr("code") = nameOf(error.code());
    PyErr_SetObject(errorClass, exception.ptr());
  } catch (py::error_already_set& another) {
    another.restore();
  }
}

}  // namespace

void bindError(py::module_& module) {
  errorClass = PyErr_NewExceptionWithDoc("wordcatcher.Error", kErrorDoc, PyExc_Exception, nullptr);
  if (errorClass == nullptr) {
    throw py::error_already_set();
  }
  module.attr("Error") = py::handle(errorClass);
  // pybind11 gives it by value.
  // NOLINTNEXTLINE(performance-unnecessary-value-param)
  py::register_exception_translator([](std::exception_ptr thrown) {
    try {
      if (thrown) {
        std::rethrow_exception(thrown);
      }
    } catch (const Error& error) {
      raise(error);
    }
  });
}

}  // namespace wordcatcher::python
