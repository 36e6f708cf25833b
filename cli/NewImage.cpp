#include "cli/NewImage.h"

#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <system_error>
#include <thread>
#include <utility>

namespace wordcatcher::cli {

namespace {

namespace fs = std::filesystem;

// Longer names are cut in the name of a temporary file.
constexpr std::size_t kCommonNameBytes = 100;

// Links to the files that this process has open.
constexpr const char* kOpenFiles = "/proc/self/fd";

bool isSameFile(const struct stat& a, const struct stat& b) {
  return a.st_dev == b.st_dev && a.st_ino == b.st_ino;
}

/// Files that come and go meanwhile are no errors.
template <typename Visit>
void visitFiles(const fs::path& directory, const Visit& visit) {
  std::error_code error;
  for (fs::directory_iterator files(directory, error), end; !error && files != end;
       files.increment(error)) {
    visit(files->path());
  }
}

bool isOpen(const struct stat& status) {
  bool found = false;
  visitFiles(kOpenFiles, [&](const fs::path& descriptor) {
    struct stat open {};
    found |= stat(descriptor.c_str(), &open) == 0 && isSameFile(open, status);
  });
  return found;
}

}  // namespace

NewImage::NewImage(std::string target) : _target(std::move(target)) {
  struct stat status {};
  if (stat(_target.c_str(), &status) == 0) {
    _old = status;
  }
}

std::uint64_t NewImage::write(IndexBuilder& builder) {
  try {
    const std::uint64_t bytes = builder.commit();
    const std::lock_guard waitForTheEnd(_returning);
    return bytes;
  } catch (...) {
    // The failure may come from what discardForGood() took away.
    const std::lock_guard waitForTheEnd(_returning);
    throw;
  }
}

void NewImage::discardForGood() {
  std::unique_lock lock(_returning);
  // Writing goes on meanwhile. It may just be about to make its second file beside the target, or
  // to rename the first one, which it has closed: for that moment it looks like another run's file.
  constexpr auto kOneStep = std::chrono::milliseconds(10);
  constexpr int kSteps = 20;
  // A file made while the directory is read may be missed, so that one look without any is not
  // enough.
  constexpr int kQuietSteps = 2;
  int quiet = 0;
  for (int step = 0; step < kSteps && quiet < kQuietSteps; ++step) {
    const Met met = discardOnce();
    quiet = met == Met::nothing ? quiet + 1 : 0;
    if (met == Met::ours) {
      step = 0;
    }
    std::this_thread::sleep_for(kOneStep);
  }
  lock.release();
}

/// What there was; what was ours is taken away.
NewImage::Met NewImage::discardOnce() const {
  Met met = Met::nothing;
  const fs::path target(_target);
  const std::string stem = '.' + target.filename().string().substr(0, kCommonNameBytes);
  visitFiles(target.has_parent_path() ? target.parent_path() : ".", [&](const fs::path& path) {
    const std::string extension = path.extension();
    struct stat status {};
    if ((extension != ".tmp" && extension != ".old") ||
        !path.filename().string().starts_with(stem) || lstat(path.c_str(), &status) != 0 ||
        !S_ISREG(status.st_mode)) {
      return;
    }
    if (isOurs(status) && unlink(path.c_str()) == 0) {
      met = Met::ours;
    } else if (met == Met::nothing) {
      met = Met::others;
    }
  });
  return met;
}

bool NewImage::isOurs(const struct stat& status) const {
  return (_old && isSameFile(*_old, status)) || isOpen(status);
}

}  // namespace wordcatcher::cli
