#include "HostileFind.h"

#include <algorithm>
#include <string>

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

}  // namespace wordcatcher::testing
