#ifndef WORDCATCHER_CLI_COUNTED_H
#define WORDCATCHER_CLI_COUNTED_H

#include <cstdint>
#include <string>

namespace wordcatcher::cli {

/// A number with its noun: 1 phrase, 2 phrases.
inline std::string counted(std::uint64_t number, const std::string& noun) {
  return std::to_string(number) + ' ' + noun + (number == 1 ? "" : "s");
}

}  // namespace wordcatcher::cli

#endif
