#include "wordcatcher/storage/SearchImageWriter.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "wordcatcher/Error.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {
namespace {

template <typename Call>
ErrorCode codeOf(Call call) {
  try {
    call();
  } catch (const Error& error) {
    return error.code();
  }
  return ErrorCode{};
}

/// All of an image but its generation, as text.
std::string contentOf(const SearchImageWriter& writer) {
  const auto image = SearchImage::fromBytes(writer.finish());
  image->verify();
  std::ostringstream text;
  text << image->header().phraseCount;
  for (std::uint32_t word = 0; word < image->wordCount(); ++word) {
    writeUtf8(text << ' ', image->textOf(word)) << ':';
    for (const std::uint32_t value : image->postingsOf(word)) {
      text << image->valueText(value) << '/' << image->countedWordsOf(value) << ',';
    }
  }
  return text.str();
}

SearchImageWriter threeRivers() {
  SearchImageWriter writer(0);
  writer.addPosting(u"salzach", writer.addValue("Salzach", 1));
  writer.addPosting(u"inn", writer.addValue("Inn", 0));
  writer.addPosting(u"salzach", writer.addValue("Inn", 0));
  writer.addPosting(u"salzach", writer.addValue("Salzach", 1));
  writer.addWord(u"drau");
  writer.countPhrase();
  return writer;
}

TEST(SearchImageWriterTest, WordsAndPostingsComeInOrderAndOnce) {
  EXPECT_EQ(contentOf(threeRivers()), "1 drau: inn:Inn/0, salzach:Inn/0,Salzach/1,");
}

TEST(SearchImageWriterTest, AnImageMayBeMadeAgainAndAfterMoreWasAdded) {
  auto writer = threeRivers();
  const auto before = contentOf(writer);
  EXPECT_EQ(contentOf(writer), before);
  writer.addWord(u"mur");
  EXPECT_EQ(contentOf(writer), "1 drau: inn:Inn/0, mur: salzach:Inn/0,Salzach/1,");
}

TEST(SearchImageWriterTest, TwoImagesOfOneContentDifferInTheirGeneration) {
  const auto writer = threeRivers();
  EXPECT_NE(SearchImage::fromBytes(writer.finish())->header().generation,
            SearchImage::fromBytes(writer.finish())->header().generation);
}

TEST(SearchImageWriterTest, WhatWasAddedSinceAMarkCanBeTakenBack) {
  auto writer = threeRivers();
  const auto before = contentOf(writer);
  const auto mark = writer.mark();
  writer.addPosting(u"drau", writer.addValue("Drau", 1));
  writer.addPosting(u"inn", writer.addValue("Salzach", 1));
  writer.addPosting(u"enns", writer.addValue("Enns", 1));
  writer.countPhrase();
  EXPECT_NE(contentOf(writer), before);
  writer.rollBack(mark);
  EXPECT_EQ(contentOf(writer), before);
  EXPECT_EQ(writer.findValue("Drau"), std::nullopt);
}

TEST(SearchImageWriterTest, BeyondTheLimitNothingIsAdded) {
  SearchImageWriter writer(0, 2);
  writer.addPosting(u"inn", writer.addValue("Inn", 0));
  writer.addPosting(u"mur", writer.addValue("Mur", 0));
  const auto before = contentOf(writer);
  EXPECT_EQ(codeOf([&] { writer.addWord(u"enns"); }), ErrorCode::tooLarge);
  EXPECT_EQ(codeOf([&] { writer.addPosting(u"enns", 0); }), ErrorCode::tooLarge);
  EXPECT_EQ(codeOf([&] { writer.addValue("Enns", 1); }), ErrorCode::tooLarge);
  EXPECT_EQ(contentOf(writer), before);
  writer.addPosting(u"mur", writer.addValue("Inn", 0));
  EXPECT_EQ(contentOf(writer), "0 inn:Inn/0, mur:Inn/0,Mur/0,") << "what is known is no addition";
}

TEST(SearchImageWriterTest, ValuesAreOrderedByTheCodeUnitsOfTheirUtf16Forms) {
  // As UTF-16, U+1F600 is D83D DE00 and comes before U+E000 and U+FF5E; as UTF-8 it comes last.
  const std::vector<std::string> ascending = {
      "",        "a",       "a-b-c-d-e", "a-b-c-d-f", "aé", "a\U0001F600", "a\U0001F600b",
      "a\uE000", "a\uFF5E", "b"};
  SearchImageWriter writer(0);
  for (std::size_t i = 0; i < ascending.size(); ++i) {
    writer.addValue(ascending[i * 7 % ascending.size()], 0);
  }
  const auto image = SearchImage::fromBytes(writer.finish());
  image->verify();
  ASSERT_EQ(image->valueCount(), ascending.size());
  for (std::uint32_t value = 0; value < ascending.size(); ++value) {
    EXPECT_EQ(image->valueText(value), ascending[value]);
  }
}

}  // namespace
}  // namespace wordcatcher
