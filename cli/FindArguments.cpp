#include "cli/FindArguments.h"

#include <CLI/CLI.hpp>
#include <array>
#include <charconv>
#include <cstdint>
#include <map>
#include <optional>
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

[[noreturn]] void throwBadLengths() {
  throw CLI::ValidationError("--lengths",
                             "give 2 whole numbers with a comma between, the smaller one first, "
                             "such as 2,5");
}

/// A whole number of digits alone, up to `most`; nothing for anything else.
template <typename Number>
std::optional<Number> parsedNumber(const std::string& text, Number most) {
  Number number = 0;
  const char* const end = text.data() + text.size();
  const auto [stop, error] = std::from_chars(text.data(), end, number);
  return error == std::errc() && stop == end && number <= most ? std::optional(number)
                                                               : std::nullopt;
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
    const auto limit = parsedNumber(limits[i], EditLimits::kMaxEdits);
    if (!limit) {
      throwBadEdits();
    }
    *targets.at(i) = *limit;
  }
}

void setNumberEdits(const std::string& number, EditLimits& edits) {
  const auto limit = parsedNumber(number, EditLimits::kMaxEdits);
  if (!limit) {
    throw CLI::ValidationError("--number-edits",
                               "give a number from 0 to " + std::to_string(EditLimits::kMaxEdits));
  }
  edits.numberEdits = *limit;
}

/// Sets up to which lengths words are short and medium.
void setLengths(const std::string& list, EditLimits& edits) {
  const auto lengths = CLI::detail::split(list, ',');
  if (lengths.size() != 2) {
    throwBadLengths();
  }
  const auto shortLength = parsedNumber(lengths[0], SIZE_MAX);
  const auto mediumLength = parsedNumber(lengths[1], SIZE_MAX);
  if (!shortLength || !mediumLength || *shortLength > *mediumLength) {
    throwBadLengths();
  }
  edits.shortLength = *shortLength;
  edits.mediumLength = *mediumLength;
}

std::string editsDescription() {
  const EditLimits edits;
  return "How many edits a word may be away from a stored one\nof up to " +
         std::to_string(edits.shortLength) + " letters, of up to " +
         std::to_string(edits.mediumLength) +
         ", of more (see --lengths);\na 4th number is for whole texts. Words that hold a digit\n"
         "are only found exactly (see --number-edits).\nDefault: " +
         std::to_string(edits.shortEdits) + ',' + std::to_string(edits.mediumEdits) + ',' +
         std::to_string(edits.longEdits) + ',' + std::to_string(edits.wholeTextEdits);
}

std::string numberEditsDescription() {
  return "Edits that a word may have if it, or the stored word, holds\na digit; at most those that "
         "the stored word's length allows.\nDefault: " +
         std::to_string(EditLimits().numberEdits);
}

std::string lengthsDescription() {
  const EditLimits edits;
  return "The letters up to which a stored word has the first of the --edits,\nand the "
         "second.\nDefault: " +
         std::to_string(edits.shortLength) + ',' + std::to_string(edits.mediumLength);
}

/// Adds an option for text that is taken apart as it is set.
CLI::Option* addLimits(CLI::App& verb, const std::string& name,
                       void (*set)(const std::string& text, EditLimits& edits), EditLimits& edits,
                       const std::string& description, const std::string& type) {
  return verb
      .add_option_function<std::string>(
          name, [&edits, set](const std::string& text) { set(text, edits); }, description)
      ->type_name(type);
}

}  // namespace

std::vector<CLI::Option*> addMatchOptions(CLI::App& verb, FindOptions& options) {
  auto* const maxCost = addCount(verb, "--max-cost", options.maxCost, 0,
                                 "The greatest cost of a match; default: any");
  auto* const minWords = addCount(verb, "--min-words", options.minWords, 1,
                                  "Words of a phrase that the text must hold")
                             ->default_str(std::to_string(options.minWords));
  auto* const edits =
      addLimits(verb, "--edits", &setEdits, options.edits, editsDescription(), "LIST");
  auto* const numberEdits = addLimits(verb, "--number-edits", &setNumberEdits, options.edits,
                                      numberEditsDescription(), "N");
  auto* const lengths =
      addLimits(verb, "--lengths", &setLengths, options.edits, lengthsDescription(), "LIST");
  auto* const transpositions = verb.add_flag_callback(
      "--no-transpositions", [&options] { options.transpositions = false; },
      "Count two neighbouring letters that changed places as two edits, not one");
  return {maxCost, minWords, edits, numberEdits, lengths, transpositions};
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
