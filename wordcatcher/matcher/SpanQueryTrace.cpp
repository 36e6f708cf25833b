#include "wordcatcher/matcher/SpanQueryTrace.h"

#include <algorithm>
#include <utility>

#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

std::string quoted(std::string_view word) { return '"' + std::string(word) + '"'; }

std::string counted(std::int64_t count, const std::string& thing) {
  return std::to_string(count) + ' ' + thing + (count == 1 ? "" : "s");
}

}  // namespace

void SpanQueryTrace::leaveOut(std::u16string_view word, const char* reason) {
  tell(quoted(displayUtf8(word)) + " is not looked up: it is " + reason + ".");
}

void SpanQueryTrace::lookUpAll() {
  tell("No word of the text is long enough, so every word is looked up, and counts.");
}

void SpanQueryTrace::lookUp(std::u16string_view word, const std::vector<WordHit>& hits,
                            std::optional<std::int64_t> distance) {
  const std::string text = quoted(displayUtf8(word));
  if (std::any_of(hits.begin(), hits.end(), [](const WordHit& hit) { return hit.values > 0; })) {
    _sets.push_back({text, distance});
  }
  std::string sentence =
      text + " is near " + counted(static_cast<std::int64_t>(hits.size()), "stored word");
  if (!distance) {
    tell(sentence + (hits.empty() ? "." : ", none of which carries the value."));
    return;
  }
  const auto bringing = std::find_if(hits.begin(), hits.end(), [this](const WordHit& hit) {
    const auto values = _image.postingsOf(hit.word);
    return std::find(values.begin(), values.end(), _value) != values.end();
  });
  tell(sentence + "; " + quoted(displayUtf8(_image.textOf(bringing->word))) + ", " +
       counted(*distance, "edit") + " away, carries the value.");
}

void SpanQueryTrace::count(std::int64_t countedWords, std::int64_t uncountedLength, bool found) {
  tell("The text counts " + counted(countedWords, "word") + " (longer than " +
       counted(uncountedLength, "letter") + ", or all when every word is looked up).");
  if (!found) {
    tell("No word brings any value, so nothing is found.");
  }
}

void SpanQueryTrace::begin() {
  const auto& first = _sets.front();
  _isIn = first.distance.has_value();
  if (!_isIn) {
    tell("The candidates are the values that " + first.word +
         " brings, the first word that brings any; this one is not among them.");
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
    tell(counted(missing, "stored word") + " fewer than counted words were found, which adds " +
         std::to_string(penalty) + '.');
  }
}

void SpanQueryTrace::compare(std::size_t candidateSet, Compared outcome, std::int64_t penalty) {
  const auto& set = _sets[candidateSet];
  if (!_isIn) {
    return;
  }
  switch (outcome) {
    case Compared::same:
      tell(set.word + " brings the same values as the first word, and adds nothing.");
      return;
    case Compared::disjoint:
      add(penalty);
      tell(set.word + " shares no value with the words before it, which adds " +
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
  tell("The phrase counts " + counted(phraseWords, "word") + ", the text " +
       std::to_string(countedWords) + ", which adds " + std::to_string(penalty) + '.');
}

void SpanQueryTrace::compareWithBound(std::int64_t bound) {
  _bound = bound;
  if (_isIn) {
    tell("The distance is " + std::to_string(_distance) + "; values up to " +
         std::to_string(bound) + " are listed, so this one is" +
         (_distance <= bound ? "" : " not") + '.');
  }
}

}  // namespace wordcatcher
