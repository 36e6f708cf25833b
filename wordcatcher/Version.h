#ifndef WORDCATCHER_VERSION_H
#define WORDCATCHER_VERSION_H

#include "wordcatcher/Export.h"

/// Everything of Wordcatcher for C++. For new hosts: IndexBuilder and Index. The classes whose
/// names begin with KX, LX and PLX, and TinyCDB, are the classic interface.
namespace wordcatcher {

/// Version of the library that is loaded, as major.minor: 1.0 for every 1.0.x.
extern WORDCATCHER_EXPORT const double versionNumber;

/// Version of the library that is loaded, as "major.minor.patch".
extern WORDCATCHER_EXPORT const char* const versionString;

}  // namespace wordcatcher

#endif
