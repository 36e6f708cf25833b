// docs/index-directory.md shows real files: an index made here is the same, byte by byte.

#include <gtest/gtest.h>

#include <iomanip>
#include <sstream>

#include "TestSupport.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

namespace wordcatcher {
namespace {

constexpr std::size_t kHeaderBytes = 2048;
constexpr std::size_t kRowBytes = 16;

/// A row of the header in which both hash tables have no slots says nothing and is not shown.
bool isEmptyHeaderRow(const std::string& row) {
  return row.substr(4, 4) == std::string(4, '\0') && row.substr(12, 4) == std::string(4, '\0');
}

std::string dumpOf(const std::string& bytes) {
  std::ostringstream dump;
  dump << std::hex << std::setfill('0');
  for (std::size_t offset = 0; offset < bytes.size(); offset += kRowBytes) {
    const std::string row = bytes.substr(offset, kRowBytes);
    if (offset < kHeaderBytes && isEmptyHeaderRow(row)) {
      continue;
    }
    dump << std::setw(8) << offset << ' ';
    for (const char byte : row) {
      dump << ' ' << std::setw(2) << static_cast<unsigned>(static_cast<unsigned char>(byte));
    }
    dump << '\n';
  }
  return dump.str();
}

TEST(IndexDirectoryPageTest, ShowsTheFilesAsTheyAreWritten) {
  const testing::TemporaryDirectory directory;
  {
    LXFuzzyIndex index(directory.path());
    index.setMode(2);
    index.addString_withData(u"Ré", u"Ré{ 85 km² }");
    index.addString_withData(u"Re", u"Re");
  }
  const std::string page = testing::readFile(WORDCATCHER_SOURCE_DIR "/docs/index-directory.md");
  for (const std::string name : {"edgeTable.tdb", "finalTable.tdb", "dataTable.tdb"}) {
    const std::string dump = dumpOf(testing::readFile(directory.file(name)));
    std::string section = "### ";
    section.append(name).append("\n\n```hexdump\n").append(dump).append("```\n");
    EXPECT_NE(page.find(section), std::string::npos) << name << " is now\n" << dump;
  }
}

}  // namespace
}  // namespace wordcatcher
