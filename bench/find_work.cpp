// Finds misspelled phrases in an index of phrases.
//
//     find_work PHRASES QUERIES INDEX plain|numbered
//
// prints one JSON object of what PhraseWork tells, for a find with ten matches. A question is
// answered by any of the phrases that have the words of its source.

#include "PhraseWork.h"

namespace wordcatcher::bench {
namespace {

nlohmann::json run(const std::vector<std::string>& arguments) {
  PhraseWork work(arguments);
  work.build();
  const Index index = work.open();
  work.ask([&index](const std::string& text) { return index.find(text); },
           [&work](const Question& question, std::string_view value) {
             return work.hasWordsOfSource(question, value);
           });
  return work.result;
}

}  // namespace
}  // namespace wordcatcher::bench

int main(int argc, char** argv) {
  return wordcatcher::bench::runDriver(argc, argv, &wordcatcher::bench::run);
}
