// Encodes any code units: nothing throws, the codes are letters of the code and spaces, no more of
// either than their words allow, and the same text has the same codes again.
//
// The first two bytes are a length, little-endian; the rest is a text of UTF-16. A length of 65,280
// and more puts the first four code units of the text, repeated to that length, before the others:
// so words come to the lengths that are counted modulo 65,536. A smaller length changes nothing.

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>
#include <string_view>

#include "CodeBounds.h"
#include "wordcatcher/phonetic/KXMetaphone.h"

namespace {

constexpr std::size_t kHeaderBytes = 2;
constexpr std::size_t kPieceLength = 4;
constexpr std::size_t kShortestRepetition = 0xFF00;

void require(bool holds) {
  if (!holds) {
    std::abort();
  }
}

std::u16string repeated(std::u16string_view piece, std::size_t length) {
  std::u16string text;
  text.reserve(length + piece.size());
  while (text.size() < length) {
    text += piece;
  }
  text.resize(length);
  return text;
}

std::u16string textOf(const std::uint8_t* data, std::size_t size) {
  if (size < kHeaderBytes + sizeof(char16_t)) {
    return {};
  }
  const std::size_t length = data[0] + std::size_t{data[1]} * 256;
  std::u16string text((size - kHeaderBytes) / sizeof(char16_t), u'\0');
  std::memcpy(text.data(), data + kHeaderBytes, text.size() * sizeof(char16_t));
  if (length < kShortestRepetition) {
    return text;
  }
  const std::size_t pieceLength = std::min(text.size(), kPieceLength);
  return repeated(text.substr(0, pieceLength), length) + text.substr(pieceLength);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using wordcatcher::testing::within;
  static wordcatcher::KXMetaphone encoder;
  const std::u16string text = textOf(data, size);

  const std::u16string codes = encoder.translate(text);
  require(within(wordcatcher::testing::boundsOfText(text), codes));
  require(encoder.translate(text) == codes);

  const std::u16string code = encoder._translateWord(text);
  require(within(wordcatcher::testing::boundsOfWord(text), code));
  require(encoder._translateWord(text) == code);
  return 0;
}
