#include "wordcatcher/matcher/SpanQueryTrace.h"

#include <algorithm>
#include <utility>

#include "wordcatcher/matcher/Sentences.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

void SpanQueryTrace::leaveOut(std::u16string_view word, const char* reason) {
  tell(inQuotes(displayUtf8(word)) + " is not looked up: it is " + reason + ".");
}

void SpanQueryTrace::lookUpAll() {
  tell("No " + _noun + " of the text is long enough, so every " + _noun +
       " is looked up, and counts.");
}

void SpanQueryTrace::lookUp(std::u16string_view word, const std::vector<WordHit>& hits,
                            std::optional<std::int64_t> distance) {
  const std::string text = inQuotes(displayUtf8(word));
  if (std::any_of(hits.begin(), hits.end(), [](const WordHit& hit) { return hit.values > 0; })) {
    _sets.push_back({text, distance});
  }
  std::string sentence = text + " is near " + counted(hits.size(), "stored " + _noun);
  if (!distance) {
    tell(sentence + (hits.empty() ? "." : ", none of which carries the value."));
    return;
  }
  const auto bringing = std::find_if(hits.begin(), hits.end(), [this](const WordHit& hit) {
    const auto values = _image.postingsOf(hit.word);
    return std::find(values.begin(), values.end(), _value) != values.end();
  });
  tell(sentence + "; " + inQuotes(displayUtf8(_image.textOf(bringing->word))) + ", " +
       counted(*distance, "edit") + " away, carries the value.");
}

void SpanQueryTrace::count(std::int64_t countedWords, std::int64_t uncountedLength, bool found) {
  tell("The text counts " + counted(countedWords, _noun) + " (longer than " +
       counted(uncountedLength, "letter") + ", or all when every " + _noun + " is looked up).");
  if (!found) {
    tell("No " + _noun + " brings any value, so nothing is found.");
  }
}

void SpanQueryTrace::begin() {
  const auto& first = _sets.front();
  _isIn = first.distance.has_value();
  if (!_isIn) {
    tell("The candidates are the values that " + first.word + " brings, the first " + _noun +
         " that brings any; this one is not among them.");
    return;
  }
  _distance = *first.distance;
  tell("The candidates are the values that " + first.word +
       " brings, each at its edits: " + std::to_string(_distance) + ".");
}

void SpanQueryTrace::add(std::int64_t penalty) { _distance += _isIn ? penalty : 0; }

void SpanQueryTrace::penaliseMissing(std::int64_t missing, std::int64_t penalty) {
  if (_isIn) {
    add(penalty);
    tell(counted(missing, "stored " + _noun) + " fewer than counted " + _noun +
         "s were found, which adds " + std::to_string(penalty) +
         (_hasCodes ? ", however many there are, as codes are compared exactly." : "."));
  }
}

void SpanQueryTrace::compare(std::size_t candidateSet, Compared outcome, std::int64_t penalty) {
  const auto& set = _sets[candidateSet];
  if (!_isIn) {
    return;
  }
  switch (outcome) {
    case Compared::same:
      tell(set.word + " brings the same values as the first " + _noun + ", and adds nothing.");
      return;
    case Compared::disjoint:
      add(penalty);
      tell(set.word + " shares no value with the " + _noun + "s before it, which adds " +
           std::to_string(penalty) + '.');
      return;
    case Compared::common:
      if (!set.distance) {
        _isIn = false;
        tell("The candidates are cut to those that " + set.word +
             " brings as well; this one is not among them.");
        return;
      }
      add(*set.distance);
      tell(set.word + " brings it as well, and adds its edits: " + std::to_string(*set.distance) +
           '.');
  }
}

void SpanQueryTrace::penaliseLength(std::int64_t phraseWords, std::int64_t countedWords,
                                    std::int64_t penalty) {
  if (!_isIn) {
    return;
  }
  add(penalty);
  // Of a phrase words are counted, whatever the index holds.
  tell("The phrase counts " + counted(phraseWords, "word") + ", the text " +
       (_hasCodes ? counted(countedWords, _noun) : std::to_string(countedWords)) + ", which adds " +
       std::to_string(penalty) +
       (_hasCodes ? ": where codes are compared exactly, lengths count nothing." : "."));
}

void SpanQueryTrace::compareWithBound(std::int64_t bound) {
  _bound = bound;
  if (_isIn) {
    tell("The distance is " + std::to_string(_distance) + "; values up to " +
         std::to_string(bound) + " are listed" +
         (_hasCodes ? ", as codes are compared exactly" : "") + ", so this one is" +
         (_distance <= bound ? "" : " not") + '.');
  }
}

}  // namespace wordcatcher
