#include "wordcatcher/matcher/PhraseFinder.h"

#include <algorithm>
#include <bit>
#include <iterator>
#include <map>
#include <numeric>
#include <string_view>
#include <tuple>
#include <unordered_map>

#include "wordcatcher/storage/PhraseWords.h"
#include "wordcatcher/text/CodeUnitOrder.h"

namespace wordcatcher {

namespace {

constexpr std::uint32_t kJoinEdits = 1;

// A letter in place of the space is looked for in words, written as one, that may have so many
// edits: short ones agree with too much.
constexpr std::uint32_t kUnitBetweenLimit = 2;

constexpr char16_t kFirstBeyondAscii = 0x80;

// Words near those of a text, counted once for each of these.
constexpr std::size_t kMostOptions = 1'000'000;

// Trying all pairings of a phrase takes steps, which cost about as much as a posting.
constexpr std::uint64_t kStepsAPosting = 1;

// So many postings before a phrase is looked at, memory is asked for it, and twice as many before
// for where it is.
constexpr std::size_t kValuesAhead = 4;

// Costs above are rare.
constexpr std::size_t kCountedBounds = 64;

std::uint64_t apart(std::uint64_t a, std::uint64_t b) { return a < b ? b - a : a - b; }

/// The items by their buckets, in each in their order. Linear in both: for what differs little,
/// this is faster than to compare.
template <typename Item, typename BucketOf>
std::vector<Item> sortedByCounting(const std::vector<Item>& items, std::size_t buckets,
                                   BucketOf bucketOf) {
  std::vector<std::uint32_t> places(buckets + 1);
  for (const Item& item : items) {
    ++places[bucketOf(item) + 1];
  }
  std::partial_sum(places.begin(), places.end(), places.begin());
  std::vector<Item> sorted(items.size());
  for (const Item& item : items) {
    sorted[places[bucketOf(item)]++] = item;
  }
  return sorted;
}

/// All of the order but the code units and the value.
auto keyOf(const RankedPhrase& phrase) {
  return std::make_tuple(phrase.cost, ~phrase.words, ~phrase.exact, phrase.disorder, phrase.rarity,
                         phrase.length);
}

}  // namespace

PhraseFinder::PhraseFinder(const SearchImage& image, const FindText& text,
                           const FindOptions& options, bool joins)
    : _image(image),
      _text(text),
      _options(options),
      _pairing(text.words.size()),
      _postings(options.maxPostings),
      _steps(options.maxPostings * kStepsAPosting),
      _phraseWords(image.phraseWordCount()) {
  lookUpWords();
  if (joins) {
    lookUpJoins();
    lookUpSplits();
  }
  makeTable();
}

/// A text that repeats words near many has as many ways as both, multiplied.
void PhraseFinder::addOption(const WordOption& option) {
  if (_wordOptions.size() < kMostOptions) {
    _wordOptions.push_back(option);
  } else {
    _truncated = true;
  }
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
      place->second = wordsNear(word);
    }
    for (const NearWord& near : place->second) {
      addOption({near.word, {position, 1, 1, static_cast<std::uint8_t>(near.edits)}});
    }
  }
}

std::vector<NearWord> PhraseFinder::wordsNear(const FindWord& word) const {
  auto words = nearWords(_image, word.word, _text.nearLimit(word), _options.transpositions);
  for (const NearWord& near : words) {
    _image.prefetchPostingsOf(near.word);
    _image.prefetchOffsetOf(near.word);
  }
  for (const NearWord& near : words) {
    _image.prefetchLabelsOf(near.word);
  }
  std::erase_if(words, [&](const NearWord& near) {
    return near.edits > _text.editLimit(near.length, word.isNumber) ||
           (near.edits > _text.editLimit(near.length, true) && isNumber(near));
  });
  return words;
}

/// Whether a word near one of the text holds a digit. In a damaged image it may be any length.
bool PhraseFinder::isNumber(const NearWord& near) const {
  const auto labels = _image.labelsOf(near.word);
  if (labels.size() != near.length) {
    _image.throwDamaged("a word is not as long as its place in a tree says");
  }
  for (std::size_t i = 0; i < labels.size(); ++i) {
    const char16_t unit = _image.unitOf(labels[i]);
    if (unit >= u'0' && unit <= u'9') {
      return true;
    }
    if (unit >= kFirstBeyondAscii) {
      return holdsDigit(_image.textOf(near.word));
    }
  }
  return false;
}

/// What may stand between two words of so many code units with it; `isNumber`: one holds a digit.
Seam PhraseFinder::seamOf(std::size_t length, bool isNumber) const noexcept {
  return _text.editLimit(length, isNumber) >= kUnitBetweenLimit ? Seam::unit : Seam::none;
}

/// What two words of the text are in one, or with a letter for the space between them.
std::vector<std::uint32_t> PhraseFinder::wordsJoining(const FindWord& first,
                                                      const FindWord& second) const {
  std::vector<std::uint32_t> words;
  const std::size_t length = first.word.size() + 1 + second.word.size();
  if (seamOf(length, false) == Seam::unit) {
    words = wordsWithUnitBetween(_image, first.word, second.word);
    std::erase_if(words, [&](std::uint32_t word) {
      return seamOf(length, holdsDigit(_image.textOf(word))) == Seam::none;
    });
  }
  if (const auto word = exactWord(_image, first.word + second.word)) {
    words.push_back(*word);
  }
  return words;
}

/// Neighbours in the text that are one stored word.
void PhraseFinder::lookUpJoins() {
  std::map<std::pair<std::u16string_view, std::u16string_view>, std::vector<std::uint32_t>> known;
  for (std::uint32_t position = 0; position + 1 < _text.words.size(); ++position) {
    const FindWord& first = _text.words[position];
    const FindWord& second = _text.words[position + 1];
    if (!first.isLookedUp || !second.isLookedUp) {
      continue;
    }
    const auto [place, isNew] = known.try_emplace({first.word, second.word});
    if (isNew) {
      place->second = wordsJoining(first, second);
    }
    for (const std::uint32_t word : place->second) {
      addOption({word, {position, 2, 1, kJoinEdits}});
    }
  }
}

void PhraseFinder::lookUpSplits() {
  for (std::uint32_t position = 0; position < _text.words.size(); ++position) {
    const FindWord& word = _text.words[position];
    if (!word.isLookedUp) {
      continue;
    }
    const Seam seam = seamOf(word.word.size(), word.isNumber);
    for (const JoinedWords& joined : wordsJoinedIn(_image, word.word, seam)) {
      _splits.push_back({joined.head, joined.tail, position});
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
    std::size_t slot = hashOfNumber(_wordOptions[i].word) & (_table.size() - 1);
    while (_table[slot] != 0) {
      slot = (slot + 1) & (_table.size() - 1);
    }
    _table[slot] = i + 1;
    ++_distinctWords;
  }
}

std::span<const PhraseFinder::WordOption> PhraseFinder::optionsOf(std::uint32_t word) const {
  for (std::size_t slot = hashOfNumber(word) & (_table.size() - 1); _table[slot] != 0;
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
  _sources.reserve(_distinctWords);
  // All lists together are no longer than all postings, so that what is made of them is bounded.
  std::uint64_t postings = _image.postingCount();
  for (auto each = _wordOptions.begin(); each != _wordOptions.end();) {
    const std::uint32_t word = each->word;
    Source source = {UINT32_MAX, UINT32_MAX, _image.postingsOf(word)};
    for (; each != _wordOptions.end() && each->word == word; ++each) {
      const PairOption& option = each->option;
      if (option.textWords == 1) {
        source.rank = std::min(source.rank, _ranks[option.position]);
        source.edits = std::min<std::uint32_t>(source.edits, option.edits);
      }
    }
    if (source.values.size() > postings) {
      _image.throwDamaged("posting lists overlap");
    }
    postings -= source.values.size();
    if (source.edits != UINT32_MAX) {
      _sources.push_back(source);
    }
  }
  _sources = sortedByCounting(_sources, _text.words.size(),
                              [](const Source& source) { return source.rank; });
}

/// Phrases in which words are joined or split are judged before all others, for which the bounds
/// hold then.
void PhraseFinder::judgeJoined() {
  for (const WordOption& each : _wordOptions) {
    if (each.option.textWords == 2) {
      judgeAll(_image.postingsOf(each.word));
    }
  }
  for (const Split& split : _splits) {
    const auto heads = _image.postingsOf(split.head);
    const auto tails = _image.postingsOf(split.tail);
    const auto& few = heads.size() < tails.size() ? heads : tails;
    const auto& many = heads.size() < tails.size() ? tails : heads;
    std::vector<std::uint32_t> both;
    auto from = many.begin();
    for (const std::uint32_t value : few) {
      if (!spendPosting()) {
        return;
      }
      from = std::lower_bound(from, many.end(), value);
      if (from != many.end() && *from == value) {
        both.push_back(value);
      }
    }
    judgeAll(both);
  }
}

void PhraseFinder::judgeAll(std::span<const std::uint32_t> values) {
  for (const std::uint32_t value : values) {
    if (!spendPosting()) {
      return;
    }
    if (_judged.insert(value).isNew) {
      if (const auto phrase = judge(value)) {
        keep(*phrase);
      }
    }
  }
}

/// False when the budget is used up.
bool PhraseFinder::spendPosting() {
  if (_postings == 0 || _steps == 0) {
    _truncated = true;
    return false;
  }
  --_postings;
  return true;
}

/// The least cost of a phrase that this source is the first to bring.
std::uint64_t PhraseFinder::leastCost(const Source& source,
                                      const image::PhraseClass& phraseClass) const {
  const std::uint64_t left = _text.words.size() - source.rank;
  const std::uint64_t most =
      phraseClass.mostWords == image::kShapeCap ? UINT64_MAX : phraseClass.mostWords;
  const std::uint64_t nearest = std::clamp<std::uint64_t>(
      left, phraseClass.fewestWords, std::max<std::uint64_t>(most, phraseClass.fewestWords));
  return 2 * std::uint64_t{source.rank} + 2 * apart(nearest, left) + source.edits;
}

void PhraseFinder::addSegments(std::uint32_t number, std::vector<Segment>& segments) const {
  const Source& source = _sources[number];
  if (source.values.empty()) {
    return;
  }
  const auto classes = _image.phraseClasses();
  auto next = classes.begin();
  for (std::uint32_t begin = 0; begin < source.values.size();) {
    next = std::upper_bound(next, classes.end(), source.values[begin],
                            [](std::uint32_t value, const image::PhraseClass& each) {
                              return value < each.firstValue;
                            });
    if (next == classes.begin()) {
      _image.throwDamaged("its classes of phrases leave out values");
    }
    auto end = static_cast<std::uint32_t>(source.values.size());
    if (next != classes.end() && source.values.back() >= next->firstValue) {
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

/// By their bounds; of those with the same bound, the ones of rarer words first.
std::vector<PhraseFinder::Segment> PhraseFinder::segments() const {
  std::vector<Segment> segments;
  segments.reserve(_sources.size());
  for (std::uint32_t source = 0; source < _sources.size(); ++source) {
    addSegments(source, segments);
  }
  // Nearly all bounds are small.
  auto sorted = sortedByCounting(segments, kCountedBounds + 1, [](const Segment& segment) {
    return std::min<std::uint64_t>(segment.bound, kCountedBounds);
  });
  const auto large = std::find_if(sorted.begin(), sorted.end(), [](const Segment& segment) {
    return segment.bound >= kCountedBounds;
  });
  std::stable_sort(large, sorted.end(),
                   [](const Segment& a, const Segment& b) { return a.bound < b.bound; });
  return sorted;
}

std::vector<RankedPhrase> PhraseFinder::run(std::size_t limit) {
  _limit = limit;
  if (limit == 0) {
    return {};
  }
  rankWords();
  makeSources();
  judgeJoined();
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

/// Whether a source is of the text's most frequent word: what it is the first to bring has no
/// other.
bool PhraseFinder::isLast(const Source& source) const {
  return source.rank + 1U == _text.words.size();
}

bool PhraseFinder::isOfOneLength(const Segment& segment) const {
  const auto& phraseClass = _image.phraseClasses()[segment.phraseClass];
  return phraseClass.fewestWords == phraseClass.mostWords &&
         phraseClass.mostWords < image::kShapeCap;
}

/// Whether a phrase that costs just the segment's bound could come before the last one kept. It has
/// no more words of the text than are left, nor than it has itself.
bool PhraseFinder::canImprove(const Segment& segment) const {
  if (!isFull() || segment.bound < _kept.front().cost) {
    return true;
  }
  const Source& source = _sources[segment.source];
  const auto& phraseClass = _image.phraseClasses()[segment.phraseClass];
  RankedPhrase best;
  best.cost = segment.bound;
  best.words = std::min<std::uint64_t>(_text.words.size() - source.rank, phraseClass.mostWords);
  best.exact = best.words;
  if (isLast(source)) {
    best.exact = source.edits == 0 ? 1 : 0;
    best.rarity = source.values.size();
  }
  best.length = phraseClass.fewestWords;
  return !(keyOf(_kept.front()) < keyOf(best));
}

void PhraseFinder::read(const Segment& segment) {
  const Source& source = _sources[segment.source];
  const auto values = source.values.subspan(segment.begin, segment.end - segment.begin);
  const bool isAlone = isLast(source) && isOfOneLength(segment);
  for (std::size_t i = 0; i < std::min(values.size(), 2 * kValuesAhead); ++i) {
    _image.prefetchPhrasesOf(values[i]);
  }
  for (std::size_t i = 0; i < std::min(values.size(), kValuesAhead); ++i) {
    _image.prefetchPhraseWordsOf(values[i]);
  }
  for (std::size_t i = 0; i < values.size(); ++i) {
    if (i + 2 * kValuesAhead < values.size()) {
      _image.prefetchPhrasesOf(values[i + 2 * kValuesAhead]);
    }
    if (i + kValuesAhead < values.size()) {
      _image.prefetchPhraseWordsOf(values[i + kValuesAhead]);
    }
    if (!spendPosting()) {
      return;
    }
    if (_judged.insert(values[i]).isNew && !judgeAndKeep(values[i], source) && isAlone) {
      return;
    }
  }
}

/// False when the value is not kept, nor would be any value behind it of the same class that shares
/// just the source's word with the text. One with several phrases says nothing about those, nor one
/// that is paired by another of its words, under which there are more phrases.
bool PhraseFinder::judgeAndKeep(std::uint32_t value, const Source& source) {
  const auto phrases = _image.phrasesOf(value);
  if (phrases.size() > _phraseWords) {
    _image.throwDamaged("phrases overlap");
  }
  _phraseWords -= phrases.size();
  if (image::firstPhrase(phrases).size() < phrases.size()) {
    if (const auto phrase = judge(value)) {
      keep(*phrase);
    }
    return true;
  }
  namePairs(phrases);
  if (isFull()) {
    const PairingScore& most = _pairing.most();
    const RankedPhrase& last = _kept.front();
    if (std::make_tuple(costOf(phrases, most.gain), ~most.words, ~most.exact) >
        std::make_tuple(last.cost, ~last.words, ~last.exact)) {
      return false;
    }
  }
  const RankedPhrase phrase = solve(value, phrases);
  return !isWithinBounds(phrase) || keep(phrase) || phrase.rarity > source.values.size();
}

/// Whether the phrase is among the best so far.
bool PhraseFinder::keep(const RankedPhrase& phrase) {
  const auto before = [this](const RankedPhrase& a, const RankedPhrase& b) {
    return comesBefore(a, b);
  };
  if (!isFull()) {
    _kept.push_back(phrase);
    if (isFull()) {
      std::make_heap(_kept.begin(), _kept.end(), before);
    }
    return true;
  }
  if (!comesBefore(phrase, _kept.front())) {
    return false;
  }
  std::pop_heap(_kept.begin(), _kept.end(), before);
  _kept.back() = phrase;
  std::push_heap(_kept.begin(), _kept.end(), before);
  return true;
}

std::uint64_t PhraseFinder::unitsOf(std::span<const std::uint32_t> phrase) const {
  std::uint64_t units = 0;
  for (const std::uint32_t word : phrase) {
    units += _image.labelsOf(word & ~image::kPhraseEnd).size();
  }
  return units;
}

bool PhraseFinder::comesBefore(const RankedPhrase& a, const RankedPhrase& b) const {
  if (keyOf(a) != keyOf(b)) {
    return keyOf(a) < keyOf(b);
  }
  // Values are numbered by shape and text: of two with one phrase each, this decides.
  if (a.phrase.size() == _image.phrasesOf(a.value).size() &&
      b.phrase.size() == _image.phrasesOf(b.value).size()) {
    return a.value < b.value;
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

std::uint64_t PhraseFinder::costOf(std::span<const std::uint32_t> phrase,
                                   std::uint64_t gain) const noexcept {
  // Words that want the same word of the text can promise more than all words cost.
  const std::uint64_t alone = 2 * (_text.words.size() + phrase.size());
  return alone - std::min(alone, gain);
}

/// The best pairing of what namePairs() named.
RankedPhrase PhraseFinder::solve(std::uint32_t value, std::span<const std::uint32_t> phrase) {
  RankedPhrase ranked;
  ranked.steps = _steps;
  const PairingScore score = _pairing.solve(_steps);
  ranked.cost = costOf(phrase, score.gain);
  ranked.words = score.words;
  ranked.exact = score.exact;
  ranked.disorder = score.disorder;
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
    namePairs(phrase);
    const RankedPhrase judged = solve(value, phrase);
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
  if (!best) {
    namePairs({});
    return solve(value, {});
  }
  return *best;
}

std::vector<Pair> PhraseFinder::pairsOf(const RankedPhrase& phrase) {
  namePairs(phrase.phrase);
  std::uint64_t steps = phrase.steps;
  _pairing.solve(steps);
  return {_pairing.pairs().begin(), _pairing.pairs().end()};
}

}  // namespace wordcatcher
