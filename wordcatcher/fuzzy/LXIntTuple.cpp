#include "wordcatcher/fuzzy/LXIntTuple.h"

#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {

std::u16string LXIntTuple::description() const {
  return u'(' + textForm(_LXindex) + u'_' + textForm(_LXdistance) + u')';
}

std::ostream& operator<<(std::ostream& stream, const LXIntTuple& tuple) {
  return writeUtf8(stream, tuple.description());
}

}  // namespace wordcatcher
