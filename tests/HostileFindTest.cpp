// Texts and images that are made to let a search for phrases run away.

#include <gtest/gtest.h>

#include <numeric>
#include <string>

#include "ForgedImage.h"
#include "TestSupport.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/fuzzy/NearWords.h"
#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher {
namespace {

using image::SectionKind;
using testing::ForgedImage;
using testing::ImageBytes;
using testing::TemporaryDirectory;

constexpr std::uint32_t kRivers = 40;

std::string repeated(std::string_view piece, std::size_t times) {
  std::string text;
  for (; times > 0; --times) {
    text += piece;
  }
  return text;
}

class HostileFindTest : public ::testing::Test {
 protected:
  std::string path() const { return directory.file("names.wci"); }

  /// "river ab", "river ac" ...: each of the 41 words has a value, one has all.
  ForgedImage rivers() const {
    IndexBuilder builder(path());
    for (std::uint32_t i = 0; i < kRivers; ++i) {
      const std::string name = {'r', static_cast<char>('a' + i % 20),
                                static_cast<char>('a' + i / 20)};
      builder.add("river " + name, name);
    }
    builder.commit();
    const std::string bytes = testing::readFile(path());
    const auto view = std::as_bytes(std::span(bytes));
    return ForgedImage(ImageBytes(view.begin(), view.end()));
  }

  Index open(const ForgedImage& forged) const {
    const auto bytes = forged.bytes();
    testing::writeFile(path(), {reinterpret_cast<const char*>(bytes.data()), bytes.size()});
    return Index::open(path());
  }

  /// Every second element 0, and the others `end`: ranges that begin at an even place are whole.
  template <typename Element>
  static void makeRangesWhole(ForgedImage& forged, SectionKind offsets, std::size_t end) {
    auto numbers = forged.get<Element>(offsets);
    for (std::size_t i = 0; i < numbers.size(); ++i) {
      numbers[i] = static_cast<Element>(i % 2 == 0 ? 0 : end);
    }
    forged.set(offsets, numbers);
  }

  /// Has both trees lead to words of even numbers only.
  static void leadToEvenWords(ForgedImage& forged) {
    auto order = forged.get<std::uint32_t>(SectionKind::backwardOrder);
    for (std::uint32_t place = 0; place < order.size(); ++place) {
      order[place] = place & ~1U;
    }
    forged.set(SectionKind::forwardOrder, order);
    forged.set(SectionKind::backwardOrder, order);
  }

  static std::string damageFoundBy(const std::function<void()>& call) {
    try {
      call();
    } catch (const Error& error) {
      EXPECT_EQ(error.code(), ErrorCode::damaged);
      return error.what();
    }
    return "nothing";
  }

  TemporaryDirectory directory;
};

TEST_F(HostileFindTest, AFoundPhraseHasItsPairsWhenTheBudgetIsUsedUp) {
  IndexBuilder builder(path());
  builder.add(repeated("duran ", 60), "many");
  builder.add("duranduran duran", "joined");
  builder.add("duran bar", "few");
  builder.commit();
  const Index index = Index::open(path());
  std::size_t matches = 0;
  for (const std::size_t words : {3U, 20U, 50U, 100U}) {
    const std::string text = repeated("duran durane ", words / 2);
    for (const std::uint64_t postings : {10U, 100U, 1000U, 10000U, 100000U}) {
      FindOptions options;
      options.maxPostings = postings;
      const auto result = index.find(text, options);
      matches += result.matches.size();
      for (const auto& match : result.matches) {
        ASSERT_FALSE(match.hits.empty()) << match.value << " in " << text;
        EXPECT_EQ(match.begin, match.hits.front().begin);
        EXPECT_EQ(match.end, match.hits.back().end);
      }
    }
  }
  EXPECT_GT(matches, 20U);
}

TEST_F(HostileFindTest, WordsThatRepeatEachOtherAreNotMultiplied) {
  // Many words in one leaf of either tree, all of them a beginning and an end of the same word.
  constexpr std::uint32_t kWords = 600000;
  auto forged = rivers();
  const auto labels = forged.get<std::uint16_t>(SectionKind::labels);
  const auto label = static_cast<std::uint16_t>(
      std::find(labels.begin(), labels.end(), std::uint16_t{'a'}) - labels.begin());
  std::vector<std::uint32_t> numbers(kWords + 1);
  std::iota(numbers.begin(), numbers.end(), 0U);
  forged.set(SectionKind::wordOffsets, numbers);
  forged.set(SectionKind::wordText,
             std::vector<std::uint8_t>(kWords, static_cast<std::uint8_t>(label)));
  forged.set(SectionKind::postingOffsets, std::vector<std::uint32_t>(kWords + 1));
  numbers.pop_back();
  forged.set(SectionKind::backwardOrder, numbers);
  const image::TreeSlot root = {
      .children = std::uint64_t{1} << label, .target = 1, .shortest = 0, .longest = 0, .label = 0};
  const image::TreeSlot leaf = {.children = kWords,
                                .target = image::TreeSlot::kLeaf | image::TreeSlot::kLastChild,
                                .shortest = 0,
                                .longest = 0,
                                .label = label};
  forged.set(SectionKind::forwardTree, std::vector<image::TreeSlot>{root, leaf});
  forged.set(SectionKind::backwardTree, std::vector<image::TreeSlot>{root, leaf});
  forged.header().wordCount = kWords;
  // Beyond the time that a test has if each beginning meets each end.
  const auto image = SearchImage::fromBytes(forged.bytes());
  EXPECT_TRUE(wordsJoinedIn(*image, u"aaa", Seam::none).empty());
  EXPECT_EQ(wordsJoinedIn(*image, u"aaa", Seam::unit).size(), 1U);
  EXPECT_TRUE(open(forged).find("aaa").matches.empty());
}

TEST_F(HostileFindTest, OverlappingPostingListsAreDamage) {
  auto forged = rivers();
  makeRangesWhole<std::uint32_t>(forged, SectionKind::postingOffsets, kRivers);
  leadToEvenWords(forged);
  const Index index = open(forged);
  EXPECT_NE(damageFoundBy([&] { index.find("rab rbb rcb rdb"); }).find("posting lists overlap"),
            std::string::npos);
}

TEST_F(HostileFindTest, OverlappingPhrasesAreDamage) {
  auto forged = rivers();
  const auto words = forged.get<std::uint32_t>(SectionKind::phraseWords).size();
  makeRangesWhole<std::uint32_t>(forged, SectionKind::phraseOffsets, words);
  auto postings = forged.get<std::uint32_t>(SectionKind::postings);
  for (auto& value : postings) {
    value &= ~1U;
  }
  forged.set(SectionKind::postings, postings);
  const Index index = open(forged);
  EXPECT_NE(damageFoundBy([&] { index.find("river"); }).find("phrases overlap"), std::string::npos);
}

TEST_F(HostileFindTest, WordsThatAreNotAsLongAsTheTreeSaysAreDamage) {
  auto forged = rivers();
  makeRangesWhole<std::uint32_t>(forged, SectionKind::wordOffsets,
                                 forged.get<std::uint8_t>(SectionKind::wordText).size());
  leadToEvenWords(forged);
  const Index index = open(forged);
  EXPECT_NE(damageFoundBy([&] { index.search("rxb", 2); }).find("length"), std::string::npos);
  EXPECT_NE(damageFoundBy([&] { index.find("rxbb"); }).find("as long as"), std::string::npos);
}

}  // namespace
}  // namespace wordcatcher
