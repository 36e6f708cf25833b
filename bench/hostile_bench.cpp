// How long query() and find() take over texts that are made to make them slow, from 64 KB to 1 MB,
// in every mode, with the budgets that an index has by default and with budgets of the text that
// cut nothing off. The budget of postings is find()'s own in both: how much it judges is not a
// matter of the text's length.
//
// Prints how many times as long a text takes as one of half its size. Up to 2.3 counts as linear;
// what is beyond is marked. Memory that was given back is kept by the process: whether the system
// takes and clears pages anew for each query depends on their number, and would be told as jumps.

#include <benchmark/benchmark.h>
#include <malloc.h>

#include <array>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include "IsoNames.h"
#include "LeastTimeReporter.h"
#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::bench {
namespace {

constexpr std::array<std::size_t, 5> kKilobytes = {64, 128, 256, 512, 1024};
constexpr std::size_t kKilobyte = 1024;
constexpr std::size_t kNames = 1000;
constexpr std::size_t kUnbounded = SIZE_MAX;
constexpr double kLinearBound = 2.3;

std::string utf8(const std::u16string& text) {
  const auto bytes = std::filesystem::path(text).u8string();
  return {bytes.begin(), bytes.end()};
}

std::string joined(const std::vector<std::u16string>& names) {
  std::string text;
  for (const auto& name : names) {
    text += utf8(name) + ' ';
  }
  return text;
}

/// The names with no space within: "PapuaNewGuinea".
std::string joinedWords(const std::vector<std::u16string>& names) {
  std::string text;
  for (auto name : names) {
    std::erase(name, u' ');
    text += utf8(name) + ' ';
  }
  return text;
}

/// A word of which a phrase of the index holds many.
constexpr const char* kEqualWord = "duran";
constexpr std::size_t kEqualWords = 200;

/// A text of as many bytes as are wanted, of one piece again and again; nothing of it is cut.
struct Hostile {
  const char* name;
  std::string piece;

  std::string text(std::size_t bytes) const {
    std::string text;
    while (text.size() + piece.size() <= bytes) {
      text += piece;
    }
    return text;
  }
};

std::vector<Hostile> hostileTexts() {
  using namespace std::string_literals;
  return {{"names", joined(misspelled(isoNames(200)))},
          {"one word over and over", "island "},
          {"one long word", "a"},
          {"(ab)^k", "ab"},
          {"long words", std::string(1000, 'a') + ' '},
          {"stars", "* a*a*a "},
          {"spaces", " "},
          {"zeros", "\0"s},
          {"ill-formed bytes", "\xFF"},
          {"ill-formed bytes in words", "isl\xC3(and\xE2\x82"},
          {"ideographs", "沖縄県"},
          {"accents on one letter", "\xCC\x81"},
          {"capitals that grow", "İ"},
          {"many equal words", kEqualWord + " "s},
          {"joined words", joinedWords(isoNames(200))}};
}

struct Mode {
  const char* name;
  MatchingMode mode;
};
constexpr std::array<Mode, 3> kModes = {{{"words", MatchingMode::words},
                                         {"text", MatchingMode::wholeText},
                                         {"phonetic", MatchingMode::phoneticWords}}};

struct Budgets {
  const char* name;
  Index::Options options;
};

std::vector<Budgets> budgets() {
  Index::Options unbounded;
  unbounded.maxQueryWords = kUnbounded;
  unbounded.maxWordUnits = kUnbounded;
  return {{"default budgets", {}}, {"no budgets", unbounded}};
}

/// The names as an index; its file is gone once it is open.
Index indexOf(MatchingMode mode, const Index::Options& options) {
  const auto path = std::filesystem::temp_directory_path() / "wordcatcher-hostile-bench.wci";
  IndexBuilder builder(path, {.mode = mode, .tables = {}});
  for (const auto& name : isoNames(kNames)) {
    builder.add(utf8(name), utf8(name));
  }
  std::string equalWords;
  for (std::size_t i = 0; i < kEqualWords; ++i) {
    equalWords += kEqualWord + std::string(" ");
  }
  builder.add(equalWords, "equal words");
  builder.add(std::string(kEqualWord) + kEqualWord, "joined words");
  builder.commit();
  Index index = Index::open(path, options);
  std::filesystem::remove(path);
  return index;
}

/// What is timed.
struct Call {
  const char* name;
  void (*of)(const Index& index, const std::string& text);
};
constexpr std::array<Call, 2> kCalls = {
    {{"query", [](const Index& index,
                  const std::string& text) { benchmark::DoNotOptimize(index.query(text)); }},
     {"find", [](const Index& index, const std::string& text) {
        benchmark::DoNotOptimize(index.find(text));
      }}}};

/// The name of a benchmark without its size.
std::string seriesName(const Call& call, const Mode& mode, const Budgets& budget,
                       const Hostile& hostile) {
  return std::string(call.name) + ", " + mode.name + ", " + budget.name + ", " + hostile.name;
}

std::string nameOf(const std::string& series, std::size_t kilobytes) {
  return series + ", " + std::to_string(kilobytes) + " KB";
}

/// Registers a benchmark for each size.
void addSeries(const std::string& series, const Call& call, const Index& index,
               const Hostile& hostile) {
  for (const std::size_t kilobytes : kKilobytes) {
    benchmark::RegisterBenchmark(nameOf(series, kilobytes).c_str(),
                                 [call, index, hostile, kilobytes](benchmark::State& state) {
                                   const auto text = hostile.text(kilobytes * kKilobyte);
                                   while (state.KeepRunning()) {
                                     call.of(index, text);
                                   }
                                 })
        ->Unit(benchmark::kMillisecond)
        ->MinTime(0.01)
        ->Repetitions(5);
  }
}

void printRatios(const std::string& series, const LeastTimeReporter& reporter) {
  if (!reporter.has(nameOf(series, kKilobytes.back()))) {
    return;  // a filter left it out
  }
  std::printf("%-62s", series.c_str());
  bool linear = true;
  for (std::size_t i = 1; i < kKilobytes.size(); ++i) {
    const double ratio =
        reporter.ratio(nameOf(series, kKilobytes[i]), nameOf(series, kKilobytes[i - 1]));
    linear = linear && ratio <= kLinearBound;
    std::printf("%9.2f", ratio);
  }
  std::printf("%s\n", linear ? "" : "  beyond 2.3");
}

void run() {
  std::vector<std::string> all;
  for (const auto& mode : kModes) {
    for (const auto& budget : budgets()) {
      const Index index = indexOf(mode.mode, budget.options);
      for (const auto& hostile : hostileTexts()) {
        for (const auto& call : kCalls) {
          all.push_back(seriesName(call, mode, budget, hostile));
          addSeries(all.back(), call, index, hostile);
        }
      }
    }
  }
  LeastTimeReporter reporter(LeastTimeReporter::Rows::fastest);
  benchmark::RunSpecifiedBenchmarks(&reporter);
  std::printf("\n%-62s", "Times as long as half the text (at most 2.3):");
  for (std::size_t i = 1; i < kKilobytes.size(); ++i) {
    std::printf("%6zu KB", kKilobytes[i]);
  }
  std::printf("\n");
  for (const auto& series : all) {
    printRatios(series, reporter);
  }
}

}  // namespace
}  // namespace wordcatcher::bench

int main(int argc, char** argv) {
  mallopt(M_MMAP_MAX, 0);
  mallopt(M_TRIM_THRESHOLD, -1);
  benchmark::Initialize(&argc, argv);
  wordcatcher::bench::run();
  return 0;
}
