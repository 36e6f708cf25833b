#include "wordcatcher/text/TextForm.h"

#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

std::ostream& writeUtf8(std::ostream& stream, std::u16string_view text) {
  return stream << displayUtf8(text);
}

}  // namespace wordcatcher
