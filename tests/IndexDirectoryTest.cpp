// Which table the command waits for, so that it blames no other process for being slow itself.

#include "cli/IndexDirectory.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/file.h>
#include <unistd.h>

#include <optional>
#include <string>

#include "TestSupport.h"

namespace wordcatcher::cli {
namespace {

class OpenFile {
 public:
  explicit OpenFile(const std::string& path)
      : _descriptor(open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600)) {}
  ~OpenFile() { close(_descriptor); }
  OpenFile(const OpenFile&) = delete;
  OpenFile& operator=(const OpenFile&) = delete;

  bool lock() const { return flock(_descriptor, LOCK_EX | LOCK_NB) == 0; }

 private:
  int _descriptor;
};

TEST(IndexDirectoryTest, TheTableThatIsAwaitedIsOpenAndNotLocked) {
  const testing::TemporaryDirectory place;
  const IndexDirectory directory(place.path());
  EXPECT_EQ(directory.awaitedTable(), std::nullopt) << "there are no tables";
  const OpenFile edges(directory.tables()[0]);
  EXPECT_EQ(directory.awaitedTable(), 0U);
  ASSERT_TRUE(edges.lock());
  EXPECT_EQ(directory.awaitedTable(), std::nullopt) << "the only one is locked";
  const OpenFile data(directory.tables()[1]);
  EXPECT_EQ(directory.awaitedTable(), 1U);
  ASSERT_TRUE(data.lock());
  EXPECT_EQ(directory.awaitedTable(), std::nullopt) << "nothing is waited for";
}

}  // namespace
}  // namespace wordcatcher::cli
