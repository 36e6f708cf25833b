#include "WorkFiles.h"

#include <sys/resource.h>

#include <algorithm>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <numeric>
#include <stdexcept>

namespace wordcatcher::bench {

std::vector<std::string> linesOf(const std::string& path) {
  std::ifstream file(path);
  if (!file) {
    throw std::runtime_error("Cannot read " + path + "; write it with the programs in bench/data.");
  }
  std::vector<std::string> lines;
  for (std::string line; std::getline(file, line);) {
    lines.push_back(line);
  }
  return lines;
}

std::vector<Question> questionsOf(const std::string& path) {
  std::vector<Question> questions;
  for (const auto& line : linesOf(path)) {
    const std::size_t tab = line.find('\t');
    questions.push_back({std::stoul(line.substr(0, tab)), line.substr(tab + 1)});
  }
  return questions;
}

nlohmann::json latency(std::vector<double> seconds) {
  std::sort(seconds.begin(), seconds.end());
  const double sum = std::accumulate(seconds.begin(), seconds.end(), 0.0);
  const auto count = static_cast<double>(seconds.size());
  constexpr double kMicroseconds = 1e6;
  return {{"mean", sum / count * kMicroseconds},
          {"p50", seconds[seconds.size() / 2] * kMicroseconds},
          {"p99", seconds[seconds.size() * 99 / 100] * kMicroseconds}};
}

int runDriver(int argc, char** argv, nlohmann::json (*run)(const std::vector<std::string>&)) {
  try {
    std::cout << run({argv + 1, argv + argc}) << '\n';
    return 0;
  } catch (const std::exception& error) {
    std::cerr << std::filesystem::path(argv[0]).filename().string() << ": " << error.what() << '\n';
    return 1;
  }
}

std::size_t peakMemory() {
  rusage usage = {};
  getrusage(RUSAGE_SELF, &usage);
  constexpr std::size_t kUnit = 1024;
  return static_cast<std::size_t>(usage.ru_maxrss) * kUnit;
}

}  // namespace wordcatcher::bench
