#include "FindSupport.h"

#include "TestSupport.h"

namespace wordcatcher::testing {

Index indexOf(const Entries& entries, MatchingMode mode, const Index::Options& options) {
  const TemporaryDirectory directory;
  const std::string path = directory.file("phrases.wci");
  IndexBuilder builder(path, {.mode = mode, .tables = {}});
  for (const auto& [phrase, value] : entries) {
    builder.add(phrase, value);
  }
  builder.commit();
  return Index::open(path, options);
}

Index indexOfPhrases(const std::vector<std::string>& phrases, MatchingMode mode,
                     const Index::Options& options) {
  Entries entries;
  for (const auto& phrase : phrases) {
    entries.emplace_back(phrase, phrase);
  }
  return indexOf(entries, mode, options);
}

std::vector<std::string> linesOf(const std::vector<FoundPhrase>& matches) {
  std::vector<std::string> lines;
  for (const auto& match : matches) {
    std::string line = match.value + " costs " + std::to_string(match.cost) + " at " +
                       std::to_string(match.begin) + '-' + std::to_string(match.end) + ':';
    for (const auto& hit : match.hits) {
      line += ' ' + hit.word + '@' + std::to_string(hit.begin) + '-' + std::to_string(hit.end) +
              '+' + std::to_string(hit.edits);
    }
    lines.push_back(line);
  }
  return lines;
}

FindOptions unlimited() {
  FindOptions options;
  options.limit = SIZE_MAX;
  options.maxPostings = UINT64_MAX;
  return options;
}

std::vector<std::string> valuesOf(const FindResult& result) {
  std::vector<std::string> values;
  for (const auto& match : result.matches) {
    values.push_back(match.value);
  }
  return values;
}

}  // namespace wordcatcher::testing
