#ifndef WORDCATCHER_BENCH_WORKFILES_H
#define WORDCATCHER_BENCH_WORKFILES_H

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

/// Mean, median and 99th percentile, in microseconds, of how long queries took, in seconds.
nlohmann::json latency(std::vector<double> seconds);

/// What a driver's main() does: prints the JSON object that `run` makes of the arguments on one
/// line, or the failure on standard error, under the name of the program. Returns the exit code.
int runDriver(int argc, char** argv, nlohmann::json (*run)(const std::vector<std::string>&));

/// The most memory that the process ever held, in bytes.
std::size_t peakMemory();

}  // namespace wordcatcher::bench

#endif
