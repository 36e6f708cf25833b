#ifndef WORDCATCHER_C_RESULTS_H
#define WORDCATCHER_C_RESULTS_H

#include <memory>
#include <string>
#include <vector>

#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/wordcatcher.h"

// The results of C++ calls beside the records that C reads, which point into them. Each is made
// whole, so that reading it can never fail, and stays where it was made.

struct wordcatcher_matches {
  static std::unique_ptr<wordcatcher_matches> of(wordcatcher::Index::QueryResult result);
  static std::unique_ptr<wordcatcher_matches> of(wordcatcher::Index::SearchResult result);

  bool found = false;
  bool truncated = false;
  std::vector<std::string> values;
  std::vector<std::vector<std::string>> data;
  std::vector<wordcatcher_match> records;
};

struct wordcatcher_findings {
  static std::unique_ptr<wordcatcher_findings> of(wordcatcher::FindResult result);

  wordcatcher::FindResult result;
  std::vector<wordcatcher_finding> records;
  std::vector<std::vector<wordcatcher_hit>> hits;
};

struct wordcatcher_explanation {
  /// Of a FindExplanation or a QueryExplanation.
  template <typename Explanation>
  static std::unique_ptr<wordcatcher_explanation> of(const Explanation& explanation) {
    auto result = std::make_unique<wordcatcher_explanation>();
    result->json = explanation.toJson();
    result->text = explanation.toText();
    result->isStored = explanation.isStored;
    result->isFound = explanation.isFound;
    return result;
  }

  std::string json;
  std::string text;
  bool isStored = false;
  bool isFound = false;
};

#endif
