#ifndef WORDCATCHER_FUZZ_TRANSLATIONCHECK_H
#define WORDCATCHER_FUZZ_TRANSLATIONCHECK_H

#include <cstdlib>
#include <string>

#include "CodeBounds.h"
#include "wordcatcher/phonetic/KXMetaphone.h"

namespace wordcatcher::testing {

inline void require(bool holds) {
  if (!holds) {
    std::abort();
  }
}

/// Encodes a text, and all of it as one word: the codes are letters of the code and spaces, no more
/// of either than the words allow. Returns the codes of both, one after the other.
inline std::u16string checkedCodes(KXMetaphone& encoder, const std::u16string& text) {
  const std::u16string codes = encoder.translate(text);
  require(within(boundsOfText(text), codes));
  const std::u16string code = encoder._translateWord(text);
  require(within(boundsOfWord(text), code));
  return codes + code;
}

}  // namespace wordcatcher::testing

#endif
