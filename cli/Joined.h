#ifndef WORDCATCHER_CLI_JOINED_H
#define WORDCATCHER_CLI_JOINED_H

#include <string>
#include <vector>

namespace wordcatcher::cli {

/// The parts with the separator between.
inline std::string joined(const std::vector<std::string>& parts, const std::string& separator) {
  std::string whole;
  for (const auto& part : parts) {
    whole += (&part == &parts.front() ? "" : separator) + part;
  }
  return whole;
}

}  // namespace wordcatcher::cli

#endif
