#ifndef WORDCATCHER_CLI_SUBSTITUTES_H
#define WORDCATCHER_CLI_SUBSTITUTES_H

#include <string>

namespace wordcatcher::cli {

/// The bytes with U+001A, the control character SUBSTITUTE, in place of each byte that is no part
/// of well-formed UTF-8: UTF-8 of the same length, so that offsets stay what they are.
std::string withSubstitutes(std::string bytes);

}  // namespace wordcatcher::cli

#endif
