#include "wordcatcher/c/Results.h"

#include <cstddef>
#include <utility>

namespace {

/// An element, or null when there is none of this number.
template <typename Element>
const Element* elementOf(const std::vector<Element>& elements, std::size_t number) {
  return number < elements.size() ? &elements[number] : nullptr;
}

const char* textOf(const std::string* text, std::size_t* length) {
  if (length != nullptr) {
    *length = text == nullptr ? 0 : text->size();
  }
  return text == nullptr ? nullptr : text->c_str();
}

/// Query matches and search matches have the same members.
template <typename Match>
void take(std::vector<Match> matches, wordcatcher_matches& result) {
  result.values.reserve(matches.size());
  result.data.reserve(matches.size());
  result.records.reserve(matches.size());
  for (auto& match : matches) {
    const std::string& value = result.values.emplace_back(std::move(match.value));
    const auto& data = result.data.emplace_back(std::move(match.data));
    result.records.push_back({value.c_str(), value.size(), match.distance, data.size()});
  }
}

wordcatcher_hit hitOf(const wordcatcher::FoundWord& word) {
  return {word.word.c_str(), word.word.size(), word.begin, word.end, word.edits};
}

}  // namespace

std::unique_ptr<wordcatcher_matches> wordcatcher_matches::of(
    wordcatcher::Index::QueryResult result) {
  auto matches = std::make_unique<wordcatcher_matches>();
  matches->found = result.found;
  matches->truncated = result.truncated;
  take(std::move(result.matches), *matches);
  return matches;
}

std::unique_ptr<wordcatcher_matches> wordcatcher_matches::of(
    wordcatcher::Index::SearchResult result) {
  auto matches = std::make_unique<wordcatcher_matches>();
  matches->found = !result.matches.empty();
  matches->truncated = result.truncated;
  take(std::move(result.matches), *matches);
  return matches;
}

std::unique_ptr<wordcatcher_findings> wordcatcher_findings::of(wordcatcher::FindResult result) {
  auto findings = std::make_unique<wordcatcher_findings>();
  findings->result = std::move(result);
  for (const auto& match : findings->result.matches) {
    auto& hits = findings->hits.emplace_back();
    hits.reserve(match.hits.size());
    for (const auto& word : match.hits) {
      hits.push_back(hitOf(word));
    }
    findings->records.push_back({match.value.c_str(), match.value.size(), match.cost, match.begin,
                                 match.end, match.hits.size()});
  }
  return findings;
}

size_t wordcatcher_matches_count(const wordcatcher_matches* matches) {
  return matches == nullptr ? 0 : matches->records.size();
}

const wordcatcher_match* wordcatcher_matches_at(const wordcatcher_matches* matches, size_t match) {
  return matches == nullptr ? nullptr : elementOf(matches->records, match);
}

const char* wordcatcher_matches_data(const wordcatcher_matches* matches, size_t match, size_t data,
                                     size_t* length) {
  const auto* const strings = matches == nullptr ? nullptr : elementOf(matches->data, match);
  return textOf(strings == nullptr ? nullptr : elementOf(*strings, data), length);
}

bool wordcatcher_matches_found(const wordcatcher_matches* matches) {
  return matches != nullptr && matches->found;
}

bool wordcatcher_matches_truncated(const wordcatcher_matches* matches) {
  return matches != nullptr && matches->truncated;
}

void wordcatcher_matches_free(wordcatcher_matches* matches) { delete matches; }

size_t wordcatcher_findings_count(const wordcatcher_findings* findings) {
  return findings == nullptr ? 0 : findings->records.size();
}

const wordcatcher_finding* wordcatcher_findings_at(const wordcatcher_findings* findings,
                                                   size_t finding) {
  return findings == nullptr ? nullptr : elementOf(findings->records, finding);
}

const wordcatcher_hit* wordcatcher_findings_hit(const wordcatcher_findings* findings,
                                                size_t finding, size_t hit) {
  const auto* const hits = findings == nullptr ? nullptr : elementOf(findings->hits, finding);
  return hits == nullptr ? nullptr : elementOf(*hits, hit);
}

bool wordcatcher_findings_truncated(const wordcatcher_findings* findings) {
  return findings != nullptr && findings->result.truncated;
}

void wordcatcher_findings_free(wordcatcher_findings* findings) { delete findings; }

const char* wordcatcher_explanation_json(const wordcatcher_explanation* explanation,
                                         size_t* length) {
  return textOf(explanation == nullptr ? nullptr : &explanation->json, length);
}

const char* wordcatcher_explanation_text(const wordcatcher_explanation* explanation,
                                         size_t* length) {
  return textOf(explanation == nullptr ? nullptr : &explanation->text, length);
}

bool wordcatcher_explanation_is_stored(const wordcatcher_explanation* explanation) {
  return explanation != nullptr && explanation->isStored;
}

bool wordcatcher_explanation_is_found(const wordcatcher_explanation* explanation) {
  return explanation != nullptr && explanation->isFound;
}

void wordcatcher_explanation_free(wordcatcher_explanation* explanation) { delete explanation; }
