#ifndef WORDCATCHER_TESTS_EDITDISTANCEYARDSTICK_H
#define WORDCATCHER_TESTS_EDITDISTANCEYARDSTICK_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace wordcatcher::testing {

/// The distance at which a search for `query` finds `stored`, or nothing beyond `maxDistance`: the
/// textbook table of edit distances, with three changes. The query's first characters cannot be
/// left out before something is read; a "*" of the query equals any character; a "_" of the query
/// costs nothing to leave out and equals no character.
std::optional<std::int64_t> searchDistance(std::u16string_view query, std::u16string_view stored,
                                           std::int64_t maxDistance);

/// Whether a stored string can be reached at all: not when a code unit of it has no UTF-8 form.
bool reachable(std::u16string_view stored);

}  // namespace wordcatcher::testing

#endif
