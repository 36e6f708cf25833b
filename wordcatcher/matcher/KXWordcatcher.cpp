#include "wordcatcher/matcher/KXWordcatcher.h"

#include <cstdint>
#include <utility>

#include "wordcatcher/fuzzy/LXFuzzyIndex.h"
#include "wordcatcher/matcher/SpanQuery.h"
#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/text/Unicode.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

namespace {

constexpr std::uint64_t kWordMode = 0;
constexpr std::uint64_t kWholeTextMode = 1;
constexpr std::uint64_t kPhoneticMode = 2;

constexpr std::int64_t kClassicTextDistance = 3;

}  // namespace

KXWordcatcher::KXWordcatcher(std::string path, std::uint64_t options)
    : _index(std::make_unique<LXFuzzyIndex>(std::move(path))),
      _meta(std::make_unique<KXMetaphone>()),
      _options(options),
      _segmenter(std::make_unique<WordSegmenter>()) {}

KXWordcatcher::~KXWordcatcher() = default;
KXWordcatcher::KXWordcatcher(KXWordcatcher&&) noexcept = default;
KXWordcatcher& KXWordcatcher::operator=(KXWordcatcher&&) noexcept = default;

void KXWordcatcher::setMode(std::int32_t mode) {
  if (_index) {
    _index->setMode(mode);
  }
}

std::int32_t KXWordcatcher::getMode() const noexcept { return _index ? _index->getMode() : 0; }

void KXWordcatcher::index_withData(std::u16string_view text,
                                   std::optional<std::u16string_view> data) {
  if (!_index) {
    return;
  }
  switch (_options) {
    case kPhoneticMode:
      _index->addWordsFromString_data(_meta->translate(text), data);
      break;
    case kWholeTextMode:
      _index->addString_withData(text, data);
      break;
    case kWordMode:
      _index->addWordsFromString_data(text, data);
      break;
    default:
      break;
  }
}

std::optional<QueryResult> KXWordcatcher::query(std::u16string_view text) {
  if (_options == kWholeTextMode) {
    return _index ? _index->search_withMaxDistance(text, kClassicTextDistance)
                  : std::vector<LXFuzzyMatch>();
  }
  if (!_index || (_options != kWordMode && _options != kPhoneticMode)) {
    return std::nullopt;
  }
  std::u16string codes;
  if (_options == kPhoneticMode) {
    codes = _meta->translate(text);
    text = codes;
    // Kept after the call: codes of one sound are equal, and what was indexed by codes is never
    // searched for within edits again.
    _editDistance = 0;
  }
  const SearchImage& image = _index->image();
  SpanQuery query(
      image, *_segmenter,
      {_editDistance, _ignoredWordLength, _ignoredWordLengthForEditDistance, SIZE_MAX, SIZE_MAX},
      _wordsMatched);
  const auto scored = query.run(text);
  if (!scored) {
    return std::nullopt;
  }
  std::vector<KXWordcatch> records;
  for (const auto& [value, distance] : *scored) {
    records.emplace_back(*fromUtf8(image.valueText(value)), distance);
  }
  return records;
}

}  // namespace wordcatcher
