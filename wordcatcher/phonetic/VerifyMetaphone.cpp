#include "wordcatcher/phonetic/VerifyMetaphone.h"

#include <stdexcept>
#include <string_view>
#include <utility>

#include "wordcatcher/log/LogLine.h"
#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

constexpr int kPieceLength = 4095;

struct Expectation {
  std::u16string_view word;
  std::u16string_view code;
};

Expectation expectationOf(std::u16string_view line) {
  const std::size_t comma = line.find(u',');
  if (comma == std::u16string_view::npos) {
    throw std::runtime_error(
        "there is no comma; write each line as word,CODE and end the last one without a newline.");
  }
  const std::u16string_view rest = line.substr(comma + 1);
  return {line.substr(0, comma), rest.substr(0, rest.find(u','))};
}

std::u16string_view trimmed(std::u16string_view code) {
  const std::size_t first = code.find_first_not_of(u' ');
  return first == std::u16string_view::npos
             ? std::u16string_view()
             : code.substr(first, code.find_last_not_of(u' ') - first + 1);
}

void verify(KXMetaphone& encoder, const Expectation& expectation) {
  const std::u16string codes = encoder.translate(expectation.word);
  const std::u16string_view code = trimmed(codes);
  const bool contained = code.find(expectation.code) != std::u16string_view::npos;
  logLine(R"(%@: "%@" -> "%@" == "%@")", {std::string_view(contained ? "pass" : "FAIL"),
                                          expectation.word, code, expectation.code});
}

void verifyLine(KXMetaphone& encoder, std::FILE* expectations) {
  const std::u16string line = readLineAsKXString(expectations);
  if (std::ferror(expectations) != 0) {
    throw std::runtime_error(
        "the file cannot be read any further; check that it is a file, not a directory, and that "
        "its disk is sound, and try again.");
  }
  verify(encoder, expectationOf(line));
}

}  // namespace

void verifyMetaphone(std::FILE* expectations) {
  KXMetaphone encoder;
  for (int number = 1; std::feof(expectations) == 0; ++number) {
    try {
      verifyLine(encoder, expectations);
    } catch (const std::runtime_error& error) {
      throw std::runtime_error("Line " + std::to_string(number) + ": " + error.what());
    }
  }
}

std::u16string readLineAsKXString(std::FILE* stream) {
  std::string bytes;
  int count = 0;
  bool inPieces = false;
  for (char piece[kPieceLength + 1]; std::fscanf(stream, "%4095[^\n]%n%*c", piece, &count) == 1;) {
    bytes += piece;
    if (count < kPieceLength) {
      break;
    }
    inPieces = true;
  }
  if (inPieces) {
    // The byte that was dropped may have been one of several of its character.
    return decodeUtf8(bytes);
  }
  if (auto line = fromUtf8(bytes)) {
    return *std::move(line);
  }
  throw std::runtime_error("the text is not UTF-8; convert the file.");
}

}  // namespace wordcatcher
