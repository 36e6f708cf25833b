// The two forms of an explanation: for programs and for people.

#include <nlohmann/json.hpp>

#include "wordcatcher/matcher/Find.h"

namespace wordcatcher {

namespace {

using Json = nlohmann::ordered_json;

// Strings that are not UTF-8, as a host may pass any, appear with U+FFFD.
std::string oneLine(const Json& json) {
  return json.dump(-1, ' ', false, Json::error_handler_t::replace);
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
  Json json = {{"text", text},       {"value", value}, {"isStored", isStored},
               {"isFound", isFound}, {"cost", cost},   {"edits", edits}};
  json["words"] = Json::array();
  for (const auto& word : words) {
    Json compared = Json::array();
    for (const auto& each : word.comparisons) {
      compared.push_back({{"word", each.word}, {"edits", each.edits}, {"within", each.within}});
    }
    json["words"].push_back({{"begin", word.begin},
                             {"end", word.end},
                             {"word", word.word},
                             {"limit", word.limit},
                             {"comparisons", std::move(compared)}});
  }
  json["phrase"] = phrase;
  json["pairs"] = Json::array();
  for (const auto& pair : pairs) {
    json["pairs"].push_back(
        {{"begin", pair.begin}, {"end", pair.end}, {"word", pair.word}, {"edits", pair.edits}});
  }
  json["missing"] = missing;
  json["surplus"] = surplus;
  json["objections"] = objections;
  json["truncated"] = truncated;
  return oneLine(json);
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
  Json json = {{"text", text},       {"value", value},       {"isStored", isStored},
               {"isFound", isFound}, {"distance", distance}, {"bound", bound}};
  json["steps"] = Json::array();
  for (const auto& step : steps) {
    json["steps"].push_back({{"sentence", step.sentence}, {"distance", step.distance}});
  }
  json["truncated"] = truncated;
  return oneLine(json);
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
