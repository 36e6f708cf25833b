#include "wordcatcher/text/CodeUnitOrder.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

struct Text {
  std::u16string units;
  std::string bytes;
};

/// Every string of up to three of the code points at which the encodings change their length, or
/// at which the order of bytes and the order of code units part.
std::vector<Text> textsAroundTheBorders() {
  std::vector<Text> texts = {{}};
  std::size_t first = 0;
  for (int length = 1; length <= 3; ++length) {
    for (const std::size_t end = texts.size(); first < end; ++first) {
      for (const std::u16string_view point :
           {u"\u0001", u"\u007F", u"\u0080", u"\u07FF", u"\u0800", u"\uD7FF", u"\uE000", u"\uFFFF",
            u"\U00010000", u"\U00010400", u"\U000FFFFF", u"\U0010FFFF"}) {
        const std::u16string units = texts[first].units + std::u16string(point);
        texts.push_back({units, toUtf8(units).value()});
      }
    }
  }
  return texts;
}

TEST(CodeUnitOrderTest, IsTheOrderOfUtf16) {
  const auto texts = textsAroundTheBorders();
  ASSERT_EQ(texts.size(), 1U + 12 + 144 + 1728);
  for (const Text& a : texts) {
    for (const Text& b : texts) {
      if (utf16Less(a.bytes, b.bytes) != (a.units < b.units)) {
        FAIL() << a.bytes << " and " << b.bytes;
      }
    }
  }
}

TEST(CodeUnitOrderTest, IsNotTheOrderOfBytes) {
  EXPECT_TRUE(utf16Less("\U00010000", "\uE000"));
  EXPECT_LT(std::string("\uE000"), std::string("\U00010000"));
}

}  // namespace
}  // namespace wordcatcher
