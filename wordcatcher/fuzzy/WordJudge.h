#ifndef WORDCATCHER_FUZZY_WORDJUDGE_H
#define WORDCATCHER_FUZZY_WORDJUDGE_H

#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "wordcatcher/fuzzy/BandedAutomaton.h"
#include "wordcatcher/fuzzy/QueryPattern.h"
#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher {

/// Tells of single words of an image whether a search for a query would find them, and at which
/// distance, without searching: for hosts of candidates that came from elsewhere. A query must hold
/// none of the signs that have a meaning of their own ("*" and "_"), and the distance is at most 2.
class WordJudge {
 public:
  static constexpr unsigned kMaxDistance = 2;

  static bool canJudge(std::u16string_view query, std::int64_t maxDistance) noexcept {
    return maxDistance >= 0 && maxDistance <= kMaxDistance && !query.empty() &&
           query.find_first_of(u"*_") == std::u16string_view::npos;
  }

  /// The query is lower-cased; the image must live as long as this does.
  WordJudge(const SearchImage& image, std::u16string_view query, std::int64_t maxDistance)
      : _image(image),
        _maxDistance(static_cast<std::uint32_t>(maxDistance)),
        _units(unitsOf(image, query)),
        _pattern(_units, {0, kMaxDistance}) {}

  /// As searchImage() finds it. Linear in the word. Throws Error (damaged).
  std::optional<std::uint32_t> distanceOf(std::uint32_t word) const {
    const auto labels = _image.labelsOf(word);
    if (labels.size() > _units.size() + _maxDistance ||
        _units.size() > labels.size() + _maxDistance) {
      return std::nullopt;
    }
    std::uint64_t states = _pattern.start();
    for (std::size_t depth = 0; depth < labels.size() && states != 0; ++depth) {
      states = _pattern.step(states, depth, labels[depth]);
    }
    states &= _pattern.acceptingAt(labels.size());
    if (states == 0) {
      return std::nullopt;
    }
    const std::uint32_t distance = Band<kMaxDistance>::distanceOf(states);
    return distance <= _maxDistance ? std::optional(distance) : std::nullopt;
  }

 private:
  const SearchImage& _image;
  std::uint32_t _maxDistance;
  std::vector<QueryUnit> _units;
  BandedPattern<kMaxDistance> _pattern;
};

}  // namespace wordcatcher

#endif
