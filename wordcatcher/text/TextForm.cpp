#include "wordcatcher/text/TextForm.h"

#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

std::u16string textForm(std::string_view utf8) { return fromUtf8(utf8).value_or(u"\uFFFD"); }

std::ostream& writeUtf8(std::ostream& stream, std::u16string_view text) {
  return stream << displayUtf8(text);
}

}  // namespace wordcatcher
