// The yardstick of look-ups: every word of the list is compared, in the band of the table of edit
// distances that a bound leaves.
//
//     brute_force WORDS QUERIES [RESULTS]
//
// prints one JSON object as search_work does. Into RESULTS it writes lines of the bound, the query
// and the words with two distances: the plain one, and that of searches that may not leave out the
// head of the query before a code unit of the word is read.

#include <algorithm>
#include <array>
#include <cstdint>
#include <fstream>
#include <string_view>

#include "WorkFiles.h"

namespace wordcatcher::bench {
namespace {

constexpr int kLongest = 64;
struct Bound {
  int edits;
  const char* name;
};
constexpr std::array<Bound, 3> kBounds = {{{1, "k1"}, {2, "k2"}, {3, "k3"}}};

/// The edit distance of two words, or bound + 1 for anything beyond the bound. Cells farther from
/// the diagonal than the bound cost more than it, so only the others are computed.
int banded(std::string_view a, std::string_view b, int bound) {
  const int n = static_cast<int>(a.size());
  const int m = static_cast<int>(b.size());
  if (std::abs(n - m) > bound || n > kLongest || m > kLongest) {
    return bound + 1;
  }
  const int beyond = bound + 1;
  std::array<int, kLongest + 2> row;
  for (int j = 0; j <= std::min(m, bound); ++j) {
    row[j] = j;
  }
  if (bound + 1 <= m) {
    row[bound + 1] = beyond;
  }
  for (int i = 1; i <= n; ++i) {
    const int first = std::max(1, i - bound);
    const int last = std::min(m, i + bound);
    int diagonal = row[first - 1];
    row[first - 1] = first == 1 && i <= bound ? i : beyond;
    int least = row[first - 1];
    for (int j = first; j <= last; ++j) {
      const int replaced = diagonal + (a[i - 1] == b[j - 1] ? 0 : 1);
      diagonal = row[j];
      row[j] = std::min({replaced, row[j] + 1, row[j - 1] + 1});
      least = std::min(least, row[j]);
    }
    if (last < m) {
      row[last + 1] = beyond;
    }
    if (least > bound) {
      return beyond;
    }
  }
  return std::min(row[m], beyond);
}

/// The distance when the first edit is not leaving out the head of the query.
int readingFirst(std::string_view query, std::string_view word, int bound) {
  const auto rest = word.substr(1);
  const int replaced = (query[0] == word[0] ? 0 : 1) + banded(query.substr(1), rest, bound);
  return std::min({replaced, 1 + banded(query, rest, bound), bound + 1});
}

struct Hit {
  std::size_t word;
  int distance;
};

std::vector<Hit> scan(const std::vector<std::string>& words, const std::string& query, int bound) {
  std::vector<Hit> hits;
  for (std::size_t word = 0; word < words.size(); ++word) {
    const int distance = banded(query, words[word], bound);
    if (distance <= bound) {
      hits.push_back({word, distance});
    }
  }
  return hits;
}

nlohmann::json run(const std::vector<std::string>& arguments) {
  const auto words = linesOf(arguments.at(0));
  const auto queries = linesOf(arguments.at(1));
  std::ofstream results;
  if (arguments.size() > 2) {
    results.open(arguments[2]);
  }
  for (const auto& word : words) {
    if (word.size() > kLongest) {
      throw std::runtime_error("A word is longer than the table.");
    }
  }
  nlohmann::json output;
  for (const auto& [bound, name] : kBounds) {
    std::vector<double> seconds;
    std::size_t found = 0;
    for (const auto& query : queries) {
      const Stopwatch watch;
      const auto hits = scan(words, query, bound);
      seconds.push_back(watch.seconds());
      found += hits.size();
      if (results.is_open()) {
        results << bound << '\t' << query << '\t';
        for (const auto& hit : hits) {
          results << words[hit.word] << ':' << hit.distance << ':'
                  << readingFirst(query, words[hit.word], bound) << ' ';
        }
        results << '\n';
      }
    }
    output[name] = latency(std::move(seconds));
    output[name]["found"] = found;
  }
  return output;
}

}  // namespace
}  // namespace wordcatcher::bench

int main(int argc, char** argv) {
  return wordcatcher::bench::runDriver(argc, argv, &wordcatcher::bench::run);
}
