#include "PhraseWork.h"

#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::bench {

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

}  // namespace wordcatcher::bench
