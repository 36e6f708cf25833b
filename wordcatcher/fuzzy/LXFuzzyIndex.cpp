#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

#include <algorithm>
#include <utility>

#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/fuzzy/TableImage.h"
#include "wordcatcher/storage/TableFile.h"
#include "wordcatcher/text/TextForm.h"
#include "wordcatcher/text/Unicode.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

LXFuzzyIndex::LXFuzzyIndex() : _segmenter(std::make_unique<WordSegmenter>()) {}

LXFuzzyIndex::LXFuzzyIndex(std::string path)
    : _LXindex(std::move(path)), _segmenter(std::make_unique<WordSegmenter>()) {}

LXFuzzyIndex::~LXFuzzyIndex() = default;

void LXFuzzyIndex::setMode(std::int32_t mode) {
  if (mode == kReading || mode == kWriting) {
    _image.reset();
  }
  _LXindex.setMode(mode);
}

std::int32_t LXFuzzyIndex::getMode() const noexcept { return _LXindex.getMode(); }

void LXFuzzyIndex::addString(std::u16string_view string) {
  addString_withData(string, std::nullopt);
}

void LXFuzzyIndex::addString_withData(std::u16string_view string,
                                      std::optional<std::u16string_view> data) {
  const std::u16string stored = toLower(string);
  const std::u16string_view view = stored;
  for (std::size_t i = 0; i < view.size(); ++i) {
    _LXindex.addEdge_fromState_toState(view.substr(i, 1), view.substr(0, i), view.substr(0, i + 1));
  }
  _LXindex.addFinalState(view);
  if (data) {
    _LXindex.setDataFor_to(view, *data);
  }
}

void LXFuzzyIndex::addWordsFromString_data(std::u16string_view text,
                                           std::optional<std::u16string_view> data) {
  _segmenter->start(text);
  while (const auto word = _segmenter->next()) {
    addString_withData(*word, data);
  }
}

std::vector<LXFuzzyMatch> LXFuzzyIndex::search_withMaxDistance(
    std::optional<std::u16string_view> query, std::int64_t maxDistance) {
  std::vector<LXFuzzyMatch> matches;
  if (!query || query->empty()) {
    return matches;
  }
  const SearchImage& tree = image();
  for (const auto& hit : searchImage(tree, toLower(*query), maxDistance)) {
    std::vector<std::u16string> data;
    for (const auto value : tree.postingsOf(hit.word)) {
      data.push_back(*fromUtf8(tree.valueText(value)));
    }
    std::sort(data.begin(), data.end());
    matches.emplace_back(tree.textOf(hit.word), hit.distance, std::move(data));
  }
  return matches;
}

const std::shared_ptr<const SearchImage>& LXFuzzyIndex::sharedImage() {
  if (!_image) {
    _image = makeTableImage(_LXindex);
  }
  return _image;
}

std::u16string LXFuzzyIndex::description() const { return _LXindex.description(); }

std::ostream& operator<<(std::ostream& stream, const LXFuzzyIndex& index) {
  return writeUtf8(stream, index.description());
}

}  // namespace wordcatcher
