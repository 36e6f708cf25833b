#ifndef WORDCATCHER_TESTS_HOSTILEFIND_H
#define WORDCATCHER_TESTS_HOSTILEFIND_H

#include <cstdint>
#include <string>
#include <string_view>

#include "ForgedImage.h"
#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher::testing {

/// Queries an image of any content for a text, in both ways: whether no more is found than the
/// image has. Throws Error as they do.
bool queriesWithinBounds(const SearchImage& image, std::u16string_view text, std::int64_t edits);

/// Finds the phrases of a text in an image of any content, and explains the first: whether what
/// they say stays within the text and the image. Throws Error as they do.
bool findsWithinBounds(const SearchImage& image, std::u16string_view text, std::int64_t edits);

/// The bytes of an image, opened as a host does. They are copied: a sanitizer sees what is read
/// beyond them. Throws Error as Index::open does.
Index openIndex(const ImageBytes& bytes, Index::Options options = {});

/// What an index is asked.
struct Question {
  std::string text;
  std::string value;  // which is explained, beside those that are found
  FindOptions options;
};

/// Asks find(), explain(), query() and explainQuery(): what is wrong with what they say, if
/// anything is, and an empty string else. `isWhole`: verify() finds no damage; only then must they
/// agree with one another. Throws Error as they do.
std::string faultOfAnswers(const Index& index, const Question& question, bool isWhole);

}  // namespace wordcatcher::testing

#endif
