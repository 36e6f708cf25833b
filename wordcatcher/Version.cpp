#include "wordcatcher/Version.h"

namespace wordcatcher {

const double versionNumber = WORDCATCHER_VERSION_NUMBER;
const char* const versionString = WORDCATCHER_VERSION_STRING;

}  // namespace wordcatcher
