#ifndef WORDCATCHER_PHONETIC_LETTERRULES_H
#define WORDCATCHER_PHONETIC_LETTERRULES_H

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/phonetic/WordPredicates.h"

namespace wordcatcher {

/// A string as a template argument, for anyOf.
template <std::size_t Size>
struct Literal {
  // Implicit, so that anyOf takes plain string literals.
  consteval Literal(const char16_t (&literal)[Size]) { std::copy_n(literal, Size, text); }

  static constexpr std::size_t length = Size - 1;
  char16_t text[Size] = {};
};

/// Strings of one length, written where they are used and known to the compiler there, so that
/// comparing with them is comparing with constants.
template <Literal first, Literal... others>
struct AnyOf {
  static constexpr std::size_t length = first.length;
  static_assert(((others.length == length) && ...));

  static constexpr bool contains(std::u16string_view piece) noexcept {
    const auto equals = [piece](const auto& member) {
      return std::equal(piece.begin(), piece.end(), member.text);
    };
    return piece.size() == length && (equals(first) || ... || equals(others));
  }
};

template <Literal... members>
inline constexpr AnyOf<members...> anyOf;

/// The letter rules, run over one word. The word is padded with a space before and one after, so
/// that its first letter stands at position 1 and its last two places before the padded word's end.
/// Outside of that, a single character reads as a space. A piece that begins before position 0
/// is moved there and keeps its length; a piece that reaches beyond the end is shorter, and fits no
/// string of its full length. A word that `length` cuts is read beyond the cut: rules see the
/// letters that follow.
///
/// Each letter function looks around the current position, appends to the encoder's two codes and
/// returns how many positions it has dealt with, at least 1. Within a function the first rule that
/// fits ends it; their order is part of the rules. Some rules never fit, because they look for a
/// letter at position 0 or for the position at the length, where there is only padding. They are
/// kept because the rules around them are read, and checked against their sources, in this order;
/// a short comment marks each.
///
/// Positions are plain integers and `length` at most 65,535, the padded length modulo 65,536: a
/// step beyond the last position ends the word, however long it is, and never comes round again.
class LetterRules {
 public:
  LetterRules(KXMetaphone& encoder, std::u16string_view word, std::uint16_t length) noexcept
      : _encoder(encoder), _word(word), _length(length) {}

  /// Encodes the word. Linear in its length.
  void run();

 private:
  std::int32_t startPosition();
  int anyCharacter(char16_t character);

  int vowel();
  int letterB();
  int letterC();
  int letterD();
  int letterF();
  int letterG();
  int letterH();
  int letterJ();
  int letterK();
  int letterL();
  int letterM();
  int letterN();
  int letterP();
  int letterQ();
  int letterR();
  int letterS();
  int letterT();
  int letterV();
  int letterW();
  int letterX();
  int letterZ();

  /// Parts of the rules of C, G, S and W.
  int ch();
  int gh();
  int gBeforeEIY();
  int sc();
  void firstW();

  bool isFirstLetter() const noexcept { return _pos == 1; }
  char16_t unitAt(std::int32_t position) const noexcept {
    return nth(_word, static_cast<std::size_t>(position));
  }
  char16_t next(std::int32_t distance) const noexcept { return unitAt(_pos + distance); }
  /// ssa() for the length that the members have.
  template <Literal... members>
  bool at(std::int32_t start, AnyOf<members...> list) const noexcept {
    return list.contains(substring(_word, start, list.length));
  }
  bool vowelAt(std::int32_t position) const noexcept { return _isVowel(_word, position); }
  bool slavoGermanic();

  int append(std::u16string_view code, int dealtWith) {
    _encoder._append(code);
    return dealtWith;
  }
  int append(std::u16string_view primary, std::u16string_view alternate, int dealtWith) {
    _encoder._append_alt(primary, alternate);
    return dealtWith;
  }

  KXMetaphone& _encoder;
  std::u16string_view _word;
  std::int32_t _length;
  std::int32_t _pos = 0;
  // Asked at many letters, answered once a word: each answer reads the whole word.
  std::optional<bool> _slavoGermanicWord;
};

}  // namespace wordcatcher

#endif
