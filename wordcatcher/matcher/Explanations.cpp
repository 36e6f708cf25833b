// The two forms of an explanation: for programs and for people.

#include <concepts>
#include <initializer_list>
#include <nlohmann/json.hpp>
#include <string>
#include <utility>
#include <vector>

#include "wordcatcher/matcher/Find.h"

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

std::string comparison(const FindExplanation::Comparison& each) {
  return object(
      {{"word", json(each.word)}, {"edits", json(each.edits)}, {"within", json(each.within)}});
}

std::string textWord(const FindExplanation::TextWord& word) {
  return object({{"begin", json(word.begin)},
                 {"end", json(word.end)},
                 {"word", json(word.word)},
                 {"limit", json(word.limit)},
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

std::string counted(std::uint64_t count, const std::string& thing) {
  return std::to_string(count) + ' ' + thing + (count == 1 ? "" : "s");
}

constexpr const char* kCutOff = "Some words of the text were left out: it is beyond the budget.\n";

}  // namespace

std::string FindExplanation::toJson() const {
  return object({{"text", json(text)},
                 {"value", json(value)},
                 {"isStored", json(isStored)},
                 {"isFound", json(isFound)},
                 {"cost", json(cost)},
                 {"edits", json(edits)},
                 {"words", array(words, &textWord)},
                 {"phrase", array(phrase)},
                 {"pairs", array(pairs, &foundWord)},
                 {"missing", array(missing)},
                 {"surplus", array(surplus)},
                 {"objections", array(objections)},
                 {"truncated", json(truncated)}});
}

std::string FindExplanation::toText() const {
  std::string lines = "Text:   " + text + "\nValue:  " + value + '\n';
  if (isStored) {
    lines += "Phrase: " + listed(phrase) + '\n';
    for (const auto& word : words) {
      const bool isLookedUp = phrase.empty() || !word.comparisons.empty();
      lines += "  " + word.word +
               (isLookedUp ? ", up to " + counted(word.limit, "edit") + ':' : ", not looked up");
      for (const auto& each : word.comparisons) {
        lines += ' ' + each.word + ' ' + std::to_string(each.edits) +
                 (each.within ? " (near)" : "") + (&each == &word.comparisons.back() ? "" : ",");
      }
      lines += '\n';
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
  if (!isStored) {
    lines += "The index holds no such data string.\n";
  }
  std::size_t number = 0;
  for (const auto& step : steps) {
    lines += std::to_string(++number) + ". " + step.sentence + '\n';
  }
  return lines + (truncated ? kCutOff : "");
}

}  // namespace wordcatcher
