#include "wordcatcher/matcher/SpanShortcut.h"

#include <algorithm>
#include <numeric>
#include <tuple>

#include "wordcatcher/fuzzy/NearWords.h"
#include "wordcatcher/storage/PhraseWords.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

// Looking up one more word costs about as much as judging so many candidates.
constexpr std::uint64_t kFewValues = 200;

// Beyond these the lists of all words are merged faster than phrases are judged.
constexpr std::uint64_t kManyValues = 2000;
constexpr std::size_t kManyWords = 64;

// How many values of a word are asked whether another word brings them, too.
constexpr std::size_t kWitnesses = 32;

std::int64_t unitsOf(std::u16string_view text) { return static_cast<std::int64_t>(text.size()); }

}  // namespace

std::optional<SpanAnswer> SpanShortcut::run(std::u16string_view text) {
  if (!cut(text)) {
    return std::nullopt;
  }
  const auto answer = [this](std::optional<std::vector<ScoredValue>> scored) {
    return SpanAnswer{std::move(scored), _truncated};
  };
  const auto few = lookUpFew();
  if (!few) {
    return answer(std::nullopt);
  }
  if (valuesOf(_words[*few]) > kManyValues) {
    return std::nullopt;
  }
  _candidates = candidatesOf(_words[*few]);
  if (!judgeCandidates()) {
    return std::nullopt;
  }
  for (std::size_t word = 0; word < _words.size(); ++word) {
    bool bringsAnyCandidate = false;
    for (std::size_t i = 0; i < _candidates.size() && !bringsAnyCandidate; ++i) {
      bringsAnyCandidate = bringsCandidate(word, i);
    }
    if (!bringsAnyCandidate && !bringsNothing(word)) {
      return answer(std::vector<ScoredValue>());
    }
  }
  auto records = scored();
  return records ? std::optional(answer(std::move(records))) : std::nullopt;
}

/// False when the words are too many or too special for this.
bool SpanShortcut::cut(std::u16string_view text) {
  std::vector<std::u16string_view> tokens;
  _segmenter.start(text);
  while (const auto token = _segmenter.next()) {
    if (tokens.size() == _limits.maxWords) {
      _truncated = true;
      break;
    }
    tokens.push_back(*token);
    if (tokens.size() > kManyWords) {
      return false;
    }
  }
  const bool isAnyLong = std::any_of(tokens.begin(), tokens.end(), [this](const auto& token) {
    return unitsOf(token) > _limits.ignoredWordLength;
  });
  for (const auto& token : tokens) {
    if (isAnyLong && unitsOf(token) <= _limits.ignoredWordLength) {
      continue;
    }
    _countedWords +=
        !isAnyLong || unitsOf(token) > _limits.ignoredWordLengthForEditDistance ? 1 : 0;
    if (token.size() > _limits.maxWordUnits) {
      _truncated = true;
    } else {
      addWord(token);
    }
  }
  return std::all_of(_words.begin(), _words.end(), [this](const Word& word) {
    return WordJudge::canJudge(word.text, _limits.editDistance);
  });
}

void SpanShortcut::addWord(std::u16string_view token) {
  std::u16string text = toLower(token);
  auto known = std::find_if(_words.begin(), _words.end(),
                            [&text](const Word& word) { return word.text == text; });
  if (known == _words.end()) {
    _words.push_back({std::move(text), nullptr, std::nullopt, true});
    known = _words.end() - 1;
  }
  _occurrences.push_back(static_cast<std::size_t>(known - _words.begin()));
}

void SpanShortcut::lookUp(Word& word) {
  word.hits = searchImage(_image, word.text, _limits.editDistance);
  word.bringsAny = valuesOf(word) > 0;
}

std::uint64_t SpanShortcut::valuesOf(const Word& word) const {
  return std::accumulate(word.hits->begin(), word.hits->end(), std::uint64_t{0},
                         [](std::uint64_t sum, const WordHit& hit) { return sum + hit.values; });
}

/// Looks up words, the longest first since they are the cheapest and have the fewest hits, until
/// one brings few values, but some; the one with the fewest of those that were looked up. Nothing
/// when no word brings any.
std::optional<std::size_t> SpanShortcut::lookUpFew() {
  std::vector<std::size_t> order(_words.size());
  std::iota(order.begin(), order.end(), 0);
  std::stable_sort(order.begin(), order.end(), [this](std::size_t a, std::size_t b) {
    return _words[a].text.size() > _words[b].text.size();
  });
  std::optional<std::size_t> fewest;
  for (const std::size_t word : order) {
    lookUp(_words[word]);
    if (_words[word].bringsAny && (!fewest || valuesOf(_words[word]) < valuesOf(_words[*fewest]))) {
      fewest = word;
    }
    if (fewest && valuesOf(_words[*fewest]) <= kFewValues) {
      break;
    }
  }
  return fewest;
}

std::vector<std::uint32_t> SpanShortcut::candidatesOf(const Word& word) const {
  std::vector<std::uint32_t> values;
  for (const WordHit& hit : *word.hits) {
    const auto postings = _image.postingsOf(hit.word);
    values.insert(values.end(), postings.begin(), postings.end());
  }
  std::sort(values.begin(), values.end());
  values.erase(std::unique(values.begin(), values.end()), values.end());
  return values;
}

/// False when that would take too long.
bool SpanShortcut::judgeCandidates() {
  _ofCandidates.reserve(_candidates.size() * _words.size());
  for (const std::uint32_t value : _candidates) {
    if (!spendOn(value)) {
      return false;
    }
    const auto distances = distancesOf(value);
    _ofCandidates.insert(_ofCandidates.end(), distances.begin(), distances.end());
  }
  return true;
}

/// Whether there is still room for what distancesOf() does. Once there is not, there is none for
/// anything.
bool SpanShortcut::spendOn(std::uint32_t value) {
  const std::uint64_t comparisons =
      _image.phrasesOf(value).size() * (_words.size() + kComparisonsAWord);
  if (comparisons > _comparisons) {
    _comparisons = 0;
    return false;
  }
  _comparisons -= comparisons;
  return true;
}

/// The distances of a stored word for the words of the text.
std::span<const std::uint8_t> SpanShortcut::distancesOfWord(std::uint32_t word) {
  const auto [ordinal, isNew] = _judged.insert(word);
  if (isNew) {
    _judgedWords.push_back(word);
    for (Word& each : _words) {
      if (!each.judge) {
        each.judge = std::make_unique<WordJudge>(_image, each.text, _limits.editDistance);
      }
      _ofWords.push_back(static_cast<std::uint8_t>(each.judge->distanceOf(word).value_or(kNone)));
    }
  }
  return std::span(_ofWords).subspan(ordinal * _words.size(), _words.size());
}

/// The distances of a value: of the stored words that bring it, each word of the text takes the one
/// that its search would list first. Valid until the next call.
std::span<const std::uint8_t> SpanShortcut::distancesOf(std::uint32_t value) {
  _best.assign(_words.size(), kNone);
  _first.resize(_words.size());
  for (const std::uint32_t flagged : _image.phrasesOf(value)) {
    const std::uint32_t word = flagged & ~image::kPhraseEnd;
    const auto distances = distancesOfWord(word);
    for (std::size_t i = 0; i < _best.size(); ++i) {
      if (distances[i] == kNone) {
        continue;
      }
      const auto values = static_cast<std::uint32_t>(_image.postingsOf(word).size());
      const auto place = [this](std::uint32_t count, std::uint32_t distance, std::uint32_t number) {
        return std::make_tuple(~count, distance, _image.labelsOf(number).size(), number);
      };
      if (_best[i] == kNone ||
          place(values, distances[i], word) < place(_first[i].values, _best[i], _first[i].word)) {
        _first[i] = {values, word};
        _best[i] = distances[i];
      }
    }
  }
  return _best;
}

bool SpanShortcut::bringsCandidate(std::size_t word, std::size_t candidate) const {
  return _ofCandidates[candidate * _words.size() + word] != kNone;
}

/// Whether a word that brings none of the candidates brings no value at all.
bool SpanShortcut::bringsNothing(std::size_t number) {
  Word& word = _words[number];
  if (!word.hits) {
    const auto same = exactWord(_image, word.text);
    if (same && !_image.postingsOf(*same).empty()) {
      return false;
    }
    lookUp(word);
  }
  return !word.bringsAny;
}

/// The stored words that are known to be hits of a word.
std::vector<std::uint32_t> SpanShortcut::knownHits(std::size_t number) const {
  std::vector<std::uint32_t> hits;
  if (_words[number].hits) {
    for (const WordHit& hit : *_words[number].hits) {
      hits.push_back(hit.word);
    }
    return hits;
  }
  for (std::uint32_t ordinal = 0; ordinal < _judgedWords.size(); ++ordinal) {
    if (_ofWords[ordinal * _words.size() + number] != kNone) {
      hits.push_back(_judgedWords[ordinal]);
    }
  }
  return hits;
}

/// Whether some value of one word is found that another does not bring.
bool SpanShortcut::bringsOther(std::size_t a, std::size_t b) {
  for (const std::uint32_t hit : knownHits(a)) {
    const auto postings = _image.postingsOf(hit);
    for (const std::uint32_t value : postings.first(std::min(postings.size(), kWitnesses))) {
      if (!spendOn(value)) {
        return false;
      }
      if (distancesOf(value)[b] == kNone) {
        return true;
      }
    }
  }
  return false;
}

/// Whether two words bring the same values, if that can be told.
std::optional<bool> SpanShortcut::bringsSame(std::size_t a, std::size_t b) {
  if (a == b) {
    return true;
  }
  bool isToldApart = false;
  for (std::size_t i = 0; i < _candidates.size() && !isToldApart; ++i) {
    isToldApart = bringsCandidate(a, i) != bringsCandidate(b, i);
  }
  if (isToldApart || bringsOther(a, b) || bringsOther(b, a)) {
    return false;
  }
  if (_words[a].hits && _words[b].hits) {
    return candidatesOf(_words[a]) == candidatesOf(_words[b]);
  }
  return std::nullopt;
}

/// Whether there are hits for all counted words. A word that brings values has one at least.
bool SpanShortcut::hasHitsEnough() const {
  std::int64_t hits = 0;
  for (const std::size_t word : _occurrences) {
    const auto known = static_cast<std::int64_t>(_words[word].hits ? _words[word].hits->size()
                                                                   : knownHits(word).size());
    hits += std::max<std::int64_t>(known, _words[word].bringsAny ? 1 : 0);
  }
  return hits >= _countedWords;
}

std::optional<std::vector<ScoredValue>> SpanShortcut::scored() {
  const auto first = std::find_if(_occurrences.begin(), _occurrences.end(),
                                  [this](std::size_t word) { return _words[word].bringsAny; });
  std::vector<std::size_t> adding = {*first};
  for (auto each = first + 1; each != _occurrences.end(); ++each) {
    if (!_words[*each].bringsAny) {
      continue;
    }
    const auto same = bringsSame(*first, *each);
    if (!same) {
      return std::nullopt;
    }
    if (!*same) {
      adding.push_back(*each);
    }
  }
  if (!hasHitsEnough()) {
    return std::nullopt;
  }
  std::vector<ScoredValue> phrases;
  for (std::size_t i = 0; i < _candidates.size(); ++i) {
    bool isInAll = true;
    for (std::size_t word = 0; word < _words.size(); ++word) {
      isInAll = isInAll && (bringsCandidate(word, i) || !_words[word].bringsAny);
    }
    if (isInAll) {
      std::int64_t distance = 0;
      for (const std::size_t word : adding) {
        distance += _ofCandidates[i * _words.size() + word];
      }
      phrases.push_back({_candidates[i], distance});
    }
  }
  return scorePhrases(_image, phrases, 0, _countedWords, _limits.editDistance);
}

}  // namespace wordcatcher
