#include "LiteralSpanQuery.h"

#include <algorithm>
#include <cstdlib>
#include <utility>

namespace wordcatcher::testing {

namespace {

// Ends the phrase at the head of a data string and begins the host's own fields.
constexpr std::u16string_view kFieldSeparator = u"{ ";

std::int64_t lengthOf(std::u16string_view text) { return static_cast<std::int64_t>(text.size()); }

std::int64_t wrappingAdd(std::int64_t a, std::int64_t b) {
  return static_cast<std::int64_t>(static_cast<std::uint64_t>(a) + static_cast<std::uint64_t>(b));
}

std::int64_t wrappingSubtract(std::int64_t a, std::int64_t b) {
  return static_cast<std::int64_t>(static_cast<std::uint64_t>(a) - static_cast<std::uint64_t>(b));
}

std::int64_t wrappingMultiply(std::int64_t a, std::int64_t b) {
  return static_cast<std::int64_t>(static_cast<std::uint64_t>(a) * static_cast<std::uint64_t>(b));
}

template <typename Set>
void addToAll(Set& phrases, std::int64_t penalty) {
  for (auto& [value, distance] : phrases) {
    distance = wrappingAdd(distance, penalty);
  }
}

template <typename Set>
bool sameValues(const Set& a, const Set& b) {
  return a.size() == b.size() && std::all_of(a.begin(), a.end(), [&b](const auto& entry) {
           return b.contains(entry.first);
         });
}

}  // namespace

std::optional<std::vector<KXWordcatch>> LiteralSpanQuery::run(std::u16string_view text) {
  lookUpLongWords(text);
  if (_searchedWords == 0) {
    lookUpEveryWord(text);
  }
  if (_candidates.empty()) {
    return std::nullopt;
  }
  CandidateSet phrases = _candidates.front();
  // Words that bring exactly the first word's phrases tell nothing new.
  std::erase_if(_candidates,
                [&phrases](const CandidateSet& set) { return sameValues(set, phrases); });
  penaliseMissingHits(phrases);
  for (const auto& others : _candidates) {
    intersect(phrases, others);
  }
  penaliseLength(phrases);
  return withinBound(std::move(phrases));
}

void LiteralSpanQuery::lookUpLongWords(std::u16string_view text) {
  _segmenter.start(text);
  while (const auto word = _segmenter.next()) {
    if (lengthOf(*word) <= _limits.ignoredWordLength) {
      continue;
    }
    lookUp(*word);
    ++_searchedWords;
    if (lengthOf(*word) > _limits.ignoredWordLengthForEditDistance) {
      ++_countedWords;
    }
  }
}

void LiteralSpanQuery::lookUpEveryWord(std::u16string_view text) {
  _segmenter.start(text);
  while (const auto word = _segmenter.next()) {
    lookUp(*word);
    ++_countedWords;
  }
}

/// The phrases of every indexed word near this one. A phrase keeps the distance of the first match
/// that brings it, in the index's order, which need not be the nearest.
void LiteralSpanQuery::lookUp(std::u16string_view word) {
  CandidateSet phrases;
  for (const auto& match : _search(word, _limits.editDistance)) {
    _wordsMatched = wrappingAdd(_wordsMatched, 1);
    for (const auto& value : match.data()) {
      phrases.try_emplace(value, match.distance());
    }
  }
  if (!phrases.empty()) {
    _candidates.push_back(std::move(phrases));
  }
}

void LiteralSpanQuery::penaliseMissingHits(CandidateSet& phrases) const {
  if (_wordsMatched >= _countedWords) {
    return;
  }
  const auto missing = wrappingSubtract(_countedWords, _wordsMatched);
  addToAll(phrases, wrappingAdd(wrappingMultiply(missing, _limits.editDistance), 1));
}

void LiteralSpanQuery::intersect(CandidateSet& phrases, const CandidateSet& others) {
  CandidateSet common;
  for (const auto& [value, distance] : phrases) {
    const auto other = others.find(value);
    if (other != others.end()) {
      common.emplace(value, wrappingAdd(distance, other->second));
    }
  }
  if (common.empty()) {
    // Twice the counted words whatever the edit distance is, so that a word that shares no phrase
    // with the others counts against them in phonetic mode too.
    addToAll(phrases, wrappingAdd(wrappingMultiply(2, _countedWords), 1));
    return;
  }
  phrases = std::move(common);
  _wordsMatched = wrappingAdd(_wordsMatched, 1);
}

void LiteralSpanQuery::penaliseLength(CandidateSet& phrases) {
  for (auto& [value, distance] : phrases) {
    const std::int64_t difference = countedWordsOf(value) - _countedWords;
    distance = wrappingAdd(distance, _limits.editDistance * std::abs(difference));
  }
}

std::int64_t LiteralSpanQuery::countedWordsOf(std::u16string_view value) {
  std::int64_t count = 0;
  _segmenter.start(value.substr(0, value.find(kFieldSeparator)));
  while (const auto word = _segmenter.next()) {
    if (lengthOf(*word) > _limits.ignoredWordLengthForEditDistance) {
      ++count;
    }
  }
  return count;
}

std::vector<KXWordcatch> LiteralSpanQuery::withinBound(CandidateSet&& phrases) const {
  const std::int64_t bound = _limits.editDistance * _countedWords;
  std::vector<KXWordcatch> records;
  for (auto& [value, distance] : phrases) {
    if (distance <= bound) {
      records.emplace_back(value, distance);
    }
  }
  std::sort(records.begin(), records.end(), [](const KXWordcatch& a, const KXWordcatch& b) {
    return a.distance() != b.distance() ? a.distance() < b.distance() : a.value() < b.value();
  });
  return records;
}

}  // namespace wordcatcher::testing
