#include "HostileFind.h"

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <string>
#include <system_error>
#include <vector>

#include "wordcatcher/matcher/FoundPhrases.h"
#include "wordcatcher/matcher/SpanShortcut.h"
#include "wordcatcher/text/Unicode.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher::testing {

bool queriesWithinBounds(const SearchImage& image, std::u16string_view text, std::int64_t edits) {
  static WordSegmenter segmenter;
  constexpr std::size_t kMostWords = 100;
  constexpr std::size_t kMostUnits = 1024;
  const SpanQueryLimits limits = {std::clamp<std::int64_t>(edits, 0, 2), 2, 3, kMostWords,
                                  kMostUnits};
  std::u16string words(text);
  words += u' ';
  words += text.substr(text.size() / 2);
  const auto isBounded = [&image](const std::optional<std::vector<ScoredValue>>& scored) {
    return !scored || scored->size() <= image.valueCount();
  };
  if (const auto answer = SpanShortcut(image, segmenter, limits).run(words)) {
    if (!isBounded(answer->scored)) {
      return false;
    }
  }
  std::int64_t wordsMatched = 0;
  return isBounded(SpanQuery(image, segmenter, limits, wordsMatched).run(words));
}

bool findsWithinBounds(const SearchImage& image, std::u16string_view text, std::int64_t edits) {
  static WordSegmenter segmenter;
  constexpr std::size_t kMostWords = 100;
  constexpr std::size_t kMostUnits = 1024;
  FindOptions options;
  const auto limit =
      static_cast<std::uint32_t>(std::clamp<std::int64_t>(edits, 0, EditLimits::kMaxEdits));
  options.edits = {0, 0, limit, limit, limit, limit};
  options.overlaps = edits % 2 == 0 ? Overlaps::all : Overlaps::longest;
  options.maxPostings = 10000;
  // Once as it is, and once in two words, which may be joined again.
  const std::string whole = displayUtf8(text);
  const std::string bytes = whole + ' ' + displayUtf8(text.substr(0, text.size() / 2)) + ' ' +
                            displayUtf8(text.substr(text.size() / 2));
  const FindText words(bytes, MatchingMode::words, options.edits, segmenter, kMostWords,
                       kMostUnits);
  const auto result = findPhrases(image, words, options, true);
  for (const auto& match : result.matches) {
    if (match.hits.empty() || match.value.size() > image.bytes().size()) {
      return false;
    }
    for (const auto& hit : match.hits) {
      if (hit.begin >= hit.end || hit.end > bytes.size() || hit.begin < match.begin ||
          hit.end > match.end || hit.edits > EditLimits::kMaxEdits) {
        return false;
      }
    }
  }
  if (!result.matches.empty()) {
    const auto explained = explainFind(image, words, result.matches.front().value, options, true);
    return explained.isStored && explained.words.size() == words.words.size();
  }
  return result.matches.size() <= options.limit;
}

namespace {

/// A file in memory that has a path while this lives.
class MemoryFile {
 public:
  explicit MemoryFile(const ImageBytes& bytes) : _descriptor(memfd_create("image", MFD_CLOEXEC)) {
    if (_descriptor < 0 ||
        write(_descriptor, bytes.data(), bytes.size()) != static_cast<ssize_t>(bytes.size())) {
      throw std::system_error(errno, std::generic_category(), "a file in memory");
    }
  }
  ~MemoryFile() { close(_descriptor); }
  MemoryFile(const MemoryFile&) = delete;
  MemoryFile& operator=(const MemoryFile&) = delete;

  std::string path() const { return "/proc/self/fd/" + std::to_string(_descriptor); }

 private:
  int _descriptor;
};

std::string faultOfHits(const FoundPhrase& match, const Question& question) {
  if (match.hits.empty() || match.begin != match.hits.front().begin ||
      match.end != match.hits.back().end || match.end > question.text.size()) {
    return "a match has another range than its hits";
  }
  const std::size_t mostWords = 2 * match.hits.size();  // where each hit joins two
  if (mostWords < question.options.minWords) {
    return "a match has too few words";
  }
  for (const auto& hit : match.hits) {
    if (hit.begin >= hit.end || hit.begin < match.begin || hit.end > match.end) {
      return "a hit lies outside its match";
    }
    if (hit.edits > EditLimits::kMaxEdits) {
      return "a hit has too many edits";
    }
  }
  return {};
}

bool liesWithin(const FoundPhrase& small, const FoundPhrase& large) {
  return large.begin <= small.begin && small.end <= large.end &&
         large.end - large.begin > small.end - small.begin;
}

std::string faultOfRanges(const std::vector<FoundPhrase>& matches, Overlaps overlaps) {
  for (const auto& match : matches) {
    for (const auto& other : matches) {
      if (overlaps == Overlaps::noSub && liesWithin(match, other)) {
        return "a match lies within another";
      }
      if (overlaps == Overlaps::longest && &match != &other && match.begin < other.end &&
          other.begin < match.end) {
        return "two matches overlap";
      }
    }
  }
  return {};
}

std::string faultOfFound(const FindResult& found, const Question& question) {
  const FindOptions& options = question.options;
  if (found.matches.size() > options.limit) {
    return "there are too many matches";
  }
  std::uint64_t cost = 0;
  for (const auto& match : found.matches) {
    if (auto fault = faultOfHits(match, question); !fault.empty()) {
      return fault;
    }
    if (match.cost < cost || (options.maxCost && match.cost > *options.maxCost)) {
      return "a match has another cost than it may";
    }
    cost = match.cost;
  }
  return faultOfRanges(found.matches, options.overlaps);
}

std::string faultOfExplanation(const FindExplanation& explained) {
  if (explained.toJson().empty() || explained.toText().empty()) {
    return "an explanation has no form";
  }
  if (!explained.isStored) {
    return explained.isFound ? "what is not stored is found" : "";
  }
  if (explained.isFound != explained.objections.empty()) {
    return "what is found has objections, or what is not has none";
  }
  std::uint64_t edits = 0;
  for (const auto& pair : explained.pairs) {
    if (pair.begin >= pair.end || pair.end > explained.text.size()) {
      return "a pair lies outside the text";
    }
    edits += pair.edits;
  }
  const bool isCounted =
      explained.edits == edits &&
      explained.cost == edits + 2 * (explained.missing.size() + explained.surplus.size());
  return isCounted ? "" : "the cost is not that of pairs, missing words and those left over";
}

std::string faultOfFind(const Index& index, const Question& question, bool isWhole) {
  const FindResult found = index.find(question.text, question.options);
  if (auto fault = faultOfFound(found, question); !fault.empty()) {
    return fault;
  }
  for (const auto& match : found.matches) {
    const auto explained = index.explain(question.text, match.value, question.options);
    if (auto fault = faultOfExplanation(explained); !fault.empty()) {
      return fault;
    }
    if (!explained.isStored) {
      return "what is found is not stored";
    }
    // With a budget used up there may be better pairs than those that were found.
    if (isWhole && !found.truncated &&
        (!explained.isFound || explained.cost != match.cost || explained.pairs != match.hits)) {
      return "find() and explain() tell different things";
    }
  }
  return faultOfExplanation(index.explain(question.text, question.value, question.options));
}

std::string faultOfExplained(const Index& index, const Question& question,
                             const Index::Match& match, const std::string& value) {
  const auto explained = index.explainQuery(question.text, value);
  return explained.isStored && explained.isFound && explained.distance == match.distance
             ? ""
             : "query() and explainQuery() tell different things";
}

std::string faultOfQuery(const Index& index, const Question& question, bool isWhole) {
  const auto found = index.query(question.text);
  if (!std::is_sorted(
          found.matches.begin(), found.matches.end(),
          [](const auto& one, const auto& other) { return one.distance < other.distance; })) {
    return "distances do not ascend";
  }
  const bool isText = index.info().mode == MatchingMode::wholeText;
  for (const auto& match : found.matches) {
    for (const auto& value : isText ? match.data : std::vector<std::string>{match.value}) {
      auto fault = faultOfExplained(index, question, match, value);
      // A value of several texts is explained by the nearest.
      if (isWhole && !isText && !fault.empty()) {
        return fault;
      }
    }
  }
  const auto explained = index.explainQuery(question.text, question.value);
  return explained.toJson().empty() || explained.toText().empty() || explained.steps.empty()
             ? "an explanation has no form"
             : "";
}

}  // namespace

Index openIndex(const ImageBytes& bytes, Index::Options options) {
  const MemoryFile file(bytes);
  options.load = Index::Load::copy;
  return Index::open(file.path(), options);
}

std::string faultOfAnswers(const Index& index, const Question& question, bool isWhole) {
  auto fault = faultOfFind(index, question, isWhole);
  return fault.empty() ? faultOfQuery(index, question, isWhole) : fault;
}

}  // namespace wordcatcher::testing
