// Opening search images of any kind, and damaged and hostile ones: an Error or an answer, within
// time and memory that are linear in the image.

#include "wordcatcher/storage/SearchImage.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <algorithm>
#include <cstdlib>
#include <functional>
#include <map>
#include <optional>
#include <random>
#include <set>

#include "ForgedImage.h"
#include "HostileFind.h"
#include "SampleImages.h"
#include "TestSupport.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/fuzzy/NearWords.h"
#include "wordcatcher/storage/LeafTails.h"
#include "wordcatcher/storage/SearchImageWriter.h"

namespace wordcatcher {
namespace {

using image::SectionKind;
using image::TreeSlot;
using testing::ForgedImage;
using testing::ImageBytes;
using testing::SampleImage;

std::string asText(const ImageBytes& bytes) {
  return {reinterpret_cast<const char*>(bytes.data()), bytes.size()};
}

/// The code of the Error that an action throws, and nothing when it throws none.
std::optional<ErrorCode> errorOf(const std::function<void()>& action) {
  try {
    action();
  } catch (const Error& error) {
    return error.code();
  }
  return std::nullopt;
}

std::optional<ErrorCode> openError(const ImageBytes& bytes) {
  return errorOf([&bytes] { SearchImage::fromBytes(bytes); });
}

std::optional<ErrorCode> openOrVerifyError(const ImageBytes& bytes) {
  return errorOf([&bytes] { SearchImage::fromBytes(bytes)->verify(); });
}

void flipBit(ImageBytes& bytes, std::size_t bit) {
  bytes[bit / 8] ^= std::byte{1} << static_cast<int>(bit % 8);
}

const std::vector<std::u16string>& someQueries() {
  static const std::vector<std::u16string> queries = {u"rhine",
                                                      u"_o*er",
                                                      u"sa",
                                                      u"abababababab",
                                                      u"\U0001F600",
                                                      std::u16string(258, u'e'),
                                                      u"!eta",
                                                      u"ré",
                                                      u"oder",
                                                      std::u16string(1, 0x4E03),
                                                      u"alaknandaangara",
                                                      u"newzealand aotaeroa new york",
                                                      u"a 12 route 67 duran durane",
                                                      u"река дунаи μαύρηθάλασσα"};
  return queries;
}

/// Asks an image, and looks at all that the answers lead to.
void ask(const SearchImage& image, std::u16string_view query, std::int64_t distance) {
  const auto hits = searchImage(image, query, distance);
  ASSERT_LE(hits.size(), image.wordCount());
  std::uint64_t values = 0;
  for (const WordHit& hit : hits) {
    ASSERT_LE(image.textOf(hit.word).size(), image.unitCount());
    ASSERT_LE(hit.distance, distance);
    const auto postings = image.postingsOf(hit.word);
    ASSERT_EQ(postings.size(), hit.values);
    values += postings.size();
    for (const std::uint32_t value : postings) {
      ASSERT_LE(image.valueText(value).size(), image.bytes().size());
      image.countedWordsOf(value);
    }
  }
  ASSERT_LE(values, image.postingCount());
  ASSERT_TRUE(testing::queriesWithinBounds(image, query, distance));
  ASSERT_TRUE(testing::findsWithinBounds(image, query, distance));
}

/// What became of an image whose bytes were altered: an Error that says so, or answers.
struct Outcome {
  bool opened = false;
  bool answered = false;
};

Outcome examine(const ImageBytes& bytes, std::u16string_view query, std::int64_t distance) {
  Outcome outcome;
  const auto code = errorOf([&] {
    const auto image = SearchImage::fromBytes(bytes);
    outcome.opened = true;
    ask(*image, query, distance);
    outcome.answered = true;
  });
  if (code) {
    EXPECT_TRUE(*code == ErrorCode::damaged || (*code == ErrorCode::notAnIndex && !outcome.opened));
  }
  return outcome;
}

class SearchImageFileTest : public ::testing::TestWithParam<SearchImage::Load> {
 protected:
  std::optional<ErrorCode> openError(const std::string& path) const {
    return errorOf([&] { SearchImage::open(path, GetParam()); });
  }
  std::optional<ErrorCode> errorOfContent(std::string_view bytes) const {
    testing::writeFile(directory.file("image.wci"), bytes);
    return openError(directory.file("image.wci"));
  }

  testing::TemporaryDirectory directory;
};

INSTANTIATE_TEST_SUITE_P(MappedOrCopied, SearchImageFileTest,
                         ::testing::Values(SearchImage::Load::map, SearchImage::Load::copy));

TEST_P(SearchImageFileTest, OpensWhatWasWritten) {
  const ImageBytes bytes = testing::riverImage();
  testing::writeFile(directory.file("rivers.wci"), asText(bytes));
  const auto image = SearchImage::open(directory.file("rivers.wci"), GetParam());
  std::filesystem::remove(directory.file("rivers.wci"));  // what is open stays open
  image->verify();
  EXPECT_EQ(image->wordCount(), 18U);
  EXPECT_TRUE(std::equal(image->bytes().begin(), image->bytes().end(), bytes.begin(), bytes.end()));
  const auto hits = searchImage(*image, u"rhei", 1);
  ASSERT_EQ(hits.size(), 1U);
  EXPECT_EQ(image->textOf(hits[0].word), u"rhein");
  EXPECT_EQ(image->valueText(image->postingsOf(hits[0].word)[2]), "Rijn");
}

TEST_P(SearchImageFileTest, TellsWhatCannotBeOpened) {
  EXPECT_EQ(openError(directory.file("missing.wci")), ErrorCode::notFound);
  EXPECT_EQ(openError(directory.file("missing/image.wci")), ErrorCode::notFound);
  EXPECT_EQ(openError(directory.path()), ErrorCode::notAnIndex);
  ASSERT_EQ(mkfifo(directory.file("pipe").c_str(), 0600), 0);
  EXPECT_EQ(openError(directory.file("pipe")), ErrorCode::notAnIndex);
  EXPECT_EQ(openError(directory.file(std::string(300, 'n'))), ErrorCode::notReadable);
  EXPECT_EQ(openError("/proc/self/mem/"), ErrorCode::notFound);
}

TEST_P(SearchImageFileTest, TellsWhatIsNoImage) {
  EXPECT_EQ(errorOfContent(""), ErrorCode::notAnIndex);
  EXPECT_EQ(errorOfContent("WCIMAGE"), ErrorCode::notAnIndex);
  EXPECT_EQ(errorOfContent("Thames\nSevern\nTrent\n" + std::string(1000, ' ')),
            ErrorCode::notAnIndex);
  const std::string good = asText(testing::riverImage());
  EXPECT_EQ(errorOfContent(good), std::nullopt);
  EXPECT_EQ(errorOfContent(good + '\0'), ErrorCode::damaged);
  for (std::size_t bit = 0; bit < 8 * image::kMagic.size(); ++bit) {
    std::string other = good;
    other[bit / 8] =
        static_cast<char>(static_cast<unsigned char>(other[bit / 8]) ^ (1U << bit % 8));
    EXPECT_EQ(errorOfContent(other), ErrorCode::notAnIndex);
  }
}

TEST(SearchImageTest, TellsOtherVersionsAndMachines) {
  ImageBytes bytes = testing::riverImage();
  image::Header header = {};
  std::memcpy(&header, bytes.data(), sizeof header);
  const auto errorOfHeader = [&bytes](const image::Header& other) {
    ImageBytes altered = bytes;
    std::memcpy(altered.data(), &other, sizeof other);
    testing::forgeChecksums(altered);
    return openError(altered);
  };
  EXPECT_EQ(errorOfHeader(header), std::nullopt);
  for (const std::uint32_t version : {0U, 1U, 3U, 0x02000000U}) {
    image::Header other = header;
    other.version = version;
    EXPECT_EQ(errorOfHeader(other), ErrorCode::notAnIndex);
  }
  image::Header otherOrder = header;
  otherOrder.byteOrder = 0x04030201;
  EXPECT_EQ(errorOfHeader(otherOrder), ErrorCode::notAnIndex);
  image::Header otherMode = header;
  otherMode.mode = image::kLastMode + 1;
  EXPECT_EQ(errorOfHeader(otherMode), ErrorCode::damaged);
  image::Header reserved = header;
  reserved.reserved = 1;  // for later versions: no reason to refuse
  EXPECT_EQ(errorOfHeader(reserved), std::nullopt);
}

TEST(SearchImageTest, HoldsTheSamplesAsTheyWereAdded) {
  for (const SampleImage& sample : testing::sampleImages()) {
    EXPECT_EQ(openOrVerifyError(sample.bytes), std::nullopt) << sample.name;
  }
  const auto empty = SearchImage::fromBytes(testing::emptyImage());
  EXPECT_EQ(empty->wordCount(), 0U);
  EXPECT_EQ(empty->labelOf(u'a'), 0);
  EXPECT_EQ(errorOf([&empty] { empty->textOf(0); }), ErrorCode::damaged);
  EXPECT_EQ(errorOf([&empty] { empty->valueText(0); }), ErrorCode::damaged);
}

TEST(SearchImageTest, KeepsWordsInOrderWhenLabelsAreNot) {
  const auto image = SearchImage::fromBytes(testing::manyLettersImage());
  EXPECT_EQ(image->forward().order.size(), image->wordCount());
  EXPECT_GT(image->labelOf(u'!'), image->labelOf(u'e'));
  std::vector<std::u16string> words;
  for (std::uint32_t word = 0; word < image->wordCount(); ++word) {
    words.push_back(image->textOf(word));
  }
  EXPECT_TRUE(std::is_sorted(words.begin(), words.end()));
  EXPECT_EQ(std::adjacent_find(words.begin(), words.end()), words.end());
  for (const std::u16string& word : words) {
    const auto hits = searchImage(*image, word, 0);
    ASSERT_EQ(hits.size(), 1U);
    EXPECT_EQ(image->textOf(hits[0].word), word);
  }
  EXPECT_TRUE(image->postingsOf(searchImage(*image, std::u16string(254, u'e'), 0)[0].word).empty());
  const auto longest = searchImage(*image, std::u16string(299, u'e') + u't', 1);
  ASSERT_EQ(longest.size(), 1U);
  EXPECT_EQ(longest[0].length, 301U);
  // Values ascend by the lengths of their words: the longest word's comes last, though its text is
  // the first of all.
  EXPECT_EQ(image->valueText(image->valueCount() - 1), "");
}

TEST(DamagedImageTest, NoShorterImageIsOpened) {
  for (const SampleImage& sample : testing::sampleImages()) {
    for (std::size_t length = 0; length < sample.bytes.size(); ++length) {
      ImageBytes shorter(sample.bytes.begin(),
                         sample.bytes.begin() + static_cast<std::ptrdiff_t>(length));
      const auto expected =
          length < sizeof(image::Header) ? ErrorCode::notAnIndex : ErrorCode::damaged;
      ASSERT_EQ(openError(shorter), expected) << sample.name << " cut to " << length;
      if (length >= sizeof(image::Header)) {
        const std::uint64_t claimed = length;
        std::memcpy(shorter.data() + offsetof(image::Header, fileBytes), &claimed, sizeof claimed);
        testing::forgeChecksums(shorter);
        const Outcome outcome = examine(shorter, u"rhine", 2);
        EXPECT_TRUE(!outcome.opened || sample.name == "empty") << length;
      }
    }
  }
}

TEST(DamagedImageTest, EveryFlippedBitIsFound) {
  for (const SampleImage& sample : testing::sampleImages()) {
    ImageBytes bytes = sample.bytes;
    // The large one has the same kinds of places many times.
    const std::size_t stride = bytes.size() > 4096 ? 7 : 1;
    for (std::size_t bit = 0; bit < 8 * bytes.size(); bit += stride) {
      flipBit(bytes, bit);
      ASSERT_NE(openOrVerifyError(bytes), std::nullopt) << sample.name << ", bit " << bit;
      flipBit(bytes, bit);
    }
  }
}

TEST(DamagedImageTest, FlippedBitsOfTheHeaderAreFoundAtOnce) {
  constexpr std::size_t kHeaderBits = 8 * image::headerBytes(image::kSectionKinds);
  for (const SampleImage& sample : testing::sampleImages()) {
    ImageBytes bytes = sample.bytes;
    for (std::size_t bit = 0; bit < kHeaderBits; ++bit) {
      flipBit(bytes, bit);
      ASSERT_NE(openError(bytes), std::nullopt) << sample.name << ", bit " << bit;
      ImageBytes forged = bytes;
      testing::forgeChecksums(forged);
      for (const std::int64_t distance : {0, 2, 5}) {
        examine(forged, someQueries()[bit % someQueries().size()], distance);
      }
      errorOf([&forged] { SearchImage::fromBytes(forged)->verify(); });
      flipBit(bytes, bit);
    }
  }
}

/// Of the flipped bits of each section, those that verify() does not find when the checksums are
/// right again.
std::map<SectionKind, std::size_t> unseenFlips(const ImageBytes& good) {
  std::map<SectionKind, std::size_t> unseen;
  for (const image::Section& section : testing::sectionTable(good)) {
    unseen[section.kind] = 0;
    for (std::size_t bit = 8 * section.offset; bit < 8 * (section.offset + section.bytes); ++bit) {
      ImageBytes altered = good;
      flipBit(altered, bit);
      testing::forgeChecksums(altered);
      if (!openOrVerifyError(altered)) {
        ++unseen[section.kind];
        for (const std::int64_t distance : {0, 2, 6}) {
          EXPECT_TRUE(examine(altered, u"rhine", distance).answered);
        }
      }
    }
  }
  return unseen;
}

TEST(DamagedImageTest, OnlyContentNeedsItsChecksum) {
  // Another letter or number of words, or a border between two data strings elsewhere, makes
  // another image that is as good. What has one right value, given the rest, is checked against it;
  // so are words whose letters all stand in the trees, as they do here.
  const std::set<SectionKind> content = {SectionKind::labels, SectionKind::valueOffsets,
                                         SectionKind::valueText, SectionKind::countedWords};
  const ImageBytes bytes = testing::riverImage();
  for (const auto& [kind, count] : unseenFlips(bytes)) {
    EXPECT_EQ(count != 0, content.contains(kind)) << static_cast<unsigned>(kind) << ": " << count;
    if (kind == SectionKind::countedWords) {
      EXPECT_EQ(count, std::size_t{32} * SearchImage::fromBytes(bytes)->valueCount());
    }
  }
}

/// Alters bytes of one section, in the ways in which offsets, flags and counts go wrong.
void mutate(ImageBytes& bytes, const image::Section& section, std::mt19937_64& random) {
  const auto below = [&random](std::uint64_t bound) { return random() % bound; };
  const std::size_t element = section.elementBytes;
  const std::uint64_t elements = section.bytes / element;
  const auto at = [&](std::uint64_t index) {
    return bytes.data() + section.offset + index * element;
  };
  switch (below(5)) {
    case 0:  // a bit
      flipBit(bytes, 8 * section.offset + below(8 * section.bytes));
      break;
    case 1:  // any byte
      bytes[section.offset + below(section.bytes)] = static_cast<std::byte>(random());
      break;
    case 2:  // an element of somewhere else
      std::memmove(at(below(elements)), at(below(elements)), element);
      break;
    case 3: {  // a small or a large number
      const std::uint64_t number = below(2) == 0 ? below(64) : ~below(64);
      std::memcpy(at(below(elements)), &number, std::min(element, sizeof number));
      break;
    }
    default: {  // one more or one less
      std::uint64_t number = 0;
      std::byte* const place = at(below(elements));
      std::memcpy(&number, place, std::min(element, sizeof number));
      number += below(2) == 0 ? 1 : ~std::uint64_t{0};
      std::memcpy(place, &number, std::min(element, sizeof number));
    }
  }
}

TEST(HostileImageTest, ManyMutationsWithTheRightChecksums) {
  constexpr int kMutations = 100000;
  const ImageBytes large = testing::manyLettersImage();
  const std::vector<ImageBytes> small = {testing::riverImage(),       testing::exampleImage(),
                                         testing::deepImage(),        testing::phrasesImage(),
                                         testing::rareLettersImage(), testing::wideLabelsImage(),
                                         testing::codesImage(),       testing::textsImage()};
  std::mt19937_64 random(20261121);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  int opened = 0;
  int answered = 0;
  int verified = 0;
  for (int i = 0; i < kMutations; ++i) {
    // The image of many letters is large, and would take most of the time.
    ImageBytes bytes = i % 32 == 0 ? large : small[random() % small.size()];
    const auto table = testing::sectionTable(bytes);
    for (std::uint64_t changes = 1 + random() % 4; changes > 0; --changes) {
      const image::Section& section = table[random() % table.size()];
      if (section.bytes > 0) {
        mutate(bytes, section, random);
      }
    }
    testing::forgeChecksums(bytes);
    const auto& query = someQueries()[random() % someQueries().size()];
    const Outcome outcome = examine(bytes, query, static_cast<std::int64_t>(random() % 7));
    opened += outcome.opened ? 1 : 0;
    answered += outcome.answered ? 1 : 0;
    if (i % 4 == 0) {
      const auto code = openOrVerifyError(bytes);
      verified += code ? 0 : 1;
      ASSERT_TRUE(!code || *code == ErrorCode::damaged);
    }
    if (HasFatalFailure()) {
      FAIL() << "at mutation " << i;
    }
  }
  // The lengths of the sections are whole, so that every image opens.
  EXPECT_EQ(opened, kMutations);
  EXPECT_GT(answered, kMutations / 2);
  EXPECT_LT(answered, kMutations);
  EXPECT_GT(verified, 0);
  EXPECT_LT(verified, kMutations / 8);
}

/// An image of so many words, each one letter of its own.
ForgedImage broadImage(std::uint32_t letters) {
  SearchImageWriter writer(0);
  for (std::uint32_t i = 0; i < letters; ++i) {
    writer.addPosting(std::u16string(1, static_cast<char16_t>(0x4E00 + i)),
                      writer.addValue(std::to_string(i), 1));
  }
  return ForgedImage(std::move(writer).finish());
}

constexpr std::uint32_t kBroad = 20000;
constexpr std::uint64_t kAllCommon = 0x7FFFFFFFFFFFFFFE;  // 62 children

TEST(HostileImageTest, ManyPlacesWithTheSameManyChildren) {
  // Each place leads to the same long row of rare children: the square of the image's size, if the
  // row were read for each.
  ForgedImage image = broadImage(kBroad);
  std::vector<TreeSlot> slots(std::size_t{2} * kBroad);
  slots[0] = {.children = std::uint64_t{1} << image::kRareBit, .target = 1};
  for (std::uint32_t i = 1; i < 2 * kBroad; ++i) {
    slots[i] = {.children = std::uint64_t{1} << image::kRareBit,
                .target = kBroad,
                .longest = 255,
                .label = static_cast<std::uint16_t>(100 + i % kBroad)};
  }
  slots[kBroad - 1].target |= TreeSlot::kLastChild;
  slots.back().target |= TreeSlot::kLastChild;
  image.set(SectionKind::forwardTree, slots);
  image.set(SectionKind::backwardTree, slots);
  const ImageBytes bytes = image.bytes();
  const auto opened = SearchImage::fromBytes(bytes);
  const std::u16string head(1, opened->unitOf(101));
  const std::u16string tail(1, opened->unitOf(kBroad - 100));
  EXPECT_EQ(errorOf([&] { wordsWithUnitBetween(*opened, head, tail); }), ErrorCode::damaged);
  std::u16string manySteps;
  for (int i = 0; i < 10; ++i) {
    manySteps += tail;
  }
  EXPECT_EQ(errorOf([&] { exactWord(*opened, manySteps); }), ErrorCode::damaged);
  EXPECT_EQ(errorOf([&] { wordsJoinedIn(*opened, manySteps, Seam::unit); }), ErrorCode::damaged);
  for (const std::u16string_view query : {u"***", u"*****", u"*********"}) {
    for (std::int64_t distance = 1; distance <= 4; ++distance) {
      const Outcome outcome = examine(bytes, query, distance);
      EXPECT_TRUE(outcome.opened);
      EXPECT_FALSE(outcome.answered);
    }
  }
  EXPECT_EQ(openOrVerifyError(bytes), ErrorCode::damaged);
}

TEST(HostileImageTest, ManyLeavesWithoutWords) {
  ForgedImage image = broadImage(kBroad);
  std::vector<TreeSlot> slots(std::size_t{2} * kBroad);
  for (auto& slot : slots) {
    slot = {.target = TreeSlot::kLeaf, .longest = 255};
  }
  for (std::uint32_t i = 0; i < kBroad; ++i) {
    // Each leads on to the next block, and from there to the same leaves.
    slots[i] = {.children = kAllCommon, .target = i + 1, .longest = 255};
  }
  image.set(SectionKind::forwardTree, slots);
  image.set(SectionKind::backwardTree, slots);
  const Outcome outcome = examine(image.bytes(), std::u16string(kBroad, u'*'), 2);
  EXPECT_TRUE(outcome.opened);
  EXPECT_FALSE(outcome.answered);
}

TEST(HostileImageTest, OneLongWordAtEveryPlace) {
  // As many places of one word as the word is long.
  SearchImageWriter writer(0);
  std::u16string text(kBroad, u'a');
  for (std::uint32_t i = 0; i < kBroad; ++i) {
    writer.addPosting(std::u16string(1, static_cast<char16_t>(0x4E00 + i)) + u"abcdefghijk",
                      writer.addValue("x", 1));
  }
  writer.addWord(text);
  ForgedImage image(std::move(writer).finish());
  const std::vector<std::uint32_t> order(kBroad + 1, 0U);
  ASSERT_EQ(SearchImage::fromBytes(image.bytes())->textOf(0), text);
  image.set(SectionKind::forwardOrder, order);
  image.set(SectionKind::backwardOrder, order);
  const ImageBytes bytes = image.bytes();
  const std::u16string query(kBroad, u'*');
  auto forward = image.get<TreeSlot>(SectionKind::forwardTree);
  for (auto& slot : forward) {
    slot.longest = 255;
  }
  image.set(SectionKind::forwardTree, forward);
  auto backward = image.get<TreeSlot>(SectionKind::backwardTree);
  for (auto& slot : backward) {
    slot.longest = 255;
  }
  image.set(SectionKind::backwardTree, backward);
  for (std::int64_t distance = 0; distance <= 4; ++distance) {
    EXPECT_FALSE(examine(image.bytes(), query, distance).answered) << distance;
  }
  EXPECT_EQ(openOrVerifyError(bytes), ErrorCode::damaged);
}

TEST(HostileImageTest, TailsThatShareMoreThanThereIs) {
  using Tails = image::LeafTails;
  ForgedImage image(testing::riverImage());
  auto slots = image.get<TreeSlot>(SectionKind::forwardTree);
  const auto leaf = std::find_if(slots.begin(), slots.end(), [](const TreeSlot& slot) {
    return slot.isLeaf() && image::hasTails(slot) && image::leafWords(slot) == 2;
  });
  ASSERT_NE(leaf, slots.end());
  leaf->children =
      std::uint64_t{2} << Tails::kCountShift | 1U | std::uint64_t{2} << (2 * Tails::kCodeBits);
  image.set(SectionKind::forwardTree, slots);
  EXPECT_FALSE(examine(image.bytes(), u"***", 3).answered);
  EXPECT_EQ(openOrVerifyError(image.bytes()), ErrorCode::damaged);
}

TEST(HostileImageTest, OneWordAtEveryPlaceOfALeaf) {
  // Every head with every tail: the square of the image's size, if all were tried.
  SearchImageWriter writer(0);
  writer.addPosting(u"rhine", writer.addValue("x", 1));
  for (std::uint32_t i = 0; i < kBroad; ++i) {
    writer.addPosting(std::u16string(1, static_cast<char16_t>(0x4E00 + i)),
                      writer.addValue("x", 1));
  }
  ForgedImage image(std::move(writer).finish());
  const std::vector<std::uint32_t> order(kBroad + 1, 0U);
  image.set(SectionKind::forwardOrder, order);
  image.set(SectionKind::backwardOrder, order);
  for (const auto kind : {SectionKind::forwardTree, SectionKind::backwardTree}) {
    auto slots = image.get<TreeSlot>(kind);
    for (std::size_t i = 1; i < slots.size(); ++i) {
      slots[i].children = kBroad + 1;
      slots[i].target = TreeSlot::kLeaf | (slots[i].target & TreeSlot::kLastChild);
    }
    image.set(kind, slots);
  }
  const auto opened = SearchImage::fromBytes(image.bytes());
  EXPECT_LE(wordsJoinedIn(*opened, u"rhinerhine", Seam::unit).size(), 20U);
  EXPECT_LE(wordsWithUnitBetween(*opened, u"rh", u"ne").size(), std::size_t{kBroad} + 1);
}

TEST(HostileImageTest, AllPostingsInEveryList) {
  ForgedImage image = broadImage(300);
  auto offsets = image.get<std::uint32_t>(SectionKind::postingOffsets);
  for (std::size_t i = 0; i < offsets.size(); ++i) {
    offsets[i] = i % 2 == 0 ? 0 : 300;
  }
  image.set(SectionKind::postingOffsets, offsets);
  const auto opened = SearchImage::fromBytes(image.bytes());
  EXPECT_EQ(opened->postingsOf(0).size(), 300U);
  EXPECT_EQ(opened->postingsOf(2).size(), 300U);
  EXPECT_EQ(errorOf([&opened] { searchImage(*opened, u"*", 0); }), ErrorCode::damaged);
}

TEST(HostileImageTest, EveryLeafHoldsAllWords) {
  // As many words behind each unit between two words: the square of the image's size.
  SearchImageWriter writer(0);
  const std::uint32_t value = writer.addValue("x", 1);
  for (std::uint32_t i = 0; i < kBroad; ++i) {
    const char16_t unit = static_cast<char16_t>(0x4E00 + i);
    writer.addPosting(std::u16string(u"go") + unit + u"fish", value);
  }
  ForgedImage image(std::move(writer).finish());
  auto slots = image.get<TreeSlot>(SectionKind::forwardTree);
  for (auto& slot : slots) {
    if (slot.isLeaf()) {
      slot.children = kBroad;
      slot.target = TreeSlot::kLeaf | (slot.target & TreeSlot::kLastChild);
    }
  }
  image.set(SectionKind::forwardTree, slots);
  const auto opened = SearchImage::fromBytes(image.bytes());
  EXPECT_EQ(errorOf([&opened] { wordsWithUnitBetween(*opened, u"go", u"fish"); }),
            ErrorCode::damaged);
}

TEST(HostileImageTest, APostingListLongerThanThereAreValues) {
  ForgedImage image = broadImage(300);
  image.set(SectionKind::postings, std::vector<std::uint32_t>(301));
  auto offsets = image.get<std::uint32_t>(SectionKind::postingOffsets);
  offsets.back() = 301;
  offsets[1] = 301;
  image.set(SectionKind::postingOffsets, offsets);
  const auto opened = SearchImage::fromBytes(image.bytes());
  EXPECT_EQ(errorOf([&opened] { opened->postingsOf(0); }), ErrorCode::damaged);
  EXPECT_EQ(opened->postingsOf(299).size(), 2U);
}

TEST(HostileImageTest, BranchesWithoutWordsThatMeetAgain) {
  // Forty pairs of places, each leading to the next pair: 2^40 ways from the root.
  ForgedImage image = broadImage(100);
  std::vector<TreeSlot> slots(81);
  for (std::uint32_t i = 0; i < 40; ++i) {
    const std::uint64_t children = i < 39 ? 6 : 0;
    slots[1 + 2 * i] = {.children = children, .target = 3 + 2 * i, .longest = 255, .label = 1};
    slots[2 + 2 * i] = {.children = children,
                        .target = (3 + 2 * i) | TreeSlot::kLastChild,
                        .longest = 255,
                        .label = 2};
  }
  slots[0] = {.children = 6, .target = 1};
  image.set(SectionKind::forwardTree, slots);
  image.set(SectionKind::backwardTree, slots);
  EXPECT_EQ(openOrVerifyError(image.bytes()), ErrorCode::damaged);
  const std::u16string query(40, u'*');
  for (std::int64_t distance = 0; distance <= 4; ++distance) {
    EXPECT_FALSE(examine(image.bytes(), query, distance).answered);
  }
}

TEST(HostileImageTest, LabelsAndElementsOfOtherSizes) {
  ForgedImage image = broadImage(100);
  std::vector<std::uint16_t> labels(image::kMaxLabels + 1);
  image.set(SectionKind::labels, labels);
  EXPECT_EQ(openError(image.bytes()), ErrorCode::damaged);
  ImageBytes bytes = testing::riverImage();
  for (std::size_t i = 0; i < image::kSectionKinds; ++i) {
    ImageBytes altered = bytes;
    altered[sizeof(image::Header) + i * sizeof(image::Section) +
            offsetof(image::Section, elementBytes)] ^= std::byte{4};
    testing::forgeChecksums(altered);
    EXPECT_EQ(openError(altered), ErrorCode::damaged);
  }
}

TEST(VerifyTest, FindsWhatASearchWouldMiss) {
  const auto verifyError = [](const std::function<void(ForgedImage&)>& alter) {
    ForgedImage image(testing::riverImage());
    alter(image);
    return openOrVerifyError(image.bytes());
  };
  EXPECT_EQ(verifyError([](ForgedImage&) {}), std::nullopt);
  EXPECT_EQ(verifyError([](ForgedImage& image) {
              auto slots = image.get<TreeSlot>(SectionKind::forwardTree);
              const auto inner = std::find_if(slots.begin() + 1, slots.end(),
                                              [](const TreeSlot& s) { return !s.isLeaf(); });
              ASSERT_NE(inner, slots.end());
              --inner->longest;
              image.set(SectionKind::forwardTree, slots);
            }),
            ErrorCode::damaged)
      << "an inner place that promises shorter words than it has";
  EXPECT_EQ(verifyError([](ForgedImage& image) {
              auto order = image.get<std::uint32_t>(SectionKind::backwardOrder);
              const auto slots = image.get<TreeSlot>(SectionKind::backwardTree);
              const auto leaf = std::find_if(slots.begin(), slots.end(), [](const TreeSlot& s) {
                return s.isLeaf() && image::leafWords(s) == 2;
              });
              ASSERT_NE(leaf, slots.end());
              order[leaf->index()] = order[leaf->index() + 1];
              image.set(SectionKind::backwardOrder, order);
            }),
            ErrorCode::damaged)
      << "one word at two places of a leaf";
  EXPECT_EQ(verifyError([](ForgedImage& image) {
              auto slots = image.get<TreeSlot>(SectionKind::forwardTree);
              const auto leaf = std::find_if(slots.begin(), slots.end(), [](const TreeSlot& s) {
                return s.isLeaf() && image::hasTails(s) && s.longest > 0;
              });
              ASSERT_NE(leaf, slots.end());
              leaf->children ^= 1U;
              image.set(SectionKind::forwardTree, slots);
            }),
            ErrorCode::damaged)
      << "another letter in a leaf than in its word";
  EXPECT_EQ(verifyError([](ForgedImage& image) {
              auto labels = image.get<std::uint16_t>(SectionKind::labels);
              labels[0] = u'q';
              image.set(SectionKind::labels, labels);
            }),
            ErrorCode::damaged)
      << "a letter for the end of a word";
}

/// The inputs of fuzz/image_fuzzer.cpp, which says what their bytes mean: each sample with texts
/// and options.
std::map<std::string, std::string> fuzzCorpus() {
  struct Questions {
    const char* name;
    std::string_view options;  // five bytes
    std::u16string_view text;
  };
  using namespace std::string_view_literals;
  const std::vector<Questions> questions = {
      // The default limits of edits, swaps; with the phrase of the first value behind the text.
      {"search", "\x51\x02\x24\x00\x00"sv, u"rhine"},
      // verify() first. All limits at 3; longest ranges; the phrase of another value in one word.
      {"verify", "\xDB\x05\xFF\x02\x00"sv, u"_o*er new"},
      // No swaps, two words at the least, a cost of at most 14, one edit of a number, no ranges
      // within others; a text of its own.
      {"words", "\x05\x08\x64\x03\x04"sv, u"newzealand duran route 67 река"},
      // verify() first. Small budgets, and no edits.
      {"budgets", "\x73\x00\x00\x04\x00"sv, u"a 12 new zealand"}};
  std::map<std::string, std::string> corpus;
  for (const SampleImage& sample : testing::sampleImages()) {
    for (const auto& [name, options, text] : questions) {
      std::string input(options);
      input += static_cast<char>(text.size());
      input.append(reinterpret_cast<const char*>(text.data()), 2 * text.size());
      corpus[sample.name + '-' + name] = input + asText(sample.bytes);
    }
  }
  return corpus;
}

TEST(FuzzCorpusTest, IsMadeOfImagesAsTheyAreWrittenNow) {
  // With WORDCATCHER_WRITE_CORPUS set the files are written.
  const std::string directory = WORDCATCHER_SOURCE_DIR "/fuzz/corpus/image/";
  for (const auto& [name, input] : fuzzCorpus()) {
    if (std::getenv("WORDCATCHER_WRITE_CORPUS") != nullptr) {
      std::filesystem::create_directories(directory);
      testing::writeFile(directory + name, input);
    }
    EXPECT_TRUE(testing::readFile(directory + name) == input)
        << name << " is another: run this test with WORDCATCHER_WRITE_CORPUS=1";
  }
}

TEST(VerifyTest, FindsALetterWithTwoLabels) {
  ForgedImage image(testing::manyLettersImage());
  auto labels = image.get<std::uint16_t>(SectionKind::labels);
  ASSERT_GT(labels.size(), image::kRareBit + 1U);
  labels[image::kRareBit - 1] = labels.back();
  image.set(SectionKind::labels, labels);
  try {
    SearchImage::fromBytes(image.bytes())->verify();
    FAIL();
  } catch (const Error& error) {
    EXPECT_NE(std::string(error.what()).find("labels are out of order"), std::string::npos);
  }
}

}  // namespace
}  // namespace wordcatcher
