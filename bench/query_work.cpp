// Asks misspelled phrases of an index of phrases.
//
//     query_work PHRASES QUERIES INDEX plain|numbered
//
// prints one JSON object of what PhraseWork tells, for a query. A question is answered by any of
// the phrases that have the words of its source, or, if they are numbered, by the very record that
// it was made of; and no answer may be cut short.

#include <stdexcept>

#include "PhraseWork.h"

namespace wordcatcher::bench {
namespace {

nlohmann::json run(const std::vector<std::string>& arguments) {
  PhraseWork work(arguments);
  work.build();
  const Index index = work.open();
  work.ask([&index](const std::string& text) { return index.query(text); },
           [&work](const Question& question, std::string_view value) {
             return work.isNumbered() ? value == work.dataOf(question.source)
                                      : work.hasWordsOfSource(question, value);
           });
  if (work.result["truncated"] != 0) {
    throw std::runtime_error("A question was cut short.");
  }
  return work.result;
}

}  // namespace
}  // namespace wordcatcher::bench

int main(int argc, char** argv) {
  return wordcatcher::bench::runDriver(argc, argv, &wordcatcher::bench::run);
}
