#ifndef WORDCATCHER_BENCH_WORKFILES_H
#define WORDCATCHER_BENCH_WORKFILES_H

#include <algorithm>
#include <array>
#include <chrono>
#include <cstddef>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace wordcatcher::bench {

/// The lines of a file, as bench/data/ writes them. Throws std::runtime_error when it cannot be
/// read.
std::vector<std::string> linesOf(const std::string& path);

/// A question, and the number (from 0) of the phrase that it was made of.
struct Question {
  std::size_t source;
  std::string text;
};

/// The questions of a file of lines of a number, a tab and a text.
std::vector<Question> questionsOf(const std::string& path);

/// Seconds since its making.
class Stopwatch {
 public:
  double seconds() const {
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - _start).count();
  }

 private:
  std::chrono::steady_clock::time_point _start = std::chrono::steady_clock::now();
};

/// How often each question is asked to see how long it takes.
inline constexpr std::size_t kPasses = 3;

/// Asks all of so many questions, pass by pass, and tells the seconds of each: the median of the
/// passes, which leaves out what else the machine did. `ask(number)` asks one, the first being 0.
template <typename Ask>
std::vector<double> medianSeconds(std::size_t questions, Ask ask) {
  std::vector<std::array<double, kPasses>> passes(questions);
  for (std::size_t pass = 0; pass < kPasses; ++pass) {
    for (std::size_t number = 0; number < questions; ++number) {
      const Stopwatch watch;
      ask(number);
      passes[number][pass] = watch.seconds();
    }
  }
  std::vector<double> seconds;
  for (auto& times : passes) {
    std::sort(times.begin(), times.end());
    seconds.push_back(times[kPasses / 2]);
  }
  return seconds;
}

/// Mean, median and 99th percentile, in microseconds, of how long queries took, in seconds.
nlohmann::json latency(std::vector<double> seconds);

/// What a driver's main() does: prints the JSON object that `run` makes of the arguments on one
/// line, or the failure on standard error, under the name of the program. Returns the exit code.
int runDriver(int argc, char** argv, nlohmann::json (*run)(const std::vector<std::string>&));

/// The most memory that the process ever held, in bytes.
std::size_t peakMemory();

}  // namespace wordcatcher::bench

#endif
