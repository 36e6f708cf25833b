// How fast texts are encoded, and two bounds that the command checks itself against:
//
// - twice the text takes at most 2.3 times the time;
// - encoding takes at most 1.5 times what ICU takes to cut the same text into words and upper-case
//   them, which every encoder has to do.
//
// Prints both ratios and ends with 1 if one is beyond its bound. The text is English: the licences
// that every Debian system carries, repeated to the size wanted.

#include <benchmark/benchmark.h>
#include <unicode/ubrk.h>
#include <unicode/ustring.h>

#include <cstdio>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "LeastTimeReporter.h"
#include "wordcatcher/phonetic/KXMetaphone.h"

namespace {

constexpr std::size_t kMegabyte = 1'000'000;
constexpr double kLinearBound = 2.3;
constexpr double kIcuBound = 1.5;

constexpr const char* kEncode1 = "encode/1MB";
constexpr const char* kEncode2 = "encode/2MB";
constexpr const char* kIcu = "icuWords/1MB";

std::u16string licences() {
  std::u16string text;
  for (const char* name : {"GPL-3", "GPL-2", "LGPL-2.1", "GFDL-1.3", "Apache-2.0", "MPL-2.0",
                           "Artistic", "GPL-1", "CC0-1.0", "BSD"}) {
    std::ifstream file(std::string("/usr/share/common-licenses/") + name, std::ios::binary);
    // The licences are ASCII, so that a byte is a code unit.
    text.insert(text.end(), std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>());
  }
  if (text.empty()) {
    throw std::runtime_error("There are no licences in /usr/share/common-licenses.");
  }
  return text;
}

std::u16string englishText(std::size_t length) {
  static const std::u16string source = licences();
  std::u16string text;
  while (text.size() < length) {
    text += source;
  }
  text.resize(length);
  return text;
}

void encode(benchmark::State& state, std::size_t length) {
  const std::u16string text = englishText(length);
  wordcatcher::KXMetaphone encoder;
  while (state.KeepRunning()) {
    benchmark::DoNotOptimize(encoder.translate(text));
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * length));
}

void icuWords(benchmark::State& state, std::size_t length) {
  const std::u16string text = englishText(length);
  UErrorCode status = U_ZERO_ERROR;
  UBreakIterator* words = ubrk_open(UBRK_WORD, "", nullptr, 0, &status);
  UChar upper[256];
  while (state.KeepRunning()) {
    ubrk_setText(words, text.data(), static_cast<std::int32_t>(text.size()), &status);
    std::int32_t begin = 0;
    for (std::int32_t end = ubrk_next(words); end != UBRK_DONE; end = ubrk_next(words)) {
      if (ubrk_getRuleStatus(words) >= UBRK_WORD_NONE_LIMIT) {
        benchmark::DoNotOptimize(
            u_strToUpper(upper, std::size(upper), text.data() + begin, end - begin, "", &status));
      }
      begin = end;
    }
  }
  ubrk_close(words);
  if (U_FAILURE(status)) {
    throw std::runtime_error(u_errorName(status));
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * length));
}

bool within(double bound, double ratio, const char* what) {
  std::printf("%-55s %.2f (at most %.1f)\n", what, ratio, bound);
  return ratio <= bound;
}

BENCHMARK_CAPTURE(encode, 1MB, kMegabyte)->Unit(benchmark::kMillisecond)->Repetitions(9);
BENCHMARK_CAPTURE(encode, 2MB, 2 * kMegabyte)->Unit(benchmark::kMillisecond)->Repetitions(9);
BENCHMARK_CAPTURE(icuWords, 1MB, kMegabyte)->Unit(benchmark::kMillisecond)->Repetitions(9);

}  // namespace

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  using wordcatcher::bench::LeastTimeReporter;
  LeastTimeReporter reporter(LeastTimeReporter::Rows::aggregates);
  benchmark::RunSpecifiedBenchmarks(&reporter);
  const bool linear =
      within(kLinearBound, reporter.ratio(kEncode2, kEncode1), "2 MB against 1 MB of English:");
  const bool fast = within(kIcuBound, reporter.ratio(kEncode1, kIcu),
                           "encoding against ICU's words and upper-casing:");
  return linear && fast ? 0 : 1;
}
