#include "cli/Highlight.h"

#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <vector>

namespace wordcatcher::cli {

namespace {

constexpr const char* kPlain = nullptr;
constexpr const char* kExact = "\x1b[32m";
constexpr const char* kEdited = "\x1b[33m";
constexpr const char* kReset = "\x1b[0m";

/// The colour of each byte of the text.
std::vector<const char*> colours(std::size_t bytes, const FindResult& result) {
  std::vector<const char*> colours(bytes, kPlain);
  for (const auto& match : result.matches) {
    for (const auto& hit : match.hits) {
      for (std::size_t i = hit.begin; i < std::min(hit.end, bytes); ++i) {
        if (colours[i] == kPlain) {
          colours[i] = hit.edits == 0 ? kExact : kEdited;
        }
      }
    }
  }
  return colours;
}

}  // namespace

std::string highlighted(std::string_view text, const FindResult& result) {
  const auto each = colours(text.size(), result);
  std::string shown;
  const char* current = kPlain;
  const auto change = [&](const char* colour) {
    if (colour != current) {
      shown += colour == kPlain ? kReset : colour;
      current = colour;
    }
  };
  for (std::size_t i = 0; i < text.size(); ++i) {
    change(each[i]);
    shown += text[i];
  }
  change(kPlain);
  return shown;
}

bool wantsColor() {
  const char* const refused = std::getenv("NO_COLOR");
  return isatty(STDOUT_FILENO) == 1 && (refused == nullptr || *refused == '\0');
}

}  // namespace wordcatcher::cli
