// The command verify-metaphone, run as users run it.

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <syslog.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <sstream>
#include <string>
#include <vector>

#include "TestSupport.h"

namespace wordcatcher {
namespace {

using testing::TemporaryDirectory;

struct CommandRun {
  int exitCode;
  // What came from the one stream that was asked for.
  std::vector<std::string> lines;
};

CommandRun runInShell(const std::string& directory, const std::string& programAndStream) {
  const std::string command = "cd '" + directory + "' && " + programAndStream;
  // The command line is made of paths of the build.
  std::FILE* pipe = popen(command.c_str(), "r");  // NOLINT(cert-env33-c)
  std::stringstream output;
  std::array<char, 4096> chunk{};
  for (std::size_t got = 0; (got = fread(chunk.data(), 1, chunk.size(), pipe)) > 0;) {
    output.write(chunk.data(), static_cast<std::streamsize>(got));
  }
  CommandRun run{WEXITSTATUS(pclose(pipe)), {}};
  for (std::string line; std::getline(output, line);) {
    run.lines.push_back(line);
  }
  return run;
}

/// What the command writes to its error stream.
CommandRun runIn(const std::string& directory, const std::string& arguments = "") {
  return runInShell(directory, "'" VERIFY_METAPHONE "' " + arguments + " 2>&1 >/dev/null");
}

/// What the command writes to the system log: each line behind its priority.
CommandRun recordedRunIn(const std::string& directory) {
  return runInShell(directory, "'" RECORDED_VERIFY_METAPHONE "' 2>/dev/null");
}

CommandRun runOver(std::string_view expectations, const std::string& arguments = "") {
  const TemporaryDirectory directory;
  testing::writeFile(directory.file("TestDBLMetaphone.txt"), expectations);
  return runIn(directory.path(), arguments);
}

std::ptrdiff_t passes(const CommandRun& run) {
  return std::count_if(run.lines.begin(), run.lines.end(),
                       [](const std::string& line) { return line.starts_with("pass: \""); });
}

TEST(VerifyMetaphoneCommandTest, TheEncoderMeetsEveryExpectation) {
  const CommandRun run = runIn(EXPECTATIONS_DIRECTORY);
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_GE(run.lines.size(), 600U);
  for (const std::string& line : run.lines) {
    EXPECT_TRUE(line.starts_with("pass: \"")) << line;
  }
}

TEST(VerifyMetaphoneCommandTest, TheExpectationsAreWholeCodes) {
  // The command is content with a part of a code; the list is meant to say all of it.
  for (const std::string& line : runIn(EXPECTATIONS_DIRECTORY).lines) {
    const std::size_t code = line.find("\" -> ") + 5;
    const std::size_t expected = line.find(" == ") + 4;
    EXPECT_EQ(line.substr(code, expected - 4 - code), line.substr(expected));
  }
}

TEST(VerifyMetaphoneCommandTest, AWrongExpectationIsSaidAndStillEndsWith0) {
  const CommandRun run = runOver("smith,SM0\nsmith,XMT\nknife,KNF");
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_EQ(run.lines, (std::vector<std::string>{"pass: \"smith\" -> \"SM0\" == \"SM0\"",
                                                 "FAIL: \"smith\" -> \"SM0\" == \"XMT\"",
                                                 "pass: \"knife\" -> \"KNF\" == \"KNF\""}));
}

TEST(VerifyMetaphoneCommandTest, VerdictsGoToTheSystemLogAsInformationOfAUserProgram) {
  const std::string priority = std::to_string(LOG_USER | LOG_INFO);
  const TemporaryDirectory directory;
  testing::writeFile(directory.file("TestDBLMetaphone.txt"), "smith,SM0\ngarçon,XMT");
  const CommandRun run = recordedRunIn(directory.path());
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_EQ(run.lines,
            (std::vector<std::string>{priority + " pass: \"smith\" -> \"SM0\" == \"SM0\"",
                                      priority + " FAIL: \"garçon\" -> \"KRSN\" == \"XMT\""}));
}

TEST(VerifyMetaphoneCommandTest, TheSystemLogHasEveryLineThatTheErrorStreamHas) {
  const std::string priority = std::to_string(LOG_USER | LOG_INFO);
  std::vector<std::string> shown = runIn(EXPECTATIONS_DIRECTORY).lines;
  for (std::string& line : shown) {
    line.insert(0, priority + ' ');
  }
  EXPECT_EQ(recordedRunIn(EXPECTATIONS_DIRECTORY).lines, shown);
}

TEST(VerifyMetaphoneCommandTest, ArgumentsAreIgnored) {
  const CommandRun run = runOver("smith,SM0", "--help nothing");
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_EQ(passes(run), 1);
}

TEST(VerifyMetaphoneCommandTest, AMissingFileEndsWithASentenceAnd2) {
  const TemporaryDirectory directory;
  const CommandRun run = runIn(directory.path());
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_EQ(run.lines, (std::vector<std::string>{
                           "verify-metaphone: ./TestDBLMetaphone.txt cannot be opened (No "
                           "such file or directory). Run the command in the directory that "
                           "holds it."}));
}

TEST(VerifyMetaphoneCommandTest, ALineWithoutACommaEndsWithItsNumberAnd2) {
  const std::string reason =
      "there is no comma; write each line as word,CODE and end the last one without a newline.";
  for (const char* expectations : {"smith,SM0\nknife\nark,ARK", "smith,SM0\n"}) {
    const CommandRun run = runOver(expectations);
    EXPECT_EQ(run.exitCode, 2);
    EXPECT_EQ(run.lines, (std::vector<std::string>{
                             "pass: \"smith\" -> \"SM0\" == \"SM0\"",
                             "verify-metaphone: ./TestDBLMetaphone.txt: Line 2: " + reason}));
  }
}

TEST(VerifyMetaphoneCommandTest, LongLinesAreReadInPieces) {
  const CommandRun run = runOver("ark," + std::string(4091, 'X') + "\nARK");
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_EQ(run.lines, (std::vector<std::string>{"FAIL: \"ark\" -> \"ARK\" == \"" +
                                                 std::string(4091, 'X') + "ARK\""}));
}

}  // namespace
}  // namespace wordcatcher
