#ifndef WORDCATCHER_PYTHON_NAMES_H
#define WORDCATCHER_PYTHON_NAMES_H

#include <string>

#include "wordcatcher/Error.h"
#include "wordcatcher/matcher/Find.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::python {

// What Python calls the values of enumerations. A name that there is not throws
// pybind11::value_error, which tells the ones that there are.

MatchingMode modeNamed(const std::string& name);
std::string nameOf(MatchingMode mode);

Overlaps overlapsNamed(const std::string& name);

std::string nameOf(ErrorCode code);

}  // namespace wordcatcher::python

#endif
