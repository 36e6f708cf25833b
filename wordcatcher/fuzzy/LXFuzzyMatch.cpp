#include "wordcatcher/fuzzy/LXFuzzyMatch.h"

#include <stdexcept>
#include <utility>

#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {

LXFuzzyMatch::LXFuzzyMatch() : _LXdistance(0) {
  throw std::logic_error("Init is not a valid initializer for the class LXFuzzyMatch.");
}

LXFuzzyMatch::LXFuzzyMatch(std::u16string_view value, std::int64_t distance,
                           std::vector<std::u16string> data)
    : _LXdistance(distance), _LXdata(std::move(data)), _LXvalue(value) {}

std::u16string LXFuzzyMatch::description() const {
  std::u16string list = u"(";
  for (const auto& entry : _LXdata) {
    list += (list.size() > 1 ? u", " : u"") + entry;
  }
  return u"{ value: " + _LXvalue + u", distance: " + textForm(_LXdistance) + u", data: " + list +
         u") }";
}

std::ostream& operator<<(std::ostream& stream, const LXFuzzyMatch& match) {
  return writeUtf8(stream, match.description());
}

}  // namespace wordcatcher
