#ifndef WORDCATCHER_CLI_HIGHLIGHT_H
#define WORDCATCHER_CLI_HIGHLIGHT_H

#include <string>
#include <string_view>

#include "wordcatcher/matcher/Find.h"

namespace wordcatcher::cli {

/// The text with the words that were found in it in colour, as a terminal takes it: green where
/// they stand as stored, yellow where they needed edits. A word of several matches has the colour
/// of the best one.
std::string highlighted(std::string_view text, const FindResult& result);

/// Whether a terminal shows standard output, and its user did not ask for a life without colours
/// (https://no-color.org).
bool wantsColor();

}  // namespace wordcatcher::cli

#endif
