// Finds misspelled phrases in an index of phrases.
//
//     find_work PHRASES QUERIES INDEX plain|numbered
//
// builds the index, opens it and prints one JSON object: the latency of a find with ten matches, in
// microseconds, after a whole pass to warm up, and how many questions found the phrase that they
// were made of: first, or within ten. The data string of a phrase is itself; "numbered" adds its
// number, so that phrases that repeat are records of their own, and a question is answered by any
// of them.

#include <algorithm>

#include "WorkFiles.h"
#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::bench {
namespace {

class FindWork {
 public:
  FindWork(std::vector<std::string> phrases, std::vector<Question> questions, bool numbered)
      : _phrases(std::move(phrases)), _questions(std::move(questions)), _numbered(numbered) {}

  void build(const std::string& path) {
    const Stopwatch watch;
    IndexBuilder builder(path);
    for (std::size_t number = 0; number < _phrases.size(); ++number) {
      const std::string& phrase = _phrases[number];
      builder.add(phrase, _numbered ? phrase + "{ " + std::to_string(number) + " }" : phrase);
    }
    result["indexBytes"] = builder.commit();
    result["buildSeconds"] = watch.seconds();
  }

  void ask(const std::string& path) {
    const Index index = Index::open(path);
    std::size_t first = 0;
    std::size_t withinTen = 0;
    std::size_t truncated = 0;
    for (const auto& question : _questions) {
      const auto answer = index.find(question.text);
      const auto& matches = answer.matches;
      const std::string& source = _phrases[question.source];
      const auto at =
          std::find_if(matches.begin(), matches.end(), [&source](const FoundPhrase& match) {
            return std::string_view(match.value).substr(0, match.value.find("{ ")) == source;
          });
      first += at == matches.begin() && at != matches.end() ? 1 : 0;
      withinTen += at != matches.end() ? 1 : 0;
      truncated += answer.truncated ? 1 : 0;
    }
    std::vector<double> seconds;
    for (const auto& question : _questions) {
      const Stopwatch watch;
      index.find(question.text);
      seconds.push_back(watch.seconds());
    }
    result["query"] = latency(std::move(seconds));
    result["questions"] = _questions.size();
    result["foundFirst"] = first;
    result["foundWithinTen"] = withinTen;
    result["truncated"] = truncated;
    result["peakBytes"] = peakMemory();
  }

  nlohmann::json result;

 private:
  std::vector<std::string> _phrases;
  std::vector<Question> _questions;
  bool _numbered;
};

nlohmann::json run(const std::vector<std::string>& arguments) {
  FindWork work(linesOf(arguments.at(0)), questionsOf(arguments.at(1)),
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
