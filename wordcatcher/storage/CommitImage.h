#ifndef WORDCATCHER_STORAGE_COMMITIMAGE_H
#define WORDCATCHER_STORAGE_COMMITIMAGE_H

#include <cstddef>
#include <span>
#include <string>

#include "wordcatcher/storage/FileSystem.h"

namespace wordcatcher {

/// Replaces the file at `path` in one step, or makes it: the bytes go to a temporary file beside
/// it, which is synced and renamed over it, and the directory is synced. A power failure at any
/// time leaves the old file or the new one, whole; so does the end of the process.
///
/// Throws Error (notWritable) with the target as it was and no other file left. One exception: when
/// the last step, the sync of the directory, fails and the old file cannot be put back either, the
/// new one stays, whole; the sentence says so. It can be put back on every file system that has
/// hard links.
///
/// A process that is killed meanwhile may leave files named ".NAME-HEX.tmp" and ".NAME-HEX.old"
/// beside the target, which nobody reads and anybody may delete.
void commitImage(FileSystem& files, const std::string& path, std::span<const std::byte> bytes);

}  // namespace wordcatcher

#endif
