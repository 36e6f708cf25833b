#ifndef WORDCATCHER_TESTS_TESTSUPPORT_H
#define WORDCATCHER_TESTS_TESTSUPPORT_H

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/log/LogSink.h"

namespace wordcatcher::testing {

/// A directory of the test's own, removed with everything in it. path() ends in "/".
class TemporaryDirectory {
 public:
  TemporaryDirectory();
  ~TemporaryDirectory();
  TemporaryDirectory(const TemporaryDirectory&) = delete;
  TemporaryDirectory& operator=(const TemporaryDirectory&) = delete;

  const std::string& path() const noexcept { return _path; }
  std::string file(std::string_view name) const { return _path + std::string(name); }

 private:
  std::string _path;
};

/// Collects the library's log lines while it lives; elsewhere the tests run in silence.
class LogCapture final : public LogSink {
 public:
  LogCapture() : _previous(setLogSink(this)) {}
  ~LogCapture() override { setLogSink(_previous); }

  void write(std::string_view line) noexcept override { _lines.emplace_back(line); }

  const std::vector<std::string>& lines() const noexcept { return _lines; }
  void clear() { _lines.clear(); }

 private:
  LogSink* _previous;
  std::vector<std::string> _lines;
};

std::string readFile(const std::string& path);
void writeFile(const std::string& path, std::string_view bytes);

/// Standard output of a shell command; fails the test when the command does.
std::string outputOf(const std::string& command);

}  // namespace wordcatcher::testing

#endif
