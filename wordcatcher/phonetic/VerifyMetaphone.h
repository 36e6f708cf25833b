#ifndef WORDCATCHER_PHONETIC_VERIFYMETAPHONE_H
#define WORDCATCHER_PHONETIC_VERIFYMETAPHONE_H

#include <cstdio>
#include <string>

#include "wordcatcher/Export.h"

namespace wordcatcher {

/// Holds the phonetic encoder against a file of expectations and writes one line per word to the
/// log (see LogSink):
///
///     pass: "smith" -> "SM0" == "SM0"
///
/// Each line of the file is a word, a comma and the code expected of it; further fields are
/// ignored. The verdict is "pass" when the word's code, without the spaces around it, contains the
/// expected one, so that an empty expectation always passes, and "FAIL" otherwise. The word may be
/// a text of several words.
///
/// `expectations` is open for reading, read from where it stands to its end, and not closed. The
/// last line must not end with a newline: the empty line that would follow has no expectation.
///
/// Throws std::runtime_error, whose text tells which line (counted from 1 as
/// readLineAsKXString() delivers them) and what to do about it, when a line has no comma, is not
/// UTF-8 (see there for lines of 4,095 bytes and more), or cannot be read. The lines before it have
/// had their verdicts.
///
/// Thread safety: one thread at a time for one stream.
WORDCATCHER_EXPORT void verifyMetaphone(std::FILE* expectations);

/// The next line of a UTF-8 stream, without its newline; empty if nothing could be read. The next
/// line is only reached if this one is not empty: an empty line stays in the stream.
///
/// Lines are read in pieces of 4,095 bytes. The byte after each full piece is dropped; if that is
/// the line's own newline, the following line is joined to it; if it is one of several bytes of a
/// character, what remains of the character becomes U+FFFD, and so does all else in such a line
/// that is not UTF-8. A NUL byte hides the rest of its piece. Lines below 4,095 bytes are read as
/// they are.
///
/// Throws std::runtime_error if the bytes of a line below 4,095 bytes are not UTF-8, and
/// std::length_error for a line of more than 2,147,483,647 bytes.
WORDCATCHER_EXPORT std::u16string readLineAsKXString(std::FILE* stream);

}  // namespace wordcatcher

#endif
