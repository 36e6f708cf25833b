#include "wordcatcher/phonetic/LetterRules.h"

namespace wordcatcher {

void LetterRules::run() {
  for (_pos = startPosition(); _pos < _length;) {
    _pos += anyCharacter(unitAt(_pos));
  }
}

std::int32_t LetterRules::startPosition() {
  // Both checks look at the padding before the word and never hold: silent first letters are
  // encoded like any other, and a first X is left to its own rule.
  std::int32_t start = at(0, anyOf<u"GN", u"KN", u"PN", u"WR", u"PS">) ? 1 : 0;
  if (unitAt(0) == u'X') {
    start += append(u"S", 1);
  }
  return start;
}

int LetterRules::anyCharacter(char16_t character) {
  switch (character) {
    case u' ':
      return append(u" ", 1);
    case u'A':
    case u'E':
    case u'I':
    case u'O':
    case u'U':
    case u'Y':
      return vowel();
    case u'B':
      return letterB();
    case u'C':
      return letterC();
    case u'D':
      return letterD();
    case u'F':
      return letterF();
    case u'G':
      return letterG();
    case u'H':
      return letterH();
    case u'J':
      return letterJ();
    case u'K':
      return letterK();
    case u'L':
      return letterL();
    case u'M':
      return letterM();
    case u'N':
      return letterN();
    case u'P':
      return letterP();
    case u'Q':
      return letterQ();
    case u'R':
      return letterR();
    case u'S':
      return letterS();
    case u'T':
      return letterT();
    case u'V':
      return letterV();
    case u'W':
      return letterW();
    case u'X':
      return letterX();
    case u'Z':
      return letterZ();
    case u'Ç':
      return append(u"S", 1);
    case u'Ñ':
      return append(u"N", 1);
    default:
      return 1;
  }
}

int LetterRules::vowel() { return isFirstLetter() ? append(u"A", 1) : 1; }

bool LetterRules::slavoGermanic() {
  if (!_slavoGermanicWord) {
    _slavoGermanicWord = _slavoGermanic(_word);
  }
  return *_slavoGermanicWord;
}

}  // namespace wordcatcher
