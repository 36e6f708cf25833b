#include "wordcatcher/phonetic/VerifyMetaphone.h"

#include <gtest/gtest.h>

#include <memory>
#include <stdexcept>

#include "TestSupport.h"

namespace wordcatcher {
namespace {

using testing::LogCapture;
using Lines = std::vector<std::string>;

struct CloseFile {
  void operator()(std::FILE* file) const { static_cast<void>(std::fclose(file)); }
};
using File = std::unique_ptr<std::FILE, CloseFile>;

File fileOf(std::string_view bytes) {
  File file(std::tmpfile());
  EXPECT_EQ(std::fwrite(bytes.data(), 1, bytes.size(), file.get()), bytes.size());
  std::rewind(file.get());
  return file;
}

/// The log lines of one run.
Lines verdictsOf(std::string_view bytes) {
  const LogCapture log;
  verifyMetaphone(fileOf(bytes).get());
  return log.lines();
}

/// What the run stops with.
std::string errorOf(std::string_view bytes) {
  const LogCapture log;
  try {
    verifyMetaphone(fileOf(bytes).get());
  } catch (const std::runtime_error& error) {
    return error.what();
  }
  return "none";
}

TEST(VerifyMetaphoneTest, EachLineHasItsVerdict) {
  EXPECT_EQ(verdictsOf("smith,SM0\nknife,KNF"), (Lines{"pass: \"smith\" -> \"SM0\" == \"SM0\"",
                                                       "pass: \"knife\" -> \"KNF\" == \"KNF\""}));
}

TEST(VerifyMetaphoneTest, AWrongExpectationFailsAndTheRunGoesOn) {
  EXPECT_EQ(verdictsOf("smith,XMT\nknife,KNF"), (Lines{"FAIL: \"smith\" -> \"SM0\" == \"XMT\"",
                                                       "pass: \"knife\" -> \"KNF\" == \"KNF\""}));
}

TEST(VerifyMetaphoneTest, APartOfTheCodePasses) {
  EXPECT_EQ(verdictsOf("ark,AR"), (Lines{"pass: \"ark\" -> \"ARK\" == \"AR\""}));
  EXPECT_EQ(verdictsOf("ark,ARKA"), (Lines{"FAIL: \"ark\" -> \"ARK\" == \"ARKA\""}));
}

TEST(VerifyMetaphoneTest, AnEmptyExpectationPasses) {
  EXPECT_EQ(verdictsOf("x,"), (Lines{"pass: \"x\" -> \"KS\" == \"\""}));
  EXPECT_EQ(verdictsOf(","), (Lines{"pass: \"\" -> \"\" == \"\""}));
}

TEST(VerifyMetaphoneTest, TheExpectationIsTakenAsItStands) {
  EXPECT_EQ(verdictsOf("ark, ARK"), (Lines{"FAIL: \"ark\" -> \"ARK\" == \" ARK\""}));
  EXPECT_EQ(verdictsOf("ark,ARK\r\nark,ARK"), (Lines{"FAIL: \"ark\" -> \"ARK\" == \"ARK\r\"",
                                                     "pass: \"ark\" -> \"ARK\" == \"ARK\""}));
}

TEST(VerifyMetaphoneTest, FurtherFieldsAreIgnored) {
  EXPECT_EQ(verdictsOf("smith,SM0,XMT,"), (Lines{"pass: \"smith\" -> \"SM0\" == \"SM0\""}));
}

TEST(VerifyMetaphoneTest, SeveralWordsKeepTheSpacesBetweenTheirCodes) {
  EXPECT_EQ(verdictsOf("Kathryn Shmit,K0RN   XMT"),
            (Lines{"pass: \"Kathryn Shmit\" -> \"K0RN   XMT\" == \"K0RN   XMT\""}));
}

TEST(VerifyMetaphoneTest, TheFileIsUtf8) {
  EXPECT_EQ(verdictsOf("garçon,KRSN"), (Lines{"pass: \"garçon\" -> \"KRSN\" == \"KRSN\""}));
  EXPECT_EQ(errorOf("smith,SM0\ngar\xE7on,KRSN"),
            "Line 2: the text is not UTF-8; convert the file.");
}

TEST(VerifyMetaphoneTest, ALineWithoutACommaEndsTheRunAfterTheVerdictsBeforeIt) {
  const LogCapture log;
  EXPECT_THROW(verifyMetaphone(fileOf("smith,SM0\nknife\nark,ARK").get()), std::runtime_error);
  EXPECT_EQ(log.lines(), (Lines{"pass: \"smith\" -> \"SM0\" == \"SM0\""}));
}

TEST(VerifyMetaphoneTest, TheErrorNamesTheLine) {
  const std::string reason =
      "there is no comma; write each line as word,CODE and end the last one without a newline.";
  EXPECT_EQ(errorOf("knife"), "Line 1: " + reason);
  EXPECT_EQ(errorOf("smith,SM0\nknife"), "Line 2: " + reason);
  EXPECT_EQ(errorOf(""), "Line 1: " + reason);
  EXPECT_EQ(errorOf("smith,SM0\n"), "Line 2: " + reason);
  EXPECT_EQ(errorOf("smith,SM0\n\nknife,KNF"), "Line 2: " + reason);
}

TEST(VerifyMetaphoneTest, AFileThatCannotBeReadIsAnError) {
  const File directory(std::fopen("/", "r"));
  ASSERT_TRUE(directory);
  try {
    verifyMetaphone(directory.get());
    ADD_FAILURE() << "It was read.";
  } catch (const std::runtime_error& error) {
    EXPECT_STREQ(error.what(),
                 "Line 1: the file cannot be read any further; check that it is a file, not a "
                 "directory, and that its disk is sound, and try again.");
  }
}

TEST(VerifyMetaphoneTest, AStreamAtItsEndHasNoVerdicts) {
  const LogCapture log;
  const File file = fileOf("smith,SM0");
  verifyMetaphone(file.get());
  verifyMetaphone(file.get());
  EXPECT_EQ(log.lines().size(), 1U);
}

TEST(LineReaderTest, LinesComeWithoutTheirNewline) {
  const File file = fileOf("smith,SM0\nknife,KNF");
  EXPECT_EQ(readLineAsKXString(file.get()), u"smith,SM0");
  EXPECT_EQ(std::feof(file.get()), 0);
  EXPECT_EQ(readLineAsKXString(file.get()), u"knife,KNF");
  EXPECT_NE(std::feof(file.get()), 0);
  EXPECT_EQ(readLineAsKXString(file.get()), u"");
}

TEST(LineReaderTest, AnEmptyLineStaysInTheStream) {
  const File file = fileOf("\nknife,KNF");
  EXPECT_EQ(readLineAsKXString(file.get()), u"");
  EXPECT_EQ(readLineAsKXString(file.get()), u"");
  EXPECT_EQ(std::fgetc(file.get()), '\n');
  EXPECT_EQ(readLineAsKXString(file.get()), u"knife,KNF");
}

TEST(LineReaderTest, ALineOf4094BytesIsReadAsItIs) {
  const File file = fileOf(std::string(4094, 'a') + "\nb");
  EXPECT_EQ(readLineAsKXString(file.get()), std::u16string(4094, u'a'));
  EXPECT_EQ(readLineAsKXString(file.get()), u"b");
}

TEST(LineReaderTest, ALineOf4095BytesIsJoinedWithTheNext) {
  const File file = fileOf(std::string(4095, 'a') + "\nb\nc");
  EXPECT_EQ(readLineAsKXString(file.get()), std::u16string(4095, u'a') + u"b");
  EXPECT_EQ(readLineAsKXString(file.get()), u"c");
}

TEST(LineReaderTest, ALineOf4095BytesAtTheEndIsAlone) {
  const File file = fileOf(std::string(4095, 'a'));
  EXPECT_EQ(readLineAsKXString(file.get()), std::u16string(4095, u'a'));
  EXPECT_NE(std::feof(file.get()), 0);
}

TEST(LineReaderTest, TheByteAfterEachFullPieceIsDropped) {
  const File file = fileOf(std::string(4095, 'a') + "X" + std::string(4095, 'b') + "Yc\nd");
  EXPECT_EQ(readLineAsKXString(file.get()),
            std::u16string(4095, u'a') + std::u16string(4095, u'b') + u"c");
  EXPECT_EQ(readLineAsKXString(file.get()), u"d");
}

TEST(LineReaderTest, AnEmptyRestOfALongLineStaysInTheStream) {
  const File file = fileOf(std::string(4095, 'a') + "X\nb");
  EXPECT_EQ(readLineAsKXString(file.get()), std::u16string(4095, u'a'));
  EXPECT_EQ(readLineAsKXString(file.get()), u"");
}

TEST(LineReaderTest, ACharacterThatLosesAByteBecomesAReplacementCharacter) {
  // The first byte of the é ends the piece, and the second one is dropped.
  const File secondByte = fileOf(std::string(4094, 'a') + "éb");
  EXPECT_EQ(readLineAsKXString(secondByte.get()), std::u16string(4094, u'a') + u"\uFFFDb");
  // The first byte is dropped.
  const File firstByte = fileOf(std::string(4095, 'a') + "éb");
  EXPECT_EQ(readLineAsKXString(firstByte.get()), std::u16string(4095, u'a') + u"\uFFFDb");
  // A dropped character of one byte leaves the others whole.
  const File noByte = fileOf(std::string(4093, 'a') + "éxéb");
  EXPECT_EQ(readLineAsKXString(noByte.get()), std::u16string(4093, u'a') + u"ééb");
}

TEST(LineReaderTest, OnlyALineInPiecesMayHoldBytesThatAreNotUtf8) {
  const File shorter = fileOf(std::string(4093, 'a') + "\xE9");
  EXPECT_THROW(readLineAsKXString(shorter.get()), std::runtime_error);
  const File longer = fileOf(std::string(4094, 'a') + "\xE9");
  EXPECT_EQ(readLineAsKXString(longer.get()), std::u16string(4094, u'a') + u"\uFFFD");
}

TEST(LineReaderTest, ANulByteHidesTheRestOfItsPiece) {
  const File file = fileOf(std::string_view("ab\0cd\nef", 8));
  EXPECT_EQ(readLineAsKXString(file.get()), u"ab");
  EXPECT_EQ(readLineAsKXString(file.get()), u"ef");
}

TEST(VerifyMetaphoneTest, ALineThatIsCutInsideACharacterHasItsVerdict) {
  const std::string word(4095, 'b');
  EXPECT_EQ(verdictsOf(word + "é,PP\nknife,KNF"),
            (Lines{"pass: \"" + word + "\uFFFD\" -> \"" + std::string(2048, 'P') + "\" == \"PP\"",
                   "pass: \"knife\" -> \"KNF\" == \"KNF\""}));
}

TEST(VerifyMetaphoneTest, TwoLinesThatAreReadAsOneAreSplitAsOne) {
  // The first line is its word to the very end; the second one brings the comma.
  const std::string word(4095, 'b');
  EXPECT_EQ(verdictsOf(word + "\nb,PP"),
            (Lines{"pass: \"" + word + "b\" -> \"" + std::string(2048, 'P') + "\" == \"PP\""}));
  // The first line has the comma: the second becomes part of its code.
  const std::string line = "ark," + std::string(4091, ' ');
  EXPECT_EQ(verdictsOf(line + "\nknife,KNF"),
            (Lines{"FAIL: \"ark\" -> \"ARK\" == \"" + std::string(4091, ' ') + "knife\""}));
}

}  // namespace
}  // namespace wordcatcher
