#include "PhraseWork.h"

#include <algorithm>

#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::bench {

namespace {

std::string_view phraseOfValue(std::string_view value) { return value.substr(0, value.find("{ ")); }

std::string spaced(std::string_view phrase) {
  std::string words(phrase);
  std::replace(words.begin(), words.end(), '-', ' ');
  return words;
}

}  // namespace

PhraseWork::PhraseWork(const std::vector<std::string>& arguments)
    : _phrases(linesOf(arguments.at(0))),
      _questions(questionsOf(arguments.at(1))),
      _path(arguments.at(2)),
      _numbered(arguments.at(3) == "numbered") {}

void PhraseWork::build() {
  result["inputBytes"] = peakMemory();
  const Stopwatch watch;
  IndexBuilder builder(_path);
  for (std::size_t number = 0; number < _phrases.size(); ++number) {
    builder.add(_phrases[number], dataOf(number));
  }
  result["indexBytes"] = builder.commit();
  result["buildSeconds"] = watch.seconds();
  result["buildPeakBytes"] = peakMemory();
}

Index PhraseWork::open() {
  const Stopwatch watch;
  Index index = Index::open(_path);
  result["openSeconds"] = watch.seconds();
  return index;
}

bool PhraseWork::hasWordsOfSource(const Question& question, std::string_view value) const {
  return spaced(phraseOfValue(value)) == spaced(_phrases[question.source]);
}

bool PhraseWork::isSpelledAsSource(const Question& question, std::string_view value) const {
  return phraseOfValue(value) == _phrases[question.source];
}

}  // namespace wordcatcher::bench
