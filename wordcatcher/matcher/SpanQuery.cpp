#include "wordcatcher/matcher/SpanQuery.h"

#include <algorithm>
#include <cstdlib>
#include <utility>

#include "wordcatcher/text/CodeUnitOrder.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

// Up to this many postings, or this part of all values, sorting them costs less than marking them
// in an array of all values.
constexpr std::size_t kShortLists = 4096;
constexpr std::size_t kShortPart = 16;

// Where one list is this many times as long as the other, its elements are searched for one by one.
constexpr std::size_t kMuchLonger = 16;

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

/// The first place from `begin` on that is not below `value`: near places are tried first, since
/// the values that are asked for ascend as well.
template <typename Iterator>
Iterator gallop(Iterator begin, Iterator end, std::uint32_t value) {
  std::ptrdiff_t step = 1;
  Iterator low = begin;
  while (end - low > step && low[step] < value) {
    low += step;
    step *= 2;
  }
  return std::lower_bound(low, end - low > step ? low + step + 1 : end, value);
}

}  // namespace

std::optional<std::vector<ScoredValue>> SpanQuery::run(std::u16string_view text) {
  lookUpLongWords(text);
  if (_searchedWords == 0) {
    if (_trace != nullptr) {
      _trace->lookUpAll();
    }
    lookUpEveryWord(text);
  }
  if (_trace != nullptr) {
    _trace->count(_countedWords, _limits.ignoredWordLengthForEditDistance, !_candidates.empty());
  }
  if (_candidates.empty()) {
    return std::nullopt;
  }
  const CandidateSet first = std::move(_candidates.front());
  _phrases.reserve(first.values.size());
  for (std::size_t i = 0; i < first.values.size(); ++i) {
    _phrases.push_back({first.values[i], first.distances[i]});
  }
  if (_trace != nullptr) {
    _trace->begin();
  }
  penaliseMissingHits();
  for (std::size_t i = 1; i < _candidates.size(); ++i) {
    // Words that bring exactly the first word's phrases tell nothing new.
    const bool isSame = _candidates[i].values == first.values;
    const bool isCommon = !isSame && intersect(_candidates[i]);
    if (_trace != nullptr) {
      using Compared = SpanQueryTrace::Compared;
      _trace->compare(i,
                      isSame     ? Compared::same
                      : isCommon ? Compared::common
                                 : Compared::disjoint,
                      disjointPenalty());
    }
  }
  return scored();
}

void SpanQuery::lookUpLongWords(std::u16string_view text) {
  std::size_t seen = 0;
  _segmenter.start(text);
  while (const auto word = _segmenter.next()) {
    if (seen++ == _limits.maxWords) {
      _truncated = true;
      return;
    }
    if (lengthOf(*word) <= _limits.ignoredWordLength) {
      if (_trace != nullptr) {
        _trace->leaveOut(*word, "too short");
      }
      continue;
    }
    lookUp(*word);
    ++_searchedWords;
    if (lengthOf(*word) > _limits.ignoredWordLengthForEditDistance) {
      ++_countedWords;
    }
  }
}

void SpanQuery::lookUpEveryWord(std::u16string_view text) {
  std::size_t seen = 0;
  _segmenter.start(text);
  while (const auto word = _segmenter.next()) {
    if (seen++ == _limits.maxWords) {
      _truncated = true;
      return;
    }
    lookUp(*word);
    ++_countedWords;
  }
}

/// The phrases of every indexed word near this one. Every near word counts as a hit, also one
/// without values.
void SpanQuery::lookUp(std::u16string_view word) {
  if (word.size() > _limits.maxWordUnits) {
    _truncated = true;
    if (_trace != nullptr) {
      _trace->leaveOut(word, "too long");
    }
    return;
  }
  const auto hits = searchImage(_image, toLower(word), _limits.editDistance);
  _wordsMatched = wrappingAdd(_wordsMatched, static_cast<std::int64_t>(hits.size()));
  CandidateSet phrases = candidatesOf(hits);
  if (_trace != nullptr) {
    const auto at = std::lower_bound(phrases.values.begin(), phrases.values.end(), _trace->value());
    const bool isIn = at != phrases.values.end() && *at == _trace->value();
    _trace->lookUp(
        word, hits,
        isIn ? std::optional<std::int64_t>(
                   phrases.distances[static_cast<std::size_t>(at - phrases.values.begin())])
             : std::nullopt);
  }
  if (!phrases.values.empty()) {
    _candidates.push_back(std::move(phrases));
  }
}

/// A phrase keeps the distance of the first hit that brings it, in the order of the search, which
/// need not be the nearest.
SpanQuery::CandidateSet SpanQuery::candidatesOf(const std::vector<WordHit>& hits) const {
  std::size_t postings = 0;
  for (const auto& hit : hits) {
    postings += hit.values;
  }
  const bool isShort = postings <= std::max(kShortLists, _image.valueCount() / kShortPart);
  return isShort ? mergeShortLists(hits) : markLongLists(hits);
}

SpanQuery::CandidateSet SpanQuery::mergeShortLists(const std::vector<WordHit>& hits) const {
  struct Posting {
    std::uint32_t value;
    std::uint32_t hit;
  };
  std::vector<Posting> postings;
  for (std::uint32_t hit = 0; hit < hits.size(); ++hit) {
    for (const std::uint32_t value : _image.postingsOf(hits[hit].word)) {
      postings.push_back({value, hit});
    }
  }
  std::sort(postings.begin(), postings.end(), [](const Posting& a, const Posting& b) {
    return a.value != b.value ? a.value < b.value : a.hit < b.hit;
  });
  CandidateSet set;
  for (const auto& posting : postings) {
    if (set.values.empty() || set.values.back() != posting.value) {
      set.values.push_back(posting.value);
      set.distances.push_back(hits[posting.hit].distance);
    }
  }
  return set;
}

SpanQuery::CandidateSet SpanQuery::markLongLists(const std::vector<WordHit>& hits) const {
  // 0 for a value that no hit brings, else its distance and one. A distance is at most the limit of
  // the query, which is small.
  std::vector<std::uint8_t> marks(_image.valueCount());
  std::size_t count = 0;
  for (const auto& hit : hits) {
    const auto mark = static_cast<std::uint8_t>(hit.distance + 1);
    for (const std::uint32_t value : _image.postingsOf(hit.word)) {
      if (value >= marks.size()) {
        _image.throwDamaged("a posting list refers to a data string that is not there");
      }
      if (marks[value] == 0) {
        marks[value] = mark;
        ++count;
      }
    }
  }
  CandidateSet set;
  set.values.reserve(count);
  set.distances.reserve(count);
  for (std::uint32_t value = 0; value < marks.size(); ++value) {
    if (marks[value] != 0) {
      set.values.push_back(value);
      set.distances.push_back(marks[value] - 1U);
    }
  }
  return set;
}

void SpanQuery::penaliseMissingHits() {
  if (_wordsMatched >= _countedWords) {
    return;
  }
  const auto missing = wrappingSubtract(_countedWords, _wordsMatched);
  _penalty = wrappingAdd(wrappingMultiply(missing, _limits.editDistance), 1);
  if (_trace != nullptr) {
    _trace->penaliseMissing(missing, _penalty);
  }
}

/// Twice the counted words whatever the edit distance is, so that a word that shares no phrase with
/// the others counts against them in phonetic mode too.
std::int64_t SpanQuery::disjointPenalty() const {
  return wrappingAdd(wrappingMultiply(2, _countedWords), 1);
}

/// Cuts the phrases in play to those that these candidates hold as well; false when there are none.
bool SpanQuery::intersect(const CandidateSet& others) {
  std::vector<ScoredValue> common;
  const auto begin = others.values.begin();
  const auto end = others.values.end();
  if (others.values.size() / kMuchLonger >= _phrases.size()) {
    auto place = begin;
    for (const auto& phrase : _phrases) {
      place = gallop(place, end, phrase.value);
      if (place == end) {
        break;
      }
      if (*place == phrase.value) {
        common.push_back(
            {phrase.value, wrappingAdd(phrase.distance,
                                       others.distances[static_cast<std::size_t>(place - begin)])});
      }
    }
  } else {
    auto phrase = _phrases.begin();
    for (auto place = begin; place != end && phrase != _phrases.end();) {
      if (*place < phrase->value) {
        ++place;
      } else if (phrase->value < *place) {
        ++phrase;
      } else {
        common.push_back({phrase->value,
                          wrappingAdd(phrase->distance,
                                      others.distances[static_cast<std::size_t>(place - begin)])});
        ++place;
        ++phrase;
      }
    }
  }
  if (common.empty()) {
    _penalty = wrappingAdd(_penalty, disjointPenalty());
    return false;
  }
  _phrases = std::move(common);
  _wordsMatched = wrappingAdd(_wordsMatched, 1);
  return true;
}

std::vector<ScoredValue> SpanQuery::scored() const {
  if (_trace != nullptr) {
    const std::int64_t words = _image.countedWordsOf(_trace->value());
    _trace->penaliseLength(words, _countedWords,
                           _limits.editDistance * std::abs(words - _countedWords));
    _trace->compareWithBound(_limits.editDistance * _countedWords);
  }
  return scorePhrases(_image, _phrases, _penalty, _countedWords, _limits.editDistance);
}

std::vector<ScoredValue> scorePhrases(const SearchImage& image,
                                      const std::vector<ScoredValue>& phrases, std::int64_t penalty,
                                      std::int64_t countedWords, std::int64_t editDistance) {
  const std::int64_t bound = editDistance * countedWords;
  std::vector<ScoredValue> records;
  for (const auto& phrase : phrases) {
    const std::int64_t difference =
        static_cast<std::int64_t>(image.countedWordsOf(phrase.value)) - countedWords;
    const std::int64_t distance =
        wrappingAdd(wrappingAdd(phrase.distance, penalty), editDistance * std::abs(difference));
    if (distance <= bound) {
      records.push_back({phrase.value, distance});
    }
  }
  std::sort(records.begin(), records.end(), [&image](const ScoredValue& a, const ScoredValue& b) {
    return a.distance != b.distance ? a.distance < b.distance
                                    : utf16Less(image.valueText(a.value), image.valueText(b.value));
  });
  return records;
}

}  // namespace wordcatcher
