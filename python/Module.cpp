#include "python/Bindings.h"
#include "python/Construction.h"
#include "wordcatcher/Version.h"

PYBIND11_MODULE(_wordcatcher, module) {
  using namespace wordcatcher::python;  // NOLINT(google-build-using-namespace): the macro's scope

  py::options options;
  options.disable_function_signatures();
  module.doc() = "The compiled part of wordcatcher.";
  module.attr("__version__") = wordcatcher::versionString;
  // Hosts, pickles, help() and the sentences of pybind11 know the classes by the package.
  module.attr("__module__") = "wordcatcher";
  bindError(module);
  bindResults(module);
  bindBuilder(module);
  bindIndex(module);
  fixClasses(module);
  py::delattr(module, "__module__");
}
