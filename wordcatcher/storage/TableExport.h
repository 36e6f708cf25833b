#ifndef WORDCATCHER_STORAGE_TABLEEXPORT_H
#define WORDCATCHER_STORAGE_TABLEEXPORT_H

#include <string>

#include "wordcatcher/storage/SearchImageWriter.h"

namespace wordcatcher {

/// Writes the three table files of a classic index, whose names begin with `prefix`, of the words
/// and values that a search image holds; a classic index answers from them as if the same phrases
/// had been added to it. Each edge and each final mark is stored once, where LXFuzzyIndex stores
/// one for each adding call: finishing a table takes time quadratic in the records under one key.
///
/// The files are read back and synced. Throws Error (notWritable) when they do not hold what was
/// written; what stood there before is lost then.
void exportTables(const std::string& prefix, const SearchImageWriter::Content& content);

}  // namespace wordcatcher

#endif
