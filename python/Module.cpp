#include "python/Bindings.h"
#include "wordcatcher/Version.h"

namespace wordcatcher::python {

namespace {

/// Hosts, pickles and help() know the classes by the package.
void moveClassesToPackage(py::module_& module) {
  for (const auto& [name, object] : module.attr("__dict__").cast<py::dict>()) {
    if (py::isinstance<py::type>(object)) {
      object.attr("__module__") = "wordcatcher";
    }
  }
}

}  // namespace

}  // namespace wordcatcher::python

PYBIND11_MODULE(_wordcatcher, module) {
  using namespace wordcatcher::python;  // NOLINT(google-build-using-namespace): the macro's scope

  py::options options;
  options.disable_function_signatures();
  module.doc() = "The compiled part of wordcatcher.";
  module.attr("__version__") = wordcatcher::versionString;
  bindError(module);
  bindResults(module);
  bindBuilder(module);
  bindIndex(module);
  moveClassesToPackage(module);
}
