#include "wordcatcher/fuzzy/NearWords.h"

#include <algorithm>
#include <bit>

#include "wordcatcher/fuzzy/BandedWalk.h"
#include "wordcatcher/fuzzy/LazyAutomaton.h"
#include "wordcatcher/fuzzy/SwapAutomaton.h"
#include "wordcatcher/fuzzy/TableAutomaton.h"
#include "wordcatcher/storage/LeafTails.h"

namespace wordcatcher {

namespace {

using image::TreeSlot;

constexpr std::uint32_t kNoWord = UINT32_MAX;

std::vector<std::uint16_t> labelsOf(const SearchImage& image, std::u16string_view word) {
  std::vector<std::uint16_t> labels;
  labels.reserve(word.size());
  for (const char16_t unit : word) {
    labels.push_back(image.labelOf(unit));
  }
  return labels;
}

/// A place of a tree, and how many labels lead there.
struct Reached {
  std::size_t slot = 0;
  std::size_t depth = 0;
};

/// A tree read along labels. Where it is a tree, no place and no word is met more than twice by
/// what one of these is made for; it ends a reading that meets more of them.
class TreeReader {
 public:
  TreeReader(const SearchImage& image, bool backward)
      : _image(image),
        _backward(backward),
        _tree(backward ? image.backward() : image.forward()),
        _left(2 * (_tree.slots.size() + std::uint64_t{image.wordCount()})) {}

  const TreeSlot& at(const Reached& reached) const { return _tree.slots[reached.slot]; }

  bool isAtLeaf(const Reached& reached) const { return reached.depth > 0 && at(reached).isLeaf(); }

  /// Calls `visit(word, labels of the word)` for the words of a leaf.
  template <typename Visit>
  void forEachWordOf(const TreeSlot& leaf, Visit visit) {
    for (std::size_t i = 0; i < image::leafWords(leaf); ++i) {
      spend();
      const std::uint32_t word = wordAt(leaf.index() + i);
      visit(word, _image.labelsOf(word));
    }
  }

  /// Calls `visit(slot, label)` for the children of a place that is no leaf, but for the end of a
  /// word.
  template <typename Visit>
  void forEachChildOf(const TreeSlot& place, Visit visit) {
    if (place.children == 0) {
      return;
    }
    for (std::size_t child = place.index();; ++child) {
      const TreeSlot& slot = read(child);
      if (slot.label != 0) {
        visit(child, slot.label);
      }
      if (slot.isLastChild()) {
        return;
      }
    }
  }

  /// Calls `visit(word, length)` for every word of the image that the labels begin with, or end
  /// with in the backward tree, where they stand in reverse; from a place on to which they lead,
  /// and up to the place that is given back: where the labels end, or no place is behind, or a leaf
  /// is reached.
  template <typename Visit>
  Reached along(std::span<const std::uint16_t> labels, Reached from, Visit visit) {
    for (;; ++from.depth) {
      const TreeSlot& place = at(from);
      if (isAtLeaf(from)) {
        forEachWordOf(place, [&](std::uint32_t word, const SearchImage::Labels& own) {
          bool isAlong = own.size() <= labels.size();
          for (std::size_t i = 0; isAlong && i < own.size(); ++i) {
            isAlong = labels[i] == own[_backward ? own.size() - 1 - i : i];
          }
          if (isAlong) {
            visit(word, own.size());
          }
        });
        return from;
      }
      if (const std::size_t end = childOf(place, 0)) {
        visit(wordAt(_tree.slots[end].index()), from.depth);
      }
      if (from.depth == labels.size() || labels[from.depth] == 0) {
        return from;
      }
      const std::size_t child = childOf(place, labels[from.depth]);
      if (child == 0) {
        return from;
      }
      from.slot = child;
    }
  }

 private:
  void spend() {
    if (_left == 0) {
      _image.throwDamaged("places of a tree overlap");
    }
    --_left;
  }

  const TreeSlot& read(std::size_t slot) {
    if (slot >= _tree.slots.size()) {
      _image.throwDamaged("a tree leads out of its section");
    }
    spend();
    return _tree.slots[slot];
  }

  /// The child of a place behind an edge, or 0.
  std::size_t childOf(const TreeSlot& place, std::uint16_t label) {
    const unsigned bit = image::labelBit(label);
    if ((place.children >> bit & 1U) == 0) {
      return 0;
    }
    const std::uint64_t before = place.children & ((std::uint64_t{1} << bit) - 1);
    std::size_t child = place.index() + static_cast<unsigned>(std::popcount(before));
    for (;; ++child) {
      const TreeSlot& slot = read(child);
      if (slot.label == label) {
        return child;
      }
      if (slot.label > label || slot.isLastChild()) {
        return 0;
      }
    }
  }

  /// The word at a place among the leaves.
  std::uint32_t wordAt(std::size_t place) const {
    if (place >= _image.wordCount()) {
      _image.throwDamaged("a tree has more leaves than words");
    }
    return _tree.order.empty() ? static_cast<std::uint32_t>(place) : _tree.order[place];
  }

  const SearchImage& _image;
  bool _backward;
  const SearchImage::Tree& _tree;
  std::uint64_t _left;  // slots and words of leaves that may still be read
};

template <typename Automaton, typename Accept>
void walk(const SearchImage& image, bool backward, const typename Automaton::Pattern& pattern,
          WalkMemory& memory, Accept accept) {
  const auto& tree = backward ? image.backward() : image.forward();
  BandedWalk<Automaton>(image, tree, backward, pattern, memory).run(pattern.start(), accept);
}

/// The patterns of the walks within K edits. Up to 2 edits there are tables, which leave out words
/// of K edits that are less than so many code units longer than the query (or shorter, below 0);
/// beyond, such words are met.
template <unsigned K, bool HasTable = (K <= 2)>
class Patterns {
 public:
  using Automaton = TableAutomaton<K>;
  using Pattern = typename Automaton::Pattern;
  using Units = std::vector<QueryUnit>;

  Patterns(bool swaps, std::int64_t leastLonger)
      : _swaps(swaps), _leastLonger(static_cast<int>(std::clamp(leastLonger, -kEdits, kEdits))) {}

  Pattern whole(const Units& units) const {
    return Pattern(units, SwapTable<K>::ofFirst(_swaps, _leastLonger));
  }
  Pattern first(const Units& units, std::size_t head) const {
    return Pattern(units, SwapTable<K>::ofFirst(_swaps, _leastLonger), head);
  }
  Pattern second(const Units& reversed, std::size_t head) const {
    return Pattern(reversed, SwapTable<K>::ofSecond(_swaps, _leastLonger), head);
  }

 private:
  static constexpr std::int64_t kEdits = K;

  bool _swaps;
  int _leastLonger;
};

template <unsigned K>
class Patterns<K, false> {
 public:
  using Automaton = LazyAutomaton<K, 1, SwapPattern<K>>;
  using Pattern = SwapPattern<K>;
  using Units = std::vector<QueryUnit>;

  Patterns(bool swaps, std::int64_t) : _swaps(swaps) {}

  Pattern whole(const Units& units) const { return Pattern(units, _swaps, {0, K}); }
  Pattern first(const Units& units, std::size_t head) const {
    return Pattern(units, _swaps, {head, Halves<K>::kInFirst, true});
  }
  Pattern second(const Units& reversed, std::size_t head) const {
    return Pattern(reversed, _swaps, {head, Halves<K>::kInSecond, false});
  }

 private:
  bool _swaps;
};

/// Two walks, each with few edits in the half of the query that it reads first; see
/// ImageSearch.cpp. Walks along the whole query count the least edits that their limits allow, so a
/// word that both meet has the lesser of its two counts: with all edits in reach of one half, that
/// is the distance. Words of K edits are left out if they have fewer than `fromLength` code units.
template <unsigned K>
void searchWithin(const SearchImage& image, const std::vector<QueryUnit>& units,
                  std::size_t fromLength, bool swaps, std::vector<NearWord>& found) {
  // Halves of fewer code units rule too little out.
  constexpr std::size_t kMinSplitLength = K <= 2 ? 4 : 2 + 2 * std::size_t{K};
  const auto accept = [&found, fromLength](std::uint32_t word, std::uint32_t edits,
                                           std::size_t length) {
    if (edits < K || length >= fromLength) {
      found.push_back({word, edits, static_cast<std::uint32_t>(length)});
    }
  };
  using Automaton = typename Patterns<K>::Automaton;
  const Patterns<K> patterns(
      swaps, static_cast<std::int64_t>(fromLength) - static_cast<std::int64_t>(units.size()));
  const auto memory = image.lendWalkMemory();
  if (units.size() < kMinSplitLength) {
    walk<Automaton>(image, false, patterns.whole(units), *memory, accept);
    return;
  }
  const std::size_t half = Halves<K>::first(units.size());
  const std::vector<QueryUnit> reversed(units.rbegin(), units.rend());
  walk<Automaton>(image, false, patterns.first(units, half), *memory, accept);
  walk<Automaton>(image, true, patterns.second(reversed, units.size() - half), *memory, accept);
}

}  // namespace

std::vector<NearWord> nearWords(const SearchImage& image, std::u16string_view word, NearLimit limit,
                                bool transpositions) {
  std::vector<NearWord> found;
  if (word.empty()) {
    return found;
  }
  const auto units = unitsOf(image, word);
  if (limit.edits > 0 && limit.fromLength > word.size() + limit.edits) {
    // None of so many edits is that long.
    limit = {limit.edits - 1, 0};
  }
  switch (limit.edits) {
    case 0:
      if (const auto same = exactWord(image, word)) {
        found.push_back({*same, 0, static_cast<std::uint32_t>(word.size())});
      }
      return found;
    case 1:
      searchWithin<1>(image, units, limit.fromLength, transpositions, found);
      break;
    case 2:
      searchWithin<2>(image, units, limit.fromLength, transpositions, found);
      break;
    default:
      searchWithin<3>(image, units, limit.fromLength, transpositions, found);
      break;
  }
  std::sort(found.begin(), found.end(), [](const NearWord& a, const NearWord& b) {
    return a.word != b.word ? a.word < b.word : a.edits < b.edits;
  });
  const auto sameWord = [](const NearWord& a, const NearWord& b) { return a.word == b.word; };
  found.erase(std::unique(found.begin(), found.end(), sameWord), found.end());
  return found;
}

std::optional<std::uint32_t> exactWord(const SearchImage& image, std::u16string_view word) {
  const auto labels = labelsOf(image, word);
  std::optional<std::uint32_t> found;
  TreeReader(image, false).along(labels, {}, [&](std::uint32_t other, std::size_t length) {
    if (length == labels.size()) {
      found = other;
    }
  });
  return found;
}

std::vector<std::uint32_t> wordsWithUnitBetween(const SearchImage& image, std::u16string_view head,
                                                std::u16string_view tail) {
  auto labels = labelsOf(image, head);
  const std::size_t gap = labels.size();
  TreeReader reader(image, false);
  const auto reached = reader.along(labels, {}, [](std::uint32_t, std::size_t) {});
  const auto tailLabels = labelsOf(image, tail);
  labels.push_back(0);
  labels.insert(labels.end(), tailLabels.begin(), tailLabels.end());
  std::vector<std::uint32_t> found;
  if (reader.isAtLeaf(reached)) {
    reader.forEachWordOf(reader.at(reached),
                         [&](std::uint32_t word, const SearchImage::Labels& own) {
                           bool isSame = own.size() == labels.size();
                           for (std::size_t i = 0; isSame && i < own.size(); ++i) {
                             isSame = i == gap || labels[i] == own[i];
                           }
                           if (isSame) {
                             found.push_back(word);
                           }
                         });
  } else if (reached.depth == gap) {
    reader.forEachChildOf(reader.at(reached), [&](std::size_t child, std::uint16_t label) {
      labels[gap] = label;
      reader.along(labels, {child, gap + 1}, [&](std::uint32_t word, std::size_t length) {
        if (length == labels.size()) {
          found.push_back(word);
        }
      });
    });
  }
  return found;
}

std::vector<JoinedWords> wordsJoinedIn(const SearchImage& image, std::u16string_view word,
                                       Seam seam) {
  auto labels = labelsOf(image, word);
  // By length: words differ, so at most one of each length is the word's beginning, or its end.
  std::vector<std::uint32_t> heads(labels.size(), kNoWord);
  std::vector<std::uint32_t> tails(labels.size(), kNoWord);
  const auto noteIn = [](std::vector<std::uint32_t>& words) {
    return [&words](std::uint32_t other, std::size_t length) {
      if (length > 0 && length < words.size()) {
        words[length] = other;
      }
    };
  };
  TreeReader(image, false).along(labels, {}, noteIn(heads));
  std::reverse(labels.begin(), labels.end());
  TreeReader(image, true).along(labels, {}, noteIn(tails));
  std::vector<JoinedWords> joined;
  for (std::size_t length = 1; length < tails.size(); ++length) {
    const auto addBehind = [&](std::size_t headLength) {
      if (heads[headLength] != kNoWord) {
        joined.push_back({heads[headLength], tails[length]});
      }
    };
    if (tails[length] != kNoWord) {
      addBehind(tails.size() - length);
      if (seam == Seam::unit) {
        addBehind(tails.size() - length - 1);
      }
    }
  }
  return joined;
}

}  // namespace wordcatcher
