#include "wordcatcher/storage/StringPool.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

namespace wordcatcher {
namespace {

TEST(StringPoolTest, AStringKeepsItsNumber) {
  StringPool<char16_t> pool;
  EXPECT_EQ(pool.find(u"drau"), std::nullopt);
  EXPECT_EQ(pool.insert(u"drau"), std::make_pair(0U, true));
  EXPECT_EQ(pool.insert(u""), std::make_pair(1U, true));
  EXPECT_EQ(pool.insert(u"mur"), std::make_pair(2U, true));
  EXPECT_EQ(pool.insert(u"drau"), std::make_pair(0U, false));
  EXPECT_EQ(pool.find(u""), 1U);
  EXPECT_EQ(pool.find(u"dra"), std::nullopt);
  EXPECT_EQ(pool[0], u"drau");
  EXPECT_EQ(pool[1], u"");
  EXPECT_EQ(pool[2], u"mur");
  EXPECT_EQ(pool.size(), 3U);
  EXPECT_EQ(pool.characters(), 7U);
}

TEST(StringPoolTest, ManyStringsAreKeptApart) {
  StringPool<char> pool;
  for (unsigned i = 0; i < 20000; ++i) {
    ASSERT_EQ(pool.insert(std::to_string(i * 7919U)), std::make_pair(i, true));
  }
  for (unsigned i = 0; i < 20000; ++i) {
    ASSERT_EQ(pool.find(std::to_string(i * 7919U)), i);
    ASSERT_EQ(pool[i], std::to_string(i * 7919U));
  }
}

RC_GTEST_PROP(StringPoolTest, TruncatingForgetsTheLastAndNothingElse, ()) {
  StringPool<char> pool;
  std::vector<std::string> model;
  for (int step = 0; step < 12; ++step) {
    if (*rc::gen::inRange(0, 4) == 0) {
      const auto size = *rc::gen::inRange<std::size_t>(0, model.size() + 1);
      pool.truncate(static_cast<std::uint32_t>(size));
      model.resize(size);
    }
    const auto count = *rc::gen::inRange(0, 30);
    for (int i = 0; i < count; ++i) {
      const auto string = std::to_string(*rc::gen::inRange(0, 200));
      const auto known = std::find(model.begin(), model.end(), string);
      const auto number = static_cast<std::uint32_t>(known - model.begin());
      RC_ASSERT(pool.insert(string) == std::make_pair(number, known == model.end()));
      if (known == model.end()) {
        model.push_back(string);
      }
    }
    RC_ASSERT(pool.size() == model.size());
    for (int i = 0; i < 200; ++i) {
      const auto string = std::to_string(i);
      const auto known = std::find(model.begin(), model.end(), string);
      RC_ASSERT(pool.find(string).has_value() == (known != model.end()));
    }
  }
  for (std::uint32_t i = 0; i < model.size(); ++i) {
    RC_ASSERT(pool[i] == model[i]);
    RC_ASSERT(pool.find(model[i]) == i);
  }
}

}  // namespace
}  // namespace wordcatcher
