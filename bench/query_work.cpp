// Asks misspelled phrases of an index of phrases.
//
//     query_work PHRASES QUERIES INDEX plain|numbered
//
// builds the index, opens it and prints one JSON object: sizes and seconds, peak memory after the
// build and in all, the latency of a query, in microseconds, after a whole pass to warm up, and how
// many questions found the phrase that they were made of: first, within ten, or at all. The data
// string of a phrase is itself; "numbered" adds its number, so that phrases that repeat are records
// of their own.

#include <algorithm>

#include "WorkFiles.h"
#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::bench {
namespace {

constexpr std::size_t kShown = 10;

class QueryWork {
 public:
  QueryWork(std::vector<std::string> phrases, std::vector<Question> questions, bool numbered)
      : _phrases(std::move(phrases)), _questions(std::move(questions)), _numbered(numbered) {}

  void build(const std::string& path) {
    const std::size_t before = peakMemory();
    const Stopwatch watch;
    IndexBuilder builder(path);
    for (std::size_t number = 0; number < _phrases.size(); ++number) {
      builder.add(_phrases[number], dataOf(number));
    }
    result["indexBytes"] = builder.commit();
    result["buildSeconds"] = watch.seconds();
    result["inputBytes"] = before;
    result["buildPeakBytes"] = peakMemory();
  }

  void ask(const std::string& path) {
    const Stopwatch open;
    const Index index = Index::open(path);
    result["openSeconds"] = open.seconds();

    for (const auto& question : _questions) {
      judge(question, index.query(question.text));
    }
    std::vector<double> seconds;
    for (const auto& question : _questions) {
      const Stopwatch watch;
      const auto answer = index.query(question.text);
      seconds.push_back(watch.seconds());
      if (answer.truncated) {
        throw std::runtime_error("A question was cut short: " + question.text);
      }
    }
    result["query"] = latency(std::move(seconds));
    result["questions"] = _questions.size();
    result["foundFirst"] = _first;
    result["foundWithinTen"] = _withinTen;
    result["found"] = _found;
    result["matches"] = _matches;
    result["peakBytes"] = peakMemory();
  }

  nlohmann::json result;

 private:
  std::string dataOf(std::size_t number) const {
    return _numbered ? _phrases[number] + "{ " + std::to_string(number) + " }" : _phrases[number];
  }

  void judge(const Question& question, const Index::QueryResult& answer) {
    const auto& matches = answer.matches;
    const auto source = std::find_if(
        matches.begin(), matches.end(),
        [&](const Index::Match& match) { return match.value == dataOf(question.source); });
    const auto place = static_cast<std::size_t>(source - matches.begin());
    _matches += matches.size();
    _found += source != matches.end() ? 1 : 0;
    _first += source != matches.end() && place == 0 ? 1 : 0;
    _withinTen += source != matches.end() && place < kShown ? 1 : 0;
  }

  std::vector<std::string> _phrases;
  std::vector<Question> _questions;
  bool _numbered;
  std::size_t _found = 0;
  std::size_t _first = 0;
  std::size_t _withinTen = 0;
  std::size_t _matches = 0;
};

nlohmann::json run(const std::vector<std::string>& arguments) {
  QueryWork work(linesOf(arguments.at(0)), questionsOf(arguments.at(1)),
                 arguments.at(3) == "numbered");
  work.build(arguments.at(2));
  work.ask(arguments.at(2));
  return work.result;
}

}  // namespace
}  // namespace wordcatcher::bench

int main(int argc, char** argv) {
  return wordcatcher::bench::runDriver(argc, argv, &wordcatcher::bench::run);
}
