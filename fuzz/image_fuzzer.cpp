// Searches an image of any bytes, and finds phrases in it: an Error or an answer, within time and
// memory that are linear in the image. An input is
//
//     one byte of flags, from bit 0 on:
//         whether the checksums are made right
//         whether verify() comes first
//         what becomes of overlaps, 2 bits, modulo 3
//         whether swaps are one edit
//         whether budgets are small
//         whether the text goes on with the phrase of a value
//         whether that is written in one word
//     one byte: the distance of a search, 3 bits; the least number of words less 1, 2 bits
//     one byte: the edits of short, medium and long words and of numbers, 2 bits each
//     one byte: the number of the value, modulo all
//     one byte, modulo 8: 0 for any cost, or n for costs up to 2^n - 2
//     one byte: the length of the text in code units
//     the text, UTF-16, little-endian
//     the image
//
// The corpus is written by `search_image_test` (see tests/SearchImageTest.cpp).

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

#include "ForgedImage.h"
#include "HostileFind.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/storage/PhraseWords.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/text/Unicode.h"

namespace {

using wordcatcher::Error;
using wordcatcher::ErrorCode;
using wordcatcher::FindOptions;
using wordcatcher::Index;
using wordcatcher::SearchImage;
using wordcatcher::testing::ImageBytes;
using wordcatcher::testing::Question;

/// What stands before the text in an input.
struct Head {
  std::uint8_t flags;
  std::uint8_t distanceAndWords;
  std::uint8_t edits;
  std::uint8_t value;
  std::uint8_t cost;
  std::uint8_t textUnits;

  bool makesChecksumsRight() const { return (flags & 1U) != 0; }
  bool verifiesFirst() const { return (flags & 2U) != 0; }
  bool hasSmallBudgets() const { return (flags & 0x20U) != 0; }
  bool appendsPhrase() const { return (flags & 0x40U) != 0; }
  bool joinsPhrase() const { return (flags & 0x80U) != 0; }
  std::int64_t distance() const { return distanceAndWords % 8; }

  FindOptions findOptions() const {
    FindOptions options;
    options.overlaps = static_cast<wordcatcher::Overlaps>((flags >> 2U) % 4 % 3);
    options.transpositions = (flags & 0x10U) != 0;
    options.minWords = 1 + (distanceAndWords >> 3U) % 4;
    options.edits.shortEdits = edits % 4;
    options.edits.mediumEdits = (edits >> 2U) % 4;
    options.edits.longEdits = (edits >> 4U) % 4;
    options.edits.wholeTextEdits = options.edits.longEdits;
    options.edits.numberEdits = edits >> 6U;
    if (cost % 8 != 0) {
      options.maxCost = (std::uint64_t{1} << cost % 8) - 2;
    }
    options.limit = hasSmallBudgets() ? 2 : 10;
    options.maxPostings = hasSmallBudgets() ? 20 : 10000;
    return options;
  }

  Index::Options indexOptions() const {
    Index::Options options;
    if (hasSmallBudgets()) {
      options.maxQueryWords = 4;
      options.maxWordUnits = 12;
    }
    return options;
  }
};

void require(bool holds) {
  if (!holds) {
    std::abort();
  }
}

/// Reads everything that the answers lead to.
void ask(const SearchImage& image, std::u16string_view query, std::int64_t distance) {
  const auto hits = wordcatcher::searchImage(image, query, distance);
  require(hits.size() <= image.wordCount());
  std::uint64_t values = 0;
  for (const auto& hit : hits) {
    require(hit.distance <= distance);
    require(image.textOf(hit.word, hit.length).size() == hit.length);
    for (const std::uint32_t value : image.postingsOf(hit.word)) {
      require(image.valueText(value).size() <= image.bytes().size());
      image.countedWordsOf(value);
    }
    values += hit.values;
  }
  require(values <= image.postingCount());
  require(wordcatcher::testing::queriesWithinBounds(image, query, distance));
  require(wordcatcher::testing::findsWithinBounds(image, query, distance));
}

/// The words of a value's first phrase: no mutation of a text comes upon them when those of the
/// image have changed.
std::u16string phraseOf(const SearchImage& image, std::uint32_t value, bool joined) {
  constexpr std::size_t kMostUnits = 1000;
  std::u16string text;
  for (const std::uint32_t word : wordcatcher::image::firstPhrase(image.phrasesOf(value))) {
    if (text.size() > kMostUnits) {
      break;
    }
    if (!joined || text.empty()) {
      text += u' ';
    }
    text += image.textOf(word & ~wordcatcher::image::kPhraseEnd);
  }
  return text;
}

/// What an index of the image is asked.
Question questionOf(const SearchImage& image, const Head& head, std::u16string text) {
  Question question;
  question.options = head.findOptions();
  if (image.valueCount() > 0) {
    const std::uint32_t value = head.value % image.valueCount();
    question.value = image.valueText(value);
    if (head.appendsPhrase()) {
      text += phraseOf(image, value, head.joinsPhrase());
    }
  }
  question.text = wordcatcher::displayUtf8(text);
  return question;
}

/// A whole image answers: nothing is found out about it later.
void examine(const ImageBytes& bytes, const Head& head, const std::u16string& text) {
  bool verified = false;
  try {
    const auto image = SearchImage::fromBytes(bytes);
    if (head.verifiesFirst()) {
      image->verify();
      verified = true;
    }
    const Question question = questionOf(*image, head, text);
    const Index index = wordcatcher::testing::openIndex(bytes, head.indexOptions());
    require(wordcatcher::testing::faultOfAnswers(index, question, verified).empty());
    ask(*image, text, head.distance());
  } catch (const Error& error) {
    require(!verified);
    require(error.code() == ErrorCode::damaged || error.code() == ErrorCode::notAnIndex);
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Head head = {};
  if (size < sizeof head) {
    return 0;
  }
  std::memcpy(&head, data, sizeof head);
  std::u16string text(head.textUnits, u'\0');
  if (size - sizeof head < 2 * text.size()) {
    return 0;
  }
  if (!text.empty()) {
    std::memcpy(text.data(), data + sizeof head, 2 * text.size());
  }
  const auto* const first =
      reinterpret_cast<const std::byte*>(data + sizeof head + 2 * text.size());
  const auto* const last = reinterpret_cast<const std::byte*>(data + size);
  ImageBytes bytes(first, last);
  if (head.makesChecksumsRight()) {
    // The length as well: it changes with every input.
    const std::uint64_t length = bytes.size();
    if (length >= sizeof(wordcatcher::image::Header)) {
      std::memcpy(bytes.data() + offsetof(wordcatcher::image::Header, fileBytes), &length,
                  sizeof length);
    }
    wordcatcher::testing::forgeChecksums(bytes);
  }
  examine(bytes, head, text);
  return 0;
}
