#ifndef WORDCATCHER_C_OPTIONS_H
#define WORDCATCHER_C_OPTIONS_H

#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/wordcatcher.h"

namespace wordcatcher::c {

/// A C struct of options as the C++ one. Null stands for all defaults. Throw Error (badInput) for
/// values that do not exist and for members that this library does not know.
Index::Options openOptionsOf(const wordcatcher_open_options* options);
MatchingMode modeOf(const wordcatcher_open_options* options);
FindOptions findOptionsOf(const wordcatcher_find_options* options);
IndexBuilder::Options builderOptionsOf(const wordcatcher_builder_options* options);

}  // namespace wordcatcher::c

#endif
