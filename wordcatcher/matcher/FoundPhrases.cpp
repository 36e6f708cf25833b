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
#include "wordcatcher/matcher/Sentences.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

using Range = std::pair<std::size_t, std::size_t>;  // begin, end

/// A word of a phrase, whose last one carries a flag.
std::u16string wordUnits(const SearchImage& image, std::uint32_t word) {
  return image.textOf(word & ~image::kPhraseEnd);
}

std::string wordText(const SearchImage& image, std::uint32_t word) {
  return displayUtf8(wordUnits(image, word));
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

FindExplanation::Comparison comparisonOf(const FindText& text, const FindWord& word,
                                         const std::u16string& other, const FindOptions& options) {
  const std::uint64_t edits = editDistance(word.word, other, options.transpositions);
  const std::uint32_t limit = text.editLimit(other.size(), word.isNumber || holdsDigit(other));
  return {displayUtf8(other), edits, limit, edits <= limit};
}

/// The words of the text beside those of the phrase, as far as the steps suffice.
void compareWords(const SearchImage& image, const FindText& text, const RankedPhrase& phrase,
                  const FindOptions& options, FindExplanation& explanation) {
  std::uint64_t steps = FindExplanation::kMaxSteps;
  for (const FindWord& word : text.words) {
    auto& compared = explanation.words.emplace_back();
    compared.begin = word.begin;
    compared.end = word.end;
    compared.word = displayUtf8(word.word);
    if (text.hasCodes() && word.isLookedUp) {
      compared.written = text.source.substr(word.begin, word.end - word.begin);
    }
    compared.isLookedUp = word.isLookedUp;
    if (!word.isLookedUp) {
      continue;
    }
    for (const std::uint32_t flagged : phrase.phrase) {
      const std::uint32_t other = flagged & ~image::kPhraseEnd;
      const std::uint64_t taken = std::max<std::uint64_t>(
          FindExplanation::kComparisonSteps, word.word.size() * image.labelsOf(other).size());
      if (taken > steps) {
        steps = 0;
        explanation.truncated = true;
        break;
      }
      steps -= taken;
      compared.comparisons.push_back(comparisonOf(text, word, image.textOf(other), options));
    }
  }
}

/// Which words of a text and of a phrase are in some pair.
struct Paired {
  std::vector<bool> inText;
  std::vector<bool> inPhrase;

  Paired(const FindText& text, const RankedPhrase& phrase, const std::vector<Pair>& pairs)
      : inText(text.words.size()), inPhrase(phrase.phrase.size()) {
    for (const Pair& pair : pairs) {
      for (std::uint32_t i = 0; i < pair.option.textWords; ++i) {
        inText[pair.option.position + i] = true;
      }
      for (std::uint32_t i = 0; i < pair.option.phraseWords; ++i) {
        inPhrase[pair.phrasePosition + i] = true;
      }
    }
  }
};

void listWords(const SearchImage& image, const FindText& text, const RankedPhrase& phrase,
               const Paired& paired, FindExplanation& explanation) {
  for (std::size_t i = 0; i < paired.inPhrase.size(); ++i) {
    const std::u16string word = wordUnits(image, phrase.phrase[i]);
    explanation.phrase.push_back({displayUtf8(word), text.editLimit(word.size(), false),
                                  text.editLimit(word.size(), holdsDigit(word))});
    if (!paired.inPhrase[i]) {
      explanation.missing.push_back(explanation.phrase.back().word);
    }
  }
  for (std::size_t i = 0; i < paired.inText.size(); ++i) {
    if (!paired.inText[i]) {
      explanation.surplus.push_back(shown(explanation.words[i]));
    }
  }
}

/// Two words that stayed alone and could be paired but for a digit; nothing if there are none.
std::optional<std::string> digitObjection(const Paired& paired,
                                          const FindExplanation& explanation) {
  for (std::size_t i = 0; i < explanation.words.size(); ++i) {
    const auto& word = explanation.words[i];
    for (std::size_t j = 0; j < word.comparisons.size(); ++j) {
      const auto& other = word.comparisons[j];
      if (paired.inText[i] || paired.inPhrase[j] || other.within ||
          other.edits > explanation.phrase[j].lengthLimit) {
        continue;
      }
      return "A word that holds a digit " +
             (other.limit == 0 ? "must be the same"
                               : "may have up to " + counted(other.limit, "edit")) +
             ", and " + inQuotes(word.word) + " is " + counted(other.edits, "edit") + " from " +
             inQuotes(other.word) + '.';
    }
  }
  return std::nullopt;
}

void object(const RankedPhrase& phrase, const FindOptions& options, bool isCutOff,
            FindExplanation& explanation) {
  auto& objections = explanation.objections;
  if (phrase.phrase.empty()) {
    objections.emplace_back("Its phrase holds no word.");
  } else if (phrase.words == 0 && isCutOff) {
    objections.emplace_back("The budget was used up before its words were paired.");
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

/// The place of a value among all matches, the first being 1; nothing if the budget hides it.
std::optional<std::size_t> placeOf(const SearchImage& image, const FindText& text,
                                   std::uint32_t number, FindOptions options, bool joins) {
  options.limit = std::numeric_limits<std::size_t>::max();
  std::size_t place = 0;
  if (options.overlaps == Overlaps::all) {
    // As findPhrases() does, but for the hits, which would take memory.
    PhraseFinder finder(image, text, options, joins);
    for (const RankedPhrase& phrase : finder.run(options.limit)) {
      ++place;
      if (phrase.value == number) {
        return place;
      }
    }
    return std::nullopt;
  }
  for (const FoundPhrase& match : findPhrases(image, text, options, joins).matches) {
    ++place;
    if (match.value == image.valueText(number)) {
      return place;
    }
  }
  return std::nullopt;
}

/// Why a value that matches is not listed all the same; nothing if it is. Sets `isCutOff` when the
/// list is.
std::optional<std::string> omissionOf(const SearchImage& image, const FindText& text,
                                      std::uint32_t number, FindOptions options, bool joins,
                                      bool& isCutOff) {
  const FindResult result = findPhrases(image, text, options, joins);
  isCutOff = isCutOff || result.truncated;
  if (lists(result, image.valueText(number))) {
    return std::nullopt;
  }
  const std::string beyondLimit = "It is not among the first " + std::to_string(options.limit) +
                                  " in order, which is the limit";
  if (const auto place = placeOf(image, text, number, options, joins)) {
    return beyondLimit + ": its place is " + std::to_string(*place) + '.';
  }
  if (options.overlaps == Overlaps::all && !result.truncated) {
    return beyondLimit + "; the budget of postings does not suffice to tell its place.";
  }
  const Overlaps overlaps = std::exchange(options.overlaps, Overlaps::all);
  if (overlaps != Overlaps::all && placeOf(image, text, number, options, joins)) {
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
  explanation.text = text.source;
  explanation.value = value;
  explanation.truncated = text.truncated;
  const auto number = valueNumber(image, value);
  explanation.isStored = number.has_value();
  if (!number) {
    return explanation;
  }
  PhraseFinder finder(image, text, options, joins);
  const auto admitted = finder.judge(*number);
  const RankedPhrase phrase = admitted ? *admitted : finder.judgeAnyway(*number);
  auto pairs = finder.pairsOf(phrase);
  const Paired paired(text, phrase, pairs);
  explanation.cost = phrase.cost;
  for (const Pair& pair : pairs) {
    explanation.edits += pair.option.edits;
  }
  explanation.truncated = explanation.truncated || finder.truncated();
  compareWords(image, text, phrase, options, explanation);
  listWords(image, text, phrase, paired, explanation);
  explanation.pairs = hitsOf(image, text, phrase, std::move(pairs));
  if (!admitted) {
    object(phrase, options, finder.truncated(), explanation);
    if (auto objection = digitObjection(paired, explanation)) {
      explanation.objections.push_back(*std::move(objection));
    }
  } else if (auto omission =
                 omissionOf(image, text, *number, options, joins, explanation.truncated)) {
    explanation.objections.push_back(*std::move(omission));
  }
  explanation.isFound = explanation.objections.empty();
  return explanation;
}

}  // namespace wordcatcher
