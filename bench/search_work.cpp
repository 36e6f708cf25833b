// Looks up misspelled words in an image of a word list.
//
//     search_work WORDS QUERIES IMAGE [RESULTS]
//
// writes the image, opens it and prints one JSON object: sizes and seconds, and per distance the
// latency of a look-up, in microseconds, after a whole pass to warm up, and the number of words
// found. Into RESULTS it writes what it found, lines of the distance allowed, the query and the
// words with their distances.

#include <array>
#include <cstdint>
#include <fstream>

#include "WorkFiles.h"
#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/storage/SearchImageWriter.h"

namespace wordcatcher::bench {
namespace {

struct Distance {
  std::int64_t edits;
  const char* name;
};
constexpr std::array<Distance, 3> kDistances = {{{1, "k1"}, {2, "k2"}, {3, "k3"}}};

/// The words are ASCII.
std::u16string unitsOf(const std::string& word) { return {word.begin(), word.end()}; }

std::string asciiOf(const std::u16string& units) {
  std::string text;
  for (const char16_t unit : units) {
    text += static_cast<char>(unit);
  }
  return text;
}

std::vector<std::u16string> wordsOf(const std::string& path) {
  std::vector<std::u16string> words;
  for (const auto& line : linesOf(path)) {
    words.push_back(unitsOf(line));
  }
  return words;
}

void writeImage(const std::vector<std::u16string>& words, const std::string& path) {
  SearchImageWriter writer(0);
  for (const auto& word : words) {
    writer.addWord(word);
  }
  const auto bytes = std::move(writer).finish();
  std::ofstream file(path, std::ios::binary);
  file.write(reinterpret_cast<const char*>(bytes.data()),
             static_cast<std::streamsize>(bytes.size()));
  if (!file.flush()) {
    throw std::runtime_error("Cannot write " + path + ".");
  }
}

nlohmann::json lookUpAll(const SearchImage& image, const std::vector<std::u16string>& queries,
                         std::int64_t distance) {
  std::size_t found = 0;
  for (const auto& query : queries) {
    found += searchImage(image, query, distance).size();
  }
  std::size_t foundAgain = 0;
  auto seconds = medianSeconds(queries.size(), [&](std::size_t number) {
    foundAgain += searchImage(image, queries[number], distance).size();
  });
  if (foundAgain != kPasses * found) {
    throw std::runtime_error("A look-up did not find the same again.");
  }
  nlohmann::json result = latency(std::move(seconds));
  result["found"] = found;
  return result;
}

void writeResults(const SearchImage& image, const std::vector<std::u16string>& queries,
                  const std::string& path) {
  std::ofstream file(path);
  for (const auto& distance : kDistances) {
    for (const auto& query : queries) {
      file << distance.edits << '\t' << asciiOf(query) << '\t';
      for (const auto& hit : searchImage(image, query, distance.edits)) {
        file << asciiOf(image.textOf(hit.word)) << ':' << hit.distance << ' ';
      }
      file << '\n';
    }
  }
}

nlohmann::json run(const std::vector<std::string>& arguments) {
  const auto words = wordsOf(arguments.at(0));
  const auto queries = wordsOf(arguments.at(1));
  const std::string& path = arguments.at(2);
  nlohmann::json result;

  const Stopwatch build;
  writeImage(words, path);
  result["buildSeconds"] = build.seconds();

  const Stopwatch open;
  const auto image = SearchImage::open(path, SearchImage::Load::map);
  result["openSeconds"] = open.seconds();
  result["indexBytes"] = image->bytes().size();

  for (const auto& distance : kDistances) {
    result[distance.name] = lookUpAll(*image, queries, distance.edits);
  }
  if (arguments.size() > 3) {
    writeResults(*image, queries, arguments[3]);
  }
  return result;
}

}  // namespace
}  // namespace wordcatcher::bench

int main(int argc, char** argv) {
  return wordcatcher::bench::runDriver(argc, argv, &wordcatcher::bench::run);
}
