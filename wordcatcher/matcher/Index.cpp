#include "wordcatcher/matcher/Index.h"

#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <system_error>
#include <utility>

#include "wordcatcher/Error.h"
#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"
#include "wordcatcher/matcher/FindText.h"
#include "wordcatcher/matcher/FoundPhrases.h"
#include "wordcatcher/matcher/Sentences.h"
#include "wordcatcher/matcher/SpanQuery.h"
#include "wordcatcher/matcher/SpanShortcut.h"
#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/storage/TableFile.h"
#include "wordcatcher/text/CodeUnitOrder.h"
#include "wordcatcher/text/PhraseLength.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

// As the classic matcher's.
constexpr std::int64_t kWordDistance = 2;
constexpr std::int64_t kWholeTextDistance = 3;
constexpr std::int64_t kIgnoredWordLength = 2;

constexpr std::int64_t kMaxSearchDistance = 16;

/// The three files of a classic index whose names begin with `prefix`.
std::vector<std::string> tablesAt(const std::string& prefix) {
  return {prefix + "edgeTable.tdb", prefix + "dataTable.tdb", prefix + "finalTable.tdb"};
}

bool isDirectory(const std::string& path) {
  struct stat status = {};
  return stat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
}

bool exists(const std::string& path) {
  struct stat status = {};
  return stat(path.c_str(), &status) == 0;
}

[[noreturn]] void throwNoTable(const std::string& prefix, const std::string& table, int code) {
  throw Error(code == ENOENT ? ErrorCode::notFound : ErrorCode::notReadable,
              "There is no classic index at " + prefix + ": " + table + " cannot be read (" +
                  std::generic_category().message(code) +
                  "); check the path, or index the phrases again with tables there.");
}

/// The tables' own failures are only lines in the log, so what can be told beforehand is told here.
void checkThere(const std::string& prefix) {
  for (const auto& table : tablesAt(prefix)) {
    struct stat status = {};
    if (stat(table.c_str(), &status) != 0) {
      throwNoTable(prefix, table, errno);
    }
    if (!S_ISREG(status.st_mode)) {
      throw Error(ErrorCode::notAnIndex, table + " is no file; index again.");
    }
  }
}

/// Only the locks tell that no other process is still writing, so this waits until they were taken.
void checkFinished(const std::string& prefix) {
  for (const auto& table : tablesAt(prefix)) {
    struct stat status = {};
    if (stat(table.c_str(), &status) != 0 || status.st_size < off_t{kHeaderBytes}) {
      throw Error(ErrorCode::notAnIndex, table + " is no finished table; index again.");
    }
  }
}

/// Codes are compared exactly, and whole texts are one word.
bool joinsWords(MatchingMode mode, const FindOptions& options) {
  const EditLimits& edits = options.edits;
  return mode == MatchingMode::words &&
         std::max({edits.shortEdits, edits.mediumEdits, edits.longEdits}) > 0;
}

std::uint32_t modeNumber(MatchingMode mode) { return static_cast<std::uint32_t>(mode); }

}  // namespace

struct Index::State {
  std::shared_ptr<const SearchImage> image;
  MatchingMode mode;
  Options options;
  // Copied by each query; never used itself.
  WordSegmenter segmenter;

  std::vector<std::string> dataOf(std::uint32_t word) const {
    const auto values = image->postingsOf(word);
    std::vector<std::string> data;
    data.reserve(values.size());
    for (const std::uint32_t value : values) {
      data.emplace_back(image->valueText(value));
    }
    std::sort(data.begin(), data.end(), &utf16Less);
    return data;
  }

  /// A word of the image as UTF-8; unpaired surrogates, which no text has, appear as U+FFFD.
  std::string wordText(const WordHit& hit) const {
    return displayUtf8(image->textOf(hit.word, hit.length));
  }

  FindText cut(std::string_view text, const EditLimits& limits) const;

  QueryResult queryWholeText(const std::u16string& text) const;
  QueryResult queryWords(std::u16string_view text) const;

  SpanAnswer runSpanQuery(std::u16string_view text, SpanQueryTrace* trace) const;

  /// What to do about a value that is not stored.
  std::string absenceOf(std::string_view value) const;
};

Index::Index(std::shared_ptr<const State> state) : _state(std::move(state)) {}

Index Index::open(const std::string& path) { return open(path, Options()); }

Index Index::open(const std::string& path, const Options& options, MatchingMode mode) {
  const bool directory = isDirectory(path);
  const std::string prefix = directory && !path.ends_with('/') ? path + '/' : path;
  if (directory || (!exists(path) && exists(tablesAt(path).front()))) {
    checkThere(prefix);
    LXFuzzyIndex tables(prefix);
    tables.setMode(kReading);
    checkFinished(prefix);
    if (tables.getMode() != kReading) {
      throw Error(ErrorCode::notReadable,
                  "The classic index at " + prefix +
                      " cannot be opened; see in the log which table failed, and index again.");
    }
    return Index(
        std::make_shared<const State>(State{tables.sharedImage(), mode, options, WordSegmenter()}));
  }
  auto image = SearchImage::open(
      path, options.load == Load::copy ? SearchImage::Load::copy : SearchImage::Load::map);
  const std::uint32_t stored = image->header().mode;
  if (stored > modeNumber(MatchingMode::phoneticWords)) {
    throw Error(ErrorCode::notAnIndex, "The search image " + path +
                                           " has a matching mode that this version does not know; "
                                           "use a newer version, or build it again.");
  }
  return Index(std::make_shared<const State>(
      State{std::move(image), static_cast<MatchingMode>(stored), options, WordSegmenter()}));
}

Index::QueryResult Index::query(std::string_view text) const {
  const std::u16string units = decodeUtf8(text);
  return _state->mode == MatchingMode::wholeText ? _state->queryWholeText(units)
                                                 : _state->queryWords(units);
}

Index::QueryResult Index::State::queryWholeText(const std::u16string& text) const {
  QueryResult result;
  result.found = true;
  if (text.size() > options.maxWordUnits) {
    result.truncated = true;
    return result;
  }
  auto hits = searchImage(*image, toLower(text), kWholeTextDistance);
  std::sort(hits.begin(), hits.end(), [](const WordHit& a, const WordHit& b) {
    return a.distance != b.distance ? a.distance < b.distance : a.word < b.word;
  });
  result.matches.reserve(hits.size());
  for (const auto& hit : hits) {
    result.matches.push_back({wordText(hit), hit.distance, dataOf(hit.word)});
  }
  return result;
}

SpanAnswer Index::State::runSpanQuery(std::u16string_view text, SpanQueryTrace* trace) const {
  std::u16string codes;
  std::int64_t editDistance = kWordDistance;
  if (mode == MatchingMode::phoneticWords) {
    codes = KXMetaphone(segmenter).translate(text);
    text = codes;
    editDistance = 0;
  }
  std::int64_t wordsMatched = 0;
  WordSegmenter words(segmenter);
  const SpanQueryLimits limits = {editDistance, kIgnoredWordLength, kUncountedWordLength,
                                  options.maxQueryWords, options.maxWordUnits};
  if (trace == nullptr) {
    if (auto answer = SpanShortcut(*image, words, limits).run(text)) {
      return *std::move(answer);
    }
  }
  SpanQuery query(*image, words, limits, wordsMatched);
  if (trace != nullptr) {
    query.tellTo(*trace);
  }
  auto scored = query.run(text);
  return {std::move(scored), query.truncated()};
}

Index::QueryResult Index::State::queryWords(std::u16string_view text) const {
  const auto [scored, truncated] = runSpanQuery(text, nullptr);
  QueryResult result;
  result.truncated = truncated;
  result.found = scored.has_value();
  if (scored) {
    result.matches.reserve(scored->size());
    for (const auto& [value, distance] : *scored) {
      result.matches.push_back({std::string(image->valueText(value)), distance, {}});
    }
  }
  return result;
}

Index::SearchResult Index::search(std::string_view word, std::int64_t maxDistance) const {
  if (maxDistance > kMaxSearchDistance) {
    throw Error(ErrorCode::badInput, "A distance of " + std::to_string(maxDistance) +
                                         " finds almost anything; give at most " +
                                         std::to_string(kMaxSearchDistance) + ".");
  }
  const auto units = fromUtf8(word);
  if (!units) {
    throw Error(ErrorCode::badInput, "The word is not UTF-8; convert it before the search.");
  }
  SearchResult result;
  if (units->size() > _state->options.maxWordUnits) {
    result.truncated = true;
    return result;
  }
  const auto hits = searchImage(*_state->image, toLower(*units), maxDistance);
  result.matches.reserve(hits.size());
  for (const auto& hit : hits) {
    result.matches.push_back({_state->wordText(hit), hit.distance, _state->dataOf(hit.word)});
  }
  return result;
}

FindText Index::State::cut(std::string_view text, const EditLimits& limits) const {
  for (const std::uint32_t edits : {limits.shortEdits, limits.mediumEdits, limits.longEdits,
                                    limits.wholeTextEdits, limits.numberEdits}) {
    if (edits > EditLimits::kMaxEdits) {
      throw Error(ErrorCode::badInput, "An edit limit of " + std::to_string(edits) +
                                           " finds almost anything; give at most " +
                                           std::to_string(EditLimits::kMaxEdits) + ".");
    }
  }
  WordSegmenter words(segmenter);
  return {text, mode, limits, words, options.maxQueryWords, options.maxWordUnits};
}

FindResult Index::find(std::string_view text) const { return find(text, FindOptions()); }

FindResult Index::find(std::string_view text, const FindOptions& options) const {
  const FindText words = _state->cut(text, options.edits);
  return findPhrases(*_state->image, words, options, joinsWords(_state->mode, options));
}

FindExplanation Index::explain(std::string_view text, std::string_view value) const {
  return explain(text, value, FindOptions());
}

FindExplanation Index::explain(std::string_view text, std::string_view value,
                               const FindOptions& options) const {
  const FindText words = _state->cut(text, options.edits);
  auto explanation =
      explainFind(*_state->image, words, value, options, joinsWords(_state->mode, options));
  if (!explanation.isStored) {
    explanation.objections.push_back(_state->absenceOf(value));
  }
  return explanation;
}

std::string Index::State::absenceOf(std::string_view value) const {
  FindOptions options;
  options.limit = 1;
  const FindText words = cut(phraseOf(value), options.edits);
  const auto nearest = findPhrases(*image, words, options, joinsWords(mode, options)).matches;
  return "The index holds no such data string; give one just as find prints it" +
         (nearest.empty() ? "." : ", such as " + inQuotes(nearest.front().value) + '.');
}

QueryExplanation Index::explainQuery(std::string_view text, std::string_view value) const {
  const SearchImage& image = *_state->image;
  QueryExplanation explanation;
  explanation.text = text;
  explanation.value = value;
  const QueryResult result = query(text);
  explanation.truncated = result.truncated;
  if (_state->mode == MatchingMode::wholeText) {
    explanation.bound = kWholeTextDistance;
    for (const Match& match : result.matches) {
      if (std::find(match.data.begin(), match.data.end(), value) != match.data.end()) {
        explanation.isFound = true;
        explanation.distance = match.distance;
        explanation.steps.push_back({"The stored text \"" + match.value +
                                         "\" carries the value and is " +
                                         counted(match.distance, "edit") + " from this one.",
                                     match.distance});
        break;
      }
    }
    explanation.isStored = explanation.isFound || valueNumber(image, value).has_value();
    if (explanation.isStored && !explanation.isFound) {
      explanation.steps.push_back({result.truncated
                                       ? "The text is not looked up: it is too long."
                                       : "No stored text that carries the value is within " +
                                             counted(kWholeTextDistance, "edit") + " of this one.",
                                   0});
    } else if (!explanation.isStored) {
      explanation.steps.push_back({_state->absenceOf(value), 0});
    }
    return explanation;
  }
  const auto number = valueNumber(image, value);
  explanation.isStored = number.has_value();
  if (!number) {
    explanation.steps.push_back({_state->absenceOf(value), 0});
    return explanation;
  }
  SpanQueryTrace trace(image, *number, _state->mode == MatchingMode::phoneticWords);
  _state->runSpanQuery(decodeUtf8(text), &trace);
  const auto found = std::find_if(result.matches.begin(), result.matches.end(),
                                  [value](const Match& match) { return match.value == value; });
  explanation.isFound = found != result.matches.end();
  explanation.distance = trace.distance();
  explanation.bound = trace.bound();
  explanation.steps = trace.steps();
  return explanation;
}

Index::Info Index::info() const {
  const auto& header = _state->image->header();
  constexpr const char* kDigits = "0123456789abcdef";
  Info info = {};
  info.mode = _state->mode;
  info.phrases = header.phraseCount;
  info.words = header.wordCount;
  info.values = header.valueCount;
  info.bytes = _state->image->bytes().size();
  info.version = header.version;
  for (const std::uint64_t half : header.generation) {
    for (unsigned shift = 64; shift > 0; shift -= 4) {
      info.generation += kDigits[(half >> (shift - 4)) & 0xFU];
    }
  }
  return info;
}

void Index::verify() const { _state->image->verify(); }

}  // namespace wordcatcher
