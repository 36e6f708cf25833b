#ifndef WORDCATCHER_TESTS_FINDSUPPORT_H
#define WORDCATCHER_TESTS_FINDSUPPORT_H

#include <string>
#include <utility>
#include <vector>

#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::testing {

/// Phrases with their data strings.
using Entries = std::vector<std::pair<std::string, std::string>>;

/// An index of these, open though its file is gone.
Index indexOf(const Entries& entries, MatchingMode mode = MatchingMode::words,
              const Index::Options& options = {});

/// An index in which every phrase is its own data string.
Index indexOfPhrases(const std::vector<std::string>& phrases,
                     MatchingMode mode = MatchingMode::words, const Index::Options& options = {});

/// One line a match, for comparisons that tell what differs: value, cost and hits.
std::vector<std::string> linesOf(const std::vector<FoundPhrase>& matches);

/// Options that cut nothing off.
FindOptions unlimited();

/// The values of the matches, in order.
std::vector<std::string> valuesOf(const FindResult& result);

}  // namespace wordcatcher::testing

#endif
