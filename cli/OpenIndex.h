#ifndef WORDCATCHER_CLI_OPENINDEX_H
#define WORDCATCHER_CLI_OPENINDEX_H

#include <optional>
#include <string>
#include <vector>

#include "wordcatcher/matcher/Index.h"

namespace wordcatcher::cli {

/// Whether this names a classic index, which is a directory; a search image is a file.
bool namesDirectory(const std::string& name);

/// Opens a search image, or a classic index, whose tables are locked while they are read; it says
/// on standard error when that waits for another process. `verbose` copies the tables' storage log
/// to standard error.
///
/// `mode` is how a classic index is queried, words when it is empty. A search image remembers its
/// mode, and another one is a Failure. Failure or Error when the index cannot be read.
Index openIndex(const std::string& name, std::optional<MatchingMode> mode, bool verbose);

/// Failure if there is no file `name`, but one of the `others` is an index: then they stand in the
/// wrong order.
void checkIndexComesFirst(const std::string& name, const std::vector<std::string>& others);

/// Says on standard error that the limits of a query cut the answer to a text or word.
void noteTruncated();

}  // namespace wordcatcher::cli

#endif
