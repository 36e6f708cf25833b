#ifndef WORDCATCHER_TESTS_HOSTILEFIND_H
#define WORDCATCHER_TESTS_HOSTILEFIND_H

#include <cstdint>
#include <string_view>

#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher::testing {

/// Queries an image of any content for a text, in both ways: whether no more is found than the
/// image has. Throws Error as they do.
bool queriesWithinBounds(const SearchImage& image, std::u16string_view text, std::int64_t edits);

/// Finds the phrases of a text in an image of any content, and explains the first: whether what
/// they say stays within the text and the image. Throws Error as they do.
bool findsWithinBounds(const SearchImage& image, std::u16string_view text, std::int64_t edits);

}  // namespace wordcatcher::testing

#endif
