#ifndef WORDCATCHER_CLI_LOCKWATCHER_H
#define WORDCATCHER_CLI_LOCKWATCHER_H

#include <condition_variable>
#include <mutex>
#include <thread>

namespace wordcatcher::cli {

class IndexDirectory;

/// Watches from a thread of its own, while it lives, how the library opens the tables. The library
/// waits for a table's lock without a word; after two seconds at one table the watcher says on
/// standard error which file is being waited for, once a file.
class LockWatcher {
 public:
  /// `directory` must outlive the watcher.
  explicit LockWatcher(const IndexDirectory& directory);
  ~LockWatcher() = default;
  LockWatcher(const LockWatcher&) = delete;
  LockWatcher& operator=(const LockWatcher&) = delete;

 private:
  void watch(const std::stop_token& stop);

  const IndexDirectory& _directory;
  std::mutex _mutex;
  std::condition_variable_any _wake;
  // Last, so that it has ended before what it uses goes.
  std::jthread _thread;
};

}  // namespace wordcatcher::cli

#endif
