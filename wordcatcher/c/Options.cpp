#include "wordcatcher/c/Options.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <string>

#include "wordcatcher/Error.h"

namespace wordcatcher::c {

namespace {

/// No struct of options will ever be so large: a greater size was never set.
constexpr std::size_t kMaxSize = 4096;

// A later version appends members, which must not hide in what is padding now.
static_assert(sizeof(wordcatcher_open_options) ==
              offsetof(wordcatcher_open_options, max_word_units) + sizeof(std::size_t));
static_assert(sizeof(wordcatcher_find_options) ==
              offsetof(wordcatcher_find_options, number_edits) + sizeof(std::uint64_t));
static_assert(sizeof(wordcatcher_builder_options) ==
              offsetof(wordcatcher_builder_options, tables) + sizeof(const char*));

static_assert(WORDCATCHER_MODE_WORDS == static_cast<int>(MatchingMode::words) &&
              WORDCATCHER_MODE_WHOLE_TEXT == static_cast<int>(MatchingMode::wholeText) &&
              WORDCATCHER_MODE_PHONETIC_WORDS == static_cast<int>(MatchingMode::phoneticWords));
static_assert(WORDCATCHER_OVERLAPS_ALL == static_cast<int>(Overlaps::all) &&
              WORDCATCHER_OVERLAPS_NO_SUB == static_cast<int>(Overlaps::noSub) &&
              WORDCATCHER_OVERLAPS_LONGEST == static_cast<int>(Overlaps::longest));

wordcatcher_open_options defaultsOf(const wordcatcher_open_options* /*type*/) {
  const Index::Options defaults;
  wordcatcher_open_options options = {};
  options.load = WORDCATCHER_LOAD_MAP;
  options.mode = WORDCATCHER_MODE_WORDS;
  options.max_query_words = defaults.maxQueryWords;
  options.max_word_units = defaults.maxWordUnits;
  return options;
}

wordcatcher_find_options defaultsOf(const wordcatcher_find_options* /*type*/) {
  const FindOptions defaults;
  wordcatcher_find_options options = {};
  options.limit = defaults.limit;
  options.max_cost = defaults.maxCost.value_or(WORDCATCHER_ANY_COST);
  options.min_words = defaults.minWords;
  options.short_length = defaults.edits.shortLength;
  options.medium_length = defaults.edits.mediumLength;
  options.short_edits = defaults.edits.shortEdits;
  options.medium_edits = defaults.edits.mediumEdits;
  options.long_edits = defaults.edits.longEdits;
  options.whole_text_edits = defaults.edits.wholeTextEdits;
  options.transpositions = defaults.transpositions ? 1 : 0;
  options.overlaps = static_cast<std::int32_t>(defaults.overlaps);
  options.max_postings = defaults.maxPostings;
  options.number_edits = defaults.edits.numberEdits;
  return options;
}

wordcatcher_builder_options defaultsOf(const wordcatcher_builder_options* /*type*/) {
  wordcatcher_builder_options options = {};
  options.mode = static_cast<std::int32_t>(IndexBuilder::Options().mode);
  return options;
}

/// Fills a struct of the caller's, which may be of an older or a newer version than this one.
template <typename Options>
void init(Options* options, std::size_t size) {
  if (options == nullptr) {
    return;
  }
  Options defaults = defaultsOf(options);
  defaults.size = size;
  std::memset(options, 0, size);
  std::memcpy(options, &defaults, std::min(size, sizeof(Options)));
}

/// The caller's options, with defaults for members that its version does not have.
template <typename Options>
Options take(const Options* given) {
  Options options = defaultsOf(given);
  if (given == nullptr) {
    return options;
  }
  const std::size_t size = given->size;
  if (size < sizeof(size) || size > kMaxSize) {
    throw Error(ErrorCode::badInput,
                "The options have no size; fill them by their _init function first.");
  }
  const auto* const bytes = reinterpret_cast<const unsigned char*>(given);
  for (std::size_t i = sizeof(Options); i < size; ++i) {
    if (bytes[i] != 0) {
      throw Error(ErrorCode::badInput,
                  "An option is set that this version of the library does not know; leave it as it "
                  "was filled, or use a newer library.");
    }
  }
  std::memcpy(&options, given, std::min(size, sizeof(Options)));
  return options;
}

/// Throws Error (badInput) for a number that is no enumerator; they count from 0.
void checkEnumerator(std::int32_t number, std::int32_t last, const char* name) {
  if (number < 0 || number > last) {
    throw Error(ErrorCode::badInput, "There is no " + std::string(name) + " " +
                                         std::to_string(number) + "; use one of its enumerators.");
  }
}

MatchingMode modeOf(std::int32_t mode) {
  checkEnumerator(mode, WORDCATCHER_MODE_PHONETIC_WORDS, "matching mode");
  return static_cast<MatchingMode>(mode);
}

}  // namespace

Index::Options openOptionsOf(const wordcatcher_open_options* options) {
  const auto given = take(options);
  checkEnumerator(given.load, WORDCATCHER_LOAD_COPY, "way to load");
  Index::Options result;
  result.load = given.load == WORDCATCHER_LOAD_COPY ? Index::Load::copy : Index::Load::map;
  result.maxQueryWords = given.max_query_words;
  result.maxWordUnits = given.max_word_units;
  return result;
}

MatchingMode modeOf(const wordcatcher_open_options* options) { return modeOf(take(options).mode); }

FindOptions findOptionsOf(const wordcatcher_find_options* options) {
  const auto given = take(options);
  checkEnumerator(given.overlaps, WORDCATCHER_OVERLAPS_LONGEST, "treatment of overlaps");
  FindOptions result;
  result.limit = given.limit;
  if (given.max_cost != WORDCATCHER_ANY_COST) {
    result.maxCost = given.max_cost;
  }
  result.minWords = given.min_words;
  result.edits.shortLength = given.short_length;
  result.edits.mediumLength = given.medium_length;
  result.edits.shortEdits = given.short_edits;
  result.edits.mediumEdits = given.medium_edits;
  result.edits.longEdits = given.long_edits;
  result.edits.wholeTextEdits = given.whole_text_edits;
  result.transpositions = given.transpositions != 0;
  result.overlaps = static_cast<Overlaps>(given.overlaps);
  result.maxPostings = given.max_postings;
  // What 32 bits do not hold is too much as well, and must not become less.
  result.edits.numberEdits =
      static_cast<std::uint32_t>(std::min<std::uint64_t>(given.number_edits, UINT32_MAX));
  return result;
}

IndexBuilder::Options builderOptionsOf(const wordcatcher_builder_options* options) {
  const auto given = take(options);
  IndexBuilder::Options result;
  result.mode = modeOf(given.mode);
  if (given.tables != nullptr) {
    result.tables = given.tables;
  }
  return result;
}

}  // namespace wordcatcher::c

void wordcatcher_open_options_init(wordcatcher_open_options* options, size_t size) {
  wordcatcher::c::init(options, size);
}

void wordcatcher_find_options_init(wordcatcher_find_options* options, size_t size) {
  wordcatcher::c::init(options, size);
}

void wordcatcher_builder_options_init(wordcatcher_builder_options* options, size_t size) {
  wordcatcher::c::init(options, size);
}
