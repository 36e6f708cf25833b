#include "wordcatcher/matcher/FoundPhrases.h"

#include <algorithm>
#include <iterator>
#include <limits>
#include <map>
#include <numeric>
#include <set>
#include <string>
#include <utility>

#include "wordcatcher/fuzzy/EditDistance.h"
#include "wordcatcher/matcher/PhraseFinder.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

using Range = std::pair<std::size_t, std::size_t>;  // begin, end

std::string wordText(const SearchImage& image, std::uint32_t word) {
  return displayUtf8(image.textOf(word & ~image::kPhraseEnd));
}

std::vector<FoundWord> hitsOf(const SearchImage& image, const FindText& text,
                              const RankedPhrase& phrase, std::vector<Pair> pairs) {
  std::sort(pairs.begin(), pairs.end(),
            [](const Pair& a, const Pair& b) { return a.option.position < b.option.position; });
  std::vector<FoundWord> hits;
  for (const Pair& pair : pairs) {
    const PairOption& option = pair.option;
    std::string word = wordText(image, phrase.phrase[pair.phrasePosition]);
    if (option.phraseWords == 2) {
      word += ' ' + wordText(image, phrase.phrase[pair.phrasePosition + 1U]);
    }
    hits.push_back({text.words[option.position].begin,
                    text.words[option.position + option.textWords - 1U].end, std::move(word),
                    option.edits});
  }
  return hits;
}

FoundPhrase foundPhrase(const SearchImage& image, const FindText& text, PhraseFinder& finder,
                        const RankedPhrase& phrase) {
  FoundPhrase found = {std::string(image.valueText(phrase.value)), phrase.cost, 0, 0,
                       hitsOf(image, text, phrase, finder.pairsOf(phrase))};
  // Hits do not overlap, so the last one in the text ends last; all but codes of one word, which
  // have its range in common.
  found.begin = found.hits.front().begin;
  found.end = found.hits.back().end;
  return found;
}

Range rangeOf(const FoundPhrase& match) { return {match.begin, match.end}; }

/// The ranges that lie in no larger one.
std::set<Range> rangesWithoutSubranges(const std::vector<FoundPhrase>& matches) {
  // Ascending by beginning, of equal ones the longest first: what comes later lies within an
  // earlier one if it ends no later than any of them.
  std::vector<Range> ranges;
  ranges.reserve(matches.size());
  for (const auto& match : matches) {
    ranges.push_back(rangeOf(match));
  }
  std::sort(ranges.begin(), ranges.end(), [](const Range& a, const Range& b) {
    return a.first != b.first ? a.first < b.first : a.second > b.second;
  });
  std::set<Range> kept;
  std::size_t furthest = 0;
  for (const Range& range : ranges) {
    if (kept.empty() || range.second > furthest) {
      kept.insert(range);
      furthest = std::max(furthest, range.second);
    }
  }
  return kept;
}

void keepLargerRanges(std::vector<FoundPhrase>& matches) {
  const auto kept = rangesWithoutSubranges(matches);
  std::erase_if(matches,
                [&kept](const FoundPhrase& match) { return !kept.contains(rangeOf(match)); });
}

/// The longest match, the longest that does not overlap it, and so on; of equally long ones the
/// first.
void keepLongest(std::vector<FoundPhrase>& matches) {
  std::vector<std::size_t> order(matches.size());
  std::iota(order.begin(), order.end(), std::size_t{0});
  const auto lengthOf = [&matches](std::size_t i) { return matches[i].end - matches[i].begin; };
  std::stable_sort(order.begin(), order.end(),
                   [lengthOf](std::size_t a, std::size_t b) { return lengthOf(a) > lengthOf(b); });
  std::set<Range> kept;
  std::vector<std::size_t> places;
  for (const std::size_t i : order) {
    const Range range = rangeOf(matches[i]);
    const auto next = kept.lower_bound({range.first, 0});
    const bool meetsNext = next != kept.end() && next->first < range.second;
    const bool meetsPrevious = next != kept.begin() && std::prev(next)->second > range.first;
    if (!meetsNext && !meetsPrevious) {
      kept.insert(range);
      places.push_back(i);
    }
  }
  std::sort(places.begin(), places.end());
  std::vector<FoundPhrase> longest;
  longest.reserve(places.size());
  for (const std::size_t place : places) {
    longest.push_back(std::move(matches[place]));
  }
  matches = std::move(longest);
}

void leaveOutOverlaps(std::vector<FoundPhrase>& matches, Overlaps overlaps) {
  if (overlaps == Overlaps::noSub) {
    keepLargerRanges(matches);
  } else {
    keepLongest(matches);
  }
}

std::vector<FindExplanation::TextWord> comparedWords(const SearchImage& image, const FindText& text,
                                                     const RankedPhrase& phrase,
                                                     bool transpositions) {
  std::vector<FindExplanation::TextWord> words;
  for (const FindWord& word : text.words) {
    auto& compared = words.emplace_back();
    compared.begin = word.begin;
    compared.end = word.end;
    compared.word = displayUtf8(word.word);
    compared.limit = word.limit;
    if (!word.isLookedUp) {
      continue;
    }
    for (const std::uint32_t flagged : phrase.phrase) {
      const std::u16string other = image.textOf(flagged & ~image::kPhraseEnd);
      const std::uint64_t edits = editDistance(word.word, other, transpositions);
      const bool isNumber = text.hasNumbers && (holdsDigit(word.word) || holdsDigit(other));
      const bool within = edits <= word.limit && (edits == 0 || !isNumber);
      compared.comparisons.push_back({displayUtf8(other), edits, within});
    }
  }
  return words;
}

void listUnpaired(const SearchImage& image, const FindText& text, const RankedPhrase& phrase,
                  const std::vector<Pair>& pairs, FindExplanation& explanation) {
  std::vector<bool> inText(text.words.size());
  std::vector<bool> inPhrase(phrase.phrase.size());
  for (const Pair& pair : pairs) {
    for (std::uint32_t i = 0; i < pair.option.textWords; ++i) {
      inText[pair.option.position + i] = true;
    }
    for (std::uint32_t i = 0; i < pair.option.phraseWords; ++i) {
      inPhrase[pair.phrasePosition + i] = true;
    }
    explanation.edits += pair.option.edits;
  }
  for (std::size_t i = 0; i < inPhrase.size(); ++i) {
    explanation.phrase.push_back(wordText(image, phrase.phrase[i]));
    if (!inPhrase[i]) {
      explanation.missing.push_back(explanation.phrase.back());
    }
  }
  for (std::size_t i = 0; i < inText.size(); ++i) {
    if (!inText[i]) {
      explanation.surplus.push_back(explanation.words[i].word);
    }
  }
}

void object(const RankedPhrase& phrase, const FindOptions& options, FindExplanation& explanation) {
  auto& objections = explanation.objections;
  if (phrase.phrase.empty()) {
    objections.emplace_back("Its phrase holds no word.");
  } else if (phrase.words == 0) {
    objections.emplace_back("None of its words is near enough to a word of the text.");
  } else if (phrase.words < options.minWords) {
    objections.push_back("Only " + std::to_string(phrase.words) + " of its words " +
                         (phrase.words == 1 ? "is" : "are") + " in the text, and at least " +
                         std::to_string(options.minWords) + " must be.");
  }
  if (phrase.words > 0 && options.maxCost && phrase.cost > *options.maxCost) {
    objections.push_back("Its cost of " + std::to_string(phrase.cost) +
                         " is more than the greatest allowed, " + std::to_string(*options.maxCost) +
                         ".");
  }
}

bool lists(const FindResult& result, std::string_view value) {
  return std::any_of(result.matches.begin(), result.matches.end(),
                     [value](const FoundPhrase& match) { return match.value == value; });
}

/// Why a value that matches is not listed all the same; nothing if it is.
std::optional<std::string> omissionOf(const SearchImage& image, const FindText& text,
                                      std::string_view value, FindOptions options, bool joins) {
  const Overlaps overlaps = options.overlaps;
  const std::size_t limit = options.limit;
  const FindResult result = findPhrases(image, text, options, joins);
  if (lists(result, value)) {
    return std::nullopt;
  }
  options.limit = std::numeric_limits<std::size_t>::max();
  const bool isCutByLimit = (overlaps == Overlaps::all && !result.truncated) ||
                            lists(findPhrases(image, text, options, joins), value);
  if (isCutByLimit) {
    return "It is not among the first " + std::to_string(limit) + " in order, which is the limit.";
  }
  options.overlaps = Overlaps::all;
  if (overlaps != Overlaps::all && lists(findPhrases(image, text, options, joins), value)) {
    return overlaps == Overlaps::noSub
               ? "Its range in the text lies within the larger one of another match."
               : "Its range in the text overlaps that of another match, which is longer or comes "
                 "first.";
  }
  return "The budget of postings was used up before it was looked at.";
}

}  // namespace

std::optional<std::uint32_t> valueNumber(const SearchImage& image, std::string_view value) {
  for (std::uint32_t number = 0; number < image.valueCount(); ++number) {
    if (image.valueText(number) == value) {
      return number;
    }
  }
  return std::nullopt;
}

FindResult findPhrases(const SearchImage& image, const FindText& text, const FindOptions& options,
                       bool joins) {
  PhraseFinder finder(image, text, options, joins);
  const bool isWhole = options.overlaps == Overlaps::all;
  FindResult result;
  for (const RankedPhrase& phrase :
       finder.run(isWhole ? options.limit : std::numeric_limits<std::size_t>::max())) {
    result.matches.push_back(foundPhrase(image, text, finder, phrase));
  }
  if (!isWhole) {
    leaveOutOverlaps(result.matches, options.overlaps);
    result.matches.resize(std::min(result.matches.size(), options.limit));
  }
  result.truncated = text.truncated || finder.truncated();
  return result;
}

FindExplanation explainFind(const SearchImage& image, const FindText& text, std::string_view value,
                            const FindOptions& options, bool joins) {
  FindExplanation explanation;
  explanation.value = value;
  explanation.truncated = text.truncated;
  const auto number = valueNumber(image, value);
  explanation.isStored = number.has_value();
  if (!number) {
    explanation.objections.emplace_back("The index holds no such data string.");
    return explanation;
  }
  PhraseFinder finder(image, text, options, joins);
  const auto admitted = finder.judge(*number);
  const RankedPhrase phrase = admitted ? *admitted : finder.judgeAnyway(*number);
  auto pairs = finder.pairsOf(phrase);
  explanation.cost = phrase.cost;
  explanation.words = comparedWords(image, text, phrase, options.transpositions);
  listUnpaired(image, text, phrase, pairs, explanation);
  explanation.pairs = hitsOf(image, text, phrase, std::move(pairs));
  if (!admitted) {
    object(phrase, options, explanation);
  } else if (auto omission = omissionOf(image, text, value, options, joins)) {
    explanation.objections.push_back(*std::move(omission));
  }
  explanation.isFound = explanation.objections.empty();
  return explanation;
}

}  // namespace wordcatcher
