#include "wordcatcher/phonetic/LetterRules.h"

namespace wordcatcher {

int LetterRules::letterL() {
  if (next(1) != u'L') {
    return append(u"L", 1);
  }
  // The three endings reach into the padding after the word and fit only where a word of more than
  // 65,533 letters is cut.
  if (_pos == _length - 3 && at(_pos - 1, anyOf<u"ILLO", u"ILLA", u"ALLE">)) {
    return append(u"L", u" ", 2);
  }
  if (at(_length - 1, anyOf<u"AS", u"OS">)) {
    return append(u"L", u" ", 2);
  }
  if (at(_length, anyOf<u"A", u"O">) && at(_pos - 1, anyOf<u"ALLE">)) {
    return append(u"L", u" ", 2);
  }
  return append(u"L", 2);
}

int LetterRules::letterM() {
  if (at(_pos - 1, anyOf<u"UMB">)) {
    // Fits only where a word of more than 65,533 letters is cut: a final B is inside the word.
    if (_pos + 1 == _length) {
      return append(u"M", 2);
    }
    if (at(_pos + 2, anyOf<u"ER">)) {
      return append(u"M", 2);
    }
  }
  return append(u"M", next(1) == u'M' ? 2 : 1);
}

int LetterRules::letterN() { return append(u"N", next(1) == u'N' ? 2 : 1); }

int LetterRules::letterP() {
  if (next(1) == u'H') {
    return append(u"F", 2);
  }
  return append(u"P", at(_pos + 1, anyOf<u"P", u"B">) ? 2 : 1);
}

int LetterRules::letterQ() { return append(u"K", next(1) == u'Q' ? 2 : 1); }

int LetterRules::letterR() {
  const int dealtWith = next(1) == u'R' ? 2 : 1;
  // Never holds: no letter stands at the length, so that every R is heard.
  if (_pos == _length && !slavoGermanic() && at(_pos - 2, anyOf<u"IE">) &&
      !at(_pos - 4, anyOf<u"ME", u"MA">)) {
    return append(u"", u"R", dealtWith);
  }
  return append(u"R", dealtWith);
}

int LetterRules::letterS() {
  if (at(_pos - 1, anyOf<u"ISL", u"YSL">)) {
    return 1;
  }
  if (at(_pos, anyOf<u"SUGAR">)) {
    return append(u"X", u"S", 1);
  }
  if (at(_pos, anyOf<u"SH">)) {
    const bool german = at(_pos + 1, anyOf<u"HEIM", u"HOEK", u"HOLM", u"HOLZ">);
    return append(german ? u"S" : u"X", 2);
  }
  if (at(_pos, anyOf<u"SIO", u"SIA">) || at(_pos, anyOf<u"SIAN">)) {
    return slavoGermanic() ? append(u"S", 3) : append(u"S", u"X", 3);
  }
  const bool beforeZ = at(_pos + 1, anyOf<u"Z">);
  if ((isFirstLetter() && at(2, anyOf<u"M", u"N", u"L", u"W">)) || beforeZ) {
    return append(u"S", u"X", beforeZ ? 2 : 1);
  }
  if (at(_pos, anyOf<u"SC">)) {
    return sc();
  }
  const int dealtWith = at(_pos + 1, anyOf<u"S", u"Z">) ? 2 : 1;
  // Never holds: no letter stands at the length, so that a final French S is heard.
  if (_pos == _length && at(_pos - 2, anyOf<u"AI", u"OI">)) {
    return append(u"", u"S", dealtWith);
  }
  return append(u"S", dealtWith);
}

int LetterRules::sc() {
  if (next(2) == u'H') {
    if (at(_pos + 3, anyOf<u"OO", u"ER", u"EN", u"UY", u"ED", u"EM">)) {
      return at(_pos + 3, anyOf<u"ER", u"EN">) ? append(u"X", u"SK", 3) : append(u"SK", 3);
    }
    // Position 3 is this very H, so that only the first condition decides.
    if (isFirstLetter() && !vowelAt(3) && unitAt(3) != u'W') {
      return append(u"X", u"S", 3);
    }
    return append(u"X", 3);
  }
  return append(at(_pos + 2, anyOf<u"I", u"E", u"Y">) ? u"S" : u"SK", 3);
}

int LetterRules::letterT() {
  if (at(_pos, anyOf<u"TION">) || at(_pos, anyOf<u"TIA", u"TCH">)) {
    return append(u"X", 3);
  }
  if (at(_pos, anyOf<u"TH">) || at(_pos, anyOf<u"TTH">)) {
    if (at(_pos + 2, anyOf<u"OM", u"AM">)) {
      return append(u"T", 2);
    }
    // Never holds: position 0 is padding.
    if (at(0, anyOf<u"VAN ", u"VON ">) || at(0, anyOf<u"SCH">)) {
      return append(u"T", 2);
    }
    return append(u"0", u"T", 2);
  }
  return append(u"T", at(_pos + 1, anyOf<u"T", u"D">) ? 2 : 1);
}

int LetterRules::letterV() { return append(u"F", next(1) == u'V' ? 2 : 1); }

int LetterRules::letterW() {
  if (at(_pos, anyOf<u"WR">)) {
    return append(u"R", 2);
  }
  if (isFirstLetter()) {
    firstW();
  }
  // Never holds: no letter stands at the length.
  if (_pos == _length && vowelAt(_pos - 1)) {
    return append(u"", u"F", 1);
  }
  if (at(_pos - 1, anyOf<u"EWSKI", u"EWSKY", u"OWSKI", u"OWSKY">)) {
    return append(u"", u"F", 1);
  }
  // Never holds: position 0 is padding.
  if (at(0, anyOf<u"SCH">)) {
    return append(u"", u"F", 1);
  }
  if (at(_pos, anyOf<u"WICZ", u"WITZ">)) {
    return append(u"TS", u"FX", 4);
  }
  return 1;
}

void LetterRules::firstW() {
  if (vowelAt(2)) {
    append(u"A", u"F", 0);
  } else if (at(1, anyOf<u"WH">)) {
    append(u"A", 0);
  }
}

int LetterRules::letterX() {
  const int dealtWith = at(_pos + 1, anyOf<u"C", u"X">) ? 2 : 1;
  // Never holds: no letter stands at the length, so that a final French X is heard.
  if (_pos == _length &&
      (at(_pos - 3, anyOf<u"IAU", u"EAU">) || at(_pos - 2, anyOf<u"AU", u"OU">))) {
    return dealtWith;
  }
  return append(u"KS", dealtWith);
}

int LetterRules::letterZ() {
  if (next(1) == u'H') {
    return append(u"J", 2);
  }
  const int dealtWith = next(1) == u'Z' ? 2 : 1;
  if (at(_pos + 1, anyOf<u"ZO", u"ZI", u"ZA">)) {
    return append(u"S", u"TS", dealtWith);
  }
  if (slavoGermanic()) {
    return unitAt(_pos - 1) == u'T' ? append(u"S", dealtWith) : append(u"S", u"TS", dealtWith);
  }
  return append(u"S", dealtWith);
}

}  // namespace wordcatcher
