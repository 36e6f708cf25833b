#include "wordcatcher/log/LogSink.h"

#include <gtest/gtest.h>

#include "TestSupport.h"
#include "wordcatcher/Version.h"
#include "wordcatcher/storage/TinyCDB.h"

namespace wordcatcher {
namespace {

/// Wants no line about finishing a table.
class PickySink final : public LogSink {
 public:
  bool accepts(std::string_view pattern) const noexcept override {
    return pattern != "%s Finalizing %@";
  }
  void write(std::string_view /*line*/) noexcept override { ++written; }

  int written = 0;
};

TEST(LogSinkTest, ReplacingASinkReturnsTheOneBefore) {
  PickySink first;
  PickySink second;
  LogSink* const tests = setLogSink(&first);
  EXPECT_EQ(setLogSink(&second), &first);
  EXPECT_EQ(setLogSink(tests), &second);
}

TEST(LogSinkTest, NullBringsTheFirstSinkBack) {
  LogSink* const tests = setLogSink(nullptr);
  LogSink* const original = setLogSink(tests);
  EXPECT_NE(original, nullptr);
  EXPECT_NE(original, tests);
}

TEST(LogSinkTest, ASinkChoosesByThePatternBeforeTheLineIsMade) {
  const testing::TemporaryDirectory directory;
  PickySink sink;
  LogSink* const tests = setLogSink(&sink);
  TinyCDB table(directory.file("table.tdb"));
  table.setMode(2);
  table.setMode(1);
  EXPECT_EQ(sink.written, 0);
  table.valuesFor(u"missing");
  EXPECT_EQ(sink.written, 1);
  table.setMode(0);
  setLogSink(tests);
}

TEST(LogSinkTest, LinesShowHalfSurrogatesAsReplacementCharacters) {
  const testing::TemporaryDirectory directory;
  TinyCDB table(directory.file("table.tdb"));
  const testing::LogCapture log;
  errno = 0;
  table.valuesFor(std::u16string(1, char16_t{0xD800}));
  ASSERT_EQ(log.lines().size(), 1U);
  EXPECT_EQ(log.lines()[0],
            "-[TinyCDB valuesFor:] Could not init query for @\"\uFFFD\" because (0)");
}

TEST(VersionTest, NumberAndStringAgree) {
  const std::string text = versionString;
  EXPECT_DOUBLE_EQ(versionNumber, std::stod(text.substr(0, text.rfind('.'))));
}

}  // namespace
}  // namespace wordcatcher
