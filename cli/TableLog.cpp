#include "cli/TableLog.h"

#include <cerrno>
#include <iostream>

namespace wordcatcher::cli {

namespace {

bool tellsOfFailure(std::string_view pattern) {
  return pattern != "%s Finalizing %@" && !pattern.starts_with("%s Could not init query");
}

}  // namespace

TableLog::TableLog(bool verbose) : _verbose(verbose), _previous(setLogSink(this)) {}

TableLog::~TableLog() { setLogSink(_previous); }

bool TableLog::accepts(std::string_view pattern) const noexcept {
  const int code = errno;
  if (!_failed && tellsOfFailure(pattern)) {
    _failed = true;
    _errorCode = code;
  }
  return _verbose;
}

void TableLog::write(std::string_view line) noexcept { std::cerr << line << '\n'; }

}  // namespace wordcatcher::cli
