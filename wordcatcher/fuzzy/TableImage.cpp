#include "wordcatcher/fuzzy/TableImage.h"

#include <string_view>
#include <unordered_map>
#include <unordered_set>

#include "wordcatcher/storage/PLXDFA.h"
#include "wordcatcher/storage/SearchImageWriter.h"
#include "wordcatcher/storage/TableScan.h"
#include "wordcatcher/text/PhraseLength.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

/// Bytes of the UTF-8 form of the character that these bytes begin with, if it is one code unit in
/// UTF-16; 0 for U+0000, at which keys end, for longer characters and for what is no UTF-8.
std::size_t oneUnitLength(std::string_view bytes) {
  if (bytes.empty() || bytes.front() == '\0') {
    return 0;
  }
  const auto lead = static_cast<unsigned char>(bytes.front());
  const std::size_t length = lead < 0x80 ? 1 : (lead < 0xE0 ? 2 : 3);
  if (lead >= 0xF0 || length > bytes.size() || !fromUtf8(bytes.substr(0, length))) {
    return 0;
  }
  return length;
}

/// The edges of the tree: each is the bytes of its state's name and of its symbol, in one piece.
class Edges {
 public:
  explicit Edges(const TinyCDB& table) {
    TableScan scan(table);
    while (const auto record = scan.next()) {
      if (oneUnitLength(record->value) == record->value.size() && !record->value.empty()) {
        _edges.emplace(record->key.data(), record->key.size() + record->value.size());
      }
    }
  }

  /// Whether edges lead from the start state to the state of this name, character by character.
  bool leadTo(std::string_view state) const {
    for (std::size_t end = 0; end < state.size();) {
      const std::size_t length = oneUnitLength(state.substr(end));
      end += length;
      if (length == 0 || !_edges.contains(state.substr(0, end))) {
        return false;
      }
    }
    return true;
  }

 private:
  std::unordered_set<std::string_view> _edges;
};

}  // namespace

std::shared_ptr<const SearchImage> makeTableImage(const PLXDFA& automaton) {
  constexpr std::uint32_t kNoMode = 0;
  constexpr std::string_view kFinalMark = "t";
  SearchImageWriter writer(kNoMode);
  std::unordered_map<std::string_view, std::u16string> words;
  {
    const Edges edges(automaton._edgeTable);
    TableScan finals(automaton._finalTable);
    while (const auto record = finals.next()) {
      if (record->value != kFinalMark || record->key.empty() || words.contains(record->key) ||
          !edges.leadTo(record->key)) {
        continue;
      }
      const auto& word = words.emplace(record->key, *fromUtf8(record->key)).first->second;
      writer.addWord(word);
    }
  }
  WordSegmenter segmenter;
  std::unordered_map<std::string_view, SearchImageWriter::Value> values;
  TableScan data(automaton._dataTable);
  while (const auto record = data.next()) {
    const auto word = words.find(record->key);
    if (word == words.end()) {
      continue;
    }
    auto value = values.find(record->value);
    if (value == values.end()) {
      const auto text = fromUtf8(record->value);
      if (!text) {
        continue;
      }
      const auto counted =
          static_cast<std::uint32_t>(countedWords(segmenter, phraseOf(std::u16string_view(*text))));
      value = values.emplace(record->value, writer.addValue(record->value, counted)).first;
    }
    writer.addPosting(word->second, value->second);
  }
  return SearchImage::fromBytes(writer.finish());
}

}  // namespace wordcatcher
