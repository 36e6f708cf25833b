#ifndef WORDCATCHER_CLI_NEWIMAGE_H
#define WORDCATCHER_CLI_NEWIMAGE_H

#include <sys/stat.h>

#include <cstdint>
#include <mutex>
#include <optional>
#include <string>

#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::cli {

/// The image file that an indexing run writes, and how to take back what an interrupted one leaves
/// beside it: the library writes to ".NAME-HEX.tmp", and for a moment gives the old image the
/// second name ".NAME-HEX.old". Only this run's files go: the one that the process has open, and
/// the one that is the old image. For some microseconds the library has the new file closed and not
/// yet renamed; an interrupt gives it 0.2 seconds then, whereupon the new image stands in its
/// place. What stays even so nobody reads, and anybody may delete.
///
/// Thread safety: discardForGood() may come from another thread at any time.
class NewImage {
 public:
  explicit NewImage(std::string target);

  /// Commits the builder, which writes to the target; returns the bytes of the image.
  std::uint64_t write(IndexBuilder& builder);

  /// Takes back what is not finished and keeps write() from returning: the process is about to end.
  void discardForGood();

 private:
  enum class Met { nothing, others, ours };

  Met discardOnce() const;
  bool isOurs(const struct stat& status) const;

  std::string _target;
  std::optional<struct stat> _old;
  std::mutex _returning;
};

}  // namespace wordcatcher::cli

#endif
