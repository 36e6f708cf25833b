// The two forms of an explanation: for programs and for people.

#include <algorithm>
#include <concepts>
#include <initializer_list>
#include <iterator>
#include <nlohmann/json.hpp>
#include <string>
#include <utility>
#include <vector>

#include "wordcatcher/matcher/Find.h"
#include "wordcatcher/matcher/Sentences.h"

namespace wordcatcher {

namespace {

// The text is put together piece by piece: the library's trees of values allocate memory in their
// destructors, which would end the process where memory runs out.

/// Strings that are not UTF-8, as a host may pass any, appear with U+FFFD.
std::string json(const std::string& text) {
  using Json = nlohmann::json;
  return Json(text).dump(-1, ' ', false, Json::error_handler_t::replace);
}

std::string json(bool value) { return value ? "true" : "false"; }

template <std::integral Number>
std::string json(Number number) {
  return std::to_string(number);
}

using Members = std::initializer_list<std::pair<const char*, std::string>>;

/// An object of members whose values are JSON already; their names need no escapes.
std::string object(const Members& members) {
  std::string text;
  for (const auto& [name, value] : members) {
    text.append(text.empty() ? "{\"" : ",\"").append(name).append("\":").append(value);
  }
  return text + '}';
}

template <typename Element, typename Form>
std::string array(const std::vector<Element>& elements, const Form& form) {
  std::string text = "[";
  for (const auto& element : elements) {
    text.append(&element == &elements.front() ? "" : ",").append(form(element));
  }
  return text + ']';
}

std::string array(const std::vector<std::string>& texts) {
  return array(texts, [](const std::string& text) { return json(text); });
}

std::string phraseWord(const FindExplanation::PhraseWord& word) {
  return object({{"word", json(word.word)},
                 {"lengthLimit", json(word.lengthLimit)},
                 {"limit", json(word.limit)}});
}

std::string comparison(const FindExplanation::Comparison& each) {
  return object({{"word", json(each.word)},
                 {"edits", json(each.edits)},
                 {"limit", json(each.limit)},
                 {"within", json(each.within)}});
}

std::string textWord(const FindExplanation::TextWord& word) {
  return object({{"begin", json(word.begin)},
                 {"end", json(word.end)},
                 {"word", json(word.word)},
                 {"written", json(word.written)},
                 {"isLookedUp", json(word.isLookedUp)},
                 {"comparisons", array(word.comparisons, &comparison)}});
}

std::string foundWord(const FoundWord& word) {
  return object({{"begin", json(word.begin)},
                 {"end", json(word.end)},
                 {"word", json(word.word)},
                 {"edits", json(word.edits)}});
}

std::string queryStep(const QueryExplanation::Step& step) {
  return object({{"sentence", json(step.sentence)}, {"distance", json(step.distance)}});
}

std::string listed(const std::vector<std::string>& words) {
  std::string list;
  for (const auto& word : words) {
    list += list.empty() ? word : ", " + word;
  }
  return list.empty() ? "none" : list;
}

constexpr const char* kCutOff =
    "A budget was used up: some words, comparisons, pairings or phrases were left out.\n";
constexpr const char* kNotCompared = " ... (beyond the budget)";

/// A word of the phrase with its limit.
std::string limited(const FindExplanation::PhraseWord& word) {
  return word.word + " (up to " + counted(word.limit, "edit") +
         (word.limit < word.lengthLimit ? " as it holds a digit)" : ")");
}

/// One word of the text beside those of the phrase.
std::string lineOf(const FindExplanation::TextWord& word,
                   const std::vector<FindExplanation::PhraseWord>& phrase) {
  std::string line = "  " + shown(word);
  if (!word.isLookedUp) {
    return line + ", not looked up\n";
  }
  line += phrase.empty() ? "" : ":";
  for (std::size_t i = 0; i < word.comparisons.size(); ++i) {
    const auto& each = word.comparisons[i];
    line += (i == 0 ? " " : ", ") + each.word + ' ' + std::to_string(each.edits);
    if (each.within) {
      line += " (near)";
    } else if (i < phrase.size() && each.edits <= phrase[i].lengthLimit) {
      // Only a digit has the limit of the two fall below that of the length.
      line += each.limit == 0 ? " (words with a digit must be the same)"
                              : " (words with a digit: up to " + counted(each.limit, "edit") + ')';
    }
  }
  return line + (word.comparisons.size() < phrase.size() ? kNotCompared : "") + '\n';
}

}  // namespace

std::string FindExplanation::toJson() const {
  return object({{"text", json(text)},
                 {"value", json(value)},
                 {"isStored", json(isStored)},
                 {"isFound", json(isFound)},
                 {"cost", json(cost)},
                 {"edits", json(edits)},
                 {"words", array(words, &textWord)},
                 {"phrase", array(phrase, &phraseWord)},
                 {"pairs", array(pairs, &foundWord)},
                 {"missing", array(missing)},
                 {"surplus", array(surplus)},
                 {"objections", array(objections)},
                 {"truncated", json(truncated)}});
}

std::string FindExplanation::toText() const {
  std::string lines = "Text:   " + text + "\nValue:  " + value + '\n';
  if (isStored) {
    std::vector<std::string> limits;
    std::transform(phrase.begin(), phrase.end(), std::back_inserter(limits), &limited);
    lines += "Phrase: " + listed(limits) + '\n';
    for (const auto& word : words) {
      lines += lineOf(word, phrase);
    }
    for (const auto& pair : pairs) {
      lines += "Paired: " + text.substr(pair.begin, pair.end - pair.begin) + " with " + pair.word +
               ", " + counted(pair.edits, "edit") + '\n';
    }
    lines += "Missing from the text: " + listed(missing) +
             "\nLeft over in the text: " + listed(surplus) + "\nCost: " + std::to_string(cost) +
             " = " + counted(edits, "edit") + " + 2 x " + std::to_string(missing.size()) +
             " missing + 2 x " + std::to_string(surplus.size()) + " left over\n";
  }
  for (const auto& objection : objections) {
    lines += "Not found: " + objection + '\n';
  }
  return lines + (truncated ? kCutOff : "");
}

std::string QueryExplanation::toJson() const {
  return object({{"text", json(text)},
                 {"value", json(value)},
                 {"isStored", json(isStored)},
                 {"isFound", json(isFound)},
                 {"distance", json(distance)},
                 {"bound", json(bound)},
                 {"steps", array(steps, &queryStep)},
                 {"truncated", json(truncated)}});
}

std::string QueryExplanation::toText() const {
  std::string lines = "Text:  " + text + "\nValue: " + value + '\n';
  std::size_t number = 0;
  for (const auto& step : steps) {
    lines += std::to_string(++number) + ". " + step.sentence + '\n';
  }
  return lines + (truncated ? kCutOff : "");
}

}  // namespace wordcatcher
