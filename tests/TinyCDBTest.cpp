#include "wordcatcher/storage/TinyCDB.h"

#include <cdb.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <fstream>

#include "PrivateMember.h"
#include "TestSupport.h"

namespace wordcatcher::testing {

struct Mode {
  friend auto memberOf(Mode /*tag*/);
};
template struct PrivateMember<Mode, &TinyCDB::_mode>;

struct Capacity {
  friend auto memberOf(Capacity /*tag*/);
};
template struct PrivateMember<Capacity, &TinyCDB::blen>;

}  // namespace wordcatcher::testing

namespace wordcatcher {
namespace {

using testing::LogCapture;
using testing::outputOf;
using testing::readFile;
using testing::TemporaryDirectory;
using testing::writeFile;
using Values = std::set<std::u16string>;
using Lines = std::vector<std::string>;

void put32(std::string& bytes, std::size_t at, std::uint32_t value) {
  for (int i = 0; i < 4; ++i) {
    bytes[at + static_cast<std::size_t>(i)] = static_cast<char>(value >> (8 * i));
  }
}

class TinyCDBTest : public ::testing::Test {
 protected:
  void write(std::initializer_list<std::pair<std::u16string_view, std::u16string_view>> records) {
    TinyCDB table(path);
    table.setMode(2);
    for (const auto& [key, value] : records) {
      table.setValue_forKey(value, key);
    }
    table.setMode(0);
  }

  TemporaryDirectory directory;
  std::string path = directory.file("table.tdb");
};

TEST_F(TinyCDBTest, ConstructionTouchesNoFile) {
  const TinyCDB table(path);
  EXPECT_EQ(table.*memberOf(testing::Mode()), 0);
  EXPECT_EQ(table.getMode(), 0);
  EXPECT_EQ(table.path(), path);
  EXPECT_FALSE(std::filesystem::exists(path));
}

TEST_F(TinyCDBTest, StoresAndFindsValues) {
  TinyCDB table(path);
  table.setMode(2);
  table.setValue_forKey(u"Wien", u"Österreich");
  table.setValue_forKey(u"東京", u"日本");
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"Österreich"), Values{u"Wien"});
  EXPECT_EQ(table.valuesFor(u"日本"), Values{u"東京"});
  EXPECT_EQ(table.valuesFor(u"Schweiz"), Values{});
  table.setMode(0);
}

TEST_F(TinyCDBTest, NewFileHasPermissions0666LessTheMask) {
  const mode_t mask = umask(0027);
  write({});
  umask(mask);
  struct stat status {};
  ASSERT_EQ(stat(path.c_str(), &status), 0);
  EXPECT_EQ(status.st_mode & 07777, 0640U);
}

TEST_F(TinyCDBTest, WritingAgainReplacesTheContents) {
  write({{u"Paris", u"Seine"}, {u"Rom", u"Tiber"}});
  const auto longSize = std::filesystem::file_size(path);
  write({{u"Wien", u"Donau"}});
  EXPECT_EQ(std::filesystem::file_size(path), longSize) << "the old tail stays in the file";
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"Wien"), Values{u"Donau"});
  EXPECT_EQ(table.valuesFor(u"Paris"), Values{});
  EXPECT_EQ(table.valuesFor(u"Rom"), Values{});
  table.setMode(0);
}

TEST_F(TinyCDBTest, AKeyCarriesEveryDistinctValue) {
  write({{u"Frankfurt", u"Main"}, {u"Frankfurt", u"Oder"}, {u"Frankfurt", u"Main"}});
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"Frankfurt"), (Values{u"Main", u"Oder"}));
  table.setMode(0);
  EXPECT_EQ(outputOf("cdb -d " + path),
            "+9,4:Frankfurt->Main\n+9,4:Frankfurt->Oder\n+9,4:Frankfurt->Main\n\n")
      << "every put is a record of its own, in the order of adding";
}

TEST_F(TinyCDBTest, AMissIsLoggedWhenTheHashSlotIsEmpty) {
  write({});
  TinyCDB table(path);
  table.setMode(1);
  const LogCapture log;
  errno = 0;
  EXPECT_EQ(table.valuesFor(u"Köln"), Values{});
  EXPECT_EQ(log.lines(),
            Lines{"-[TinyCDB valuesFor:] Could not init query for @\"Köln\" because (0)"});
  table.setMode(0);
}

TEST_F(TinyCDBTest, EmptyKeysAndValuesAreStored) {
  write({{u"", u"nameless"}, {u"empty", u""}});
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u""), Values{u"nameless"});
  EXPECT_EQ(table.valuesFor(u"empty"), Values{u""});
  table.setMode(0);
}

TEST_F(TinyCDBTest, StringsAreStoredUpToTheirFirstZero) {
  using namespace std::string_view_literals;
  write({{u"key\0rest"sv, u"value\0rest"sv}});
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"key"), Values{u"value"});
  EXPECT_EQ(table.valuesFor(u"key\0other"sv), Values{u"value"});
  table.setMode(0);
}

TEST_F(TinyCDBTest, StringsWithoutUtf8FormAreSilentlyLeftOut) {
  const LogCapture log;
  TinyCDB table(path);
  table.setMode(2);
  table.setValue_forKey(std::u16string(1, char16_t{0xD83D}), u"lone surrogate");
  table.setValue_forKey(u"lone surrogate", std::u16string(1, char16_t{0xDC00}));
  table.setValue_forKey(std::nullopt, u"key");
  table.setValue_forKey(u"value", std::nullopt);
  table.setValue_forKey(u"😀", u"whole pair");
  table.setMode(1);
  EXPECT_EQ(log.lines(), Lines{"-[TinyCDB setMode:] Finalizing " + path});
  EXPECT_EQ(table.valuesFor(u"whole pair"), Values{u"😀"});
  table.setMode(0);
  EXPECT_EQ(outputOf("cdb -l " + path), "+10:whole pair\n\n");
}

TEST_F(TinyCDBTest, AKeyWithoutUtf8FormIsNotFound) {
  write({{u"x", u"y"}});
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(std::u16string(1, char16_t{0xDC00})), Values{});
  table.setMode(0);
}

TEST_F(TinyCDBTest, ValuesThatAreNotUtf8AreLeftOut) {
  writeFile(directory.file("input"), "+3,1:key->\xff\n+3,2:key->ok\n\n");
  outputOf("cdb -c " + path + " " + directory.file("input"));
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"key"), Values{u"ok"});
  table.setMode(0);
}

TEST_F(TinyCDBTest, ReadsATableThatTheCdbToolWrote) {
  writeFile(directory.file("input"), "+7,5:Zürich->Seeé\n+0,1:->x\n\n");
  outputOf("cdb -c " + path + " " + directory.file("input"));
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"Zürich"), Values{u"Seeé"});
  EXPECT_EQ(table.valuesFor(u""), Values{u"x"});
  table.setMode(0);
}

TEST_F(TinyCDBTest, GetModeTellsWhetherItWasEverRead) {
  TinyCDB table(path);
  EXPECT_EQ(table.getMode(), 0);
  table.setMode(2);
  EXPECT_EQ(table.getMode(), 0);
  table.setMode(0);
  EXPECT_EQ(table.getMode(), 0) << "only ever written";
  table.setMode(1);
  EXPECT_EQ(table.getMode(), 1);
  table.setMode(0);
  EXPECT_EQ(table.getMode(), 1) << "also after closing";
  table.setMode(2);
  EXPECT_EQ(table.getMode(), 1) << "also while writing again";
  table.setMode(0);
}

TEST_F(TinyCDBTest, AClosedTableStillAnswersFromItsMapping) {
  write({{u"Bern", u"Aare"}});
  TinyCDB table(path);
  table.setMode(1);
  table.setMode(0);
  EXPECT_EQ(table.valuesFor(u"Bern"), Values{u"Aare"});
}

TEST_F(TinyCDBTest, ClosingGivesTheLockBackThoughTheMappingStays) {
  write({{u"Bern", u"Aare"}});
  TinyCDB table(path);
  table.setMode(1);
  const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC);
  EXPECT_EQ(flock(descriptor, LOCK_EX | LOCK_NB), -1) << "readers lock as well";
  table.setMode(0);
  EXPECT_EQ(flock(descriptor, LOCK_EX | LOCK_NB), 0);
  close(descriptor);
}

TEST_F(TinyCDBTest, AFailedReopenKeepsTheOldMapping) {
  write({{u"Bern", u"Aare"}});
  TinyCDB table(path);
  table.setMode(1);
  table.setMode(0);
  table.setPath(directory.file("missing.tdb"));
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"Bern"), Values{u"Aare"});
  EXPECT_EQ(table.getMode(), 1);
  table.setMode(0);
}

TEST_F(TinyCDBTest, ANewPathTakesEffectAtTheNextOpening) {
  const std::string other = directory.file("other.tdb");
  TinyCDB table(path);
  table.setMode(2);
  table.setPath(other);
  EXPECT_EQ(table.path(), other);
  table.setValue_forKey(u"first", u"key");
  table.setMode(1);
  EXPECT_TRUE(std::filesystem::exists(path));
  EXPECT_FALSE(std::filesystem::exists(other));
  EXPECT_EQ(table.valuesFor(u"key"), Values{}) << "the new path has no file";
  table.setMode(2);
  table.setValue_forKey(u"second", u"key");
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"key"), Values{u"second"});
  table.setMode(0);
}

TEST_F(TinyCDBTest, UnknownModesAreKeptAndOpenNothing) {
  TinyCDB table(path);
  table.setMode(2);
  table.setValue_forKey(u"v", u"k");
  table.setMode(7);
  EXPECT_EQ(table.*memberOf(testing::Mode()), 7);
  const LogCapture log;
  table.setMode(-3);
  EXPECT_EQ(table.*memberOf(testing::Mode()), -3);
  EXPECT_TRUE(log.lines().empty());
  EXPECT_NE(outputOf("cdb -d " + path), "") << "leaving writing finished the table";
  // Leaving an unknown mode must not close a descriptor a second time: by now its number may belong
  // to the host.
  const int hosts = dup(0);
  table.setMode(0);
  EXPECT_EQ(close(hosts), 0);
}

TEST_F(TinyCDBTest, AStaleErrorCodeOfTheHostDoesNotOpenTheFileTwice) {
  TinyCDB table(path);
  errno = EEXIST;
  table.setMode(2);  // would wait for its own lock for ever
  table.setMode(0);
  errno = EEXIST;
  table.setMode(2);
  table.setMode(0);
}

TEST_F(TinyCDBTest, TheScratchBufferGrowsToTheExactSizeAndNeverShrinks) {
  write({{u"long", u"Donaudampfschifffahrt"},
         {u"short", u"Inn"},
         {u"longer",
          u"Rindfleischetikett"
          u"ierung"}});
  TinyCDB table(path);
  EXPECT_EQ(table.*memberOf(testing::Capacity()), 0);
  table.setMode(1);
  table.valuesFor(u"long");
  EXPECT_EQ(table.*memberOf(testing::Capacity()), 21);
  table.valuesFor(u"short");
  EXPECT_EQ(table.*memberOf(testing::Capacity()), 21);
  table.valuesFor(u"longer");
  EXPECT_EQ(table.*memberOf(testing::Capacity()), 24);
  table.setMode(0);
}

TEST_F(TinyCDBTest, TeardownLeavesAnUnfinishedTableUnfinished) {
  // The owner is to switch the table out of writing; the table itself does not. A process of its
  // own takes the unfinished writer's memory with it.
  const pid_t child = fork();
  ASSERT_GE(child, 0);
  if (child == 0) {
    {
      TinyCDB table(path);
      table.setMode(2);
      table.setValue_forKey(u"v", u"k");
    }
    const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    _exit(flock(descriptor, LOCK_EX | LOCK_NB) == -1 ? 0 : 1);
  }
  int status = 0;
  ASSERT_EQ(waitpid(child, &status, 0), child);
  EXPECT_EQ(status, 0) << "the file is not closed, and so locked until the process ends";
  EXPECT_LT(std::filesystem::file_size(path), 2048U);
}

// The failure table, line by line. What needs a failing library call is in TinyCDBFaultTest.

TEST_F(TinyCDBTest, LogsFinalizing) {
  TinyCDB table(path);
  table.setMode(2);
  const LogCapture log;
  table.setMode(1);
  EXPECT_EQ(log.lines(), Lines{"-[TinyCDB setMode:] Finalizing " + path});
  table.setMode(0);
}

TEST_F(TinyCDBTest, LogsAFailedCreationTwice) {
  const std::string missing = directory.file("missing/table.tdb");
  TinyCDB table(missing);
  const LogCapture log;
  table.setMode(2);
  const std::string line = "-[TinyCDB setMode:] Could not RDRW open file " + missing +
                           " because (2) No such file or directory";
  EXPECT_EQ(log.lines(), (Lines{line, line}));
  EXPECT_EQ(table.*memberOf(testing::Mode()), 2) << "the mode is taken over all the same";
}

TEST_F(TinyCDBTest, LogsAFailedPutAndFinish) {
  TinyCDB table(directory.file("missing/table.tdb"));
  table.setMode(2);
  LogCapture log;
  const std::u16string value(5000, u'v');
  table.setValue_forKey(value, u"Linz");
  ASSERT_EQ(log.lines().size(), 1U);
  EXPECT_EQ(log.lines()[0], "-[TinyCDB setValue:forKey:] Could not put " + std::string(5000, 'v') +
                                " into key Linz because (9) Bad file descriptor");
  log.clear();
  table.setMode(0);
  EXPECT_EQ(log.lines(), (Lines{"-[TinyCDB setMode:] Finalizing " + table.path(),
                                "-[TinyCDB setMode:] Could not finalize for db make at " +
                                    table.path() + ", db may be corrupted!"}));
}

TEST_F(TinyCDBTest, RefusesASymbolicLinkForWritingAndFollowsItForReading) {
  write({{u"Graz", u"Mur"}});
  const std::string link = directory.file("link.tdb");
  std::filesystem::create_symlink(path, link);
  TinyCDB table(link);
  LogCapture log;
  table.setMode(2);
  const std::string reason = link + " because (40) Too many levels of symbolic links";
  EXPECT_EQ(log.lines(), (Lines{"-[TinyCDB setMode:] Could not open file " + reason,
                                "-[TinyCDB setMode:] Could not RDRW open file " + reason}));
  log.clear();
  table.setMode(0);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(u"Graz"), Values{u"Mur"});
  table.setMode(0);
}

TEST_F(TinyCDBTest, LogsAFailedOpeningForReading) {
  TinyCDB table(path);
  const LogCapture log;
  table.setMode(1);
  EXPECT_EQ(log.lines(), (Lines{"-[TinyCDB setMode:] Could not RDONLY open file " + path,
                                "-[TinyCDB setMode:] Could not init db at " + path}));
  EXPECT_EQ(table.getMode(), 0);
}

TEST_F(TinyCDBTest, LogsAFileThatIsTooShort) {
  writeFile(path, "");
  TinyCDB table(path);
  const LogCapture log;
  table.setMode(1);
  EXPECT_EQ(log.lines(), Lines{"-[TinyCDB setMode:] Could not init db at " + path});
  table.setMode(0);
}

TEST_F(TinyCDBTest, ATableThatWasNeverReadAnswersWithNothingAndALine) {
  TinyCDB table(path);
  const LogCapture log;
  errno = 0;
  EXPECT_EQ(table.valuesFor(u"Graz"), Values{});
  EXPECT_EQ(log.lines(),
            Lines{"-[TinyCDB valuesFor:] Could not init query for @\"Graz\" because (0)"});
}

TEST_F(TinyCDBTest, AValueLongerThanTheBufferCanCountIsUnreadable) {
  // One record of key "k" whose value claims 2 GiB + 1, in a sparse file that really has them.
  constexpr std::uint32_t kLength = 0x80000001U;
  write({{u"k", u"v"}});
  std::string bytes = readFile(path);
  put32(bytes, 2048 + 4, kLength);
  put32(bytes, 0, 0);  // the end of the data is read off the first table's place
  writeFile(path, bytes);
  std::filesystem::resize_file(path, std::uintmax_t{kLength} + 4096);
  TinyCDB table(path);
  table.setMode(1);
  const LogCapture log;
  EXPECT_EQ(table.valuesFor(u"k"), Values{});
  EXPECT_EQ(log.lines(), Lines{"-[TinyCDB valuesFor:] unable to read value for k"});
  table.setMode(0);
}

TEST_F(TinyCDBTest, ATableCutShortAtAnyLengthNeverCrashes) {
  write({{u"", u"g"}, {u"g", u"r"}, {u"gr", u"a"}, {u"gra", u"z"}, {u"graz", u"Graz, Steiermark"}});
  const std::string whole = readFile(path);
  for (std::size_t length = 0; length <= whole.size(); ++length) {
    writeFile(path, whole.substr(0, length));
    TinyCDB table(path);
    table.setMode(1);
    for (const auto* key : {u"", u"g", u"gr", u"graz", u"Wien"}) {
      const auto values = table.valuesFor(key);
      EXPECT_LE(values.size(), 1U);
    }
    table.setMode(0);
  }
}

TEST_F(TinyCDBTest, ATableWithAnyByteDamagedNeverCrashes) {
  write({{u"", u"g"}, {u"g", u"r"}, {u"graz", u"Graz, Steiermark"}});
  const std::string whole = readFile(path);
  for (std::size_t at = 0; at < whole.size(); ++at) {
    for (const int damage : {0x00, 0x7F, 0xFF}) {
      std::string bytes = whole;
      bytes[at] = static_cast<char>(damage);
      writeFile(path, bytes);
      TinyCDB table(path);
      table.setMode(1);
      for (const auto* key : {u"", u"g", u"graz"}) {
        EXPECT_LE(table.valuesFor(key).size(), 1U);
      }
      table.setMode(0);
    }
  }
}

TEST_F(TinyCDBTest, AKeyLongerThanTheFileIsNotCompared) {
  // The record's key claims as many bytes as the key that is looked up, and has its hash, so that
  // only its length against the file's tells that it cannot be there.
  const std::string longKey(100000, 'k');
  write({{u"k", u"v"}});
  std::string bytes = readFile(path);
  const auto hash = cdb_hash(longKey.data(), static_cast<unsigned>(longKey.size()));
  const std::size_t hashTable = bytes.size() - 16;
  put32(bytes, 2048, static_cast<std::uint32_t>(longKey.size()));
  for (const std::size_t slot : {hashTable, hashTable + 8}) {
    put32(bytes, slot, hash);
    put32(bytes, slot + 4, 2048);
  }
  put32(bytes, std::size_t{hash & 255U} * 8, static_cast<std::uint32_t>(hashTable));
  put32(bytes, (hash & 255U) * 8 + 4, 2);
  writeFile(path, bytes);
  TinyCDB table(path);
  table.setMode(1);
  EXPECT_EQ(table.valuesFor(std::u16string(longKey.size(), u'k')), Values{});
  table.setMode(0);
}

TEST_F(TinyCDBTest, AddingOutsideAWritingPassIsALineAndTouchesNothing) {
  const std::string line =
      "-[TinyCDB setValue:forKey:] Could not put v into key k because (9) Bad file descriptor";
  TinyCDB table(path);
  const LogCapture log;
  table.setValue_forKey(u"v", u"k");
  EXPECT_EQ(log.lines(), Lines{line}) << "never opened";
  table.setMode(2);
  table.setMode(0);
  const std::string hosts = directory.file("host");
  const int descriptor = open(hosts.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
  for (int i = 0; i < 10000; ++i) {
    table.setValue_forKey(u"v", u"k");
  }
  EXPECT_EQ(log.lines().back(), line) << "closed: the descriptor's number is the host's by now";
  close(descriptor);
  EXPECT_EQ(std::filesystem::file_size(hosts), 0U);
  table.setMode(1);
  table.setValue_forKey(u"v", u"k");
  EXPECT_EQ(log.lines().back(), line) << "reading";
  EXPECT_EQ(table.valuesFor(u"k"), Values{});
  table.setMode(0);
}

TEST_F(TinyCDBTest, AMissTellsTheErrorCodeAsItStands) {
  write({});
  TinyCDB table(path);
  table.setMode(1);
  LogCapture log;
  errno = ENOENT;
  table.valuesFor(u"Graz");
  EXPECT_EQ(log.lines(),
            Lines{"-[TinyCDB valuesFor:] Could not init query for @\"Graz\" because (2)"});
  table.setMode(0);
  std::string bytes = readFile(path);
  bytes.replace(0, 2048, 2048, '\x7F');
  writeFile(path, bytes);
  table.setMode(1);
  log.clear();
  table.valuesFor(u"Graz");
  EXPECT_EQ(log.lines(),
            Lines{"-[TinyCDB valuesFor:] Could not init query for @\"Graz\" because (71)"});
  table.setMode(0);
}

TEST_F(TinyCDBTest, OldMappingsAreReleased) {
  write({{u"Graz", u"Mur"}});
  const auto mappings = [] {
    const std::string maps = readFile("/proc/self/maps");
    std::size_t count = 0;
    for (std::size_t at = 0; (at = maps.find("/table.tdb", at)) != std::string::npos; ++at) {
      ++count;
    }
    return count;
  };
  {
    TinyCDB table(path);
    for (int i = 0; i < 10; ++i) {
      table.setMode(1);
      table.setMode(0);
    }
    EXPECT_EQ(mappings(), 1U);
  }
  EXPECT_EQ(mappings(), 0U);
}

}  // namespace
}  // namespace wordcatcher
