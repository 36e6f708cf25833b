#ifndef WORDCATCHER_MATCHER_SENTENCES_H
#define WORDCATCHER_MATCHER_SENTENCES_H

#include <concepts>
#include <string>
#include <string_view>

#include "wordcatcher/matcher/Find.h"

namespace wordcatcher {

// What the sentences of explanations are made of.

inline std::string inQuotes(std::string_view word) { return '"' + std::string(word) + '"'; }

/// A number with its noun: 1 edit, 2 edits.
template <std::integral Number>
std::string counted(Number number, std::string_view noun) {
  return std::to_string(number) + ' ' + std::string(noun) + (number == 1 ? "" : "s");
}

/// A word of a text as people know it: a code stands behind the word that it is of.
inline std::string shown(const FindExplanation::TextWord& word) {
  return word.written.empty() ? word.word : word.written + " (" + word.word + ')';
}

}  // namespace wordcatcher

#endif
