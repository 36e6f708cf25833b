#include "wordcatcher/storage/SearchImageWriter.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <numeric>
#include <random>
#include <span>

#define XXH_INLINE_ALL
#include <xxhash.h>

#include "wordcatcher/Error.h"
#include "wordcatcher/storage/SearchImageFormat.h"
#include "wordcatcher/text/CodeUnitOrder.h"

namespace wordcatcher {

namespace {

using image::SectionKind;
using image::TreeSlot;

// Leaves of several words keep the trees small; looking at a word costs about as much as looking at
// a slot, so beyond a few the walk gets slower.
constexpr std::uint32_t kWordsALeaf = 4;

[[noreturn]] void tooMany(const char* what) {
  throw Error(ErrorCode::tooLarge, std::string("An index holds at most 1,073,741,823 ") + what +
                                       "; split it in several.");
}

/// Words as sequences of labels, in one list.
class LabelledWords {
 public:
  LabelledWords(const std::vector<const std::u16string*>& words,
                const std::vector<std::uint16_t>& labelOfUnit) {
    _offsets.push_back(0);
    for (const auto* word : words) {
      for (const char16_t unit : *word) {
        _labels.push_back(labelOfUnit[unit]);
      }
      if (_labels.size() > std::numeric_limits<std::uint32_t>::max()) {
        throw Error(ErrorCode::tooLarge,
                    "The distinct words of an index have at most 4,294,967,295 code units in all; "
                    "split it in several.");
      }
      _offsets.push_back(static_cast<std::uint32_t>(_labels.size()));
    }
  }

  std::uint32_t size() const noexcept { return static_cast<std::uint32_t>(_offsets.size() - 1); }
  std::span<const std::uint16_t> operator[](std::uint32_t word) const {
    return {_labels.data() + _offsets[word], _labels.data() + _offsets[word + 1]};
  }
  const std::vector<std::uint32_t>& offsets() const noexcept { return _offsets; }
  const std::vector<std::uint16_t>& labels() const noexcept { return _labels; }

 private:
  std::vector<std::uint32_t> _offsets;
  std::vector<std::uint16_t> _labels;
};

/// Makes one tree over the words, read from their beginnings or from their ends.
class TreeBuilder {
 public:
  TreeBuilder(const LabelledWords& words, bool backward) : _words(words), _backward(backward) {
    _order.resize(words.size());
    std::iota(_order.begin(), _order.end(), 0U);
    std::sort(_order.begin(), _order.end(), [this](std::uint32_t a, std::uint32_t b) {
      const auto left = _words[a];
      const auto right = _words[b];
      return _backward ? std::lexicographical_compare(left.rbegin(), left.rend(), right.rbegin(),
                                                      right.rend())
                       : std::lexicographical_compare(left.begin(), left.end(), right.begin(),
                                                      right.end());
    });
    build();
  }

  const std::vector<std::uint32_t>& order() const noexcept { return _order; }
  const std::vector<TreeSlot>& slots() const noexcept { return _slots; }

 private:
  /// An inner place whose children are still to be made: its words are those at the places from
  /// `first` to `last`, which agree in `depth` labels.
  struct Pending {
    std::uint32_t slot;
    std::uint32_t first;
    std::uint32_t last;
    std::uint32_t depth;
  };

  std::uint16_t labelAt(std::uint32_t place, std::uint32_t depth) const {
    const auto word = _words[_order[place]];
    return _backward ? word[word.size() - 1 - depth] : word[depth];
  }

  std::uint32_t lengthAt(std::uint32_t place) const {
    return static_cast<std::uint32_t>(_words[_order[place]].size());
  }

  void build() {
    _slots.push_back({});
    std::vector<Pending> pending = {{0, 0, _words.size(), 0}};
    while (!pending.empty()) {
      const Pending job = pending.back();
      pending.pop_back();
      addChildren(job, pending);
    }
  }

  /// Children stand in one block, and the blocks of a subtree near each other: what a walk reads
  /// next is near what it read last.
  void addChildren(const Pending& job, std::vector<Pending>& pending) {
    const auto block = static_cast<std::uint32_t>(_slots.size());
    const std::size_t firstNew = pending.size();
    std::uint64_t children = 0;
    std::uint32_t place = job.first;
    if (place < job.last && lengthAt(place) == job.depth) {
      children |= 1U << image::kEndBit;
      _slots.push_back({.children = 1, .target = TreeSlot::kLeaf | place});
      ++place;
    }
    while (place < job.last) {
      const std::uint16_t label = labelAt(place, job.depth);
      children |= std::uint64_t{1} << image::labelBit(label);
      const std::uint32_t begin = place;
      std::uint32_t shortest = lengthAt(place);
      std::uint32_t longest = shortest;
      for (; place < job.last && labelAt(place, job.depth) == label; ++place) {
        shortest = std::min(shortest, lengthAt(place));
        longest = std::max(longest, lengthAt(place));
      }
      TreeSlot slot = {.label = label};
      slot.shortest = capped(shortest - job.depth - 1);
      slot.longest = capped(longest - job.depth - 1);
      if (place - begin <= kWordsALeaf) {
        slot.children = place - begin;
        slot.target = TreeSlot::kLeaf | begin;
      } else {
        pending.push_back({static_cast<std::uint32_t>(_slots.size()), begin, place, job.depth + 1});
      }
      _slots.push_back(slot);
    }
    if (_slots.size() > TreeSlot::kIndex) {
      tooMany("places in its tree");
    }
    if (_slots.size() > block) {
      _slots.back().target |= TreeSlot::kLastChild;
    }
    _slots[job.slot].children = children;
    _slots[job.slot].target |= block;
    std::reverse(pending.begin() + static_cast<std::ptrdiff_t>(firstNew), pending.end());
  }

  static std::uint8_t capped(std::uint32_t length) {
    return static_cast<std::uint8_t>(std::min(length, image::kLengthCap));
  }

  const LabelledWords& _words;
  bool _backward;
  std::vector<std::uint32_t> _order;
  std::vector<TreeSlot> _slots;
};

/// The code units of all words, by label: the most frequent ones have a bit of their own in the
/// trees. Each of the two groups ascends by code units; when all units fit into the first, the
/// order of labels is the order of code units.
std::vector<std::uint16_t> chooseLabels(const std::vector<const std::u16string*>& words) {
  std::vector<std::uint64_t> frequency(0x10000);
  for (const auto* word : words) {
    for (const char16_t unit : *word) {
      ++frequency[unit];
    }
  }
  std::vector<std::uint16_t> units;
  for (std::size_t unit = 0; unit < frequency.size(); ++unit) {
    if (frequency[unit] > 0) {
      units.push_back(static_cast<std::uint16_t>(unit));
    }
  }
  const std::size_t common = std::min<std::size_t>(units.size(), image::kRareBit - 1);
  std::stable_sort(units.begin(), units.end(), [&frequency](std::uint16_t a, std::uint16_t b) {
    return frequency[a] > frequency[b];
  });
  const auto middle = units.begin() + static_cast<std::ptrdiff_t>(common);
  std::sort(units.begin(), middle);
  std::sort(middle, units.end());
  units.insert(units.begin(), 0);
  return units;
}

/// Lays sections one after the other into an image.
class Assembler {
 public:
  Assembler() : _bytes(image::headerBytes(image::kSectionKinds)) {}

  template <typename Element>
  void add(SectionKind kind, const std::vector<Element>& elements) {
    addBytes(kind, sizeof(Element), elements.data(), elements.size() * sizeof(Element));
  }
  void add(SectionKind kind, const std::string& text) {
    addBytes(kind, 1, text.data(), text.size());
  }

  std::vector<std::byte> finish(image::Header header) && {
    header.magic = image::kMagic;
    header.version = image::kVersion;
    header.byteOrder = image::kByteOrderMark;
    header.fileBytes = _bytes.size();
    header.sectionCount = static_cast<std::uint32_t>(_sections.size());
    std::memcpy(_bytes.data(), &header, sizeof header);
    std::memcpy(_bytes.data() + sizeof header, _sections.data(),
                _sections.size() * sizeof(image::Section));
    const std::size_t covered = image::headerBytes(_sections.size()) - sizeof(std::uint64_t);
    const std::uint64_t checksum = XXH3_64bits(_bytes.data(), covered);
    std::memcpy(_bytes.data() + covered, &checksum, sizeof checksum);
    return std::move(_bytes);
  }

 private:
  void addBytes(SectionKind kind, std::size_t elementBytes, const void* data, std::size_t bytes) {
    const std::size_t padding =
        (image::kSectionAlignment - _bytes.size() % image::kSectionAlignment) %
        image::kSectionAlignment;
    _bytes.resize(_bytes.size() + padding);
    const std::size_t offset = _bytes.size();
    _bytes.resize(offset + bytes);
    if (bytes > 0) {
      std::memcpy(_bytes.data() + offset, data, bytes);
    }
    _sections.push_back({kind, static_cast<std::uint32_t>(elementBytes), offset, bytes,
                         XXH3_64bits(_bytes.data() + offset, bytes)});
  }

  std::vector<std::byte> _bytes;
  std::vector<image::Section> _sections;
};

std::array<std::uint64_t, 2> randomGeneration() {
  std::random_device source;
  const auto word = [&source] { return (std::uint64_t{source()} << 32U) | source(); };
  return {word(), word()};
}

/// For each element, its place when they are sorted by `before`.
template <typename Before>
std::vector<std::uint32_t> sortedOrder(std::size_t count, Before before) {
  std::vector<std::uint32_t> order(count);
  std::iota(order.begin(), order.end(), 0U);
  std::sort(order.begin(), order.end(), before);
  return order;
}

std::vector<std::uint32_t> placesOf(const std::vector<std::uint32_t>& order) {
  std::vector<std::uint32_t> places(order.size());
  for (std::uint32_t place = 0; place < order.size(); ++place) {
    places[order[place]] = place;
  }
  return places;
}

bool isIdentity(const std::vector<std::uint32_t>& order) {
  for (std::uint32_t place = 0; place < order.size(); ++place) {
    if (order[place] != place) {
      return false;
    }
  }
  return true;
}

}  // namespace

std::string_view SearchImageWriter::valueText(Value value) const noexcept {
  const std::uint64_t begin = value == 0 ? 0 : _valueEnds[value - 1];
  return std::string_view(_valueText).substr(begin, _valueEnds[value] - begin);
}

SearchImageWriter::Value SearchImageWriter::addValue(std::string_view text,
                                                     std::uint32_t countedWords) {
  const std::uint64_t hash = XXH3_64bits(text.data(), text.size());
  const auto [first, last] = _valuesByHash.equal_range(hash);
  for (auto known = first; known != last; ++known) {
    if (valueText(known->second) == text) {
      return known->second;
    }
  }
  if (_valueEnds.size() >= TreeSlot::kIndex) {
    tooMany("data strings");
  }
  const auto value = static_cast<Value>(_valueEnds.size());
  _valueText.append(text);
  _valueEnds.push_back(_valueText.size());
  _countedWords.push_back(countedWords);
  _valuesByHash.emplace(hash, value);
  return value;
}

std::uint32_t SearchImageWriter::wordId(std::u16string_view word) {
  const auto [entry, added] =
      _wordIds.try_emplace(std::u16string(word), static_cast<std::uint32_t>(_words.size()));
  if (added) {
    if (_words.size() >= TreeSlot::kIndex) {
      tooMany("distinct words");
    }
    _words.push_back(&entry->first);
  }
  return entry->second;
}

void SearchImageWriter::addWord(std::u16string_view word) { wordId(word); }

void SearchImageWriter::addPosting(std::u16string_view word, Value value) {
  _postings.emplace_back(wordId(word), value);
}

std::vector<std::byte> SearchImageWriter::finish() && {
  const auto valueOrder = sortedOrder(_valueEnds.size(), [this](Value a, Value b) {
    return utf16Less(valueText(a), valueText(b));
  });
  const auto wordOrder = sortedOrder(
      _words.size(), [this](std::uint32_t a, std::uint32_t b) { return *_words[a] < *_words[b]; });
  const auto placeOfValue = placesOf(valueOrder);
  const auto placeOfWord = placesOf(wordOrder);
  for (auto& [word, value] : _postings) {
    word = placeOfWord[word];
    value = placeOfValue[value];
  }
  std::sort(_postings.begin(), _postings.end());
  _postings.erase(std::unique(_postings.begin(), _postings.end()), _postings.end());

  std::vector<const std::u16string*> words;
  words.reserve(_words.size());
  for (const std::uint32_t word : wordOrder) {
    words.push_back(_words[word]);
  }
  const auto labels = chooseLabels(words);
  std::vector<std::uint16_t> labelOfUnit(0x10000);
  for (std::size_t label = 1; label < labels.size(); ++label) {
    labelOfUnit[labels[label]] = static_cast<std::uint16_t>(label);
  }

  Assembler assembler;
  assembler.add(SectionKind::labels, labels);
  const LabelledWords labelled(words, labelOfUnit);
  assembler.add(SectionKind::wordOffsets, labelled.offsets());
  assembler.add(SectionKind::wordText, labelled.labels());
  {
    const TreeBuilder forward(labelled, false);
    assembler.add(SectionKind::forwardTree, forward.slots());
    assembler.add(SectionKind::forwardOrder,
                  isIdentity(forward.order()) ? std::vector<std::uint32_t>() : forward.order());
  }
  {
    const TreeBuilder backward(labelled, true);
    assembler.add(SectionKind::backwardTree, backward.slots());
    assembler.add(SectionKind::backwardOrder, backward.order());
  }

  std::vector<std::uint64_t> postingOffsets(_words.size() + 1);
  std::vector<std::uint32_t> postings;
  postings.reserve(_postings.size());
  for (const auto& [word, value] : _postings) {
    ++postingOffsets[word + 1];
    postings.push_back(value);
  }
  std::partial_sum(postingOffsets.begin(), postingOffsets.end(), postingOffsets.begin());
  assembler.add(SectionKind::postingOffsets, postingOffsets);
  assembler.add(SectionKind::postings, postings);

  std::vector<std::uint64_t> valueOffsets = {0};
  std::string valueTexts;
  std::vector<std::uint32_t> countedWords;
  valueTexts.reserve(_valueText.size());
  for (const Value value : valueOrder) {
    valueTexts += valueText(value);
    valueOffsets.push_back(valueTexts.size());
    countedWords.push_back(_countedWords[value]);
  }
  assembler.add(SectionKind::valueOffsets, valueOffsets);
  assembler.add(SectionKind::valueText, valueTexts);
  assembler.add(SectionKind::countedWords, countedWords);

  image::Header header = {};
  header.generation = randomGeneration();
  header.mode = _mode;
  header.wordCount = _words.size();
  header.valueCount = _valueEnds.size();
  header.phraseCount = _phrases;
  return std::move(assembler).finish(header);
}

}  // namespace wordcatcher
