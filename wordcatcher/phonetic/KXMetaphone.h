#ifndef WORDCATCHER_PHONETIC_KXMETAPHONE_H
#define WORDCATCHER_PHONETIC_KXMETAPHONE_H
#include <string>
#include <string_view>
#include "wordcatcher/Export.h"
namespace wordcatcher {
class WORDCATCHER_EXPORT KXMetaphone {
 public:
  std::u16string translate(std::u16string_view text);
};
}  // namespace wordcatcher
#endif
