#ifndef WORDCATCHER_STORAGE_TABLEFILE_H
#define WORDCATCHER_STORAGE_TABLEFILE_H

#include <sys/types.h>

#include <cstdint>

namespace wordcatcher {

// The modes in which a table is open.
inline constexpr std::int32_t kReading = 1;
inline constexpr std::int32_t kWriting = 2;

/// Those of a new file, less the creation mask.
inline constexpr mode_t kPermissions = 0666;

/// The table of contents at the start of every cdb file.
inline constexpr unsigned kHeaderBytes = 2048;

}  // namespace wordcatcher

#endif
