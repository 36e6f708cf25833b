// docs/search-image.md shows a real image: one made here is the same, byte by byte.

#include <gtest/gtest.h>

#include <algorithm>
#include <iomanip>
#include <sstream>

#include "SampleImages.h"
#include "TestSupport.h"

namespace wordcatcher {
namespace {

/// Rows of 16 bytes; those of nothing but zeros are left out.
std::string dumpOf(std::span<const std::byte> bytes, std::size_t first, std::size_t last) {
  constexpr std::size_t kRowBytes = 16;
  std::ostringstream dump;
  dump << std::hex << std::setfill('0');
  for (std::size_t offset = first; offset < last; offset += kRowBytes) {
    const auto row = bytes.subspan(offset, std::min(kRowBytes, last - offset));
    if (std::all_of(row.begin(), row.end(), [](std::byte b) { return b == std::byte{0}; })) {
      continue;
    }
    dump << std::setw(8) << offset << ' ';
    for (const std::byte byte : row) {
      dump << ' ' << std::setw(2) << std::to_integer<unsigned>(byte);
    }
    dump << '\n';
  }
  return dump.str();
}

TEST(SearchImagePageTest, ShowsAnImageAsItIsWritten) {
  const testing::ImageBytes bytes = testing::exampleImage();
  const std::string page = testing::readFile(WORDCATCHER_SOURCE_DIR "/docs/search-image.md");
  const std::size_t tableEnd = image::headerBytes(image::kSectionKinds);
  const std::size_t sections = testing::sectionTable(bytes)[0].offset;
  for (const auto& [first, last] : {std::pair<std::size_t, std::size_t>{0, sizeof(image::Header)},
                                    {sizeof(image::Header), tableEnd},
                                    {sections, bytes.size()}}) {
    const std::string dump = dumpOf(bytes, first, last);
    EXPECT_NE(page.find("```hexdump\n" + dump + "```\n"), std::string::npos) << "is now\n" << dump;
  }
}

}  // namespace
}  // namespace wordcatcher
