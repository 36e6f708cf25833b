#include "wordcatcher/fuzzy/TableImage.h"

#include <set>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <vector>

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

/// The words of the index, by their keys, with the writer's numbers.
using Words = std::unordered_map<std::string_view, std::uint32_t>;

Words addWords(const TinyCDB& edgeTable, const TinyCDB& finalTable, SearchImageWriter& writer) {
  constexpr std::string_view kFinalMark = "t";
  Words words;
  const Edges edges(edgeTable);
  TableScan finals(finalTable);
  while (const auto record = finals.next()) {
    if (record->value == kFinalMark && !record->key.empty() && !words.contains(record->key) &&
        edges.leadTo(record->key)) {
      words.emplace(record->key, writer.addWord(*fromUtf8(record->key)));
    }
  }
  return words;
}

/// The phrases of the values. The tables only tell which words carry a value. Where these are just
/// the words of the text at the value's head, that is taken for the phrase; else they stand in the
/// order in which they were added.
class Phrases {
 public:
  /// Begins the phrase of the next value, which has the next number; returns how many counted words
  /// the value's text has.
  std::uint32_t begin(std::u16string_view value, const Words& words) {
    Phrase& phrase = _phrases.emplace_back();
    std::uint32_t counted = 0;
    _segmenter.start(phraseOf(value));
    while (const auto token = _segmenter.next()) {
      counted += static_cast<std::int64_t>(token->size()) > kUncountedWordLength ? 1 : 0;
      const auto key = toUtf8(toLower(*token));
      const auto word = key ? words.find(*key) : words.end();
      phrase.expected.push_back(word == words.end() ? kNoWord : word->second);
    }
    return counted;
  }

  void addWord(SearchImageWriter::Value value, std::uint32_t word) {
    _phrases[value].found.push_back(word);
  }

  void addTo(SearchImageWriter& writer) const {
    for (std::uint32_t value = 0; value < _phrases.size(); ++value) {
      const Phrase& phrase = _phrases[value];
      const std::set<std::uint32_t> expected(phrase.expected.begin(), phrase.expected.end());
      const std::set<std::uint32_t> found(phrase.found.begin(), phrase.found.end());
      if (expected == found) {
        writer.addPhrase(phrase.expected, value);
      } else {
        writer.addPhrase(std::vector<std::uint32_t>(found.begin(), found.end()), value);
      }
    }
  }

 private:
  static constexpr std::uint32_t kNoWord = UINT32_MAX;
  struct Phrase {
    std::vector<std::uint32_t> expected;
    std::vector<std::uint32_t> found;
  };
  std::vector<Phrase> _phrases;
  WordSegmenter _segmenter;
};

}  // namespace

std::shared_ptr<const SearchImage> makeTableImage(const PLXDFA& automaton) {
  constexpr std::uint32_t kNoMode = 0;
  SearchImageWriter writer(kNoMode);
  const auto words = addWords(automaton._edgeTable, automaton._finalTable, writer);
  Phrases phrases;
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
      const std::uint32_t counted = phrases.begin(*text, words);
      value = values.emplace(record->value, writer.addValue(record->value, counted)).first;
    }
    phrases.addWord(value->second, word->second);
  }
  phrases.addTo(writer);
  return SearchImage::fromBytes(writer.finish());
}

}  // namespace wordcatcher
