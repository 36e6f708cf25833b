// Encodes words about as long as the lengths that are counted modulo 65,536. Apart from
// translate_fuzzer, because one of them takes as long as hundreds of other texts.
//
// The first byte is a number of code units beyond 65,280; the rest is a text of UTF-16. Its first
// four code units are repeated to that length, and the others follow.

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <string_view>

#include "TranslationCheck.h"

namespace {

constexpr std::size_t kPieceLength = 4;
constexpr std::size_t kShortestRepetition = 65280;

std::u16string repeated(std::u16string_view piece, std::size_t length) {
  std::u16string text;
  text.reserve(length + piece.size());
  while (text.size() < length) {
    text += piece;
  }
  text.resize(length);
  return text;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static wordcatcher::KXMetaphone encoder;
  if (size < 1 + sizeof(char16_t)) {
    return 0;
  }
  std::u16string text((size - 1) / sizeof(char16_t), u'\0');
  std::memcpy(text.data(), data + 1, text.size() * sizeof(char16_t));
  const std::size_t pieceLength = std::min(text.size(), kPieceLength);
  const std::u16string word = repeated(text.substr(0, pieceLength), kShortestRepetition + data[0]) +
                              text.substr(pieceLength);
  wordcatcher::testing::checkedCodes(encoder, word);
  return 0;
}
