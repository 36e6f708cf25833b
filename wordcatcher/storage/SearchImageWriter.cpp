#include "wordcatcher/storage/SearchImageWriter.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <numeric>
#include <random>
#include <string>
#include <utility>

#define XXH_INLINE_ALL
#include <xxhash.h>

#include "wordcatcher/Error.h"
#include "wordcatcher/storage/LeafTails.h"
#include "wordcatcher/storage/PhraseWords.h"
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

// And so have the offsets of phrases.
constexpr std::uint64_t kMaxPhraseWords = std::numeric_limits<std::uint32_t>::max();

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

/// How much room a vector should have for `more` elements: at least twice as much as before, so
/// that adding stays linear.
std::size_t roomFor(const std::vector<std::uint32_t>& elements, std::size_t more) {
  const std::size_t needed = elements.size() + more;
  return needed <= elements.capacity() ? 0 : std::max(needed, 2 * elements.capacity());
}

/// Calls `use(value, words)` for each phrase of a writer's list.
template <typename Use>
void forEachPhrase(std::span<const std::uint32_t> stream, Use use) {
  for (std::size_t begin = 0; begin < stream.size();) {
    const std::size_t end = begin + 1 + image::firstPhrase(stream.subspan(begin + 1)).size();
    use(stream[begin], stream.subspan(begin + 1, end - begin - 1));
    begin = end;
  }
}

/// A value's phrases, ascending by their words, each once.
std::vector<std::uint32_t> distinctPhrases(std::span<const std::uint32_t> phrases) {
  std::vector<std::vector<std::uint32_t>> list;
  while (!phrases.empty()) {
    const auto phrase = image::firstPhrase(phrases);
    list.emplace_back(phrase.begin(), phrase.end());
    phrases = phrases.subspan(phrase.size());
  }
  std::sort(list.begin(), list.end());
  list.erase(std::unique(list.begin(), list.end()), list.end());
  std::vector<std::uint32_t> kept;
  for (const auto& phrase : list) {
    kept.insert(kept.end(), phrase.begin(), phrase.end());
  }
  return kept;
}

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
      rollBack({_words.size(), value, _phraseWords.size(), _phrases});
      tooMany("data strings");
    }
  }
  return value;
}

std::uint32_t SearchImageWriter::addWord(std::u16string_view word) {
  const auto [id, added] = _words.insert(word);
  if (added && (id >= _limit || _words.characters() > kMaxWordUnits)) {
    _words.truncate(id);
    tooMany("distinct words");
  }
  return id;
}

void SearchImageWriter::addPhrase(std::span<const std::uint32_t> words, Value value) {
  if (words.empty()) {
    return;
  }
  if (words.size() >= kMaxPhraseWords - _phraseWords.size()) {
    tooMany("words in its phrases");
  }
  _phraseWords.reserve(roomFor(_phraseWords, words.size() + 1));
  _phraseWords.push_back(value);
  _phraseWords.insert(_phraseWords.end(), words.begin(), words.end());
  _phraseWords.back() |= image::kPhraseEnd;
}

void SearchImageWriter::addPosting(std::u16string_view word, Value value) {
  const std::uint32_t number = addWord(word);
  addPhrase({&number, 1}, value);
}

void SearchImageWriter::rollBack(const Mark& mark) noexcept {
  _words.truncate(mark.words);
  _values.truncate(mark.values);
  _countedWords.resize(mark.values);
  _phraseWords.resize(mark.phraseWords);
  _phrases = mark.phrases;
}

SearchImageWriter::Content SearchImageWriter::content() const { return Content(*this); }

/// The phrases by the writer's numbers of their values, with the words' new numbers.
struct SearchImageWriter::Content::Phrases {
  std::vector<std::uint32_t> offsets;  // values + 1
  std::vector<std::uint32_t> words;
  std::vector<std::uint32_t> sizes;  // how much of each value's room is used
  std::vector<image::PhraseShape> shapes;

  std::span<const std::uint32_t> of(Value value) const {
    return std::span(words).subspan(offsets[value], sizes[value]);
  }
};

SearchImageWriter::Content::Content(const SearchImageWriter& writer) : _writer(writer) {
  const auto& words = writer._words;
  _words = sortedOrder(
      words.size(),
      [&words](std::uint32_t word) {
        return sortingKey<16>(words[word].begin(), words[word].end(), unitOf);
      },
      [&words](std::uint32_t a, std::uint32_t b) { return words[a] < words[b]; });
  numberValues(gatherPhrases());
  gatherPostings();
}

/// Deals the phrases out to their values, and leaves out repeated ones.
SearchImageWriter::Content::Phrases SearchImageWriter::Content::gatherPhrases() const {
  const auto placeOfWord = placesOf(_words);
  const auto& stream = _writer._phraseWords;
  const std::uint32_t values = _writer._values.size();
  Phrases phrases;
  phrases.offsets.resize(std::size_t{values} + 1);
  std::vector<std::uint32_t> counts(values);
  forEachPhrase(stream, [&](Value value, std::span<const std::uint32_t> words) {
    phrases.offsets[value + 1] += static_cast<std::uint32_t>(words.size());
    ++counts[value];
  });
  std::partial_sum(phrases.offsets.begin(), phrases.offsets.end(), phrases.offsets.begin());
  phrases.words.resize(phrases.offsets.back());
  phrases.sizes.resize(values);
  forEachPhrase(stream, [&](Value value, std::span<const std::uint32_t> words) {
    std::uint32_t& size = phrases.sizes[value];
    for (const std::uint32_t word : words) {
      phrases.words[phrases.offsets[value] + size++] =
          placeOfWord[word & ~image::kPhraseEnd] | (word & image::kPhraseEnd);
    }
  });
  phrases.shapes.reserve(values);
  for (Value value = 0; value < values; ++value) {
    if (counts[value] > 1) {
      const auto all = phrases.of(value);
      const auto kept = distinctPhrases(all);
      std::copy(kept.begin(), kept.end(), phrases.words.begin() + phrases.offsets[value]);
      phrases.sizes[value] = static_cast<std::uint32_t>(kept.size());
    }
    phrases.shapes.push_back(image::shapeOf(
        phrases.of(value), [this](std::uint32_t word) { return this->word(word).size(); }));
  }
  return phrases;
}

/// Sorts the values by shape and text, and lays down their phrases in that order.
void SearchImageWriter::Content::numberValues(const Phrases& phrases) {
  const auto& values = _writer._values;
  const auto& shapes = phrases.shapes;
  _values = sortedOrder(
      values.size(),
      [&](Value value) {
        const auto& shape = shapes[value];
        return std::uint64_t{shape.fewestWords} << 48 | std::uint64_t{shape.mostWords} << 32 |
               std::uint64_t{shape.units} << 16 |
               sortingKey<8>(values[value].begin(), values[value].end(), utf16Rank) >> 48;
      },
      [&](Value a, Value b) {
        return shapes[a] != shapes[b] ? shapes[a] < shapes[b] : utf16Less(values[a], values[b]);
      });
  _phraseOffsets.reserve(_values.size() + 1);
  _phraseOffsets.push_back(0);
  for (const Value value : _values) {
    const auto words = phrases.of(value);
    _phraseWords.insert(_phraseWords.end(), words.begin(), words.end());
    const image::PhraseClass own = {static_cast<std::uint32_t>(_phraseOffsets.size() - 1),
                                    shapes[value].fewestWords, shapes[value].mostWords};
    if (_classes.empty() || _classes.back().fewestWords != own.fewestWords ||
        _classes.back().mostWords != own.mostWords) {
      _classes.push_back(own);
    }
    _phraseOffsets.push_back(static_cast<std::uint32_t>(_phraseWords.size()));
  }
}

/// Deals the values out to the words of their phrases: one after the other, so that each list
/// ascends, and a value that repeats a word finds itself last in the word's list.
void SearchImageWriter::Content::gatherPostings() {
  const auto forEachWord = [this](auto use) {
    for (std::uint32_t value = 0; value < _values.size(); ++value) {
      for (std::uint32_t i = _phraseOffsets[value]; i < _phraseOffsets[value + 1]; ++i) {
        use(_phraseWords[i] & ~image::kPhraseEnd, value);
      }
    }
  };
  constexpr std::uint32_t kNone = std::numeric_limits<std::uint32_t>::max();
  std::vector<std::uint32_t> last(_words.size(), kNone);
  _offsets.resize(_words.size() + 1);
  forEachWord([&](std::uint32_t word, std::uint32_t value) {
    _offsets[word + 1] += std::exchange(last[word], value) != value ? 1 : 0;
  });
  std::partial_sum(_offsets.begin(), _offsets.end(), _offsets.begin());
  _postings.resize(_offsets.back());
  std::vector<std::uint64_t> next(_offsets.begin(), _offsets.end() - 1);
  std::fill(last.begin(), last.end(), kNone);
  forEachWord([&](std::uint32_t word, std::uint32_t value) {
    if (std::exchange(last[word], value) != value) {
      _postings[next[word]++] = value;
    }
  });
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

  Assembler assembler(
      sizeof(std::uint16_t) * (labels.size() + labelled.labels().size()) +
      sizeof(TreeSlot) * (forward.slots().size() + backward.slots().size()) +
      sizeof(std::uint32_t) * (labelled.offsets().size() + 2U * wordCount() +
                               content.postings().size() + countedWords.size()) +
      sizeof(std::uint32_t) * (content.phraseOffsets().size() + content.phraseWords().size()) +
      sizeof(image::PhraseClass) * content.phraseClasses().size() +
      sizeof(std::uint64_t) * (content.postingOffsets().size() + valueOffsets.size()) +
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
  assembler.add(SectionKind::phraseOffsets, content.phraseOffsets());
  assembler.add(SectionKind::phraseWords, content.phraseWords());
  assembler.add(SectionKind::phraseClasses, content.phraseClasses());

  image::Header header = {};
  header.generation = randomGeneration();
  header.mode = _mode;
  header.wordCount = wordCount();
  header.valueCount = valueCount();
  header.phraseCount = _phrases;
  return std::move(assembler).finish(header);
}

}  // namespace wordcatcher
