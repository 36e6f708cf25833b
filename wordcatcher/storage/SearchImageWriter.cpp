#include "wordcatcher/storage/SearchImageWriter.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <numeric>
#include <random>
#include <string>

#define XXH_INLINE_ALL
#include <xxhash.h>

#include "wordcatcher/Error.h"
#include "wordcatcher/storage/LeafTails.h"
#include "wordcatcher/storage/SearchImageFormat.h"
#include "wordcatcher/text/CodeUnitOrder.h"

namespace wordcatcher {

namespace {

using image::SectionKind;
using image::TreeSlot;

// Leaves of several words keep the trees small; looking at a word costs about as much as looking at
// a slot, so beyond a few the walk gets slower.
constexpr std::uint32_t kWordsALeaf = 2;

// So many labels, the one for the end of a word among them, have 8 bits each.
constexpr std::size_t kNarrowLabels = 0x100;

// Word offsets have 32 bits.
constexpr std::uint64_t kMaxWordUnits = std::numeric_limits<std::uint32_t>::max();

[[noreturn]] void tooMany(const char* what) {
  throw Error(ErrorCode::tooLarge,
              std::string("This index has too many ") + what + "; split it in several.");
}

/// The numbers from 0 in the order of `before`. Comparing strings by number jumps about in memory,
/// so the numbers are sorted by keys, made of the strings' beginnings, and only equal keys by
/// `before`.
template <typename KeyOf, typename Before>
std::vector<std::uint32_t> sortedOrder(std::uint32_t count, KeyOf keyOf, Before before) {
  struct Entry {
    std::uint64_t key;
    std::uint32_t number;
  };
  std::vector<Entry> entries;
  entries.reserve(count);
  for (std::uint32_t number = 0; number < count; ++number) {
    entries.push_back({keyOf(number), number});
  }
  std::sort(entries.begin(), entries.end(), [&before](const Entry& a, const Entry& b) {
    return a.key != b.key ? a.key < b.key : before(a.number, b.number);
  });
  std::vector<std::uint32_t> order;
  order.reserve(count);
  for (const Entry& entry : entries) {
    order.push_back(entry.number);
  }
  return order;
}

std::vector<std::uint32_t> placesOf(const std::vector<std::uint32_t>& order) {
  std::vector<std::uint32_t> places(order.size());
  for (std::uint32_t place = 0; place < order.size(); ++place) {
    places[order[place]] = place;
  }
  return places;
}

/// The first 64 bits of a sequence of `Bits` wide elements, the first one highest. Nothing is
/// counted as zeros, so that a sequence comes before those that it begins.
template <unsigned Bits, typename Iterator, typename ValueOf>
std::uint64_t sortingKey(Iterator begin, Iterator end, ValueOf valueOf) {
  std::uint64_t key = 0;
  for (unsigned shift = 64; shift > 0 && begin != end; ++begin) {
    shift -= Bits;
    key |= std::uint64_t{valueOf(*begin)} << shift;
  }
  return key;
}

std::uint16_t unitOf(std::uint16_t unit) { return unit; }

/// Words as sequences of labels, in one list.
class LabelledWords {
 public:
  LabelledWords(const SearchImageWriter::Content& content,
                const std::vector<std::uint16_t>& labelOfUnit) {
    _offsets.reserve(std::size_t{content.wordCount()} + 1);
    _offsets.push_back(0);
    for (std::uint32_t word = 0; word < content.wordCount(); ++word) {
      for (const char16_t unit : content.word(word)) {
        _labels.push_back(labelOfUnit[unit]);
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
    const auto key = [this](std::uint32_t number) {
      const auto word = _words[number];
      return _backward ? sortingKey<16>(word.rbegin(), word.rend(), unitOf)
                       : sortingKey<16>(word.begin(), word.end(), unitOf);
    };
    _order = sortedOrder(words.size(), key, [this](std::uint32_t a, std::uint32_t b) {
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
      _slots.push_back({.children = tailsOf(place, place + 1, job.depth).value_or(1),
                        .target = TreeSlot::kLeaf | place});
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
      const auto tails = tailsOf(begin, place, job.depth + 1);
      if (tails || place - begin <= kWordsALeaf) {
        slot.children = tails.value_or(place - begin);
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

  /// What is left of the words at the places from `first` to before `last` behind `depth` labels.
  std::optional<std::uint64_t> tailsOf(std::uint32_t first, std::uint32_t last,
                                       std::uint32_t depth) const {
    const auto placeOf = [first](std::size_t i) { return first + static_cast<std::uint32_t>(i); };
    return image::LeafTails::encoded(
        last - first, [&](std::size_t i) -> std::size_t { return lengthAt(placeOf(i)) - depth; },
        [&](std::size_t i, std::size_t position) {
          return labelAt(placeOf(i), depth + static_cast<std::uint32_t>(position));
        });
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
std::vector<std::uint16_t> chooseLabels(const SearchImageWriter::Content& content) {
  std::vector<std::uint64_t> frequency(0x10000);
  for (std::uint32_t word = 0; word < content.wordCount(); ++word) {
    for (const char16_t unit : content.word(word)) {
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
  /// `expected`: the bytes of all sections, for which room is made at once.
  explicit Assembler(std::size_t expected) {
    const std::size_t header = image::headerBytes(image::kSectionKinds);
    _bytes.reserve(header + expected + image::kSectionKinds * image::kSectionAlignment);
    _bytes.resize(header);
  }

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

/// The same numbers in fewer bits, which must be enough for each.
template <typename Narrow, typename Wide>
std::vector<Narrow> narrowed(const std::vector<Wide>& numbers) {
  std::vector<Narrow> narrow;
  narrow.reserve(numbers.size());
  for (const Wide number : numbers) {
    narrow.push_back(static_cast<Narrow>(number));
  }
  return narrow;
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

SearchImageWriter::Value SearchImageWriter::addValue(std::string_view text,
                                                     std::uint32_t countedWords) {
  // Room first, so that a value never lacks its count.
  if (_countedWords.size() == _countedWords.capacity()) {
    _countedWords.reserve(_countedWords.size() * 2 + 1);
  }
  const auto [value, added] = _values.insert(text);
  if (added) {
    _countedWords.push_back(countedWords);
    if (value >= _limit) {
      rollBack({_words.size(), value, _postings.size(), _phrases});
      tooMany("data strings");
    }
  }
  return value;
}

std::uint32_t SearchImageWriter::wordId(std::u16string_view word) {
  const auto [id, added] = _words.insert(word);
  if (added && (id >= _limit || _words.characters() > kMaxWordUnits)) {
    _words.truncate(id);
    tooMany("distinct words");
  }
  return id;
}

void SearchImageWriter::addWord(std::u16string_view word) { wordId(word); }

void SearchImageWriter::addPosting(std::u16string_view word, Value value) {
  _postings.emplace_back(wordId(word), value);
}

void SearchImageWriter::rollBack(const Mark& mark) noexcept {
  _words.truncate(mark.words);
  _values.truncate(mark.values);
  _countedWords.resize(mark.values);
  _postings.resize(mark.postings);
  _phrases = mark.phrases;
}

SearchImageWriter::Content SearchImageWriter::content() const { return Content(*this); }

SearchImageWriter::Content::Content(const SearchImageWriter& writer) : _writer(writer) {
  const auto& words = writer._words;
  _words = sortedOrder(
      words.size(),
      [&words](std::uint32_t word) {
        return sortingKey<16>(words[word].begin(), words[word].end(), unitOf);
      },
      [&words](std::uint32_t a, std::uint32_t b) { return words[a] < words[b]; });
  const auto& values = writer._values;
  _values = sortedOrder(
      values.size(),
      [&values](Value value) {
        return sortingKey<8>(values[value].begin(), values[value].end(), utf16Rank);
      },
      [&values](Value a, Value b) { return utf16Less(values[a], values[b]); });
  gatherPostings();
}

/// Deals the postings out to their words, sorts each word's, and closes the gaps that repeated ones
/// leave.
void SearchImageWriter::Content::gatherPostings() {
  const auto placeOfWord = placesOf(_words);
  const auto placeOfValue = placesOf(_values);
  _offsets.resize(_words.size() + 1);
  for (const auto& [word, value] : _writer._postings) {
    ++_offsets[placeOfWord[word] + 1];
  }
  std::partial_sum(_offsets.begin(), _offsets.end(), _offsets.begin());
  _postings.resize(_writer._postings.size());
  std::vector<std::uint64_t> next(_offsets.begin(), _offsets.end() - 1);
  for (const auto& [word, value] : _writer._postings) {
    _postings[next[placeOfWord[word]]++] = placeOfValue[value];
  }
  auto kept = _postings.begin();
  for (std::size_t word = 0; word < _words.size(); ++word) {
    const auto begin = _postings.begin() + static_cast<std::ptrdiff_t>(_offsets[word]);
    const auto end = _postings.begin() + static_cast<std::ptrdiff_t>(_offsets[word + 1]);
    std::sort(begin, end);
    _offsets[word] = static_cast<std::uint64_t>(kept - _postings.begin());
    const auto last = std::unique(begin, end);
    kept = kept == begin ? last : std::copy(begin, last, kept);
  }
  _offsets.back() = static_cast<std::uint64_t>(kept - _postings.begin());
  _postings.erase(kept, _postings.end());
}

std::vector<std::byte> SearchImageWriter::finish() const {
  const Content content(*this);
  const auto labels = chooseLabels(content);
  std::vector<std::uint16_t> labelOfUnit(0x10000);
  for (std::size_t label = 1; label < labels.size(); ++label) {
    labelOfUnit[labels[label]] = static_cast<std::uint16_t>(label);
  }
  const LabelledWords labelled(content, labelOfUnit);
  const TreeBuilder forward(labelled, false);
  const TreeBuilder backward(labelled, true);

  std::vector<std::uint64_t> valueOffsets = {0};
  std::string valueTexts;
  std::vector<std::uint32_t> countedWords;
  valueTexts.reserve(_values.characters());
  for (Value value = 0; value < content.valueCount(); ++value) {
    valueTexts += content.value(value);
    valueOffsets.push_back(valueTexts.size());
    countedWords.push_back(content.countedWords(value));
  }

  Assembler assembler(sizeof(std::uint16_t) * (labels.size() + labelled.labels().size()) +
                      sizeof(TreeSlot) * (forward.slots().size() + backward.slots().size()) +
                      sizeof(std::uint32_t) * (labelled.offsets().size() + 2U * wordCount() +
                                               content.postings().size() + countedWords.size()) +
                      sizeof(std::uint64_t) *
                          (content.postingOffsets().size() + valueOffsets.size()) +
                      valueTexts.size());
  assembler.add(SectionKind::labels, labels);
  assembler.add(SectionKind::wordOffsets, labelled.offsets());
  if (labels.size() <= kNarrowLabels) {
    assembler.add(SectionKind::wordText, narrowed<std::uint8_t>(labelled.labels()));
  } else {
    assembler.add(SectionKind::wordText, labelled.labels());
  }
  assembler.add(SectionKind::forwardTree, forward.slots());
  assembler.add(SectionKind::forwardOrder,
                isIdentity(forward.order()) ? std::vector<std::uint32_t>() : forward.order());
  assembler.add(SectionKind::backwardTree, backward.slots());
  assembler.add(SectionKind::backwardOrder, backward.order());
  if (content.postings().size() <= std::numeric_limits<std::uint32_t>::max()) {
    assembler.add(SectionKind::postingOffsets, narrowed<std::uint32_t>(content.postingOffsets()));
  } else {
    assembler.add(SectionKind::postingOffsets, content.postingOffsets());
  }
  assembler.add(SectionKind::postings, content.postings());
  assembler.add(SectionKind::valueOffsets, valueOffsets);
  assembler.add(SectionKind::valueText, valueTexts);
  assembler.add(SectionKind::countedWords, countedWords);

  image::Header header = {};
  header.generation = randomGeneration();
  header.mode = _mode;
  header.wordCount = wordCount();
  header.valueCount = valueCount();
  header.phraseCount = _phrases;
  return std::move(assembler).finish(header);
}

}  // namespace wordcatcher
