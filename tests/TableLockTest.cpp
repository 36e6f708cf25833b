// Locks between processes: one holds a table open, the other waits until it lets go.

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <thread>

#include "TestSupport.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"

namespace wordcatcher {
namespace {

using testing::TemporaryDirectory;

constexpr auto kHolding = std::chrono::milliseconds(300);

struct Modes {
  std::int32_t holder;
  std::int32_t waiter;
};

class TableLockTest : public ::testing::TestWithParam<Modes> {
 protected:
  void SetUp() override {
    ASSERT_EQ(pipe(opened), 0);
    ASSERT_EQ(pipe(closing), 0);
    LXFuzzyIndex index(directory.path());
    index.setMode(2);
    index.addString_withData(u"Villach", u"Drau");
    index.setMode(0);
  }

  void TearDown() override {
    for (const int end : {opened[0], opened[1], closing[0], closing[1]}) {
      close(end);
    }
  }

  /// The other process: opens the index, holds it for a while, says that it is about to let go.
  [[noreturn]] void hold() const {
    LXFuzzyIndex index(directory.path());
    index.setMode(GetParam().holder);
    if (GetParam().holder == 2) {
      index.addString_withData(u"Villach", u"Gail");
    }
    bool written = write(opened[1], "o", 1) == 1;
    std::this_thread::sleep_for(kHolding);
    written = write(closing[1], "c", 1) == 1 && written;
    index.setMode(0);
    _exit(written ? 0 : 1);
  }

  TemporaryDirectory directory;
  int opened[2] = {};
  int closing[2] = {};
};

TEST_P(TableLockTest, TheSecondProcessWaitsAndGoesOn) {
  const pid_t holder = fork();
  ASSERT_GE(holder, 0);
  if (holder == 0) {
    hold();
  }
  char byte = 0;
  ASSERT_EQ(read(opened[0], &byte, 1), 1);
  LXFuzzyIndex index(directory.path());
  index.setMode(GetParam().waiter);
  // The holder announced that it closes before our opening returned.
  close(closing[1]);
  closing[1] = -1;
  ASSERT_EQ(read(closing[0], &byte, 1), 1);
  EXPECT_EQ(byte, 'c');
  if (GetParam().waiter == 1) {
    const auto matches = index.search_withMaxDistance(u"villach", 0);
    ASSERT_EQ(matches.size(), 1U);
    EXPECT_EQ(matches[0].data(),
              std::vector<std::u16string>{GetParam().holder == 2 ? u"Gail" : u"Drau"});
  }
  index.setMode(0);
  int status = 0;
  ASSERT_EQ(waitpid(holder, &status, 0), holder);
  EXPECT_EQ(status, 0);
}

INSTANTIATE_TEST_SUITE_P(ReadersAndWriters, TableLockTest,
                         ::testing::Values(Modes{1, 1}, Modes{1, 2}, Modes{2, 1}, Modes{2, 2}));

}  // namespace
}  // namespace wordcatcher
