#ifndef WORDCATCHER_MATCHER_KXWORDCATCH_H
#define WORDCATCHER_MATCHER_KXWORDCATCH_H

#include <cstdint>
#include <functional>
#include <ostream>
#include <string>
#include <string_view>

#include "wordcatcher/Export.h"

namespace wordcatcher {

/// One phrase that a query found: a data string that the host stored with it, and its score, of
/// which smaller is better. Two records are equal when their values are, whatever their distances:
/// a set of records holds each phrase once. A value, used by one thread at a time while it is
/// changed.
class WORDCATCHER_EXPORT KXWordcatch {
 public:
  /// A record of exactly these two; neither is checked.
  KXWordcatch(std::u16string_view value, std::int64_t distance)
      : _value(value), _distance(distance) {}

  /// The data string that the host stored with the phrase, as it was given.
  const std::u16string& value() const noexcept { return _value; }

  /// Replaces the data string, and so what the record is equal to.
  void setValue(std::u16string_view value) { _value = value; }

  /// Edits of the words plus penalties for missing and surplus words.
  std::int64_t distance() const noexcept { return _distance; }

  /// Replaces the score; any number is taken.
  void setDistance(std::int64_t distance) noexcept { _distance = distance; }

  /// Whether the values hold the same code units.
  bool isEqual(const KXWordcatch& other) const noexcept { return _value == other._value; }

  /// The hash of the value.
  std::uint64_t hash() const noexcept { return std::hash<std::u16string>()(_value); }

  /// {KXWordcatch v:"the value", dist: 4}
  std::u16string description() const;

  /// As isEqual().
  friend bool operator==(const KXWordcatch& a, const KXWordcatch& b) noexcept {
    return a.isEqual(b);
  }

 private:
  std::u16string _value;
  std::int64_t _distance;
};

/// Writes the description as UTF-8.
WORDCATCHER_EXPORT std::ostream& operator<<(std::ostream& stream, const KXWordcatch& record);

}  // namespace wordcatcher

/// Lets records be keys of unordered containers.
template <>
struct std::hash<wordcatcher::KXWordcatch> {
  /// The object's own hash().
  std::size_t operator()(const wordcatcher::KXWordcatch& record) const noexcept {
    return record.hash();
  }
};

#endif
