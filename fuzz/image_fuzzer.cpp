// Searches an image of any bytes, and finds phrases in it: an Error or an answer, within time and
// memory that are linear in the image. An input is
//
//     one byte: bit 0 says whether the checksums are made right, bit 1 whether verify() comes first
//     one byte: the distance, modulo 8
//     one byte: the length of the query in code units
//     the query, UTF-16, little-endian
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
#include "wordcatcher/storage/SearchImage.h"

namespace {

using wordcatcher::Error;
using wordcatcher::ErrorCode;
using wordcatcher::SearchImage;

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

/// A whole image answers: nothing is found out about it later.
void examine(const wordcatcher::testing::ImageBytes& bytes, std::u16string_view query,
             std::int64_t distance, bool verifyFirst) {
  bool verified = false;
  try {
    const auto image = SearchImage::fromBytes(bytes);
    if (verifyFirst) {
      image->verify();
      verified = true;
    }
    ask(*image, query, distance);
  } catch (const Error& error) {
    require(!verified);
    require(error.code() == ErrorCode::damaged || error.code() == ErrorCode::notAnIndex);
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  constexpr std::size_t kHead = 3;
  if (size < kHead || size - kHead < 2 * std::size_t{data[2]}) {
    return 0;
  }
  std::u16string query(data[2], u'\0');
  if (!query.empty()) {
    std::memcpy(query.data(), data + kHead, 2 * query.size());
  }
  const auto* const first = reinterpret_cast<const std::byte*>(data + kHead + 2 * query.size());
  const auto* const last = reinterpret_cast<const std::byte*>(data + size);
  wordcatcher::testing::ImageBytes bytes(first, last);
  if ((data[0] & 1U) != 0) {
    // The length as well: it changes with every input.
    const std::uint64_t length = bytes.size();
    if (length >= sizeof(wordcatcher::image::Header)) {
      std::memcpy(bytes.data() + offsetof(wordcatcher::image::Header, fileBytes), &length,
                  sizeof length);
    }
    wordcatcher::testing::forgeChecksums(bytes);
  }
  examine(bytes, query, data[1] % 8, (data[0] & 2U) != 0);
  return 0;
}
