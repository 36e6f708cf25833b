#ifndef WORDCATCHER_TESTS_LITERALSEARCH_H
#define WORDCATCHER_TESTS_LITERALSEARCH_H

#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "wordcatcher/fuzzy/LXFuzzyMatch.h"
#include "wordcatcher/storage/PLXDFA.h"

namespace wordcatcher::testing {

/// The yardstick of searches: builds the query's automaton, makes it deterministic, and walks it in
/// step with the prefix tree in the tables, look-up by look-up. The automaton must be open for
/// reading.
std::vector<LXFuzzyMatch> literalSearch(PLXDFA& tree, std::optional<std::u16string_view> query,
                                        std::int64_t maxDistance);

}  // namespace wordcatcher::testing

#endif
