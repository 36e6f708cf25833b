#include "wordcatcher/phonetic/KXMetaphone.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>
#include <sys/mman.h>

#include <stdexcept>
#include <string>
#include <vector>

#include "CodeBounds.h"

namespace wordcatcher {
namespace {

std::u16string translate(std::u16string_view text) { return KXMetaphone().translate(text); }

std::u16string repeated(std::u16string_view piece, std::size_t length) {
  std::u16string word;
  while (word.size() < length) {
    word += piece;
  }
  word.resize(length);
  return word;
}

TEST(KXMetaphoneTest, TextsWithoutWordsGiveNothing) {
  EXPECT_EQ(translate(u""), u"");
  EXPECT_EQ(translate(u" \t\n"), u"");
  EXPECT_EQ(translate(u"... ?! (–) «»"), u"");
}

TEST(KXMetaphoneTest, EachCodeStandsBetweenThePaddingAndIsFollowedByOneSpace) {
  EXPECT_EQ(translate(u"a"), u" A  ");
  EXPECT_EQ(translate(u"Kathryn Shmit"), u" K0RN   XMT  ");
  EXPECT_EQ(translate(u"Kathryn, Shmit!"), u" K0RN   XMT  ");
}

TEST(KXMetaphoneTest, ARuleMayPassOverThePaddingAtTheEnd) {
  // S1 takes itself, the C and what follows, here the padding: SK.
  EXPECT_EQ(translate(u"sc"), u" SK ");
  EXPECT_EQ(translate(u"disc harrow"), u" TSK  HR  ");
}

TEST(KXMetaphoneTest, AVowelIsHeardOnlyAsTheFirstLetter) {
  EXPECT_EQ(translate(u"ebb"), u" AP  ");
  EXPECT_EQ(translate(u"bee"), u" P  ");
  EXPECT_EQ(translate(u"aerie"), u" AR  ");
  EXPECT_EQ(translate(u"ouija"), u" AJ  ");
  EXPECT_EQ(translate(u"eye"), u" A  ");
}

TEST(KXMetaphoneTest, SilentFirstLettersAreKept) {
  EXPECT_EQ(translate(u"gnat"), u" NT  ");
  EXPECT_EQ(translate(u"knight"), u" KNT  ");
  EXPECT_EQ(translate(u"pneumonia"), u" PNMN  ");
  EXPECT_EQ(translate(u"psalm"), u" PSLM  ");
  EXPECT_EQ(translate(u"wrist"), u" RST  ");
  EXPECT_EQ(translate(u"xavier"), u" KSFR  ");
}

TEST(KXMetaphoneTest, ALongWordHasALongCode) {
  EXPECT_EQ(translate(u"internationalisation"), u" ANTRNXNLSXN  ");
}

TEST(KXMetaphoneTest, CedillaAndTildeAreHeardInBothCases) {
  EXPECT_EQ(translate(u"garçon GARÇON"), u" KRSN   KRSN  ");
  EXPECT_EQ(translate(u"niño NIÑO ñu"), u" NN   NN   N  ");
}

TEST(KXMetaphoneTest, NothingIsNormalised) {
  // A C and a combining cedilla are two code units that the rules see one by one.
  EXPECT_EQ(translate(u"garc\u0327on"), u" KRKN  ");
  EXPECT_EQ(translate(u"\u00E9t\u00E9"), u" T  ");
}

TEST(KXMetaphoneTest, UpperCasingMayLengthenAWord) {
  EXPECT_EQ(translate(u"stra\u00DFe"), u" STRS  ");
  EXPECT_EQ(translate(u"\uFB01le"), u" FL  ");
}

TEST(KXMetaphoneTest, DigitsAndOtherScriptsAreWordsWithoutACode) {
  EXPECT_EQ(translate(u"1984"), u"   ");
  EXPECT_EQ(translate(u"b2b"), u" PP  ");
  EXPECT_EQ(translate(u"дом"), u"   ");
  EXPECT_EQ(translate(u"\U00020000"), u"   ");
}

TEST(KXMetaphoneTest, PunctuationInsideAWordIsTakenOut) {
  EXPECT_EQ(translate(u"O'Neil"), translate(u"oneil"));
  EXPECT_EQ(translate(u"O'Neil"), u" ANL  ");
  EXPECT_EQ(translate(u"O\u2019Neil"), u" ANL  ");
  // Without its apostrophe the word begins with DG.
  EXPECT_EQ(translate(u"d'gel"), u" JL  ");
  // A punctuation mark outside the Basic Multilingual Plane (U+16E97).
  EXPECT_EQ(KXMetaphone()._translateWord(u"b\U00016E97b"), u" P ");
}

TEST(KXMetaphoneTest, PunctuationAloneCanBeAWord) {
  EXPECT_EQ(translate(u"__"), u"   ");
  EXPECT_EQ(translate(u"a __ b"), u" A      P  ");
}

TEST(KXMetaphoneTest, SpacesInsideAWordAreHeard) {
  EXPECT_EQ(KXMetaphone()._translateWord(u""), u"  ");
  EXPECT_EQ(KXMetaphone()._translateWord(u"a b"), u" A P ");
  // C3 before a space and a C takes both with it.
  EXPECT_EQ(KXMetaphone()._translateWord(u"mac caffrey"), u" MKFR ");
}

TEST(KXMetaphoneTest, AnEncoderKeepsNothingBetweenWordsAndTexts) {
  KXMetaphone encoder;
  EXPECT_EQ(encoder.translate(u"smith smith"), u" SM0   SM0  ");
  EXPECT_EQ(encoder.translate(u"smith"), u" SM0  ");
  EXPECT_EQ(encoder._translateWord(u"smith"), u" SM0 ");
}

TEST(KXMetaphoneTest, OnlyThePrimaryCodeIsReturned) {
  KXMetaphone encoder;
  encoder._append(u"T");
  encoder._append_alt(u"K", u"J");
  EXPECT_EQ(encoder._translateWord(u"a"), u"TK A ");
  EXPECT_EQ(encoder._translateWord(u"a"), u" A ");
}

TEST(KXMetaphoneTest, ResetForgetsWhatWasAppended) {
  KXMetaphone encoder;
  encoder._append_alt(u"K", u"J");
  encoder.reset();
  EXPECT_EQ(encoder._translateWord(u"a"), u" A ");
}

TEST(KXMetaphoneTest, LengthsAreCountedModulo65536) {
  // 65,533 letters and two spaces are the longest word that is encoded whole.
  EXPECT_EQ(translate(repeated(u"BA", 65533)).size(), 1 + 32767 + 1 + 1);
  // One more, and the padded length counts as 0.
  EXPECT_EQ(translate(repeated(u"BA", 65534)), u" ");
  // Then as 1: the space before the word.
  EXPECT_EQ(translate(repeated(u"BA", 65535)), u"  ");
  // Then as 2 and 3: the space and the first letters.
  EXPECT_EQ(translate(repeated(u"BA", 65536)), u" P ");
  EXPECT_EQ(translate(repeated(u"BA", 65537)), u" P ");
  EXPECT_EQ(translate(repeated(u"BA", 65538)), u" PP ");
  EXPECT_EQ(translate(repeated(u"BA", 2 * 65536 - 2)), u" ");
  EXPECT_EQ(translate(repeated(u"BA", 200000)).size(), 1 + (200002 % 65536) / 2 + 1);
}

/// A word of A's with `piece` at the position, of which 65,534 letters count.
std::u16string cutWordWith(std::u16string_view piece, std::size_t position) {
  return repeated(repeated(u"A", position - 1).append(piece) + repeated(u"A", 65536), 131069);
}

TEST(KXMetaphoneTest, AStepBeyondTheLastPositionEndsTheWord) {
  // Counted in 16 bits, the positions after these rules would be 0, 1 and 2, and the word would
  // begin again.
  EXPECT_EQ(translate(cutWordWith(u"SC", 65533)), u" ASK ");
  EXPECT_EQ(translate(cutWordWith(u"SC", 65534)), u" ASK ");
  EXPECT_EQ(translate(cutWordWith(u"WITZ", 65534)), u" ATS ");
  // Of 65,540 letters the first 5 count, and the W takes 4 places from the last of them.
  EXPECT_EQ(translate(u"AAAAWITZ" + repeated(u"A", 65532)), u" ATS ");
}

TEST(KXMetaphoneTest, ACutWordIsReadBeyondItsEnd) {
  // Of 65,538 letters the first 3 count; the rules of the last of them see what follows.
  EXPECT_EQ(translate(u"AAT" + repeated(u"H", 65535)), u" A0 ");
  // UMB before the cut: the M passes over the B, and ILLO over its end.
  EXPECT_EQ(translate(u"UMB" + repeated(u"A", 65534)), u" AM ");
  EXPECT_EQ(translate(u"ILLO" + repeated(u"A", 65535)), u" AL ");
}

TEST(KXMetaphoneTest, AnEmptyPaddedLengthTouchesNoBuffer) {
  KXMetaphone encoder;
  encoder._append(u"X");
  EXPECT_EQ(encoder._translateWord(repeated(u"BA", 65534)), u"");
  EXPECT_EQ(encoder._translateWord(u"a"), u"X A ");
}

TEST(KXMetaphoneTest, LengthIsCountedAfterPunctuationIsGoneAndCasesAreMapped) {
  EXPECT_EQ(translate(repeated(u"BA", 65533) + u"_").size(), 1 + 32767 + 1 + 1);
  EXPECT_EQ(translate(repeated(u"\u00DF", 32767)), u" ");
}

TEST(KXMetaphoneTest, AskingAboutTheWholeWordStaysLinear) {
  // Each GN asks whether the word is Slavo-Germanic, which reads all of it.
  EXPECT_EQ(translate(repeated(u"GN", 65532)).size(), 1 + 32766 + 1 + 1);
}

/// A text of U+0000 that takes address space and, being read at most, no memory.
class EndlessText {
 public:
  explicit EndlessText(std::size_t length)
      : _bytes(length * sizeof(char16_t)),
        _memory(
            mmap(nullptr, _bytes, PROT_READ, MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0)) {}
  ~EndlessText() { munmap(_memory, _bytes); }
  EndlessText(const EndlessText&) = delete;
  EndlessText& operator=(const EndlessText&) = delete;

  bool exists() const { return _memory != MAP_FAILED; }
  std::u16string_view text() const {
    return {static_cast<const char16_t*>(_memory), _bytes / sizeof(char16_t)};
  }

 private:
  std::size_t _bytes;
  void* _memory;
};

TEST(KXMetaphoneTest, LongerThanIcuCountsIsAnErrorThatLeavesTheEncoderAsItWas) {
  const EndlessText endless(std::size_t{1} << 31);
  ASSERT_TRUE(endless.exists());
  KXMetaphone encoder;
  encoder._append(u"X");
  const auto expectRefused = [](const auto& encode, const std::string& advice) {
    try {
      encode();
      ADD_FAILURE() << "It was taken.";
    } catch (const std::length_error& error) {
      EXPECT_NE(std::string(error.what()).find(advice), std::string::npos) << error.what();
    }
  };
  expectRefused([&] { encoder.translate(endless.text()); }, "; give it in shorter pieces.");
  expectRefused([&] { encoder._translateWord(endless.text()); }, "; leave it out or cut it.");
  EXPECT_EQ(encoder._translateWord(u"a"), u"X A ");
  EXPECT_EQ(encoder.translate(u"smith"), u" SM0  ");
}

void checkCodes(const std::u16string& text) {
  KXMetaphone encoder;
  const std::u16string codes = encoder.translate(text);
  const testing::CodeBounds bounds = testing::boundsOfText(text);
  RC_ASSERT(testing::within(bounds, codes));
  RC_ASSERT(codes.empty() == (bounds.spaces == 0));
  RC_ASSERT(testing::within(testing::boundsOfWord(text), encoder._translateWord(text)));
}

TEST(CodeBoundsTest, LettersAndSpacesAreCountedApart) {
  const testing::CodeBounds bounds = testing::boundsOfText(u"stra\u00DFe 1984, ça!");
  EXPECT_EQ(bounds.letters, 2 * (7 + 0 + 2));
  EXPECT_EQ(bounds.spaces, 3 * 3);
  EXPECT_EQ(testing::boundsOfWord(u"mac queen").letters, 2 * 8);
  EXPECT_EQ(testing::boundsOfWord(u"mac queen").spaces, 3);
  EXPECT_TRUE(testing::within({2, 2}, u" KS "));
  EXPECT_FALSE(testing::within({1, 9}, u" KS "));
  EXPECT_FALSE(testing::within({9, 1}, u" KS "));
  EXPECT_FALSE(testing::within({9, 9}, u" KV "));
}

RC_GTEST_PROP(KXMetaphonePropertyTest, AnyCodeUnitsAreEncoded,
              (const std::vector<std::uint16_t>& units)) {
  checkCodes(std::u16string(units.begin(), units.end()));
}

RC_GTEST_PROP(KXMetaphonePropertyTest, AnyLettersAreEncoded, ()) {
  const auto letter = rc::gen::element(u'A', u'C', u'E', u'G', u'H', u'I', u'J', u'K', u'L', u'M',
                                       u'N', u'O', u'S', u'T', u'U', u'W', u'X', u'Z', u'B', u'R',
                                       u'Ç', u'\'', u' ', u'ß', char16_t{0xD800}, char16_t{0xDC00});
  checkCodes(*rc::gen::container<std::u16string>(letter));
}

RC_GTEST_PROP(KXMetaphonePropertyTest, CaseAndOuterPunctuationDoNotMatter, ()) {
  const auto word = *rc::gen::nonEmpty(
      rc::gen::container<std::u16string>(rc::gen::inRange<char16_t>(u'a', u'z' + 1)));
  std::u16string upper = word;
  for (char16_t& letter : upper) {
    letter = static_cast<char16_t>(letter - u'a' + u'A');
  }
  RC_ASSERT(translate(word) == translate(upper));
  RC_ASSERT(translate(word) == translate(u"(" + word + u"!)"));
}

RC_GTEST_PROP(KXMetaphonePropertyTest, WordsAreEncodedOneByOne, ()) {
  const auto words = *rc::gen::container<std::vector<std::u16string>>(rc::gen::nonEmpty(
      rc::gen::container<std::u16string>(rc::gen::inRange<char16_t>(u'a', u'z' + 1))));
  KXMetaphone encoder;
  std::u16string text;
  std::u16string codes;
  for (const std::u16string& word : words) {
    text += word + u' ';
    codes += encoder._translateWord(word) + u' ';
  }
  RC_ASSERT(encoder.translate(text) == codes);
}

}  // namespace
}  // namespace wordcatcher
