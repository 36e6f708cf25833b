// What IndexBuilder puts into the image, and builders that are killed while others read.

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <chrono>
#include <csignal>
#include <cstring>
#include <filesystem>
#include <map>
#include <random>
#include <set>
#include <thread>

#include "TestSupport.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/matcher/IndexBuilder.h"
#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/text/PhraseLength.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using testing::TemporaryDirectory;
using Content = std::map<std::u16string, std::set<std::string>>;

Content contentOf(const SearchImage& image) {
  Content content;
  for (std::uint32_t word = 0; word < image.wordCount(); ++word) {
    auto& values = content[image.textOf(word)];
    for (const std::uint32_t value : image.postingsOf(word)) {
      values.emplace(image.valueText(value));
    }
  }
  return content;
}

std::shared_ptr<const SearchImage> open(const std::string& path) {
  auto image = SearchImage::open(path, SearchImage::Load::map);
  image->verify();
  return image;
}

TEST(IndexBuilderImageTest, WordsAreLowerCasedEachByItself) {
  const TemporaryDirectory directory;
  const auto path = directory.file("names.wci");
  IndexBuilder builder(path);
  builder.add("Trinidad and Tobago", "Trinidad and Tobago{ TT }");
  builder.add("TRINIDAD", "Trinidad");
  builder.add("Trinidad", "Trinidad");
  builder.add("ΟΔΟΣ ΣΟΦΟΣ", std::nullopt);
  builder.add("İzmir", "İzmir{ 35 }");
  builder.commit();
  const auto image = open(path);
  EXPECT_EQ(contentOf(*image), (Content{{u"and", {"Trinidad and Tobago{ TT }"}},
                                        {u"i\u0307zmir", {"İzmir{ 35 }"}},
                                        {u"tobago", {"Trinidad and Tobago{ TT }"}},
                                        {u"trinidad", {"Trinidad", "Trinidad and Tobago{ TT }"}},
                                        {u"οδος", {}},
                                        {u"σοφος", {}}}));
  EXPECT_EQ(image->header().mode, 0U);
  EXPECT_EQ(image->header().phraseCount, 5U);
}

TEST(IndexBuilderImageTest, WholeTextsKeepTheirSpaces) {
  const TemporaryDirectory directory;
  const auto path = directory.file("names.wci");
  IndexBuilder builder(path, {.mode = MatchingMode::wholeText, .tables = {}});
  builder.add("Trinidad  AND Tobago!", "TT");
  builder.add("", "nothing");
  builder.commit();
  const auto image = open(path);
  EXPECT_EQ(contentOf(*image), (Content{{u"trinidad  and tobago!", {"TT"}}}));
  EXPECT_EQ(image->header().mode, 1U);
}

TEST(IndexBuilderImageTest, CodesAreLowerCasedAndTheirPhrasesMeasuredAsWritten) {
  const TemporaryDirectory directory;
  const auto path = directory.file("names.wci");
  IndexBuilder builder(path, {.mode = MatchingMode::phoneticWords, .tables = {}});
  builder.add("Catherine Lee", "Catherine Lee Jones");
  builder.add("Kathryn", "Kathryn");
  builder.commit();
  const auto image = open(path);
  EXPECT_EQ(contentOf(*image), (Content{{u"k0rn", {"Catherine Lee Jones", "Kathryn"}},
                                        {u"l", {"Catherine Lee Jones"}}}));
  EXPECT_EQ(image->countedWordsOf(1), 2U) << "Catherine and Jones; Lee is too short";
  EXPECT_EQ(image->header().mode, 2U);
}

TEST(IndexBuilderImageTest, PhrasesAreMeasuredUpToTheFieldSeparator) {
  struct Case {
    std::string phrase;
    std::string data;
    std::uint32_t counted;
  };
  const std::vector<Case> cases = {
      {"golden retriever puppy", "golden retriever puppy", 3},
      {"golden gate bridge", "golden gate bridge{ 8 more words here }", 3},
      {"a cat of mine", "a cat of mine{ 9 }", 1},
      {"golden gate", "another phrase altogether{ golden }", 3},
      {"golden gate", "golden gate{without space}", 4},
      {"golden gate", "{ golden gate }", 0},
      {"golden gate", "", 0},
      {"golden", "golden{ one { two }", 1},
      {"Straße ÄÖÜß abc", "Straße ÄÖÜß abc{ 1 }", 2},
      {"😀😀 the 𝐀𝐁", "😀😀 the 𝐀𝐁", 1},
  };
  for (const auto mode :
       {MatchingMode::words, MatchingMode::wholeText, MatchingMode::phoneticWords}) {
    const TemporaryDirectory directory;
    const auto path = directory.file("names.wci");
    IndexBuilder builder(path, {.mode = mode, .tables = {}});
    for (const auto& [phrase, data, counted] : cases) {
      builder.add(phrase, data);
    }
    builder.commit();
    const auto image = open(path);
    ASSERT_EQ(image->valueCount(), cases.size());
    for (std::uint32_t value = 0; value < image->valueCount(); ++value) {
      const auto known = std::find_if(cases.begin(), cases.end(), [&](const Case& each) {
        return each.data == image->valueText(value);
      });
      ASSERT_NE(known, cases.end());
      EXPECT_EQ(image->countedWordsOf(value), known->counted) << known->data;
    }
  }
}

/// Texts of letters that change in lower case, of several scripts, and of what stands between
/// words.
rc::Gen<std::string> anyText() {
  const auto piece = rc::gen::element<std::string>(
      "Golden", "gate", "BRIDGE", "İ", "Σ", "ΟΔΟΣ", "ß", "é", "日本", "😀", "𝐀", "'", " ", " ", " ",
      "-", "_", "{ ", "3.5", "K", "\u200D", "\uFF5E", "\uE000");
  return rc::gen::map(rc::gen::container<std::vector<std::string>>(piece),
                      [](const std::vector<std::string>& pieces) {
                        std::string text;
                        for (const auto& each : pieces) {
                          text += each;
                        }
                        return text;
                      });
}

RC_GTEST_PROP(IndexBuilderImageTest, HoldsTheWordsOfAnyPhrases, ()) {
  const TemporaryDirectory directory;
  const auto path = directory.file("names.wci");
  const auto mode =
      *rc::gen::element(MatchingMode::words, MatchingMode::wholeText, MatchingMode::phoneticWords);
  IndexBuilder builder(path, {.mode = mode, .tables = {}});
  Content expected;
  std::map<std::string, std::int64_t> lengths;
  WordSegmenter segmenter;
  KXMetaphone encoder;
  const auto phrases = *rc::gen::inRange(0, 12);
  for (int i = 0; i < phrases; ++i) {
    const auto phrase = *anyText();
    const auto data = *rc::gen::element(
        std::optional<std::string>(), std::optional<std::string>(phrase),
        std::optional<std::string>(phrase + "{ 1 }"), std::optional<std::string>(*anyText()));
    builder.add(phrase, data);
    const auto text = *fromUtf8(phrase);
    std::vector<std::u16string> words;
    if (mode == MatchingMode::wholeText) {
      words.push_back(toLower(text));
    } else {
      const auto source = mode == MatchingMode::words ? text : encoder.translate(text);
      segmenter.start(source);
      while (const auto word = segmenter.next()) {
        words.push_back(toLower(*word));
      }
    }
    std::erase(words, u"");
    for (const auto& word : words) {
      auto& values = expected[word];
      if (data) {
        values.insert(*data);
      }
    }
    if (data) {
      const auto value = *fromUtf8(*data);
      lengths[*data] = countedWords(segmenter, phraseOf(std::u16string_view(value)));
    }
  }
  RC_ASSERT(builder.wordCount() == expected.size());
  builder.commit();
  const auto image = open(path);
  RC_ASSERT(contentOf(*image) == expected);
  RC_ASSERT(image->valueCount() == lengths.size());
  for (std::uint32_t value = 0; value < image->valueCount(); ++value) {
    RC_ASSERT(image->countedWordsOf(value) == lengths.at(std::string(image->valueText(value))));
  }
}

// Builders that are killed. Each index holds one mark in all its data strings, and has the same
// number of answers, so that a mixture of two would be noticed.

constexpr int kPhrases = 60;
constexpr int kReaders = 4;
constexpr int kKills = 200;
constexpr std::array<const char*, 2> kMarks = {"{ old }", "{ new }"};

void buildMarked(const std::string& path, std::size_t mark) {
  IndexBuilder builder(path);
  for (int i = 0; i < kPhrases; ++i) {
    const std::string phrase = "Salzburg number " + std::to_string(i);
    builder.add(phrase, phrase + kMarks[mark]);
  }
  builder.commit();
}

/// The mark of the index at `path`, of which every answer of a query must be; nothing if they are
/// not what one of the two indexes answers.
std::optional<std::size_t> markOf(const SearchImage& image) {
  std::set<std::string> values;
  for (const auto& hit : searchImage(image, u"saltzburg", 2)) {
    for (const std::uint32_t value : image.postingsOf(hit.word)) {
      values.emplace(image.valueText(value));
    }
  }
  for (std::size_t mark = 0; mark < kMarks.size(); ++mark) {
    const auto isOfMark = [mark](const std::string& value) {
      return value.ends_with(kMarks[mark]);
    };
    if (values.size() == kPhrases && std::all_of(values.begin(), values.end(), isOfMark)) {
      return mark;
    }
  }
  return std::nullopt;
}

/// What the processes of the test share.
struct Shared {
  std::atomic<bool> stop;
  std::array<std::atomic<std::uint64_t>, 2> answers;
  std::atomic<std::uint64_t> failures;
};

void readUntilStopped(const std::string& path, Shared& shared) {
  for (std::uint64_t round = 0; !shared.stop; ++round) {
    try {
      const auto load = round % 2 == 0 ? SearchImage::Load::map : SearchImage::Load::copy;
      const auto image = SearchImage::open(path, load);
      if (round % 8 == 0) {
        image->verify();
      }
      if (const auto mark = markOf(*image)) {
        ++shared.answers[*mark];
      } else {
        ++shared.failures;
      }
    } catch (const std::exception&) {
      ++shared.failures;
    }
    // Leaves processors to the builder, whose moments matter.
    std::this_thread::sleep_for(std::chrono::microseconds(300));
  }
}

/// Runs `work` in a process that ends with this one.
template <typename Work>
pid_t startProcess(Work work) {
  const pid_t process = fork();
  if (process == 0) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    work();
    _exit(0);
  }
  return process;
}

/// Processes that read the index at `path` while this lives.
class Readers {
 public:
  explicit Readers(const std::string& path)
      : _memory(mmap(nullptr, sizeof(Shared), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS,
                     -1, 0)),
        _shared(*new (_memory) Shared()) {
    for (int i = 0; i < kReaders; ++i) {
      _processes.push_back(startProcess([&] { readUntilStopped(path, _shared); }));
    }
  }
  ~Readers() {
    stop();
    munmap(_memory, sizeof(Shared));
  }
  Readers(const Readers&) = delete;
  Readers& operator=(const Readers&) = delete;

  void stop() {
    _shared.stop = true;
    for (const pid_t process : _processes) {
      int status = 0;
      EXPECT_EQ(waitpid(process, &status, 0), process);
      EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
    }
    _processes.clear();
  }

  const Shared& shared() const { return _shared; }

 private:
  void* _memory;
  Shared& _shared;
  std::vector<pid_t> _processes;
};

TEST(KilledBuilderTest, ReadersSeeTheOldIndexOrTheNewOneWhole) {
  const TemporaryDirectory directory;
  const auto path = directory.file("names.wci");
  const auto begin = std::chrono::steady_clock::now();
  for (std::size_t i = 0; i < 10; ++i) {
    buildMarked(path, i % 2);
  }
  const auto commitTime = std::chrono::duration_cast<std::chrono::microseconds>(
      (std::chrono::steady_clock::now() - begin) / 10);
  Readers readers(path);

  std::array<int, 2> left{};
  const auto bothWereMet = [&left, &readers] {
    const auto& answers = readers.shared().answers;
    return left[0] > 0 && left[1] > 0 && answers[0] > 0 && answers[1] > 0;
  };
  // Up to a few commits, which take longer beside the readers than alone. On a busy machine nobody
  // knows how long, so that the delays grow until both indexes were left behind and met.
  constexpr std::int64_t kLongestDelay = 2'000'000;
  constexpr auto kPatience = std::chrono::seconds(120);
  std::int64_t longest = std::min<std::int64_t>(commitTime.count() * 4, 60'000);
  std::mt19937 random{std::random_device()()};
  const auto end = std::chrono::steady_clock::now() + kPatience;
  for (int kill = 0; kill < kKills || (!bothWereMet() && std::chrono::steady_clock::now() < end);
       ++kill) {
    if (kill % 20 == 19 && !bothWereMet()) {
      longest = std::min(2 * longest, kLongestDelay);
    }
    std::uniform_int_distribution<std::int64_t> delay(0, longest);
    const pid_t builder = startProcess([&path] {
      for (std::size_t i = 0;; ++i) {
        buildMarked(path, i % 2);
      }
    });
    std::this_thread::sleep_for(std::chrono::microseconds(delay(random)));
    ASSERT_EQ(::kill(builder, SIGKILL), 0);
    int status = 0;
    ASSERT_EQ(waitpid(builder, &status, 0), builder);
    EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGKILL);
    const auto mark = markOf(*open(path));
    ASSERT_TRUE(mark);
    ++left[*mark];
  }
  readers.stop();

  EXPECT_EQ(readers.shared().failures, 0U);
  for (std::size_t mark = 0; mark < kMarks.size(); ++mark) {
    EXPECT_GT(readers.shared().answers[mark], 0U);
    EXPECT_GT(left[mark], 0);
  }
  for (const auto& entry : std::filesystem::directory_iterator(directory.path())) {
    const std::string name = entry.path().filename();
    EXPECT_TRUE(name == "names.wci" || name.starts_with(".names.wci-")) << name;
    EXPECT_TRUE(name == "names.wci" || !name.ends_with(".wci")) << name;
  }
}

}  // namespace
}  // namespace wordcatcher
