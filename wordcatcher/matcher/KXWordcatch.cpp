#include "wordcatcher/matcher/KXWordcatch.h"

#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {

std::u16string KXWordcatch::description() const {
  return u"{KXWordcatch v:\"" + _value + u"\", dist: " + textForm(_distance) + u'}';
}

std::ostream& operator<<(std::ostream& stream, const KXWordcatch& record) {
  return writeUtf8(stream, record.description());
}

}  // namespace wordcatcher
