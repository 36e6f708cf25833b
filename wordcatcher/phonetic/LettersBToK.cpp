#include "wordcatcher/phonetic/LetterRules.h"

namespace wordcatcher {

int LetterRules::letterB() { return append(u"P", next(1) == u'B' ? 2 : 1); }

int LetterRules::letterC() {
  if (_pos > 1 && !vowelAt(_pos - 2) && at(_pos - 1, anyOf<u"ACH">)) {
    const bool beforeIE = next(2) == u'I' || next(2) == u'E';
    if (!beforeIE || at(_pos - 2, anyOf<u"BACHER", u"MACHER">)) {
      return append(u"K", 2);
    }
  }
  if (isFirstLetter() && at(1, anyOf<u"CAESAR">)) {
    return append(u"S", 2);
  }
  if (at(_pos, anyOf<u"CHIA">)) {
    return append(u"K", 2);
  }
  if (at(_pos, anyOf<u"CH">)) {
    return ch();
  }
  if (at(_pos, anyOf<u"CZ">) && !at(_pos - 2, anyOf<u"WICZ">)) {
    return append(u"S", u"X", 2);
  }
  if (at(_pos + 1, anyOf<u"CIA">)) {
    return append(u"X", 3);
  }
  // Always so: position 0 is padding and never an M.
  const bool notAfterFirstM = !(_pos == 2 && unitAt(0) == u'M');
  if (at(_pos, anyOf<u"CC">) && notAfterFirstM) {
    if (at(_pos + 2, anyOf<u"I", u"E", u"H">) && !at(_pos + 2, anyOf<u"HU">)) {
      const bool afterFirstA = _pos == 2 && unitAt(1) == u'A';
      const bool succeeds = at(_pos - 1, anyOf<u"UCCEE", u"UCCES">);
      return append(afterFirstA || succeeds ? u"KS" : u"X", 3);
    }
    return append(u"K", 2);
  }
  if (at(_pos, anyOf<u"CK", u"CG", u"CQ">)) {
    return append(u"K", 2);
  }
  if (at(_pos, anyOf<u"CI", u"CE", u"CY">)) {
    return at(_pos, anyOf<u"CIO", u"CIE", u"CIA">) ? append(u"S", u"X", 2) : append(u"S", 2);
  }
  // Only a word with a space in it, which no text gives, fits.
  if (at(_pos + 1, anyOf<u" C", u" Q", u" G">)) {
    return append(u"K", 3);
  }
  // Never so: the rules of CC, CK and CQ come first.
  const bool swallowsNext =
      at(_pos + 1, anyOf<u"C", u"K", u"Q">) && !at(_pos + 1, anyOf<u"CE", u"CI">);
  return append(u"K", swallowsNext ? 2 : 1);
}

int LetterRules::ch() {
  if (at(_pos, anyOf<u"CHAE">)) {
    return append(u"K", u"X", 2);
  }
  if (isFirstLetter() &&
      (at(_pos + 1, anyOf<u"HARAC", u"HARIS">) ||
       at(_pos + 1, anyOf<u"HOR", u"HYM", u"HIA", u"HEM">)) &&
      !at(_pos, anyOf<u"CHORE">)) {
    return append(u"K", 2);
  }
  // The checks at position 0 see padding, and no word token holds the bars of the first of the
  // six-letter pieces: these never hold.
  if (at(0, anyOf<u"VAN ", u"VON ">) || at(0, anyOf<u"SCH">) ||
      at(_pos - 2, anyOf<u"||CHES", u"ARCHIT", u"ORCHID">) || at(_pos + 2, anyOf<u"T", u"S">) ||
      ((isFirstLetter() || at(_pos - 1, anyOf<u"A", u"O", u"U", u"E">)) &&
       at(_pos + 2, anyOf<u"L", u"R", u"N", u"M", u"B", u"H", u"F", u"V", u"W", u" ">))) {
    return append(u"K", 2);
  }
  // Never holds: position 0 is padding.
  if (at(0, anyOf<u"MC">)) {
    return append(u"K", 2);
  }
  return append(u"X", u"K", 2);
}

int LetterRules::letterD() {
  if (at(_pos, anyOf<u"DG">)) {
    return at(_pos + 2, anyOf<u"I", u"E", u"Y">) ? append(u"J", 3) : append(u"TK", 2);
  }
  return append(u"T", at(_pos, anyOf<u"DT", u"DD">) ? 2 : 1);
}

int LetterRules::letterF() { return append(u"F", next(1) == u'F' ? 2 : 1); }

int LetterRules::letterG() {
  if (next(1) == u'H') {
    return gh();
  }
  if (next(1) == u'N') {
    // Never holds: the vowel would stand at position 0, which is padding.
    if (isFirstLetter() && vowelAt(0) && !slavoGermanic()) {
      return append(u"KN", u"N", 2);
    }
    if (!at(_pos + 2, anyOf<u"EY">) && next(1) != u'Y' && !slavoGermanic()) {
      return append(u"N", u"KN", 2);
    }
    return append(u"KN", 2);
  }
  if (at(_pos + 1, anyOf<u"LI">) && !slavoGermanic()) {
    return append(u"KL", u"L", 2);
  }
  if (isFirstLetter() &&
      (next(1) == u'Y' ||
       at(_pos + 1,
          anyOf<u"ES", u"EP", u"EB", u"EL", u"EY", u"IB", u"IL", u"IN", u"IE", u"EI", u"ER">))) {
    return append(u"K", u"J", 2);
  }
  // The words at position 0 never fit, since a space stands there: *danger* has its K.
  if ((at(_pos + 1, anyOf<u"ER">) || next(1) == u'Y') &&
      !at(0, anyOf<u"DANGER", u"RANGER", u"MANGER">) && !at(_pos - 1, anyOf<u"E", u"I">) &&
      !at(_pos - 1, anyOf<u"RGY", u"OGY">)) {
    return append(u"K", u"J", 2);
  }
  if (at(_pos + 1, anyOf<u"E", u"I", u"Y">) || at(_pos - 1, anyOf<u"AGGI", u"OGGI">)) {
    return gBeforeEIY();
  }
  return append(u"K", next(1) == u'G' ? 2 : 1);
}

int LetterRules::gh() {
  if (!vowelAt(_pos - 1)) {
    return append(u"K", 2);
  }
  // Never holds: no vowel stands before the first letter.
  if (isFirstLetter()) {
    return append(unitAt(3) == u'I' ? u"J" : u"K", 2);
  }
  if (at(_pos - 2, anyOf<u"B", u"H", u"D">)) {
    return 2;
  }
  if (_pos >= 3) {
    if (at(_pos - 3, anyOf<u"B", u"H", u"D">)) {
      return 2;
    }
    if (_pos >= 4 && at(_pos - 4, anyOf<u"B", u"H">)) {
      return 2;
    }
    if (unitAt(_pos - 1) == u'U' && at(_pos - 3, anyOf<u"C", u"G", u"L", u"R", u"T">)) {
      return append(u"F", 2);
    }
  }
  return unitAt(_pos - 1) == u'I' ? 2 : append(u"K", 2);
}

int LetterRules::gBeforeEIY() {
  // The checks at position 0 see padding and never hold.
  if (at(0, anyOf<u"VAN ", u"VON ">) || at(0, anyOf<u"SCH">) || at(_pos + 1, anyOf<u"ET">)) {
    return append(u"K", 2);
  }
  // The space is the padding after the word.
  if (at(_pos + 1, anyOf<u"IER ">)) {
    return append(u"J", 2);
  }
  return append(u"J", u"K", 2);
}

int LetterRules::letterH() {
  const bool sounded = (isFirstLetter() || vowelAt(_pos - 1)) && vowelAt(_pos + 1);
  return sounded ? append(u"H", 2) : 1;
}

int LetterRules::letterJ() {
  // Never holds: position 0 is padding.
  const bool san = at(0, anyOf<u"SAN ">);
  if (at(_pos, anyOf<u"JOSE">) || san) {
    const bool wholeWord = isFirstLetter() && next(4) == u' ';
    return wholeWord || san ? append(u"H", 1) : append(u"J", u"H", 1);
  }
  const int dealtWith = next(1) == u'J' ? 2 : 1;
  if (isFirstLetter() && !at(1, anyOf<u"JOSE">)) {
    return append(u"J", u"A", dealtWith);
  }
  if (vowelAt(_pos - 1) && !slavoGermanic() && (next(1) == u'A' || next(1) == u'O')) {
    return append(u"J", u"H", dealtWith);
  }
  // Never holds: no letter stands at the length.
  if (_pos == _length) {
    return append(u"J", u" ", dealtWith);
  }
  if (at(_pos + 1, anyOf<u"L", u"T", u"K", u"S", u"N", u"M", u"B", u"Z">) ||
      at(_pos - 1, anyOf<u"S", u"K", u"L">)) {
    return dealtWith;
  }
  return append(u"J", dealtWith);
}

int LetterRules::letterK() { return append(u"K", next(1) == u'K' ? 2 : 1); }

}  // namespace wordcatcher
