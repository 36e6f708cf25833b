#ifndef WORDCATCHER_PHONETIC_KXMETAPHONE_H
#define WORDCATCHER_PHONETIC_KXMETAPHONE_H

#include <memory>
#include <string>
#include <string_view>

#include "wordcatcher/Export.h"

namespace wordcatcher {

class WordSegmenter;

/// Turns words into codes of their English sound, so that words that sound alike get equal codes:
/// *Catherine* and *Kathryn* are both K0RN. It knows the spellings of many languages' names; the
/// page docs/phonetics.md tells what its codes mean.
///
/// A code holds the letters A, F, H, J, K, L, M, N, P, R, S, T and X, the digit 0 for the sound of
/// TH, and spaces; at most two letters for each letter of the upper-cased word. A code is as long
/// as its word needs. Characters that no rule knows add nothing; digits neither.
///
/// While it runs the encoder keeps a second code, of another way to say the word; it is thrown away
/// at the end of each word and never returned.
///
/// Words beyond 65,533 code units (upper-cased, without punctuation) are encoded only in part: with
/// a space on either side, a word's length is counted modulo 65,536, and the code ends there; it is
/// empty if nothing remains.
///
/// After an exception the buffers may hold a part of a code; reset() empties them.
///
/// Thread safety: one thread at a time, also for different texts.
class WORDCATCHER_EXPORT KXMetaphone {
 public:
  /// Loads the word-boundary rules, which takes far longer than encoding a word: keep the encoder.
  /// Throws std::runtime_error if ICU's data, which holds them, is missing.
  KXMetaphone();

  /// The same, with a copy of rules that are loaded already, at a tenth of the cost. Several
  /// threads may make theirs from the same rules while nobody uses these.
  explicit KXMetaphone(const WordSegmenter& rules);

  ~KXMetaphone();
  KXMetaphone(const KXMetaphone&) = delete;
  KXMetaphone& operator=(const KXMetaphone&) = delete;

  /// The codes of the text's words in text order, each followed by a space. A code begins with a
  /// space of its own and usually ends with one, so codes stand several spaces apart: split the
  /// result into words, do not count spaces. Words are those of the Unicode word-boundary rules
  /// (UAX #29); a text without words gives the empty string. Linear in the text.
  ///
  /// Throws std::length_error, before it encodes anything, if the text is longer than
  /// 2,147,483,647 code units, and when it comes to a word whose upper-case form is;
  /// std::runtime_error if ICU cannot walk the text.
  std::u16string translate(std::u16string_view text);

  /// The code of one word: punctuation (the Unicode category P) is taken out, the rest upper-cased
  /// by the root locale's full mapping and read with a space before and after it. Both spaces add
  /// themselves to the code, unless the last letter's rule passes over the one at the end. Whatever
  /// _append() left in the buffers comes first. Leaves the buffers empty, except for a word whose
  /// padded length is a multiple of 65,536, which gives the empty string and touches nothing.
  /// Linear in the word.
  ///
  /// Throws std::length_error if the word or its upper-case form is longer than 2,147,483,647 code
  /// units; the buffers are then as they were.
  std::u16string _translateWord(std::u16string_view word);

  /// Adds to the code of the word that is being encoded, and to its alternate code.
  void _append(std::u16string_view code) { _append_alt(code, code); }

  /// Adds `primary` to the code of the word that is being encoded, `alternate` to its alternate
  /// code.
  void _append_alt(std::u16string_view primary, std::u16string_view alternate) {
    // Letter by letter: a rule adds one or two, for which appending a string takes twice as long.
    for (const char16_t letter : primary) {
      _primary.push_back(letter);
    }
    for (const char16_t letter : alternate) {
      _secondary.push_back(letter);
    }
  }

  /// Empties both buffers.
  void reset();

 private:
  bool encode(std::u16string_view word);
  const std::u16string& code() const noexcept { return _isAlternate ? _secondary : _primary; }

  std::u16string _primary;
  std::u16string _secondary;
  // Which buffer a word's code is taken from. Nothing sets it: callers compare primary codes only.
  bool _isAlternate = false;
  // Where the word that is being encoded stands, kept for the next one.
  std::u16string _memory;
  std::unique_ptr<WordSegmenter> _segmenter;
};

}  // namespace wordcatcher

#endif
