// Holds the phonetic encoder against the expectations in ./TestDBLMetaphone.txt, one verdict line
// per word, and ends with 0 whatever the verdicts are. Takes no arguments. Ends with 2 if the file
// is missing or a line of it cannot be judged.

#include <cerrno>
#include <cstdio>
#include <exception>
#include <memory>
#include <string>
#include <string_view>
#include <system_error>

#include "wordcatcher/log/LogSink.h"
#include "wordcatcher/phonetic/VerifyMetaphone.h"

namespace {

constexpr const char* kPath = "./TestDBLMetaphone.txt";
constexpr int kSuccess = 0;
constexpr int kFailure = 2;

struct CloseFile {
  void operator()(std::FILE* file) const noexcept { static_cast<void>(std::fclose(file)); }
};

void printError(std::string_view line) noexcept {
  // Nobody is left to tell when the error stream itself fails.
  static_cast<void>(std::fprintf(stderr, "%.*s\n", static_cast<int>(line.size()), line.data()));
}

/// Shows the library's lines to the caller, beside the log that they go to anyway.
class TerminalSink final : public wordcatcher::LogSink {
 public:
  TerminalSink() : _log(wordcatcher::setLogSink(this)) {}
  ~TerminalSink() override { wordcatcher::setLogSink(_log); }
  TerminalSink(const TerminalSink&) = delete;
  TerminalSink& operator=(const TerminalSink&) = delete;

  void write(std::string_view line) noexcept override {
    _log->write(line);
    printError(line);
  }

 private:
  wordcatcher::LogSink* _log;
};

int verifyFile() {
  const std::unique_ptr<std::FILE, CloseFile> file(std::fopen(kPath, "r"));
  if (!file) {
    const std::string reason = std::generic_category().message(errno);
    printError(std::string("verify-metaphone: ") + kPath + " cannot be opened (" + reason +
               "). Run the command in the directory that holds it.");
    return kFailure;
  }
  wordcatcher::verifyMetaphone(file.get());
  return kSuccess;
}

}  // namespace

int main() {
  const TerminalSink sink;
  try {
    return verifyFile();
  } catch (const std::exception& error) {
    printError(std::string("verify-metaphone: ") + kPath + ": " + error.what());
    return kFailure;
  }
}
