// Failures that no file can provoke: this program puts its own functions in front of the library's
// calls into libcdb and the C library, and lets chosen ones fail.

#include <cdb.h>
#include <dlfcn.h>
#include <gtest/gtest.h>
#include <sys/file.h>

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <vector>

#include "TestSupport.h"
#include "wordcatcher/storage/TinyCDB.h"

namespace {

bool failMakeStart = false;
bool failRead = false;
std::size_t failReallocOf = 0;
std::vector<int> flockErrors;
int flockCalls = 0;
std::vector<std::string> errorLog;

template <typename Function>
Function next(Function /*same type*/, const char* name) {
  return reinterpret_cast<Function>(dlsym(RTLD_NEXT, name));
}

}  // namespace

extern "C" {

__attribute__((visibility("default"))) int cdb_make_start(struct cdb_make* writer, int descriptor) {
  if (failMakeStart) {
    errno = ENOMEM;
    return -1;
  }
  return next(&cdb_make_start, "cdb_make_start")(writer, descriptor);
}

__attribute__((visibility("default"))) int cdb_read(const struct cdb* table, void* buffer,
                                                    unsigned length, unsigned position) {
  if (failRead) {
    errno = EPROTO;
    return -1;
  }
  return next(&cdb_read, "cdb_read")(table, buffer, length, position);
}

__attribute__((visibility("default"))) int flock(int descriptor, int operation) noexcept {
  if (operation != LOCK_EX) {
    return next(&flock, "flock")(descriptor, operation);
  }
  ++flockCalls;
  if (!flockErrors.empty()) {
    errno = flockErrors.back();
    flockErrors.pop_back();
    return -1;
  }
  return next(&flock, "flock")(descriptor, operation);
}

__attribute__((visibility("default"))) void syslog(int priority, const char* format, ...) {
  char line[256];
  va_list arguments;
  va_start(arguments, format);
  (void)vsnprintf(line, sizeof line, format, arguments);
  va_end(arguments);
  errorLog.push_back(std::to_string(priority & 7) + " " + line);
}

#ifndef __SANITIZE_ADDRESS__
__attribute__((visibility("default"))) void* realloc(void* block, std::size_t size) noexcept {
  if (size != 0 && size == failReallocOf) {
    errno = ENOMEM;
    return nullptr;
  }
  static const auto real =
      reinterpret_cast<void* (*)(void*, std::size_t)>(dlsym(RTLD_NEXT, "realloc"));
  return real(block, size);
}
#endif
}

namespace wordcatcher {
namespace {

using testing::LogCapture;
using testing::TemporaryDirectory;
using Values = std::set<std::u16string>;
using Lines = std::vector<std::string>;

class TinyCDBFaultTest : public ::testing::Test {
 protected:
  void SetUp() override {
    TinyCDB table(path);
    table.setMode(2);
    table.setValue_forKey(u"Salzach", u"Salzburg");
    table.setValue_forKey(u"Inn", u"Innsbruck");
    table.setMode(0);
    errorLog.clear();
  }

  void TearDown() override {
    failMakeStart = false;
    failRead = false;
    failReallocOf = 0;
    flockErrors.clear();
  }

  TemporaryDirectory directory;
  std::string path = directory.file("table.tdb");
};

TEST_F(TinyCDBFaultTest, LogsAFailedStartOfWriting) {
  TinyCDB table(path);
  failMakeStart = true;
  const LogCapture log;
  table.setMode(2);
  EXPECT_EQ(log.lines(), Lines{"-[TinyCDB setMode:] Could not init for db make at " + path +
                               " because (12) Cannot allocate memory"});
  failMakeStart = false;
  table.setMode(1);
  table.setMode(0);
}

TEST_F(TinyCDBFaultTest, LogsAFailedRead) {
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"Salzburg"), Values{u"Salzach"});
  failRead = true;
  const LogCapture log;
  EXPECT_EQ(table.valuesFor(u"Innsbruck"), Values{u"Sal"}) << "goes on with what the buffer holds";
  EXPECT_EQ(log.lines(), Lines{"-[TinyCDB valuesFor:] unable to read value for Innsbruck"});
  table.setMode(0);
}

TEST_F(TinyCDBFaultTest, AnInterruptedLockIsWaitedForAgain) {
  flockErrors = {EINTR, EINTR, EINTR};
  flockCalls = 0;
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(flockCalls, 4);
  EXPECT_EQ(table.valuesFor(u"Innsbruck"), Values{u"Inn"});
  table.setMode(0);
}

TEST_F(TinyCDBFaultTest, TheErrorCodeOfALockIsNotTakenForThatOfTheOpening) {
  // EEXIST from the lock call would open the new file a second time.
  flockErrors = {EEXIST};
  flockCalls = 0;
  TinyCDB table(directory.file("new.tdb"));
  const LogCapture log;
  table.setMode(2);
  EXPECT_EQ(flockCalls, 1);
  EXPECT_TRUE(log.lines().empty());
  table.setMode(0);
}

TEST_F(TinyCDBFaultTest, WithoutASinkOfTheHostLinesGoToSyslogAsInfo) {
  LogSink* const tests = setLogSink(nullptr);
  TinyCDB table(path);
  table.setMode(2);
  table.setMode(0);
  setLogSink(tests);
  EXPECT_EQ(errorLog, Lines{"6 -[TinyCDB setMode:] Finalizing " + path});
}

TEST_F(TinyCDBFaultTest, AFailedAllocationGoesToTheGeneralErrorLogAndLosesOneValue) {
#ifdef __SANITIZE_ADDRESS__
  GTEST_SKIP() << "the sanitizer owns the allocator";
#endif
  TinyCDB table(path);
  table.setMode(1);
  failReallocOf = 7;
  const LogCapture log;
  EXPECT_EQ(table.valuesFor(u"Salzburg"), Values{});
  EXPECT_EQ(errorLog, Lines{"3 Unable to allocate 7 bytes"});
  EXPECT_EQ(log.lines(), Lines{"-[TinyCDB valuesFor:] unable to read value for Salzburg"});
  failReallocOf = 0;
  EXPECT_EQ(table.valuesFor(u"Innsbruck"), Values{}) << "the lost buffer counts as large enough";
  table.setMode(0);
}

}  // namespace
}  // namespace wordcatcher
