#ifndef WORDCATCHER_CLI_ANSWERS_H
#define WORDCATCHER_CLI_ANSWERS_H

#include <string>

#include "cli/OpenIndex.h"
#include "cli/Output.h"

namespace wordcatcher::cli {

/// Writes what the index answered to one question, in the form that was asked for, and returns
/// whether there was a match. JSON says itself that an answer was cut; for people it is a note on
/// standard error.
template <typename Result>
bool writeAnswer(Output& output, const Result& result, const std::string& lines, bool json) {
  output.write(lines);
  if (result.truncated && !json) {
    noteTruncated();
  }
  return !result.matches.empty();
}

}  // namespace wordcatcher::cli

#endif
