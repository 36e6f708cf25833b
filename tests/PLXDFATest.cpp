#include "wordcatcher/storage/PLXDFA.h"

#include <gtest/gtest.h>
#include <sys/file.h>
#include <unistd.h>

#include <fcntl.h>

#include <cerrno>
#include <filesystem>
#include <sstream>

#include "TestSupport.h"

namespace wordcatcher {
namespace {

using testing::LogCapture;
using testing::outputOf;
using testing::TemporaryDirectory;
using Strings = std::set<std::u16string>;

class PLXDFATest : public ::testing::Test {
 protected:
  TemporaryDirectory directory;
};

TEST_F(PLXDFATest, AnswersWhatWasStored) {
  PLXDFA automaton(directory.path());
  automaton.setMode(2);
  automaton.addEdge_fromState_toState(u"a", u"", u"a");
  automaton.addEdge_fromState_toState(u"b", u"a", u"ab");
  automaton.addFinalState(u"ab");
  automaton.setMode(1);
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"", u"a"), u"a");
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"a", u"b"), u"ab");
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"a", u"c"), std::nullopt);
  EXPECT_TRUE(automaton.isFinalState(u"ab"));
  EXPECT_FALSE(automaton.isFinalState(u"a"));
  EXPECT_EQ(automaton.edgesFromState(u"a"), Strings{u"b"});
  for (const auto* name : {"edgeTable.tdb", "finalTable.tdb", "dataTable.tdb"}) {
    EXPECT_TRUE(std::filesystem::exists(directory.file(name))) << name;
  }
}

TEST_F(PLXDFATest, TheSameEdgeTwiceIsOneSymbolAndTwoRecords) {
  PLXDFA automaton(directory.path());
  automaton.setMode(2);
  automaton.addEdge_fromState_toState(u"x", u"a", u"ax");
  automaton.addEdge_fromState_toState(u"x", u"a", u"ax");
  automaton.addFinalState(u"ax");
  automaton.addFinalState(u"ax");
  automaton.setMode(1);
  EXPECT_EQ(automaton.edgesFromState(u"a"), Strings{u"x"});
  automaton.setMode(0);
  EXPECT_EQ(outputOf("cdb -d " + directory.file("edgeTable.tdb")), "+1,1:a->x\n+1,1:a->x\n\n");
  EXPECT_EQ(outputOf("cdb -d " + directory.file("finalTable.tdb")), "+2,1:ax->t\n+2,1:ax->t\n\n");
}

TEST_F(PLXDFATest, NoSymbolIsSpecial) {
  PLXDFA automaton(directory.path());
  automaton.setMode(2);
  automaton.addEdge_fromState_toState(u"*", u"", u"*");
  automaton.setMode(1);
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"", u"*"), u"*");
  EXPECT_EQ(automaton.followingStateFrom_withSymbol(u"", u"a"), std::nullopt);
}

TEST_F(PLXDFATest, AStateCarriesEveryDistinctDataString) {
  PLXDFA automaton(directory.path());
  automaton.setMode(2);
  automaton.setDataFor_to(u"ulm", u"Donau");
  automaton.setDataFor_to(u"ulm", u"Blau");
  automaton.setDataFor_to(u"ulm", u"Donau");
  automaton.setMode(1);
  EXPECT_EQ(automaton.dataFor(u"ulm"), (Strings{u"Blau", u"Donau"}));
  EXPECT_EQ(automaton.dataFor(u"rom"), Strings{});
}

TEST_F(PLXDFATest, TheStartStateCanBeFinalAndCarryData) {
  PLXDFA automaton(directory.path());
  EXPECT_EQ(automaton.startState(), u"");
  automaton.setMode(2);
  automaton.addFinalState(u"");
  automaton.setDataFor_to(u"", u"nameless");
  automaton.setMode(1);
  EXPECT_TRUE(automaton.isFinalState(u""));
  EXPECT_EQ(automaton.dataFor(u""), Strings{u"nameless"});
}

TEST_F(PLXDFATest, ASecondWritingPassReplacesAllThreeTables) {
  PLXDFA automaton(directory.path());
  automaton.setMode(2);
  automaton.addEdge_fromState_toState(u"a", u"", u"a");
  automaton.addFinalState(u"a");
  automaton.setDataFor_to(u"a", u"old");
  automaton.setMode(1);
  automaton.setMode(2);
  automaton.addEdge_fromState_toState(u"b", u"", u"b");
  automaton.setMode(1);
  EXPECT_EQ(automaton.edgesFromState(u""), Strings{u"b"});
  EXPECT_FALSE(automaton.isFinalState(u"a"));
  EXPECT_EQ(automaton.dataFor(u"a"), Strings{});
}

TEST_F(PLXDFATest, GetModeFollowsTheEdgeTable) {
  PLXDFA automaton(directory.path());
  EXPECT_EQ(automaton.getMode(), 0);
  automaton.setMode(2);
  EXPECT_EQ(automaton.getMode(), 0);
  automaton.setMode(0);
  std::filesystem::remove(directory.file("dataTable.tdb"));
  automaton.setMode(1);
  EXPECT_EQ(automaton.getMode(), 1) << "the data table cannot be opened, the edge table can";
  automaton.setMode(0);
  EXPECT_EQ(automaton.getMode(), 1);
  PLXDFA other(directory.path());
  std::filesystem::rename(directory.file("edgeTable.tdb"), directory.file("away"));
  other.setMode(1);
  EXPECT_EQ(other.getMode(), 0) << "only the final-state table can be opened";
}

TEST_F(PLXDFATest, ModesGoToTheEdgeThenTheDataThenTheFinalTable) {
  PLXDFA automaton(directory.path());
  automaton.setMode(2);
  LogCapture log;
  automaton.setMode(0);
  const std::string line = "-[TinyCDB setMode:] Finalizing " + directory.path();
  EXPECT_EQ(log.lines(), (std::vector<std::string>{line + "edgeTable.tdb", line + "dataTable.tdb",
                                                   line + "finalTable.tdb"}));
}

TEST_F(PLXDFATest, ADirectoryWithTheEdgeTableAloneIsWrittenWithoutWaiting) {
  {
    TinyCDB edges(directory.file("edgeTable.tdb"));
    edges.setMode(2);
    edges.setMode(0);
  }
  PLXDFA automaton(directory.path());
  automaton.setMode(2);  // the existing file must not make the new ones open twice
  automaton.addFinalState(u"x");
  automaton.setMode(1);
  EXPECT_TRUE(automaton.isFinalState(u"x"));
}

TEST_F(PLXDFATest, TheDefaultPathPutsAPrefixBeforeTheNames) {
  const auto before = std::filesystem::current_path();
  std::filesystem::current_path(directory.path());
  {
    PLXDFA automaton;
    EXPECT_EQ(automaton.path(), "test_");
    automaton.setMode(2);
  }
  std::filesystem::current_path(before);
  for (const auto* name : {"test_edgeTable.tdb", "test_finalTable.tdb", "test_dataTable.tdb"}) {
    EXPECT_TRUE(std::filesystem::exists(directory.file(name))) << name;
  }
}

TEST_F(PLXDFATest, PathAndStartStateAreOnlyStored) {
  PLXDFA automaton(directory.path());
  automaton.setPath("/nowhere/");
  automaton.setStartState(u"s");
  EXPECT_EQ(automaton.path(), "/nowhere/");
  EXPECT_EQ(automaton.startState(), u"s");
  automaton.setMode(2);
  EXPECT_TRUE(std::filesystem::exists(directory.file("edgeTable.tdb")));
}

TEST_F(PLXDFATest, DroppingItFinishesTheTablesAndGivesTheLocksBack) {
  {
    PLXDFA automaton(directory.path());
    automaton.setMode(2);
    automaton.addFinalState(u"steyr");
  }
  for (const auto* name : {"edgeTable.tdb", "finalTable.tdb", "dataTable.tdb"}) {
    const int descriptor = open(directory.file(name).c_str(), O_RDONLY | O_CLOEXEC);
    ASSERT_GE(descriptor, 0);
    EXPECT_EQ(flock(descriptor, LOCK_EX | LOCK_NB), 0) << name;
    close(descriptor);
  }
  EXPECT_EQ(outputOf("cdb -d " + directory.file("finalTable.tdb")), "+5,1:steyr->t\n\n");
}

TEST_F(PLXDFATest, DescribesItselfByClassAndIdentity) {
  const PLXDFA automaton(directory.path());
  std::ostringstream expected;
  expected << "<PLXDFA: " << static_cast<const void*>(&automaton) << '>';
  std::ostringstream text;
  text << automaton;
  EXPECT_EQ(text.str(), expected.str());
}

}  // namespace
}  // namespace wordcatcher
