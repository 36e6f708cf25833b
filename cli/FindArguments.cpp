#include "cli/FindArguments.h"

#include <CLI/CLI.hpp>
#include <array>
#include <charconv>
#include <cstdint>
#include <map>
#include <string>

namespace wordcatcher::cli {

namespace {

constexpr std::size_t kFewestLimits = 3;

const std::map<std::string, Overlaps> kOverlaps{
    {"all", Overlaps::all}, {"no-sub", Overlaps::noSub}, {"longest", Overlaps::longest}};

/// Adds an option for a number from `least` on. CLI11 would take -1 for the largest of all.
template <typename Number>
CLI::Option* addCount(CLI::App& verb, const std::string& name, Number& number, std::uint64_t least,
                      const std::string& description) {
  const auto take = [&number, name, least](const std::string& text) {
    std::uint64_t value = 0;
    const char* const end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, value);
    if (error != std::errc() || stop != end || value < least) {
      throw CLI::ValidationError(
          name, "give a whole number from " + std::to_string(least) + " on, of 19 digits or fewer");
    }
    number = value;
  };
  return verb.add_option_function<std::string>(name, take, description)->type_name("N");
}

[[noreturn]] void throwBadEdits() {
  throw CLI::ValidationError("--edits", "give 3 or 4 numbers from 0 to " +
                                            std::to_string(EditLimits::kMaxEdits) +
                                            " with commas between, such as 0,1,2");
}

std::uint32_t parsedLimit(const std::string& text) {
  std::uint32_t limit = 0;
  const char* const end = text.data() + text.size();
  const auto [stop, error] = std::from_chars(text.data(), end, limit);
  if (error != std::errc() || stop != end || limit > EditLimits::kMaxEdits) {
    throwBadEdits();
  }
  return limit;
}

/// Sets the limits of short, medium and long words and, if it is given, that of whole texts.
void setEdits(const std::string& list, EditLimits& edits) {
  const std::array targets{&edits.shortEdits, &edits.mediumEdits, &edits.longEdits,
                           &edits.wholeTextEdits};
  const auto limits = CLI::detail::split(list, ',');
  if (limits.size() < kFewestLimits || limits.size() > targets.size()) {
    throwBadEdits();
  }
  for (std::size_t i = 0; i < limits.size(); ++i) {
    *targets.at(i) = parsedLimit(limits[i]);
  }
}

std::string editsDescription() {
  const EditLimits edits;
  return "Edits that a word of the text may have:\nof up to " + std::to_string(edits.shortLength) +
         " letters, of up to " + std::to_string(edits.mediumLength) +
         ", of more; a 4th number is for whole texts.\nDefault: " +
         std::to_string(edits.shortEdits) + ',' + std::to_string(edits.mediumEdits) + ',' +
         std::to_string(edits.longEdits) + ',' + std::to_string(edits.wholeTextEdits);
}

}  // namespace

std::vector<CLI::Option*> addMatchOptions(CLI::App& verb, FindOptions& options) {
  auto* const maxCost = addCount(verb, "--max-cost", options.maxCost, 0,
                                 "The greatest cost of a match; default: any");
  auto* const minWords = addCount(verb, "--min-words", options.minWords, 1,
                                  "Words of a phrase that the text must hold")
                             ->default_str(std::to_string(options.minWords));
  auto* const edits =
      verb.add_option_function<std::string>(
              "--edits", [&options](const std::string& list) { setEdits(list, options.edits); },
              editsDescription())
          ->type_name("LIST");
  auto* const transpositions = verb.add_flag_callback(
      "--no-transpositions", [&options] { options.transpositions = false; },
      "Count two neighbouring letters that changed places as two edits, not one");
  return {maxCost, minWords, edits, transpositions};
}

std::vector<CLI::Option*> addListOptions(CLI::App& verb, FindOptions& options) {
  auto* const limit =
      addCount(verb, "--limit", options.limit, 0, "Matches a text at the most, the best ones")
          ->default_str(std::to_string(options.limit));
  auto* const overlaps =
      verb.add_option_function<std::string>(
              "--overlaps",
              [&options](const std::string& name) { options.overlaps = kOverlaps.at(name); },
              "Matches whose ranges in the text overlap.\nall: every one"
              "\nno-sub: none within the larger range of another"
              "\nlongest: those with the longest range\nDefault: all")
          ->check(CLI::IsMember(std::vector<std::string>{"all", "no-sub", "longest"}))
          ->type_name("WHICH");
  auto* const maxPostings = addCount(verb, "--max-postings", options.maxPostings, 0,
                                     "Phrases under the words of a text that are looked at")
                                ->default_str(std::to_string(options.maxPostings));
  return {limit, overlaps, maxPostings};
}

}  // namespace wordcatcher::cli
