// The replacement of an index when the operating system refuses, interrupts, or ends it.

#include "wordcatcher/storage/CommitImage.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <filesystem>
#include <functional>

#include "TestSupport.h"
#include "wordcatcher/Error.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/storage/SearchImageWriter.h"

namespace wordcatcher {
namespace {

using testing::readFile;
using testing::TemporaryDirectory;
using testing::writeFile;
using Bytes = std::vector<std::byte>;
using Names = std::vector<std::string>;

enum class Call { status, create, openDirectory, write, sync, close, link, rename, remove };

/// The real file system, in which chosen calls fail.
class FaultyFileSystem final : public FileSystem {
 public:
  /// Asked before each call: the error with which it is to fail, or 0.
  std::function<int(Call call, std::size_t number)> fault = [](Call, std::size_t) { return 0; };
  std::size_t longestWrite = 4096;
  std::size_t freeBytes = SIZE_MAX;

  std::vector<Call> calls;

  int status(const std::string& path, struct stat& status) override {
    return fails(Call::status) ? -1 : FileSystem::status(path, status);
  }
  int create(const std::string& path) override {
    return fails(Call::create) ? -1 : FileSystem::create(path);
  }
  int openDirectory(const std::string& path) override {
    return fails(Call::openDirectory) ? -1 : FileSystem::openDirectory(path);
  }
  ssize_t write(int file, std::span<const std::byte> bytes) override {
    if (fails(Call::write)) {
      return -1;
    }
    if (freeBytes == 0) {
      errno = ENOSPC;
      return -1;
    }
    const auto written =
        FileSystem::write(file, bytes.first(std::min({bytes.size(), longestWrite, freeBytes})));
    freeBytes -= static_cast<std::size_t>(written);
    return written;
  }
  int sync(int file) override { return fails(Call::sync) ? -1 : FileSystem::sync(file); }
  int close(int file) override {
    // A close that fails has closed.
    FileSystem::close(file);
    return fails(Call::close) ? -1 : 0;
  }
  int link(const std::string& from, const std::string& to) override {
    return fails(Call::link) ? -1 : FileSystem::link(from, to);
  }
  int rename(const std::string& from, const std::string& to) override {
    return fails(Call::rename) ? -1 : FileSystem::rename(from, to);
  }
  int remove(const std::string& path) override {
    return fails(Call::remove) ? -1 : FileSystem::remove(path);
  }

 private:
  bool fails(Call call) {
    calls.push_back(call);
    const int code = fault(call, calls.size() - 1);
    errno = code;
    return code != 0;
  }
};

Bytes imageOf(const std::string& mark) {
  SearchImageWriter writer(0);
  for (int i = 0; i < 40; ++i) {
    const auto value = writer.addValue("Salzburg " + std::to_string(i) + "{ " + mark + " }", 1);
    writer.addPosting(u"salzburg", value);
  }
  return writer.finish();
}

Bytes bytesOf(const std::string& path) {
  const auto text = readFile(path);
  const auto* begin = reinterpret_cast<const std::byte*>(text.data());
  return {begin, begin + text.size()};
}

/// Whether a name is ".rivers.wci-", 16 hexadecimal digits, and ".tmp" or ".old".
bool isLeftoverName(const std::string& name) {
  const std::string start = ".rivers.wci-";
  return name.size() == start.size() + 20 && name.starts_with(start) &&
         name.find_first_not_of("0123456789abcdef", start.size()) == start.size() + 16 &&
         (name.ends_with(".tmp") || name.ends_with(".old"));
}

class CommitImageTest : public ::testing::Test {
 protected:
  void SetUp() override {
    FileSystem files;
    commitImage(files, path, old);
  }

  Names names() const {
    Names found;
    for (const auto& entry : std::filesystem::directory_iterator(directory.path())) {
      found.push_back(entry.path().filename());
    }
    std::sort(found.begin(), found.end());
    return found;
  }

  /// The sentence of the failure; empty when the commit succeeds.
  std::string commit(FileSystem& files) const {
    try {
      commitImage(files, path, fresh);
      return "";
    } catch (const Error& error) {
      EXPECT_EQ(error.code(), ErrorCode::notWritable);
      return error.what();
    }
  }

  void expectOldIndexAlone() const {
    EXPECT_TRUE(bytesOf(path) == old);
    SearchImage::open(path, SearchImage::Load::map)->verify();
    EXPECT_EQ(names(), Names{"rivers.wci"});
  }

  void expectWholeIndex() const {
    SearchImage::open(path, SearchImage::Load::map)->verify();
    EXPECT_TRUE(bytesOf(path) == old || bytesOf(path) == fresh);
  }

  void expectNewIndex() const { EXPECT_TRUE(bytesOf(path) == fresh); }

  void putBackOldIndex() const {
    for (const auto& name : names()) {
      std::filesystem::remove(directory.file(name));
    }
    FileSystem files;
    commitImage(files, path, old);
  }

  static std::size_t openFiles() {
    std::size_t count = 0;
    for (int file = 0; file < 256; ++file) {
      count += fcntl(file, F_GETFD) >= 0 ? 1 : 0;
    }
    return count;
  }

  TemporaryDirectory directory;
  std::string path = directory.file("rivers.wci");
  Bytes old = imageOf("old");
  Bytes fresh = imageOf("new");
};

TEST_F(CommitImageTest, TheFileIsSyncedBeforeTheRenameAndTheDirectoryAfterIt) {
  FaultyFileSystem files;
  files.longestWrite = SIZE_MAX;
  EXPECT_EQ(commit(files), "");
  using enum Call;
  EXPECT_EQ(files.calls, (std::vector{status, create, write, sync, close, openDirectory, link,
                                      rename, sync, close, remove}));
  expectNewIndex();
  EXPECT_EQ(names(), Names{"rivers.wci"});
}

TEST_F(CommitImageTest, WhicheverCallFailsTheOldIndexStays) {
  // What need not succeed: the look at the target, closing the directory, the second name, and the
  // removal of it.
  const std::size_t before = openFiles();
  std::size_t failures = 0;
  for (const int code : {EIO, ENOSPC, EACCES}) {
    for (std::size_t k = 0;; ++k) {
      FaultyFileSystem files;
      files.fault = [&](Call, std::size_t number) { return number == k ? code : 0; };
      const auto sentence = commit(files);
      EXPECT_EQ(openFiles(), before);
      if (files.calls.size() <= k) {
        EXPECT_EQ(sentence, "");
        expectNewIndex();
        break;
      }
      const Call failed = files.calls[k];
      if (sentence.empty()) {
        EXPECT_TRUE(failed == Call::status || failed == Call::link || failed == Call::remove ||
                    failed == Call::close);
        expectNewIndex();
        EXPECT_EQ(names().size(), failed == Call::remove ? 2U : 1U);
      } else {
        ++failures;
        EXPECT_NE(sentence.find(std::generic_category().message(code)), std::string::npos);
        EXPECT_NE(sentence.find("try again"), std::string::npos);
        expectOldIndexAlone();
      }
      putBackOldIndex();
    }
    putBackOldIndex();
  }
  // create, at least one write, sync, close, openDirectory, rename, sync; each with three codes.
  EXPECT_GE(failures, 21U);
}

TEST_F(CommitImageTest, WithoutAnOldIndexAFailureLeavesNothing) {
  std::filesystem::remove(path);
  for (std::size_t k = 0;; ++k) {
    FaultyFileSystem files;
    files.fault = [&](Call call, std::size_t number) {
      return call == Call::link ? ENOENT : number == k ? EIO : 0;
    };
    const auto sentence = commit(files);
    if (files.calls.size() <= k) {
      break;
    }
    EXPECT_EQ(names(), sentence.empty() ? Names{"rivers.wci"} : Names{});
    std::filesystem::remove(path);
  }
  expectNewIndex();
}

TEST_F(CommitImageTest, WhenEveryCallFailsFromSomeMomentOnAWholeIndexStays) {
  for (std::size_t k = 0;; ++k) {
    FaultyFileSystem files;
    files.fault = [&](Call, std::size_t number) { return number >= k ? EIO : 0; };
    const auto sentence = commit(files);
    expectWholeIndex();
    if (files.calls.size() <= k) {
      EXPECT_EQ(sentence, "");
      break;
    }
    putBackOldIndex();
  }
  expectNewIndex();
}

TEST_F(CommitImageTest, AFullDiskLeavesTheOldIndex) {
  for (std::size_t room = 0; room < fresh.size(); room += 97) {
    FaultyFileSystem files;
    files.freeBytes = room;
    EXPECT_NE(commit(files).find("make room"), std::string::npos);
    expectOldIndexAlone();
  }
  FaultyFileSystem files;
  files.freeBytes = fresh.size();
  EXPECT_EQ(commit(files), "");
  expectNewIndex();
}

TEST_F(CommitImageTest, ShortAndInterruptedWritesGoOn) {
  for (const std::size_t longest : {1U, 7U, 63U, 4096U}) {
    FaultyFileSystem files;
    files.longestWrite = longest;
    // Every second call of those that are tried again.
    files.fault = [](Call call, std::size_t number) {
      const bool isTried = call == Call::create || call == Call::write || call == Call::sync ||
                           call == Call::openDirectory;
      return isTried && number % 2 == 0 ? EINTR : 0;
    };
    EXPECT_EQ(commit(files), "");
    expectNewIndex();
    EXPECT_EQ(names(), Names{"rivers.wci"});
    putBackOldIndex();
  }
}

TEST_F(CommitImageTest, AnInterruptedCloseIsNotAFailureAndNotTriedAgain) {
  FaultyFileSystem files;
  files.fault = [](Call call, std::size_t) { return call == Call::close ? EINTR : 0; };
  EXPECT_EQ(commit(files), "");
  EXPECT_EQ(std::count(files.calls.begin(), files.calls.end(), Call::close), 2);
  expectNewIndex();
}

TEST_F(CommitImageTest, ADirectoryThatCannotBeSyncedAtAllIsNotAFailure) {
  FaultyFileSystem files;
  bool renamed = false;
  files.fault = [&](Call call, std::size_t) {
    renamed = renamed || call == Call::rename;
    return renamed && call == Call::sync ? EINVAL : 0;
  };
  EXPECT_EQ(commit(files), "");
  expectNewIndex();
}

TEST_F(CommitImageTest, WithoutHardLinksALostDirectorySyncIsToldWithTheNewIndexInPlace) {
  FaultyFileSystem files;
  bool renamed = false;
  files.fault = [&](Call call, std::size_t) {
    renamed = renamed || call == Call::rename;
    return call == Call::link ? EPERM : renamed && call == Call::sync ? EIO : 0;
  };
  EXPECT_NE(commit(files).find("the new index is in its place"), std::string::npos);
  expectNewIndex();
  EXPECT_EQ(names(), Names{"rivers.wci"});
}

TEST_F(CommitImageTest, ATakenNameIsPassedOver) {
  FaultyFileSystem files;
  std::size_t creations = 0;
  files.fault = [&](Call call, std::size_t) {
    return call == Call::create && ++creations < 5 ? EEXIST : 0;
  };
  EXPECT_EQ(commit(files), "");
  EXPECT_EQ(creations, 5U);
  expectNewIndex();
}

TEST_F(CommitImageTest, ANameThatIsAlwaysTakenIsGivenUp) {
  FaultyFileSystem files;
  files.fault = [](Call call, std::size_t) { return call == Call::create ? EEXIST : 0; };
  EXPECT_NE(commit(files), "");
  expectOldIndexAlone();
}

TEST_F(CommitImageTest, AProcessThatEndsAtAnyCallLeavesAWholeIndexAndFilesThatAreNone) {
  std::size_t leftovers = 0;
  for (std::size_t k = 0;; ++k) {
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
      FaultyFileSystem files;
      files.longestWrite = 1500;
      files.fault = [&](Call, std::size_t number) { return number == k ? raise(SIGKILL) : 0; };
      commitImage(files, path, fresh);
      _exit(0);
    }
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    expectWholeIndex();
    for (const auto& name : names()) {
      if (name == "rivers.wci") {
        continue;
      }
      ++leftovers;
      EXPECT_TRUE(isLeftoverName(name)) << name;
      // By itself such a file is an index that is whole, or one that nothing takes for one.
      const auto content = bytesOf(directory.file(name));
      if (content != old && content != fresh) {
        EXPECT_THROW(SearchImage::open(directory.file(name), SearchImage::Load::map), Error);
      }
    }
    if (WIFEXITED(status)) {
      break;
    }
    // What a dead builder left does not bother the next one.
    if (k % 2 == 0) {
      FileSystem files;
      EXPECT_EQ(commit(files), "");
      expectNewIndex();
    }
    putBackOldIndex();
  }
  EXPECT_GE(leftovers, 8U);
  expectNewIndex();
}

TEST_F(CommitImageTest, TargetsThatAreNoFilesAreRefused) {
  const auto refused = [this](const std::string& target) -> std::string {
    FileSystem files;
    try {
      commitImage(files, target, fresh);
    } catch (const Error& error) {
      EXPECT_EQ(error.code(), ErrorCode::notWritable);
      return error.what();
    }
    return "";
  };
  std::filesystem::create_directory(directory.file("austria"));
  EXPECT_NE(refused(directory.file("austria")).find("is a directory"), std::string::npos);
  EXPECT_NE(refused(directory.file("austria/")).find("does not name a file"), std::string::npos);
  EXPECT_NE(refused("").find("does not name a file"), std::string::npos);
  EXPECT_NE(refused(path + std::string("\0.wci", 5)).find("does not name a file"),
            std::string::npos);
  ASSERT_EQ(mkfifo(directory.file("pipe").c_str(), 0600), 0);
  EXPECT_NE(refused(directory.file("pipe")).find("not a regular file"), std::string::npos);
  EXPECT_NE(refused("/dev/null").find("not a regular file"), std::string::npos);
  EXPECT_NE(refused(directory.file("tyrol/names.wci")).find("create its directory"),
            std::string::npos);
  EXPECT_NE(refused(path + "/names.wci").find("create its directory"), std::string::npos);
  EXPECT_EQ(names(), (Names{"austria", "pipe", "rivers.wci"}));
  EXPECT_TRUE(std::filesystem::is_empty(directory.file("austria")));
}

TEST_F(CommitImageTest, ASymbolicLinkIsReplaced) {
  const auto link = directory.file("current.wci");
  std::filesystem::create_symlink("rivers.wci", link);
  FileSystem files;
  commitImage(files, link, fresh);
  EXPECT_FALSE(std::filesystem::is_symlink(link));
  EXPECT_TRUE(bytesOf(link) == fresh);
  EXPECT_TRUE(bytesOf(path) == old);
}

TEST_F(CommitImageTest, ASymbolicLinkIsPutBackToo) {
  const auto link = directory.file("current.wci");
  std::filesystem::create_symlink("rivers.wci", link);
  FaultyFileSystem files;
  bool renamed = false;
  files.fault = [&](Call call, std::size_t) {
    renamed = renamed || call == Call::rename;
    return renamed && call == Call::sync ? EIO : 0;
  };
  EXPECT_THROW(commitImage(files, link, fresh), Error);
  EXPECT_TRUE(std::filesystem::is_symlink(link));
  EXPECT_EQ(names(), (Names{"current.wci", "rivers.wci"}));
}

TEST_F(CommitImageTest, NamesMayBeAsLongAsTheFileSystemAllows) {
  FileSystem files;
  // The name of the temporary file is cut between characters: é is two bytes.
  for (const std::string start : {"", "x"}) {
    std::string name = start;
    while (name.size() + 2 <= 250) {
      name += "é";
    }
    name += ".wci";
    commitImage(files, directory.file(name), fresh);
    EXPECT_TRUE(bytesOf(directory.file(name)) == fresh);
    FaultyFileSystem watched;
    std::string sentence;
    watched.fault = [&](Call call, std::size_t) {
      if (call == Call::write) {
        for (const auto& temporary : names()) {
          if (temporary.starts_with(".")) {
            EXPECT_EQ(temporary.find("\xC3-"), std::string::npos);
            EXPECT_LE(temporary.size(), 255U);
            sentence = temporary;
          }
        }
      }
      return 0;
    };
    commitImage(watched, directory.file(name), fresh);
    EXPECT_NE(sentence, "");
  }
}

TEST_F(CommitImageTest, APathWithoutADirectoryIsOfTheCurrentOne) {
  const auto before = std::filesystem::current_path();
  std::filesystem::current_path(directory.path());
  FileSystem files;
  commitImage(files, "lakes.wci", fresh);
  std::filesystem::current_path(before);
  EXPECT_EQ(names(), (Names{"lakes.wci", "rivers.wci"}));
}

}  // namespace
}  // namespace wordcatcher
