// SearchImage::verify: everything that the writer promises, looked at once. Each step relies only
// on what the steps before it have made sure of, and none takes more than time linear in the file,
// however its bytes were chosen.

#include <algorithm>
#include <bitset>
#include <utility>

#define XXH_INLINE_ALL
#include <xxhash.h>

#include "wordcatcher/storage/LeafTails.h"
#include "wordcatcher/storage/PhraseWords.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/text/CodeUnitOrder.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

using image::TreeSlot;

/// Walks a whole tree in the order of labels: the words must come one after the other, each behind
/// the edges that spell it.
class TreeVerifier {
 public:
  TreeVerifier(const SearchImage& image, const SearchImage::Tree& tree, bool backward)
      : _image(image), _tree(tree), _backward(backward) {}

  void verify() {
    verifyOrder();
    // Where the root's children stand is fixed, and nothing leads to the root itself.
    const TreeSlot& root = _tree.slots[0];
    require(root.target == 1 && root.label == 0 && root.shortest == 0 && root.longest == 0);
    require(root.children != 0 || _image.wordCount() == 0);
    std::size_t seen = 1;
    pushChildren(0, 0);
    while (!_pending.empty()) {
      const auto [index, depth] = _pending.back();
      _pending.pop_back();
      ++seen;
      const TreeSlot& slot = _tree.slots[index];
      _path.resize(depth - 1);
      if (slot.label != 0) {
        _path.push_back(slot.label);
      }
      if (slot.isLeaf()) {
        verifyLeaf(slot);
      } else {
        // No branch without words: a slot that two places lead to is found by its words, which come
        // twice then.
        require(slot.label != 0 && slot.children != 0);
        pushChildren(index, depth);
        verifyLengths(slot);
      }
    }
    require(_nextPlace == _image.wordCount() && seen == _tree.slots.size());
  }

 private:
  struct Item {
    std::size_t slot;
    std::size_t depth;
  };

  void require(bool holds) const {
    if (!holds) {
      _image.throwDamaged(_backward ? "its backward tree does not spell the words"
                                    : "its forward tree does not spell the words");
    }
  }

  std::uint32_t wordAt(std::size_t place) const {
    return _tree.order.empty() ? static_cast<std::uint32_t>(place) : _tree.order[place];
  }

  /// A label of a word, counted in the direction of the tree.
  std::uint16_t labelAt(const SearchImage::Labels& word, std::size_t index) const {
    return word[_backward ? word.size() - 1 - index : index];
  }

  bool precedes(std::uint32_t left, std::uint32_t right) const {
    const auto a = _image.labelsOf(left);
    const auto b = _image.labelsOf(right);
    std::size_t shared = 0;
    while (shared < a.size() && shared < b.size() && labelAt(a, shared) == labelAt(b, shared)) {
      ++shared;
    }
    return shared < b.size() && (shared == a.size() || labelAt(a, shared) < labelAt(b, shared));
  }

  /// Ascending, so that no word is at two places, and each therefore at one.
  void verifyOrder() const {
    bool isIdentity = true;
    for (std::uint32_t place = 0; place < _image.wordCount(); ++place) {
      isIdentity = isIdentity && wordAt(place) == place;
      require(place == 0 || precedes(wordAt(place - 1), wordAt(place)));
    }
    require(_backward || _tree.order.empty() || !isIdentity);
  }

  /// Children stand behind their parent, ascending, each with its bit.
  void pushChildren(std::size_t parent, std::size_t depth) {
    const TreeSlot& slot = _tree.slots[parent];
    if (slot.children == 0) {
      return;
    }
    const std::size_t first = slot.index();
    require(first > parent);
    std::uint64_t bits = 0;
    std::size_t end = first;
    do {
      require(end < _tree.slots.size() &&
              (end == first || _tree.slots[end].label > _tree.slots[end - 1].label));
      bits |= std::uint64_t{1} << image::labelBit(_tree.slots[end].label);
    } while (!_tree.slots[end++].isLastChild());
    require(bits == slot.children);
    _children = _tree.slots.subspan(first, end - first);
    // The last one first: the first is taken first then.
    for (std::size_t child = end; child-- > first;) {
      _pending.push_back({child, depth + 1});
    }
  }

  /// An inner place's lengths follow from those of the children that were pushed last.
  void verifyLengths(const TreeSlot& slot) const {
    unsigned shortest = image::kLengthCap;
    unsigned longest = 0;
    for (const TreeSlot& child : _children) {
      const unsigned edge = child.label == 0 ? 0 : 1;
      shortest = std::min(shortest, child.shortest + edge);
      longest = std::max(longest, child.longest + edge);
    }
    require(slot.shortest == shortest && slot.longest == std::min(longest, image::kLengthCap));
  }

  /// The words of a leaf begin with its path, and end there when its edge is the end of a word.
  void verifyLeaf(const TreeSlot& slot) {
    const bool isEnd = slot.label == 0;
    const std::uint64_t words = image::leafWords(slot);
    require(slot.index() == _nextPlace && words != 0 && words <= _image.wordCount() - _nextPlace &&
            (!isEnd || words == 1));
    std::size_t shortest = SIZE_MAX;
    std::size_t longest = 0;
    for (std::uint64_t i = 0; i < words; ++i, ++_nextPlace) {
      const auto word = _image.labelsOf(wordAt(_nextPlace));
      require(word.size() >= _path.size() && (!isEnd || word.size() == _path.size()));
      for (std::size_t depth = 0; depth < _path.size(); ++depth) {
        require(labelAt(word, depth) == _path[depth]);
      }
      shortest = std::min(shortest, word.size() - _path.size());
      longest = std::max(longest, word.size() - _path.size());
    }
    require(slot.shortest == std::min<std::size_t>(shortest, image::kLengthCap) &&
            slot.longest == std::min<std::size_t>(longest, image::kLengthCap));
    require(!image::hasTails(slot) || slot.children == tailsOf(slot.index(), words));
  }

  /// The tails that a leaf of these words has; nothing when there is no room for them.
  std::optional<std::uint64_t> tailsOf(std::size_t place, std::size_t words) const {
    const auto wordOf = [&](std::size_t i) { return _image.labelsOf(wordAt(place + i)); };
    return image::LeafTails::encoded(
        words, [&](std::size_t i) { return wordOf(i).size() - _path.size(); },
        [&](std::size_t i, std::size_t position) {
          return labelAt(wordOf(i), _path.size() + position);
        });
  }

  const SearchImage& _image;
  const SearchImage::Tree& _tree;
  bool _backward;
  std::vector<Item> _pending;
  std::vector<std::uint16_t> _path;
  std::span<const TreeSlot> _children;
  std::size_t _nextPlace = 0;
};

bool ascends(std::span<const std::uint16_t> units) {
  return std::adjacent_find(units.begin(), units.end(), std::greater_equal<>()) == units.end();
}

}  // namespace

void SearchImage::verify() const {
  verifySections();
  verifyLabels();
  verifyWords();
  TreeVerifier(*this, _forward, false).verify();
  TreeVerifier(*this, _backward, true).verify();
  verifyValues();
  verifyPostings();
}

/// The sections have their checksums and, with less than an alignment of zeros before each, fill
/// the file behind the header.
void SearchImage::verifySections() const {
  std::vector<image::Section> sections(_sections.begin(), _sections.end());
  std::sort(sections.begin(), sections.end(), [](const auto& a, const auto& b) {
    return std::pair(a.offset, a.bytes) < std::pair(b.offset, b.bytes);
  });
  std::size_t end = image::headerBytes(_sections.size());
  for (const auto& section : sections) {
    const std::string name = "section " + std::to_string(static_cast<unsigned>(section.kind));
    if (section.offset < end || section.offset - end >= image::kSectionAlignment) {
      throwDamaged(name + " does not follow the one before it");
    }
    const auto padding = _bytes.subspan(end, section.offset - end);
    if (std::any_of(padding.begin(), padding.end(),
                    [](std::byte b) { return b != std::byte{0}; })) {
      throwDamaged("there is something before " + name);
    }
    if (XXH3_64bits(_bytes.data() + section.offset, section.bytes) != section.checksum) {
      throwDamaged(name + " does not have its checksum");
    }
    end = section.offset + section.bytes;
  }
  if (end != _bytes.size()) {
    throwDamaged("there is something behind its last section");
  }
}

/// Each code unit has one label, the end of a word label 0.
void SearchImage::verifyLabels() const {
  const std::size_t common = std::min<std::size_t>(_labels.size(), image::kRareBit);
  std::bitset<image::kMaxLabels> seen;
  for (const std::uint16_t unit : _labels) {
    seen.set(unit);
  }
  if (_labels[0] != 0 || seen.count() != _labels.size() || !ascends(_labels.first(common)) ||
      !ascends(_labels.subspan(common))) {
    throwDamaged("its labels are out of order");
  }
}

void SearchImage::verifyWords() const {
  if (_wordOffsets.front() != 0 || _wordOffsets.back() != _wordText.size() ||
      _postingOffsets[0] != 0 || _postingOffsets[_wordCount] != _postings.size()) {
    throwDamaged("its words do not fill their sections");
  }
  std::u16string previous;
  for (std::uint32_t word = 0; word < _wordCount; ++word) {
    std::u16string text = textOf(word);
    if (text <= previous || text.find(u'\0') != std::u16string::npos) {
      throwDamaged("its words are out of order");
    }
    previous = std::move(text);
  }
}

void SearchImage::verifyValues() const {
  if (_valueOffsets.front() != 0 || _valueOffsets.back() != _valueText.size()) {
    throwDamaged("its data strings do not fill their section");
  }
  if (_phraseOffsets.front() != 0 || _phraseOffsets.back() != _phraseWords.size()) {
    throwDamaged("its phrases do not fill their section");
  }
  std::string_view previous;
  image::PhraseShape previousShape;
  std::size_t classes = 0;
  for (std::uint32_t value = 0; value < _valueCount; ++value) {
    const std::string_view text = valueText(value);
    const auto shape = verifyPhrases(value);
    if (!fromUtf8(text) || (value > 0 && (shape < previousShape || (shape == previousShape &&
                                                                    !utf16Less(previous, text))))) {
      throwDamaged("its data strings are out of order or not UTF-8");
    }
    if (value == 0 || shape.fewestWords != previousShape.fewestWords ||
        shape.mostWords != previousShape.mostWords) {
      const image::PhraseClass expected = {value, shape.fewestWords, shape.mostWords};
      if (classes == _phraseClasses.size() || _phraseClasses[classes++] != expected) {
        throwDamaged("its classes of phrases are not those of its phrases");
      }
    }
    previous = text;
    previousShape = shape;
  }
  if (classes != _phraseClasses.size()) {
    throwDamaged("its classes of phrases are not those of its phrases");
  }
}

/// A value's phrases ascend, each ends, and all their words are there.
image::PhraseShape SearchImage::verifyPhrases(std::uint32_t value) const {
  const auto all = phrasesOf(value);
  std::span<const std::uint32_t> previous;
  for (auto rest = all; !rest.empty(); rest = rest.subspan(previous.size())) {
    const auto phrase = image::firstPhrase(rest);
    const bool ascends = std::lexicographical_compare(previous.begin(), previous.end(),
                                                      phrase.begin(), phrase.end());
    if (!ascends || (phrase.back() & image::kPhraseEnd) == 0) {
      throwDamaged("its phrases are out of order");
    }
    previous = phrase;
  }
  return image::shapeOf(all, [this](std::uint32_t word) { return labelsOf(word).size(); });
}

/// Each word has just the values in whose phrases it stands.
void SearchImage::verifyPostings() const {
  const auto require = [this](bool holds) {
    if (!holds) {
      throwDamaged("its posting lists are not those of its phrases");
    }
  };
  std::vector<std::uint32_t> read(_wordCount);
  for (std::uint32_t value = 0; value < _valueCount; ++value) {
    for (const std::uint32_t flagged : phrasesOf(value)) {
      const std::uint32_t word = flagged & ~image::kPhraseEnd;
      const auto postings = postingsOf(word);
      if (read[word] > 0 && postings[read[word] - 1] == value) {
        continue;
      }
      require(read[word] < postings.size() && postings[read[word]] == value);
      ++read[word];
    }
  }
  for (std::uint32_t word = 0; word < _wordCount; ++word) {
    require(read[word] == postingsOf(word).size());
  }
}

}  // namespace wordcatcher
