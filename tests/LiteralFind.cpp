#include "LiteralFind.h"

#include <unicode/uchar.h>
#include <unicode/utf16.h>

#include <algorithm>
#include <functional>
#include <tuple>

#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/text/Unicode.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher::testing {

namespace {

bool namesNumber(std::u16string_view word) {
  for (std::size_t i = 0; i < word.size();) {
    UChar32 character = 0;
    U16_NEXT(word.data(), i, word.size(), character);
    if (u_charType(character) == U_DECIMAL_DIGIT_NUMBER) {
      return true;
    }
  }
  return false;
}

std::uint32_t limitByLength(std::u16string_view word, const EditLimits& limits) {
  if (word.size() <= limits.shortLength) {
    return limits.shortEdits;
  }
  return word.size() <= limits.mediumLength ? limits.mediumEdits : limits.longEdits;
}

/// Whether two words are one, or would be with some unit for the space between them, which is
/// looked for in words of at least two edits.
bool areOne(std::u16string_view head, std::u16string_view tail, std::u16string_view word,
            const EditLimits& limits) {
  if (word.size() != head.size() + tail.size() + 1) {
    return word == std::u16string(head) + std::u16string(tail);
  }
  const bool isNumber = namesNumber(head) || namesNumber(tail) || namesNumber(word);
  return word.substr(0, head.size()) == head && word.substr(head.size() + 1) == tail &&
         limitByLength(word, limits) >= 2 && (!isNumber || limits.numberEdits >= 2);
}

std::size_t bytesOf(std::u16string_view text) { return toUtf8(text).value().size(); }

std::vector<std::u16string_view> tokensOf(std::u16string_view text) {
  std::vector<std::u16string_view> tokens;
  WordSegmenter segmenter;
  segmenter.start(text);
  while (const auto token = segmenter.next()) {
    tokens.push_back(*token);
  }
  return tokens;
}

}  // namespace

std::uint64_t literalEdits(std::u16string_view a, std::u16string_view b, bool transpositions) {
  std::vector<std::vector<std::uint64_t>> table(a.size() + 1,
                                                std::vector<std::uint64_t>(b.size() + 1));
  for (std::size_t i = 0; i <= a.size(); ++i) {
    for (std::size_t j = 0; j <= b.size(); ++j) {
      auto& least = table[i][j];
      least = i + j;
      if (i > 0) {
        least = std::min(least, table[i - 1][j] + 1);
      }
      if (j > 0) {
        least = std::min(least, table[i][j - 1] + 1);
      }
      if (i > 0 && j > 0) {
        least = std::min(least, table[i - 1][j - 1] + (a[i - 1] == b[j - 1] ? 0U : 1U));
      }
      if (transpositions && i > 1 && j > 1 && a[i - 2] == b[j - 1] && a[i - 1] == b[j - 2]) {
        least = std::min(least, table[i - 2][j - 2] + 1);
      }
    }
  }
  return table[a.size()][b.size()];
}

LiteralFind::Phrase LiteralFind::wordsOf(std::string_view phrase) const {
  const std::u16string text = fromUtf8(phrase).value();
  if (_mode == MatchingMode::wholeText) {
    return text.empty() ? Phrase() : Phrase{toLower(text)};
  }
  Phrase words;
  for (const auto& token : tokensOf(text)) {
    const auto some = lookedUp(token);
    words.insert(words.end(), some.begin(), some.end());
  }
  return words;
}

/// What a word of a phrase or of a text counts as: itself, or the codes of its sound.
std::vector<std::u16string> LiteralFind::lookedUp(std::u16string_view word) const {
  if (_mode == MatchingMode::words) {
    return {toLower(word)};
  }
  const std::u16string codes = KXMetaphone().translate(word);
  std::vector<std::u16string> lowered;
  for (const auto& code : tokensOf(codes)) {
    lowered.push_back(toLower(code));
  }
  return lowered;
}

void LiteralFind::add(std::string_view phrase, std::string_view value) {
  Phrase words = wordsOf(phrase);
  auto& phrases = _values[std::string(value)];
  if (!words.empty() && std::find(phrases.begin(), phrases.end(), words) == phrases.end()) {
    phrases.push_back(std::move(words));
  }
  _valuesUnder.clear();
}

std::uint64_t LiteralFind::valuesUnder(const std::u16string& word) const {
  const auto [known, isNew] = _valuesUnder.try_emplace(word, 0);
  if (isNew) {
    for (const auto& [value, phrases] : _values) {
      const bool carries = std::any_of(phrases.begin(), phrases.end(), [&](const Phrase& phrase) {
        return std::find(phrase.begin(), phrase.end(), word) != phrase.end();
      });
      known->second += carries ? 1 : 0;
    }
  }
  return known->second;
}

std::vector<LiteralFind::Token> LiteralFind::cut(std::string_view text) const {
  const std::u16string units = fromUtf8(text).value();
  std::vector<Token> tokens;
  if (_mode == MatchingMode::wholeText) {
    if (!units.empty()) {
      tokens.push_back({toLower(units), 0, text.size()});
    }
    return tokens;
  }
  for (const auto& word : tokensOf(units)) {
    const auto first = static_cast<std::size_t>(word.data() - units.data());
    const std::size_t begin = bytesOf(std::u16string_view(units).substr(0, first));
    for (const auto& each : lookedUp(word)) {
      tokens.push_back({each, begin, begin + bytesOf(word)});
    }
  }
  return tokens;
}

bool LiteralFind::mayPair(std::u16string_view inPhrase, std::u16string_view inText,
                          std::uint64_t edits, const EditLimits& limits) const {
  switch (_mode) {
    case MatchingMode::phoneticWords:
      return edits == 0;
    case MatchingMode::wholeText:
      return edits <= limits.wholeTextEdits;
    default:
      const bool isNumber = namesNumber(inPhrase) || namesNumber(inText);
      return edits <= limitByLength(inPhrase, limits) && (!isNumber || edits <= limits.numberEdits);
  }
}

std::vector<LiteralFind::Pair> LiteralFind::waysToPair(const Phrase& phrase,
                                                       const std::vector<Token>& text,
                                                       const FindOptions& options) const {
  const EditLimits& limits = options.edits;
  const bool joins = _mode == MatchingMode::words &&
                     (limits.shortEdits > 0 || limits.mediumEdits > 0 || limits.longEdits > 0);
  std::vector<Pair> ways;
  for (std::size_t i = 0; i < phrase.size(); ++i) {
    for (std::size_t j = 0; j < text.size(); ++j) {
      const std::uint64_t edits = literalEdits(phrase[i], text[j].word, options.transpositions);
      if (mayPair(phrase[i], text[j].word, edits, limits)) {
        ways.push_back({i, 1, j, 1, edits});
      }
      if (joins && i + 1 < phrase.size() &&
          areOne(phrase[i], phrase[i + 1], text[j].word, limits)) {
        ways.push_back({i, 2, j, 1, 1});
      }
      if (joins && j + 1 < text.size() &&
          areOne(text[j].word, text[j + 1].word, phrase[i], limits)) {
        ways.push_back({i, 1, j, 2, 1});
      }
    }
  }
  return ways;
}

LiteralFind::Judged LiteralFind::judge(const Phrase& phrase, const std::vector<Token>& text,
                                       const FindOptions& options) const {
  const auto ways = waysToPair(phrase, text, options);
  const auto scored = [&](const Pairs& pairs) {
    Judged judged;
    judged.phrase = phrase;
    judged.pairs = pairs;
    judged.cost = 2 * (phrase.size() + text.size());
    for (std::size_t i = 0; i < pairs.size(); ++i) {
      const Pair& pair = pairs[i];
      judged.cost += pair.edits;
      judged.cost -= 2 * (pair.phraseWords + pair.textWords);
      judged.words += pair.phraseWords;
      judged.exact += pair.edits == 0 ? pair.phraseWords : 0;
      if (i > 0) {
        const Pair& last = pairs[i - 1];
        const bool isDirectly = last.phrasePosition + last.phraseWords == pair.phrasePosition &&
                                last.textPosition + last.textWords == pair.textPosition;
        const bool isLater = last.textPosition < pair.textPosition;
        judged.disorder += isDirectly ? 0 : (isLater ? 1 : 2);
      }
      for (std::size_t word = 0; word < pair.phraseWords; ++word) {
        judged.rarity += valuesUnder(phrase[pair.phrasePosition + word]);
      }
    }
    return judged;
  };
  // Of equally good ones the one that takes the text's words earliest, then the phrase's.
  const auto places = [](const Pairs& pairs) {
    std::vector<std::size_t> inText;
    std::vector<std::size_t> inPhrase;
    for (const Pair& pair : pairs) {
      inText.push_back(pair.textPosition);
      inPhrase.push_back(pair.phrasePosition);
    }
    return std::pair(inText, inPhrase);
  };
  const auto isBetter = [&](const Judged& a, const Judged& b) {
    const auto key = [](const Judged& judged) {
      return std::make_tuple(judged.cost, ~judged.words, ~judged.exact, judged.disorder);
    };
    return key(a) != key(b) ? key(a) < key(b) : places(a.pairs) < places(b.pairs);
  };
  Judged best = scored({});
  Pairs chosen;
  std::vector<bool> taken(text.size());
  const std::function<void(std::size_t)> tryFrom = [&](std::size_t position) {
    if (position >= phrase.size()) {
      Judged judged = scored(chosen);
      if (isBetter(judged, best)) {
        best = std::move(judged);
      }
      return;
    }
    tryFrom(position + 1);
    for (const Pair& way : ways) {
      const std::size_t last = way.textPosition + way.textWords - 1;
      if (way.phrasePosition != position || taken[way.textPosition] || taken[last]) {
        continue;
      }
      taken[way.textPosition] = true;
      taken[last] = true;
      chosen.push_back(way);
      tryFrom(position + way.phraseWords);
      chosen.pop_back();
      taken[way.textPosition] = false;
      taken[last] = false;
    }
  };
  tryFrom(0);
  return best;
}

std::vector<FoundPhrase> LiteralFind::findAll(std::string_view text,
                                              const FindOptions& options) const {
  const auto tokens = cut(text);
  const auto keyOf = [](const Judged& judged) {  // but for the value, and which of its phrases
    std::size_t units = 0;
    for (const auto& word : judged.phrase) {
      units += word.size();
    }
    return std::make_tuple(judged.cost, ~judged.words, ~judged.exact, judged.disorder,
                           judged.rarity, judged.phrase.size(), units);
  };
  std::vector<std::pair<Judged, std::u16string>> found;
  for (const auto& [value, phrases] : _values) {
    std::optional<Judged> best;
    for (const Phrase& phrase : phrases) {
      Judged judged = judge(phrase, tokens, options);
      if (judged.words >= std::max<std::size_t>(options.minWords, 1) &&
          judged.cost <= options.maxCost.value_or(UINT64_MAX) &&
          (!best || std::make_pair(keyOf(judged), judged.phrase) <
                        std::make_pair(keyOf(*best), best->phrase))) {
        best = std::move(judged);
      }
    }
    if (best) {
      found.emplace_back(*std::move(best), fromUtf8(value).value());
    }
  }
  std::sort(found.begin(), found.end(), [&](const auto& a, const auto& b) {
    return std::make_pair(keyOf(a.first), a.second) < std::make_pair(keyOf(b.first), b.second);
  });
  std::vector<FoundPhrase> matches;
  for (auto& [judged, value] : found) {
    auto& match = matches.emplace_back();
    match.value = toUtf8(value).value();
    match.cost = judged.cost;
    std::sort(judged.pairs.begin(), judged.pairs.end(),
              [](const Pair& a, const Pair& b) { return a.textPosition < b.textPosition; });
    for (const Pair& pair : judged.pairs) {
      std::u16string word = judged.phrase[pair.phrasePosition];
      if (pair.phraseWords == 2) {
        word += u' ' + judged.phrase[pair.phrasePosition + 1];
      }
      match.hits.push_back({tokens[pair.textPosition].begin,
                            tokens[pair.textPosition + pair.textWords - 1].end,
                            toUtf8(word).value(), static_cast<std::uint32_t>(pair.edits)});
    }
    match.begin = match.hits.front().begin;
    match.end = match.hits.back().end;
  }
  return matches;
}

}  // namespace wordcatcher::testing
