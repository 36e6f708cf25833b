#include "EditDistanceYardstick.h"

#include <algorithm>
#include <vector>

namespace wordcatcher::testing {

std::optional<std::int64_t> searchDistance(std::u16string_view query, std::u16string_view stored,
                                           std::int64_t maxDistance) {
  if (query.empty() || stored.empty() || maxDistance < 0) {
    return std::nullopt;
  }
  constexpr std::int64_t kUnreachable = 1'000'000'000;
  // One column a stored character read; row i is the cost with i characters of the query used up.
  std::vector<std::int64_t> column(query.size() + 1, kUnreachable);
  column[0] = 0;
  for (const char16_t symbol : stored) {
    std::vector<std::int64_t> next(query.size() + 1, kUnreachable);
    next[0] = column[0] + 1;
    for (std::size_t i = 1; i <= query.size(); ++i) {
      const char16_t wanted = query[i - 1];
      const bool equal = wanted == u'*' || (wanted == symbol && wanted != u'_');
      const std::int64_t replaced = column[i - 1] + (equal ? 0 : 1);
      const std::int64_t extra = column[i] + 1;
      const std::int64_t missing = next[i - 1] + (wanted == u'_' ? 0 : 1);
      next[i] = std::min({replaced, extra, missing});
    }
    column = std::move(next);
  }
  return column.back() <= maxDistance ? std::optional(column.back()) : std::nullopt;
}

bool reachable(std::u16string_view stored) {
  return std::none_of(stored.begin(), stored.end(),
                      [](char16_t unit) { return unit >= 0xD800 && unit <= 0xDFFF; });
}

}  // namespace wordcatcher::testing
