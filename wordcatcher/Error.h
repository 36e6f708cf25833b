#ifndef WORDCATCHER_ERROR_H
#define WORDCATCHER_ERROR_H

#include <stdexcept>
#include <string>

#include "wordcatcher/Export.h"

namespace wordcatcher {

/// What went wrong, for a host that reacts; the sentence is for people.
enum class ErrorCode {
  notFound = 1,     ///< There is no such file or directory.
  notReadable = 2,  ///< The file exists and cannot be read or mapped.
  notWritable = 3,  ///< The target cannot be written; what stood there is whole.
  notAnIndex = 4,   ///< The file is something else, or of a version that this library cannot read.
  damaged = 5,      ///< The file was an index and is cut short or altered.
  badInput = 6,     ///< A phrase, a text or an option that cannot be taken.
  tooLarge = 7,     ///< More than the format can count.
};

/// The one exception of the interfaces for new hosts. what() is a sentence that says what to do.
class WORDCATCHER_EXPORT Error : public std::runtime_error {
 public:
  /// An error with its sentence, which what() returns.
  Error(ErrorCode code, const std::string& sentence) : std::runtime_error(sentence), _code(code) {}

  /// What went wrong, to be told apart by programs.
  ErrorCode code() const noexcept { return _code; }

 private:
  ErrorCode _code;
};

}  // namespace wordcatcher

#endif
