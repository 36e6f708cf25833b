#ifndef WORDCATCHER_TESTS_REALWORDS_H
#define WORDCATCHER_TESTS_REALWORDS_H

#include <cstddef>
#include <random>
#include <string>
#include <string_view>
#include <vector>

namespace wordcatcher::testing {

/// The 147,306 lemmas of WordNet, words and terms of several words, as Debian's wordnet-base has
/// them: lower-case, sorted. Throws std::runtime_error when the package is not installed.
const std::vector<std::u16string>& lemmas();

/// Up to `count` different ones of these, in their order.
std::vector<std::u16string> sample(const std::vector<std::u16string>& all, std::size_t count,
                                   std::mt19937& random);

/// The text after one insertion, deletion or replacement of a small letter anywhere. It must not be
/// empty.
std::u16string edited(std::u16string text, std::mt19937& random);

/// A phrase as people ask for it: each word of more than 4 letters edited with probability 0.5, and
/// one of `extraWords` somewhere with probability 0.3.
std::u16string misspelled(std::u16string_view phrase, const std::vector<std::u16string>& extraWords,
                          std::mt19937& random);

/// The parts of a text between its spaces.
std::vector<std::u16string> spacedWords(std::u16string_view text);

}  // namespace wordcatcher::testing

#endif
