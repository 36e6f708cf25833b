#ifndef WORDCATCHER_PYTHON_CALL_H
#define WORDCATCHER_PYTHON_CALL_H

#include <pybind11/pybind11.h>

#include <string>
#include <vector>

namespace wordcatcher::python {

namespace py = pybind11;

/// What a method takes: its own parameters, by place or by name, and whether options by name.
struct Parameters {
  std::string method;
  std::vector<std::string> names;
  std::size_t required;
  bool options = false;
};

/// The arguments of one call of a method. pybind11 would refuse wrong ones with a list of the
/// binding's signatures, in which nobody finds what to change; here each is refused by a TypeError
/// of one sentence.
class Call {
 public:
  /// Throws TypeError for too many arguments, for one that is given twice or not at all, and for
  /// a name that there is not, save where the method has options: findOptions() judges their names.
  Call(const Parameters& parameters, const py::args& byPlace, const py::kwargs& byName);

  /// The argument, or `otherwise` where it was left out.
  py::object get(const std::string& name, const py::object& otherwise) const;

  /// The argument, which is required to be there. Throws TypeError for what is no str.
  py::str text(const std::string& name) const;

  /// Those given by name that are none of the method's own parameters.
  py::kwargs options() const;

 private:
  py::dict _arguments;
  py::kwargs _options;
};

/// A method of a bound class whose `function` takes the object and the Call.
template <typename Self, typename Result>
auto method(Parameters parameters, Result (*function)(Self&, const Call&)) {
  return [parameters = std::move(parameters), function](Self& self, const py::args& byPlace,
                                                        const py::kwargs& byName) -> Result {
    return function(self, Call(parameters, byPlace, byName));
  };
}

/// A name that an argument was given by. Lone surrogates, which no parameter's has, are escaped.
std::string parameterName(const py::handle& name);

/// The name of an object's class, for sentences.
std::string typeName(const py::handle& object);

}  // namespace wordcatcher::python

#endif
