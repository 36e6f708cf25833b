#include "wordcatcher/text/ByteOffsets.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

/// Each code unit's bytes, decoded by themselves, are that code unit; nothing lies between.
void expectOffsetsOf(const std::string& bytes) {
  const std::u16string units = decodeUtf8(bytes);
  const ByteOffsets offsets(bytes);
  ASSERT_EQ(offsets.of(0), 0U);
  ASSERT_EQ(offsets.of(units.size()), bytes.size());
  for (std::size_t i = 0; i < units.size();) {
    const bool isPair = i + 1 < units.size() && offsets.of(i) == offsets.of(i + 1);
    const std::size_t next = i + (isPair ? 2 : 1);
    ASSERT_LT(offsets.of(i), offsets.of(next));
    ASSERT_EQ(
        decodeUtf8(std::string_view(bytes).substr(offsets.of(i), offsets.of(next) - offsets.of(i))),
        units.substr(i, next - i));
    i = next;
  }
}

TEST(ByteOffsetsTest, OfTextsOfEveryLength) {
  for (const char* text : {"", "Thames", "Rhône", "沖縄県", "😀", "a😀b😀", "e\u0301", "\uFFFD",
                           "\U0010FFFF\U00010000", "\u07FF\u0800\uFFFF"}) {
    expectOffsetsOf(text);
  }
  const ByteOffsets offsets("aé沖😀b");
  std::vector<std::size_t> places;
  for (std::size_t unit = 0; unit <= 6; ++unit) {
    places.push_back(offsets.of(unit));
  }
  EXPECT_EQ(places, (std::vector<std::size_t>{0, 1, 3, 6, 6, 10, 11}));
}

TEST(ByteOffsetsTest, OfIllFormedBytes) {
  for (const char* bytes : {"\xFF", "\x80", "\xC3", "a\xC3", "\xE2\x82", "\xE2\x82z",
                            "\xF0\x9F\x98", "\xF0\x9F\x98é", "\xED\xA0\x80", "\xC0\x80",
                            "\xF5\x80\x80\x80", "\xE2\x28\xA1", "\xF0\x9F\xF0\x9F\x98\x80"}) {
    expectOffsetsOf(bytes);
  }
  expectOffsetsOf(std::string("\0\xFF\0", 3));
}

RC_GTEST_PROP(ByteOffsetsTest, OfAnyBytes, (const std::string& bytes)) {
  expectOffsetsOf(bytes);
  RC_ASSERT(!::testing::Test::HasFailure());
}

RC_GTEST_PROP(ByteOffsetsTest, OfPiecesOfCharacters, ()) {
  const auto byte = rc::gen::element('a', '\xC3', '\xA9', '\xE2', '\x82', '\xAC', '\xF0', '\x9F',
                                     '\x98', '\x80', '\xED', '\xA0');
  expectOffsetsOf(*rc::gen::container<std::string>(byte));
  RC_ASSERT(!::testing::Test::HasFailure());
}

TEST(UnicodeTest, WhatIsLongerThanIcuCountsIsRefusedWithAdvice) {
  constexpr std::size_t kTooLong = std::size_t{1} << 31;
  // Nothing behind the first is read.
  const std::u16string_view units(u"a", kTooLong);
  const std::string_view bytes("a", kTooLong);
  const auto expectRefused = [](const auto& convert) {
    try {
      convert();
      ADD_FAILURE() << "It was taken.";
    } catch (const std::length_error& error) {
      EXPECT_STREQ(
          error.what(),
          "A text must not be longer than 2,147,483,647 code units; give it in shorter pieces.");
    }
  };
  expectRefused([&] { toLower(units); });
  expectRefused([&] { toUpper(units); });
  expectRefused([&] { decodeUtf8(bytes); });
}

}  // namespace
}  // namespace wordcatcher
