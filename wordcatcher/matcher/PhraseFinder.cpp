#include "wordcatcher/matcher/PhraseFinder.h"

#include <algorithm>
#include <bit>
#include <iterator>
#include <string_view>
#include <tuple>
#include <unordered_map>

#include "wordcatcher/fuzzy/NearWords.h"
#include "wordcatcher/storage/PhraseWords.h"
#include "wordcatcher/text/CodeUnitOrder.h"

namespace wordcatcher {

namespace {

constexpr std::uint32_t kJoinEdits = 1;

// Trying all pairings of a phrase takes steps, which cost about as much as a posting.
constexpr std::uint64_t kStepsAPosting = 1;

std::uint64_t apart(std::uint64_t a, std::uint64_t b) { return a < b ? b - a : a - b; }

std::uint32_t hashOf(std::uint32_t word) { return word * 0x9E3779B1U; }

}  // namespace

PhraseFinder::PhraseFinder(const SearchImage& image, const FindText& text,
                           const FindOptions& options, bool joins)
    : _image(image),
      _text(text),
      _options(options),
      _pairing(text.words.size()),
      _postings(options.maxPostings),
      _steps(options.maxPostings * kStepsAPosting) {
  lookUpWords();
  if (joins) {
    lookUpJoins();
    lookUpSplits();
  }
  makeTable();
}

void PhraseFinder::lookUpWords() {
  std::unordered_map<std::u16string_view, std::vector<NearWord>> known;
  for (std::uint32_t position = 0; position < _text.words.size(); ++position) {
    const FindWord& word = _text.words[position];
    if (!word.isLookedUp) {
      continue;
    }
    const auto [place, isNew] = known.try_emplace(word.word);
    if (isNew) {
      place->second = nearWords(_image, word.word, word.limit, _options.transpositions);
      if (!holdsDigit(word.word)) {
        std::erase_if(place->second, [this](const NearWord& near) {
          return near.edits > 0 && holdsDigit(_image.textOf(near.word));
        });
      }
    }
    for (const NearWord& near : place->second) {
      _wordOptions.push_back({near.word, {position, 1, 1, static_cast<std::uint8_t>(near.edits)}});
    }
  }
}

/// Neighbours in the text that are one stored word.
void PhraseFinder::lookUpJoins() {
  for (std::uint32_t position = 0; position + 1 < _text.words.size(); ++position) {
    const FindWord& first = _text.words[position];
    const FindWord& second = _text.words[position + 1];
    if (!first.isLookedUp || !second.isLookedUp) {
      continue;
    }
    if (const auto word = exactWord(_image, first.word + second.word)) {
      _wordOptions.push_back({*word, {position, 2, 1, kJoinEdits}});
      _joins = true;
    }
  }
}

void PhraseFinder::lookUpSplits() {
  for (std::uint32_t position = 0; position < _text.words.size(); ++position) {
    for (const auto& [head, tail] : wordsJoinedIn(_image, _text.words[position].word)) {
      _splits.push_back({head, tail, position});
      _joins = true;
    }
  }
  std::sort(_splits.begin(), _splits.end(), [](const Split& a, const Split& b) {
    return std::tie(a.head, a.position) < std::tie(b.head, b.position);
  });
}

void PhraseFinder::makeTable() {
  std::sort(_wordOptions.begin(), _wordOptions.end(), [](const WordOption& a, const WordOption& b) {
    return std::tie(a.word, a.option.position, a.option.textWords) <
           std::tie(b.word, b.option.position, b.option.textWords);
  });
  _table.assign(std::bit_ceil(_wordOptions.size() * 2 + 1), 0);
  for (std::uint32_t i = 0; i < _wordOptions.size(); ++i) {
    if (i > 0 && _wordOptions[i].word == _wordOptions[i - 1].word) {
      continue;
    }
    std::size_t slot = hashOf(_wordOptions[i].word) & (_table.size() - 1);
    while (_table[slot] != 0) {
      slot = (slot + 1) & (_table.size() - 1);
    }
    _table[slot] = i + 1;
  }
}

std::span<const PhraseFinder::WordOption> PhraseFinder::optionsOf(std::uint32_t word) const {
  for (std::size_t slot = hashOf(word) & (_table.size() - 1); _table[slot] != 0;
       slot = (slot + 1) & (_table.size() - 1)) {
    const auto first = _wordOptions.begin() + (_table[slot] - 1);
    if (first->word == word) {
      const auto last = std::find_if(first, _wordOptions.end(),
                                     [word](const WordOption& each) { return each.word != word; });
      return {first, last};
    }
  }
  return {};
}

/// The words of the text, the one with the fewest phrases under what is near it first.
void PhraseFinder::rankWords() {
  std::vector<std::uint64_t> counts(_text.words.size());
  for (const WordOption& each : _wordOptions) {
    counts[each.option.position] += _image.postingsOf(each.word).size();
  }
  std::vector<std::uint32_t> order(counts.size());
  for (std::uint32_t position = 0; position < order.size(); ++position) {
    order[position] = position;
  }
  std::stable_sort(order.begin(), order.end(),
                   [&counts](std::uint32_t a, std::uint32_t b) { return counts[a] < counts[b]; });
  _ranks.resize(order.size());
  for (std::uint32_t rank = 0; rank < order.size(); ++rank) {
    _ranks[order[rank]] = rank;
  }
}

void PhraseFinder::makeSources() {
  for (auto each = _wordOptions.begin(); each != _wordOptions.end();) {
    const std::uint32_t word = each->word;
    Source source = {UINT32_MAX, UINT32_MAX, _image.postingsOf(word)};
    for (; each != _wordOptions.end() && each->word == word; ++each) {
      const PairOption& option = each->option;
      source.rank = std::min(source.rank, _ranks[option.position]);
      if (option.textWords == 2) {
        source.rank = std::min(source.rank, _ranks[option.position + 1U]);
      }
      // The edit of a join is part of the bound already.
      source.edits =
          std::min<std::uint32_t>(source.edits, option.textWords == 2 ? 0U : option.edits);
    }
    _sources.push_back(source);
  }
  _joinedLists.reserve(_splits.size());
  for (const Split& split : _splits) {
    const auto heads = _image.postingsOf(split.head);
    const auto tails = _image.postingsOf(split.tail);
    auto& list = _joinedLists.emplace_back();
    const auto& few = heads.size() < tails.size() ? heads : tails;
    const auto& many = heads.size() < tails.size() ? tails : heads;
    if (few.size() > _postings) {
      _truncated = true;
      continue;
    }
    _postings -= few.size();
    auto from = many.begin();
    for (const std::uint32_t value : few) {
      from = std::lower_bound(from, many.end(), value);
      if (from != many.end() && *from == value) {
        list.push_back(value);
      }
    }
    _sources.push_back({_ranks[split.position], 0, list});
  }
}

/// The least cost of a phrase that this source is the first to bring.
std::uint64_t PhraseFinder::leastCost(const Source& source,
                                      const image::PhraseClass& phraseClass) const {
  const std::uint64_t left = _text.words.size() - source.rank;
  const std::uint64_t most =
      phraseClass.mostWords == image::kShapeCap ? UINT64_MAX : phraseClass.mostWords;
  const std::uint64_t nearest = std::clamp<std::uint64_t>(
      left, phraseClass.fewestWords, std::max<std::uint64_t>(most, phraseClass.fewestWords));
  return 2 * std::uint64_t{source.rank} + (_joins ? 1U : 2U) * apart(nearest, left) + source.edits;
}

void PhraseFinder::addSegments(std::uint32_t number, std::vector<Segment>& segments) const {
  const Source& source = _sources[number];
  const auto classes = _image.phraseClasses();
  std::uint32_t begin = 0;
  while (begin < source.values.size()) {
    const auto next = std::upper_bound(classes.begin(), classes.end(), source.values[begin],
                                       [](std::uint32_t value, const image::PhraseClass& each) {
                                         return value < each.firstValue;
                                       });
    if (next == classes.begin()) {
      _image.throwDamaged("its classes of phrases leave out values");
    }
    auto end = static_cast<std::uint32_t>(source.values.size());
    if (next != classes.end()) {
      const auto found =
          std::lower_bound(source.values.begin() + begin, source.values.end(), next->firstValue);
      // At least one, even if the image's lists do not ascend.
      end = std::max(begin + 1, static_cast<std::uint32_t>(found - source.values.begin()));
    }
    const auto phraseClass = std::prev(next);
    segments.push_back({leastCost(source, *phraseClass), number,
                        static_cast<std::uint32_t>(phraseClass - classes.begin()), begin, end});
    begin = end;
  }
}

std::vector<PhraseFinder::Segment> PhraseFinder::segments() const {
  std::vector<Segment> segments;
  for (std::uint32_t source = 0; source < _sources.size(); ++source) {
    addSegments(source, segments);
  }
  std::sort(segments.begin(), segments.end(), [this](const Segment& a, const Segment& b) {
    return std::tie(a.bound, _sources[a.source].rank, a.source, a.begin) <
           std::tie(b.bound, _sources[b.source].rank, b.source, b.begin);
  });
  return segments;
}

std::vector<RankedPhrase> PhraseFinder::run(std::size_t limit) {
  _limit = limit;
  if (limit == 0) {
    return {};
  }
  rankWords();
  makeSources();
  for (const Segment& segment : segments()) {
    if ((_options.maxCost && segment.bound > *_options.maxCost) ||
        (isFull() && segment.bound > _kept.front().cost)) {
      break;
    }
    if (canImprove(segment)) {
      read(segment);
    }
  }
  std::sort(_kept.begin(), _kept.end(),
            [this](const RankedPhrase& a, const RankedPhrase& b) { return comesBefore(a, b); });
  return std::move(_kept);
}

/// Whether a phrase that costs just the segment's bound could come before the last one kept. It has
/// no more words of the text than are left, nor than it has itself.
bool PhraseFinder::canImprove(const Segment& segment) const {
  if (!isFull() || segment.bound < _kept.front().cost || _joins) {
    return true;
  }
  const std::uint64_t left = _text.words.size() - _sources[segment.source].rank;
  const auto& phraseClass = _image.phraseClasses()[segment.phraseClass];
  return std::min<std::uint64_t>(left, phraseClass.mostWords) >= _kept.front().words;
}

void PhraseFinder::read(const Segment& segment) {
  const auto values =
      _sources[segment.source].values.subspan(segment.begin, segment.end - segment.begin);
  for (const std::uint32_t value : values) {
    if (_postings == 0) {
      _truncated = true;
      return;
    }
    --_postings;
    if (_judged.insert(value).second) {
      if (const auto phrase = judge(value)) {
        keep(*phrase);
      }
    }
  }
}

void PhraseFinder::keep(const RankedPhrase& phrase) {
  const auto before = [this](const RankedPhrase& a, const RankedPhrase& b) {
    return comesBefore(a, b);
  };
  if (!isFull()) {
    _kept.push_back(phrase);
    if (isFull()) {
      std::make_heap(_kept.begin(), _kept.end(), before);
    }
  } else if (comesBefore(phrase, _kept.front())) {
    std::pop_heap(_kept.begin(), _kept.end(), before);
    _kept.back() = phrase;
    std::push_heap(_kept.begin(), _kept.end(), before);
  }
}

std::uint64_t PhraseFinder::unitsOf(std::span<const std::uint32_t> phrase) const {
  std::uint64_t units = 0;
  for (const std::uint32_t word : phrase) {
    units += _image.labelsOf(word & ~image::kPhraseEnd).size();
  }
  return units;
}

bool PhraseFinder::comesBefore(const RankedPhrase& a, const RankedPhrase& b) const {
  const auto key = [](const RankedPhrase& phrase) {
    return std::make_tuple(phrase.cost, ~phrase.words, ~phrase.exact, phrase.breaks, phrase.rarity,
                           phrase.length);
  };
  if (key(a) != key(b)) {
    return key(a) < key(b);
  }
  const std::uint64_t aUnits = unitsOf(a.phrase);
  const std::uint64_t bUnits = unitsOf(b.phrase);
  return aUnits != bUnits ? aUnits < bUnits
                          : utf16Less(_image.valueText(a.value), _image.valueText(b.value));
}

/// Tells the pairing in which ways the words of a phrase can be paired.
void PhraseFinder::namePairs(std::span<const std::uint32_t> phrase) {
  _pairing.start();
  for (std::size_t i = 0; i < phrase.size(); ++i) {
    const std::uint32_t word = phrase[i] & ~image::kPhraseEnd;
    _pairing.nextWord();
    for (const WordOption& each : optionsOf(word)) {
      _pairing.add(each.option);
    }
    if (_splits.empty() || i + 1 == phrase.size()) {
      continue;
    }
    const std::uint32_t next = phrase[i + 1] & ~image::kPhraseEnd;
    for (auto split = std::lower_bound(
             _splits.begin(), _splits.end(), word,
             [](const Split&each, std::uint32_t head) { return each.head < head; });
         split != _splits.end() && split->head == word; ++split) {
      if (split->tail == next) {
        _pairing.add({split->position, 1, 2, kJoinEdits});
      }
    }
  }
}

RankedPhrase PhraseFinder::judgePhrase(std::uint32_t value, std::span<const std::uint32_t> phrase) {
  namePairs(phrase);
  const PairingScore score = _pairing.solve(_steps);
  RankedPhrase ranked;
  ranked.cost = 2 * (_text.words.size() + phrase.size()) - score.gain;
  ranked.words = score.words;
  ranked.exact = score.exact;
  ranked.breaks = score.breaks;
  ranked.length = phrase.size();
  ranked.value = value;
  ranked.phrase = phrase;
  for (const Pair& pair : _pairing.pairs()) {
    for (std::uint32_t i = 0; i < pair.option.phraseWords; ++i) {
      ranked.rarity +=
          _image.postingsOf(phrase[pair.phrasePosition + i] & ~image::kPhraseEnd).size();
    }
  }
  return ranked;
}

template <typename Admit>
std::optional<RankedPhrase> PhraseFinder::bestOf(std::uint32_t value, Admit admit) {
  std::optional<RankedPhrase> best;
  auto phrases = _image.phrasesOf(value);
  while (!phrases.empty()) {
    const auto phrase = image::firstPhrase(phrases);
    phrases = phrases.subspan(phrase.size());
    const RankedPhrase judged = judgePhrase(value, phrase);
    if (admit(judged) && (!best || comesBefore(judged, *best))) {
      best = judged;
    }
  }
  return best;
}

bool PhraseFinder::isWithinBounds(const RankedPhrase& phrase) const {
  return phrase.words >= std::max<std::size_t>(_options.minWords, 1) &&
         (!_options.maxCost || phrase.cost <= *_options.maxCost);
}

std::optional<RankedPhrase> PhraseFinder::judge(std::uint32_t value) {
  return bestOf(value, [this](const RankedPhrase& phrase) { return isWithinBounds(phrase); });
}

RankedPhrase PhraseFinder::judgeAnyway(std::uint32_t value) {
  const auto best = bestOf(value, [](const RankedPhrase&) { return true; });
  return best ? *best : judgePhrase(value, {});
}

std::vector<Pair> PhraseFinder::pairsOf(const RankedPhrase& phrase) {
  namePairs(phrase.phrase);
  _pairing.solve(_steps);
  return {_pairing.pairs().begin(), _pairing.pairs().end()};
}

}  // namespace wordcatcher
