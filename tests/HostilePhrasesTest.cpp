// Images of phrases of which one byte is another, with the checksums that it asks for: find(),
// explain(), query() and explainQuery() give an answer or Error (damaged), and take no more time
// and memory than is stated here.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <ctime>
#include <functional>
#include <set>
#include <string>
#include <vector>

#include "ForgedImage.h"
#include "HostileFind.h"
#include "MemoryCounter.h"
#include "SampleImages.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/storage/LeafTails.h"

namespace wordcatcher {
namespace {

using image::SectionKind;
using image::TreeSlot;
using testing::ForgedImage;
using testing::ImageBytes;
using testing::MemoryCounter;
using testing::Question;

// Of one question, for an image of a few kilobytes and a text of a few words: processor time, far
// above what any takes with sanitizers; and bytes beside the image, a quarter of the half megabyte
// that Index.h lets any call have.
constexpr double kMostSeconds = 2;
constexpr std::size_t kMostBytes = 131'072;

/// A sample, and what is asked of it.
struct Sample {
  const char* name;
  ImageBytes (*bytes)();
  std::vector<Question> questions;
};

std::ostream& operator<<(std::ostream& stream, const Sample& sample) {
  return stream << sample.name;
}

FindOptions with(const std::function<void(FindOptions&)>& change) {
  FindOptions options;
  change(options);
  return options;
}

const FindOptions kFarthest = with([](FindOptions& options) {
  options.edits = {1, 3, 3, 3, 3, 3, 3};
  options.overlaps = Overlaps::longest;
});
const FindOptions kNoSub = with([](FindOptions& options) {
  options.edits.numberEdits = 1;
  options.overlaps = Overlaps::noSub;
  options.maxCost = 6;
  options.limit = 3;
});
const FindOptions kTwoWords = with([](FindOptions& options) {
  options.minWords = 2;
  options.transpositions = false;
  options.maxPostings = 20;
});

std::vector<Sample> samples() {
  return {{"phrases",
           testing::phrasesImage,
           {{"holidays in newzealand aotaeroa and new york", "Trinidad and Tobago", {}},
            {"newfound land adn labradro duran durane llanfairpwllgwyngyl", "York", kFarthest},
            {"route 67 a 12", "Nowhere", kNoSub},
            {"duranduran la trinidaddelosangelos", "Route 66", {}},
            {"aotearoa new zealand duran duran new new foundland", "A12", kTwoWords}}},
          {"rareLetters",
           testing::rareLettersImage,
           {{"река дунаи quito", "Black Sea", {}},
            {"μαύρηθάλασσα danub чёрное щёлкова цна", "Danube", kFarthest},
            {"черноеморе ποταμός δούναβυς", "Nowhere", kNoSub},
            {"эльба фи жигулёвск тольятти ξάνθη хиос", "Zhiguli", kTwoWords}}},
          {"wideLabels",
           testing::wideLabelsImage,
           {{"가개갸걔거게겨 계고과괘괴교고 궈궤귀규그긔", "3", {}},
            {"가개갸걔거게겨계고과괘괴교구 까깨꺄꺼께껴", "7", kFarthest}}},
          {"codes",
           testing::codesImage,
           {{"Papua Nu Ginea", "Guinea", {}},
            {"nouvelle kalédonie schlesvig holstein trinidat", "New Caledonia", kFarthest},
            {"trinidad and tobago guinea guinea", "Nowhere", kNoSub},
            {"new new guinea papua", "Papua New Guinea", kTwoWords}}},
          {"texts",
           testing::textsImage,
           {{"New Zeeland", "Route 66", {}}, {"trindad und tobago", "NZ", kFarthest}}}};
}

/// What became of the questions of one image.
struct Outcome {
  bool answered = false;
  bool isWhole = false;
};

class HostilePhrasesTest : public ::testing::TestWithParam<Sample> {
 protected:
  /// What is made once for a program and kept is no question's.
  void SetUp() override {
    const Index index = testing::openIndex(GetParam().bytes());
    for (const Question& question : GetParam().questions) {
      testing::faultOfAnswers(index, question, true);
    }
  }

  /// Asks all that is asked of the sample.
  Outcome examine(const ImageBytes& bytes) {
    Outcome outcome;
    const Index index = testing::openIndex(bytes);
    outcome.isWhole = !isDamaged([&index] { index.verify(); });
    outcome.answered = true;
    for (const Question& question : GetParam().questions) {
      std::string fault;
      MemoryCounter::restartPeak();
      const std::size_t before = MemoryCounter::live();
      const std::clock_t begin = std::clock();
      const bool damaged =
          isDamaged([&] { fault = testing::faultOfAnswers(index, question, outcome.isWhole); });
      const auto taken = static_cast<double>(std::clock() - begin) / CLOCKS_PER_SEC;
      EXPECT_LE(taken, kMostSeconds) << question.text;
      EXPECT_LE(MemoryCounter::peak() - before, kMostBytes) << question.text;
      EXPECT_EQ(fault, "") << question.text;
      outcome.answered = outcome.answered && !damaged;
    }
    EXPECT_TRUE(outcome.answered || !outcome.isWhole) << "verify() found nothing";
    return outcome;
  }

  static bool isDamaged(const std::function<void()>& action) {
    try {
      action();
      return false;
    } catch (const Error& error) {
      EXPECT_EQ(error.code(), ErrorCode::damaged) << error.what();
      return true;
    }
  }
};

TEST_P(HostilePhrasesTest, EachQuestionFindsPhrasesOfTheWholeImage) {
  const Sample& sample = GetParam();
  const Outcome outcome = examine(sample.bytes());
  EXPECT_TRUE(outcome.answered);
  EXPECT_TRUE(outcome.isWhole);
  const Index index = testing::openIndex(sample.bytes());
  for (const Question& question : sample.questions) {
    const auto found = index.find(question.text, question.options);
    EXPECT_TRUE(std::any_of(found.matches.begin(), found.matches.end(), [](const auto& match) {
      return match.hits.size() > 1 || match.hits.front().word.find(' ') != std::string::npos;
    })) << question.text;
  }
}

TEST_P(HostilePhrasesTest, AnyByteOfAnySectionIsAnother) {
  const ImageBytes good = GetParam().bytes();
  std::size_t answered = 0;
  std::size_t damaged = 0;
  for (const image::Section& section : testing::sectionTable(good)) {
    for (std::size_t at = section.offset; at < section.offset + section.bytes; ++at) {
      // One bit, all bits, none, all.
      const std::set<std::byte> others = {good[at] ^ std::byte{1}, ~good[at], std::byte{0},
                                          std::byte{0xFF}};
      for (const std::byte other : others) {
        if (other == good[at]) {
          continue;
        }
        ImageBytes altered = good;
        altered[at] = other;
        testing::forgeChecksums(altered);
        ++(examine(altered).answered ? answered : damaged);
        ASSERT_FALSE(HasFailure())
            << "byte " << at - section.offset << " of section "
            << static_cast<unsigned>(section.kind) << " is " << std::to_integer<unsigned>(other);
      }
    }
  }
  // Most bytes are not looked at for these texts.
  EXPECT_GT(answered, damaged);
  EXPECT_GT(damaged, good.size() / 20);
}

INSTANTIATE_TEST_SUITE_P(Samples, HostilePhrasesTest, ::testing::ValuesIn(samples()),
                         [](const auto& sample) { return std::string(sample.param.name); });

/// The leaves of a tree that have tails, and those that do not.
std::array<std::size_t, 2> leavesOf(const ForgedImage& image, SectionKind tree) {
  std::array<std::size_t, 2> leaves = {};
  for (const auto& slot : image.get<TreeSlot>(tree)) {
    if (slot.isLeaf()) {
      ++leaves.at(image::hasTails(slot) ? 0 : 1);
    }
  }
  return leaves;
}

TEST(SamplePhrasesTest, HaveLeavesAndLabelsOfAllKinds) {
  const ForgedImage phrases(testing::phrasesImage());
  for (const auto tree : {SectionKind::forwardTree, SectionKind::backwardTree}) {
    EXPECT_GT(leavesOf(phrases, tree)[0], 0U);
    EXPECT_GT(leavesOf(phrases, tree)[1], 0U);
  }
  const ForgedImage rare(testing::rareLettersImage());
  const auto text = rare.get<std::uint8_t>(SectionKind::wordText);
  const auto labels = rare.get<std::uint16_t>(SectionKind::labels);
  EXPECT_LE(labels.size(), 256U) << "a byte holds a label";
  EXPECT_GT(*std::max_element(text.begin(), text.end()), image::kRareBit);
  for (const auto tree : {SectionKind::forwardTree, SectionKind::backwardTree}) {
    const auto slots = rare.get<TreeSlot>(tree);
    EXPECT_TRUE(std::any_of(slots.begin(), slots.end(), [](const TreeSlot& slot) {
      return slot.label >= image::kRareBit;
    })) << "the rare ones are edges";
  }
  const ForgedImage wide(testing::wideLabelsImage());
  EXPECT_GT(wide.get<std::uint16_t>(SectionKind::labels).size(), 256U);
}

}  // namespace
}  // namespace wordcatcher
