#include "wordcatcher/matcher/Pairing.h"

#include <algorithm>
#include <tuple>

namespace wordcatcher {

namespace {

// Longer phrases are paired word by word: trying all goes as deep as there are words.
constexpr std::size_t kMaxTriedWords = 256;

// A phrase that repeats words of a text that repeats them has as many ways of pairing as both have
// words, multiplied.
constexpr std::size_t kFewOptions = 4096;
constexpr std::size_t kOptionsATextWord = 8;

// Disorder of a pair.
constexpr std::uint64_t kDirectly = 0;
constexpr std::uint64_t kLater = 1;
constexpr std::uint64_t kBefore = 2;

auto quality(const PairingScore& score) {
  return std::make_tuple(score.gain, score.words, score.exact, ~score.disorder);
}

std::uint64_t exactWords(const PairOption& option) {
  return option.edits == 0 ? option.phraseWords : 0;
}

}  // namespace

void Pairing::start() {
  _options.clear();
  _words.clear();
  _phraseWords = 0;
  _most = {};
  _hasJoins = false;
  _best.clear();
  _bestScore = {};
}

void Pairing::nextWord() { ++_phraseWords; }

void Pairing::add(const PairOption& option) {
  if (_options.size() >= kFewOptions && _options.size() / kOptionsATextWord >= _used.size()) {
    _isExact = false;
    return;
  }
  const std::uint32_t position = _phraseWords - 1;
  const auto number = static_cast<std::uint32_t>(_options.size());
  if (_words.empty() || _words.back().position != position) {
    _words.push_back({position, number, number, 0, 0, 0});
  }
  Word& word = _words.back();
  word.endOption = number + 1;
  const auto raise = [](std::uint64_t& most, std::uint64_t& mostOfAll, std::uint64_t to) {
    if (to > most) {
      mostOfAll += to - most;
      most = to;
    }
  };
  raise(word.bestGain, _most.gain, option.gain());
  raise(word.mostWords, _most.words, option.phraseWords);
  raise(word.mostExact, _most.exact, exactWords(option));
  _hasJoins = _hasJoins || option.textWords + option.phraseWords > 2;
  _options.push_back(option);
}

PairingScore Pairing::solve(std::uint64_t& steps) {
  if (_words.empty()) {
    return {};
  }
  steps -= std::min<std::uint64_t>(steps, _options.size());
  if (_words.size() == 1) {
    pairOnlyWord();
  } else if (_hasJoins || !pairEachByItself()) {
    tryAll(steps);
  }
  return _bestScore;
}

bool Pairing::follows(const Pair& last, std::uint32_t phrasePosition,
                      const PairOption& option) const {
  return last.phrasePosition + last.option.phraseWords == phrasePosition &&
         last.option.position + last.option.textWords == option.position;
}

std::uint64_t Pairing::disorderOf(const Pair& last, std::uint32_t phrasePosition,
                                  const PairOption& option) const {
  if (follows(last, phrasePosition, option)) {
    return kDirectly;
  }
  return option.position > last.option.position ? kLater : kBefore;
}

PairingScore Pairing::scoreOf(std::span<const Pair> pairs) const {
  PairingScore score;
  const Pair* last = nullptr;
  for (const Pair& pair : pairs) {
    score.gain += pair.option.gain();
    score.words += pair.option.phraseWords;
    score.exact += exactWords(pair.option);
    score.disorder += last != nullptr ? disorderOf(*last, pair.phrasePosition, pair.option) : 0;
    last = &pair;
  }
  return score;
}

/// For each option of a word, the best one up to it and from it on: of those with the least edits
/// the one with the least disorder behind it, then the earliest.
void Pairing::rankOnward(const Word& word) {
  std::uint32_t best = kNone;
  for (std::uint32_t i = word.firstOption; i < word.endOption; ++i) {
    if (_options[i].gain() == word.bestGain &&
        (best == kNone || _onward[i].disorder < _onward[best].disorder)) {
      best = i;
    }
    _bestUpTo[i] = best;
  }
  best = kNone;
  for (std::uint32_t i = word.endOption; i-- > word.firstOption;) {
    if (_options[i].gain() == word.bestGain &&
        (best == kNone || _onward[i].disorder <= _onward[best].disorder)) {
      best = i;
    }
    _bestBehind[i] = best;
  }
}

/// What comes best behind an option of the word before.
Pairing::Onward Pairing::bestOnward(const Word& word, std::uint32_t option) const {
  const Word& before = *(&word - 1);
  const std::uint32_t position = _options[option].position;
  const auto begin = _options.begin() + word.firstOption;
  const auto end = _options.begin() + word.endOption;
  const auto later =
      static_cast<std::uint32_t>(std::upper_bound(begin, end, position,
                                                  [](std::uint32_t at, const PairOption& each) {
                                                    return at < each.position;
                                                  }) -
                                 _options.begin());
  Onward best = {UINT64_MAX, kNone};
  const auto offer = [&](std::uint32_t next, std::uint64_t disorder) {
    disorder += _onward[next].disorder;
    if (disorder < best.disorder || (disorder == best.disorder && next < best.next)) {
      best = {disorder, next};
    }
  };
  if (later > word.firstOption && _bestUpTo[later - 1] != kNone) {
    offer(_bestUpTo[later - 1], kBefore);
  }
  if (later < word.endOption && _bestBehind[later] != kNone) {
    offer(_bestBehind[later], kLater);
    if (_options[later].position == position + 1 && word.position == before.position + 1 &&
        _options[later].gain() == word.bestGain) {
      offer(later, kDirectly);
    }
  }
  return best;
}

/// No other stands in the way of the best option, or of the first one of several.
void Pairing::pairOnlyWord() {
  const auto begin = _options.begin() + _words[0].firstOption;
  const auto end = _options.begin() + _words[0].endOption;
  const auto best = std::max_element(begin, end, [](const PairOption& a, const PairOption& b) {
    return std::make_tuple(a.gain(), a.phraseWords, exactWords(a)) <
           std::make_tuple(b.gain(), b.phraseWords, exactWords(b));
  });
  _best.push_back({_words[0].position, *best});
  _bestScore = {best->gain(), best->phraseWords, exactWords(*best), 0};
}

/// Each word takes an option of its least edits; of these the ones with the least disorder. False
/// when two words come to want the same word of the text.
bool Pairing::pairEachByItself() {
  _onward.assign(_options.size(), {0, kNone});
  _bestUpTo.resize(_options.size());
  _bestBehind.resize(_options.size());
  for (std::size_t w = _words.size(); w-- > 0;) {
    if (w + 1 < _words.size()) {
      for (std::uint32_t i = _words[w].firstOption; i < _words[w].endOption; ++i) {
        if (_options[i].gain() == _words[w].bestGain) {
          _onward[i] = bestOnward(_words[w + 1], i);
        }
      }
    }
    rankOnward(_words[w]);
  }
  bool isFree = true;
  std::uint32_t option = _bestBehind[_words.front().firstOption];
  for (const Word& word : _words) {
    _best.push_back({word.position, _options[option]});
    isFree = isFree && _used[_options[option].position] == 0;
    _used[_options[option].position] = 1;
    option = _onward[option].next;
  }
  for (const Pair& pair : _best) {
    _used[pair.option.position] = 0;
  }
  if (isFree) {
    _bestScore = scoreOf(_best);
  } else {
    _best.clear();
  }
  return isFree;
}

void Pairing::tryAll(std::uint64_t& steps) {
  _current.clear();
  _currentScore = {};
  if (_words.size() > kMaxTriedWords) {
    _isExact = false;
    for (const Word& word : _words) {
      const std::uint32_t begin =
          _current.empty() ? 0
                           : _current.back().phrasePosition + _current.back().option.phraseWords;
      const auto first = _options.begin() + word.firstOption;
      const auto last = _options.begin() + word.endOption;
      const auto found =
          std::find_if(first, last, [this](const PairOption& option) { return isFree(option); });
      if (word.position >= begin && found != last) {
        use(*found, true);
        _current.push_back({word.position, *found});
      }
    }
    for (const Pair& pair : _current) {
      use(pair.option, false);
    }
    _best = _current;
    _bestScore = scoreOf(_best);
    return;
  }
  _reachableFrom.assign(_words.size() + 1, {});
  for (std::size_t w = _words.size(); w-- > 0;) {
    PairingScore& reachable = _reachableFrom[w];
    reachable = _reachableFrom[w + 1];
    reachable.gain += _words[w].bestGain;
    reachable.words += _words[w].mostWords;
    reachable.exact += _words[w].mostExact;
  }
  tryFrom(0, steps);
}

namespace {

/// Whether pairs come before others by some position of each; fewer come before the same and more.
template <typename PositionOf>
bool comesFirst(const std::vector<Pair>& pairs, const std::vector<Pair>& others,
                PositionOf positionOf) {
  return std::lexicographical_compare(
      pairs.begin(), pairs.end(), others.begin(), others.end(),
      [positionOf](const Pair& a, const Pair& b) { return positionOf(a) < positionOf(b); });
}

std::uint32_t inText(const Pair& pair) { return pair.option.position; }
std::uint32_t inPhrase(const Pair& pair) { return pair.phrasePosition; }

}  // namespace

bool Pairing::isLater() const { return comesFirst(_best, _current, inText); }

bool Pairing::isEarlier() const {
  return comesFirst(_current, _best, inText) ||
         (!isLater() && comesFirst(_current, _best, inPhrase));
}

bool Pairing::isFree(const PairOption& option) const {
  return _used[option.position] == 0 && (option.textWords == 1 || _used[option.position + 1U] == 0);
}

void Pairing::use(const PairOption& option, bool isUsed) {
  _used[option.position] = isUsed ? 1 : 0;
  if (option.textWords == 2) {
    _used[option.position + 1U] = isUsed ? 1 : 0;
  }
}

void Pairing::tryFrom(std::size_t word, std::uint64_t& steps) {
  if (steps == 0) {
    _isExact = false;
    return;
  }
  --steps;
  if (word == _words.size()) {
    if (quality(_currentScore) > quality(_bestScore) ||
        (quality(_currentScore) == quality(_bestScore) && isEarlier())) {
      _best = _current;
      _bestScore = _currentScore;
    }
    return;
  }
  const PairingScore& rest = _reachableFrom[word];
  const PairingScore reachable = {_currentScore.gain + rest.gain, _currentScore.words + rest.words,
                                  _currentScore.exact + rest.exact, _currentScore.disorder};
  if (quality(reachable) < quality(_bestScore) ||
      (quality(reachable) == quality(_bestScore) && isLater())) {
    return;
  }
  const Word& at = _words[word];
  // Also those that are taken, of which there may be many.
  steps -= std::min<std::uint64_t>(steps, at.endOption - at.firstOption);
  const bool isTaken =
      !_current.empty() &&
      _current.back().phrasePosition + _current.back().option.phraseWords > at.position;
  if (!isTaken) {
    // First what follows the pair before, then the best of the others, the earliest first.
    for (std::uint32_t i = at.firstOption; i < at.endOption; ++i) {
      if (!_current.empty() && follows(_current.back(), at.position, _options[i])) {
        tryOption(word, _options[i], steps);
      }
    }
    for (const std::uint64_t gain : {6U, 5U, 4U, 3U, 2U, 1U}) {
      for (std::uint32_t i = at.firstOption; i < at.endOption; ++i) {
        if (_options[i].gain() == gain &&
            (_current.empty() || !follows(_current.back(), at.position, _options[i]))) {
          tryOption(word, _options[i], steps);
        }
      }
    }
  }
  tryFrom(word + 1, steps);
}

void Pairing::tryOption(std::size_t word, const PairOption& option, std::uint64_t& steps) {
  if (!isFree(option)) {
    return;
  }
  const PairingScore before = _currentScore;
  const std::uint32_t position = _words[word].position;
  _currentScore.gain += option.gain();
  _currentScore.words += option.phraseWords;
  _currentScore.exact += exactWords(option);
  _currentScore.disorder += _current.empty() ? 0 : disorderOf(_current.back(), position, option);
  use(option, true);
  _current.push_back({position, option});
  tryFrom(word + 1, steps);
  _current.pop_back();
  use(option, false);
  _currentScore = before;
}

}  // namespace wordcatcher
