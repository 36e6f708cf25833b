#include "python/Names.h"

#include <pybind11/pybind11.h>

#include <array>

namespace wordcatcher::python {

namespace {

template <typename Enum>
struct Name {
  const char* name;
  Enum value;
};

constexpr std::array kModes{
    Name<MatchingMode>{"words", MatchingMode::words},
    Name<MatchingMode>{"text", MatchingMode::wholeText},
    Name<MatchingMode>{"phonetic", MatchingMode::phoneticWords},
};

constexpr std::array kOverlaps{
    Name<Overlaps>{"all", Overlaps::all},
    Name<Overlaps>{"no_sub", Overlaps::noSub},
    Name<Overlaps>{"longest", Overlaps::longest},
};

constexpr std::array kErrors{
    Name<ErrorCode>{"not_found", ErrorCode::notFound},
    Name<ErrorCode>{"not_readable", ErrorCode::notReadable},
    Name<ErrorCode>{"not_writable", ErrorCode::notWritable},
    Name<ErrorCode>{"not_an_index", ErrorCode::notAnIndex},
    Name<ErrorCode>{"damaged", ErrorCode::damaged},
    Name<ErrorCode>{"bad_input", ErrorCode::badInput},
    Name<ErrorCode>{"too_large", ErrorCode::tooLarge},
};

template <typename Names>
auto named(const Names& names, const char* parameter, const std::string& given) {
  std::string known;
  for (const auto& each : names) {
    if (given == each.name) {
      return each.value;
    }
    known += std::string(known.empty() ? "'" : ", '") + each.name + "'";
  }
  throw pybind11::value_error(std::string(parameter) + " is one of " + known + ", not '" + given +
                              "'");
}

/// A library that is newer than this module may have values without a name here.
template <typename Names, typename Enum>
std::string nameIn(const Names& names, Enum value) {
  for (const auto& each : names) {
    if (value == each.value) {
      return each.name;
    }
  }
  return std::to_string(static_cast<int>(value));
}

}  // namespace

MatchingMode modeNamed(const std::string& name) { return named(kModes, "mode", name); }
std::string nameOf(MatchingMode mode) { return nameIn(kModes, mode); }
Overlaps overlapsNamed(const std::string& name) { return named(kOverlaps, "overlaps", name); }
std::string nameOf(ErrorCode code) { return nameIn(kErrors, code); }

}  // namespace wordcatcher::python
