#include "wordcatcher/phonetic/KXMetaphone.h"
namespace wordcatcher {
std::u16string KXMetaphone::translate(std::u16string_view text) { return std::u16string(text); }
}  // namespace wordcatcher
