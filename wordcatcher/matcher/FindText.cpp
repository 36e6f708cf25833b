#include "wordcatcher/matcher/FindText.h"

#include <unicode/uchar.h>
#include <unicode/utf16.h>

#include <algorithm>
#include <optional>
#include <utility>

#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/text/ByteOffsets.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

/// The codes of words, as an index of codes holds them.
class CodeWords {
 public:
  explicit CodeWords(const WordSegmenter& rules) : _encoder(rules), _segmenter(rules) {}

  std::vector<std::u16string> of(std::u16string_view word) {
    std::vector<std::u16string> codes;
    const std::u16string translated = _encoder.translate(word);
    _segmenter.start(translated);
    while (const auto code = _segmenter.next()) {
      codes.push_back(toLower(*code));
    }
    return codes;
  }

 private:
  KXMetaphone _encoder;
  WordSegmenter _segmenter;
};

}  // namespace

FindText::FindText(std::string_view text, MatchingMode mode, const EditLimits& limits,
                   WordSegmenter& segmenter, std::size_t maxWords, std::size_t maxWordUnits)
    : source(text), _mode(mode), _limits(limits) {
  const std::u16string units = decodeUtf8(text);
  const auto add = [&](std::u16string word, std::size_t begin, std::size_t end) {
    // A whole text is more than a number, and the digits of codes are sounds.
    const bool isNumber = mode == MatchingMode::words && holdsDigit(word);
    const bool isLookedUp = word.size() <= maxWordUnits;
    truncated = truncated || !isLookedUp;
    words.push_back({std::move(word), begin, end, isNumber, isLookedUp});
  };
  if (mode == MatchingMode::wholeText) {
    if (!units.empty()) {
      add(units.size() <= maxWordUnits ? toLower(units) : units, 0, text.size());
    }
    return;
  }
  const ByteOffsets offsets(text);
  std::optional<CodeWords> codes;
  if (hasCodes()) {
    codes.emplace(segmenter);
  }
  segmenter.start(units);
  while (const auto token = segmenter.next()) {
    if (words.size() >= maxWords) {
      truncated = true;
      return;
    }
    const auto first = static_cast<std::size_t>(token->data() - units.data());
    const std::size_t begin = offsets.of(first);
    const std::size_t end = offsets.of(first + token->size());
    if (!hasCodes() || token->size() > maxWordUnits) {
      std::u16string word(*token);
      if (token->size() <= maxWordUnits) {
        word = toLower(*token);
      }
      add(std::move(word), begin, end);
      continue;
    }
    for (const auto& code : codes->of(*token)) {
      add(code, begin, end);
    }
  }
}

std::uint32_t FindText::editLimit(std::size_t length, bool isNumber) const noexcept {
  switch (_mode) {
    case MatchingMode::wholeText:
      return _limits.wholeTextEdits;
    case MatchingMode::phoneticWords:
      return 0;
    default: {
      const std::uint32_t limit = length <= _limits.shortLength    ? _limits.shortEdits
                                  : length <= _limits.mediumLength ? _limits.mediumEdits
                                                                   : _limits.longEdits;
      return isNumber ? std::min(limit, _limits.numberEdits) : limit;
    }
  }
}

NearLimit FindText::nearLimit(const FindWord& word) const noexcept {
  const std::size_t length = word.word.size();
  const std::size_t reach = EditLimits::kMaxEdits;
  NearLimit most;
  for (std::size_t other = length - std::min(length, reach); other <= length + reach; ++other) {
    const std::uint32_t limit = editLimit(other, word.isNumber);
    const std::size_t apart = length < other ? other - length : length - other;
    if (apart <= limit && limit > most.edits) {
      most = {limit, other};
    }
  }
  return most;
}

bool holdsDigit(std::u16string_view word) noexcept {
  for (std::size_t i = 0; i < word.size();) {
    UChar32 character = 0;
    U16_NEXT(word.data(), i, word.size(), character);
    if (u_isdigit(character) != 0) {
      return true;
    }
  }
  return false;
}

}  // namespace wordcatcher
