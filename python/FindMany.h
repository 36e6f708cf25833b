#ifndef WORDCATCHER_PYTHON_FINDMANY_H
#define WORDCATCHER_PYTHON_FINDMANY_H

#include <functional>
#include <string>
#include <vector>

#include "wordcatcher/matcher/Index.h"

namespace wordcatcher::python {

/// What Index::find gives for each text, in the order of the texts, with offsets in code points.
/// Knows nothing of Python, whose lock the caller has to have given up.
///
/// `threads`, at least 1, counts the calling one, which works as well and calls `pause` several
/// times a second. What a thread or `pause` throws ends the work and is thrown again here.
std::vector<FindResult> findMany(const Index& index, const std::vector<std::string>& texts,
                                 const FindOptions& options, std::size_t threads,
                                 const std::function<void()>& pause);

}  // namespace wordcatcher::python

#endif
