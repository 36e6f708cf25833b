// The alternate code, which no caller sees: the encoder keeps it beside the one that it returns.
// The tests reach it through the flag that says which of the two is the result. Each alternate is
// worked out by hand from the rules; the working names each letter with its position, from 1, and
// what it adds to the alternate code; "-" is nothing, "(2)" the places that its rule takes if there
// are more than one.

#include <gtest/gtest.h>

#include <ostream>
#include <string>

#include "PrivateMember.h"
#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/text/TextForm.h"

namespace wordcatcher::testing {

struct IsAlternate {
  friend auto memberOf(IsAlternate);
};
template struct PrivateMember<IsAlternate, &KXMetaphone::_isAlternate>;

struct Primary {
  friend auto memberOf(Primary);
};
template struct PrivateMember<Primary, &KXMetaphone::_primary>;

struct Secondary {
  friend auto memberOf(Secondary);
};
template struct PrivateMember<Secondary, &KXMetaphone::_secondary>;

}  // namespace wordcatcher::testing

namespace wordcatcher {
namespace {

bool& isAlternate(KXMetaphone& encoder) {
  return encoder.*memberOf(wordcatcher::testing::IsAlternate());
}

const std::u16string& primary(KXMetaphone& encoder) {
  return encoder.*memberOf(wordcatcher::testing::Primary());
}

const std::u16string& secondary(KXMetaphone& encoder) {
  return encoder.*memberOf(wordcatcher::testing::Secondary());
}

std::u16string withoutPadding(std::u16string code) {
  code.erase(0, code.find_first_not_of(u' '));
  code.erase(code.find_last_not_of(u' ') + 1);
  return code;
}

struct Case {
  std::u16string_view word;
  std::u16string_view primary;
  std::u16string_view alternate;
};

std::ostream& operator<<(std::ostream& stream, const Case& traced) {
  return writeUtf8(stream, traced.word);
}

class AlternateCodeTest : public ::testing::TestWithParam<Case> {};

TEST_P(AlternateCodeTest, BothCodesAreAsWorkedOut) {
  KXMetaphone encoder;
  EXPECT_EQ(withoutPadding(encoder._translateWord(GetParam().word)), GetParam().primary);
  isAlternate(encoder) = true;
  EXPECT_EQ(withoutPadding(encoder._translateWord(GetParam().word)), GetParam().alternate);
  EXPECT_FALSE(isAlternate(encoder));
  EXPECT_EQ(withoutPadding(encoder._translateWord(GetParam().word)), GetParam().primary);
}

#define LETTER(name, ...) \
  INSTANTIATE_TEST_SUITE_P(name, AlternateCodeTest, ::testing::Values(__VA_ARGS__))

LETTER(C,                                     //
       Case{u"michael", u"MKL", u"MXL"},      // M1 M, I2 -, C3 X (2; CHAE), L7 L
       Case{u"child", u"XLT", u"KLT"},        // C1 K (2), I3 -, L4 L, D5 T
       Case{u"milch", u"MLX", u"MLK"},        // M1 M, I2 -, L3 L, C4 K (2)
       Case{u"teacher", u"TXR", u"TKR"},      // T1 T, E2 -, A3 -, C4 K (2), E6 -, R7 R
       Case{u"licht", u"LKT", u"LKT"},        // L1 L, I2 -, C3 K (2; before T), T5 T
       Case{u"czech", u"SK", u"XK"},          // C1 X (2; CZ), E3 -, C4 K (2; E before, the end)
       Case{u"scwicz", u"SKKS", u"SKKTS"},    // S1 SK (3), I4 -, C5 K (WICZ), Z6 TS (C before)
       Case{u"precious", u"PRSS", u"PRXS"},   // P1 P, R2 R, E3 -, C4 X (2; CIO), U7 -, S8 S
       Case{u"ancient", u"ANSNT", u"ANXNT"},  // A1 A, N2 N, C3 X (2; CIE), N6 N, T7 T
       Case{u"social", u"SSL", u"SXL"},       // S1 S, O2 -, C3 X (2; CIA), A5 -, L6 L
       Case{u"city", u"ST", u"ST"},           // C1 S (2; CI, none of the three), T3 T, Y4 -
       Case{u"vaccine", u"FXN", u"FXN"});     // V1 F, A2 -, C3 X (3; CCI), N6 N, E7 -

LETTER(G,                                  //
       Case{u"sign", u"SN", u"SKN"},       // S1 S, I2 -, G3 KN (2)
       Case{u"wagner", u"AKNR", u"FKNR"},  // W1 F, A2 -, G3 KN (2; a W), E5 -, R6 R
       Case{u"rigney", u"RKN", u"RKN"},    // R1 R, I2 -, G3 KN (2; EY), E5 -, Y6 -
       Case{u"glide", u"KLT", u"LT"},      // G1 L (2), I3 -, D4 T, E5 -
       Case{u"gliwice", u"KLS", u"KLS"},   // G1 K (a W), L2 L, I3 -, W4 -, I5 -, C6 S (2)
       Case{u"gypsy", u"KPS", u"JPS"},     // G1 J (2; first, GY), P3 P, S4 S, Y5 -
       Case{u"german", u"KRMN", u"JRMN"},  // G1 J (2; first, ER), R3 R, M4 M, A5 -, N6 N
       Case{u"danger", u"TNKR", u"TNJR"},  // D1 T, A2 -, N3 N, G4 J (2; ER), R6 R
       Case{u"stingy", u"STNK", u"STNJ"},  // S1 S, T2 T, I3 -, N4 N, G5 J (2; GY)
       Case{u"forget", u"FRKT", u"FRKT"},  // F1 F, O2 -, R3 R, G4 K (2; ET), T6 T
       Case{u"ogier", u"AJR", u"AJR"},     // O1 A, G2 J (2; IER and the end), E4 -, R5 R
       Case{u"ogiers", u"AJRS", u"AKRS"},  // O1 A, G2 K (2; not the end), E4 -, R5 R, S6 S
       Case{u"magic", u"MJK", u"MKK"},     // M1 M, A2 -, G3 K (2; GI), C5 K
       Case{u"tiger", u"TJR", u"TKR"});    // T1 T, I2 -, G3 K (2; I before), R5 R

LETTER(J,                                //
       Case{u"jose", u"HS", u"HS"},      // J1 H (all of the word), O2 -, S3 S, E4 -
       Case{u"joseph", u"JSF", u"HSF"},  // J1 H (JOSE), O2 -, S3 S, E4 -, P5 F (2)
       Case{u"john", u"JN", u"AN"},      // J1 A (first), O2 -, H3 -, N4 N
       Case{u"hijo", u"HJ", u"HH"},      // H1 H (2), J3 H (I before, O after), O4 -
       Case{u"ouija", u"AJ", u"AH"},     // O1 A, U2 -, I3 -, J4 H (I before, A after), A5 -
       Case{u"twoja", u"TJ", u"TJ"},     // T1 T, W2 -, O3 -, J4 J (a W), A5 -
       Case{u"bajt", u"PT", u"PT"});     // B1 P, A2 -, J3 - (before T), T4 T

LETTER(S,                                     //
       Case{u"sugar", u"XKR", u"SKR"},        // S1 S (SUGAR), U2 -, G3 K, A4 -, R5 R
       Case{u"vision", u"FSN", u"FXN"},       // V1 F, I2 -, S3 X (3; SIO), N6 N
       Case{u"asian", u"ASN", u"AXN"},        // A1 A, S2 X (3; SIA), N5 N
       Case{u"kasia", u"KS", u"KS"},          // K1 K, A2 -, S3 S (3; SIA, a K)
       Case{u"small", u"SML", u"XML"},        // S1 X (first, before M), M2 M, A3 -, L4 L (2)
       Case{u"snow", u"SN", u"XN"},           // S1 X (first, before N), N2 N, O3 -, W4 -
       Case{u"slip", u"SLP", u"XLP"},         // S1 X (first, before L), L2 L, I3 -, P4 P
       Case{u"swim", u"SM", u"XM"},           // S1 X (first, before W), W2 -, I3 -, M4 M
       Case{u"maszyna", u"MSN", u"MXN"},      // M1 M, A2 -, S3 X (2; before Z), Y5 -, N6 N
       Case{u"schere", u"XR", u"SKR"},        // S1 SK (3; ER), E4 -, R5 R, E6 -
       Case{u"menschen", u"MNXN", u"MNSKN"},  // M1 M, E2 -, N3 N, S4 SK (3; EN), E7 -, N8 N
       Case{u"school", u"SKL", u"SKL"},       // S1 SK (3; OO), O4 -, O5 -, L6 L
       Case{u"schmidt", u"XMT", u"SMT"},      // S1 S (3; first), M4 M, I5 -, D6 T (2)
       Case{u"mosche", u"MX", u"MX"});        // M1 M, O2 -, S3 X (3; not the first), E6 -

LETTER(T,                                  //
       Case{u"smith", u"SM0", u"XMT"},     // S1 X (first, before M), M2 M, I3 -, T4 T (2)
       Case{u"gottheit", u"K0T", u"KTT"},  // G1 K, O2 -, T3 T (2), H5 -, E6 -, I7 -, T8 T
       Case{u"thomas", u"TMS", u"TMS"});   // T1 T (2; OM), O3 -, M4 M, A5 -, S6 S

LETTER(W,                                          //
       Case{u"water", u"ATR", u"FTR"},             // W1 F (before A), A2 -, T3 T, E4 -, R5 R
       Case{u"where", u"AR", u"AR"},               // W1 A (WH), H2 -, E3 -, R4 R, E5 -
       Case{u"dostojewski",                        //
            u"TSTJSK", u"TSTJFSK"},                // D1 T, O2 -, S3 S, T4 T, O5 -, J6 J, E7 -, W8 F
                                                   // (EWSKI), S9 S, K10 K, I11 -
       Case{u"kowalewsky", u"KLSK", u"KLFSK"},     // K1 K, O2 -, W3 -, A4 -, L5 L, E6 -, W7 F
                                                   // (EWSKY), S8 S, K9 K, Y10 -
       Case{u"lewandowski", u"LNTSK", u"LNTFSK"},  // L1 L, E2 -, W3 -, A4 -, N5 N, D6 T, O7 -, W8 F
                                                   // (OWSKI), S9 S, K10 K, I11 -
       Case{u"makowsky", u"MKSK", u"MKFSK"},   // M1 M, A2 -, K3 K, O4 -, W5 F (OWSKY), S6 S, K7 K
       Case{u"kowalski", u"KLSK", u"KLSK"},    // K1 K, O2 -, W3 -, A4 -, L5 L, S6 S, K7 K, I8 -
       Case{u"horowitz", u"HRTS", u"HRFX"},    // H1 H (2), R3 R, O4 -, W5 FX (4)
       Case{u"mickiewicz", u"MKTS", u"MKFX"},  // M1 M, I2 -, C3 K (2), I5 -, E6 -, W7 FX (4)
       Case{u"witzel", u"ATSL", u"FFXL"});     // W1 F (before I), then FX (4), E5 -, L6 L

LETTER(Z,                                    //
       Case{u"mezzo", u"MS", u"MTS"},        // M1 M, E2 -, Z3 TS (2; ZO), O5 -
       Case{u"pozzi", u"PS", u"PTS"},        // P1 P, O2 -, Z3 TS (2; ZI), I5 -
       Case{u"pizza", u"PS", u"PTS"},        // P1 P, I2 -, Z3 TS (2; ZA), A5 -
       Case{u"klotz", u"KLTS", u"KLTS"},     // K1 K, L2 L, O3 -, T4 T, Z5 S (a K, T before)
       Case{u"sarkozy", u"SRKS", u"SRKTS"},  // S1 S, A2 -, R3 R, K4 K, O5 -, Z6 TS (a K), Y7 -
       Case{u"zorn", u"SRN", u"SRN"},        // Z1 S (not Slavo-Germanic), O2 -, R3 R, N4 N
       Case{u"nozze", u"NS", u"NS"});        // N1 N, O2 -, Z3 S (2; ZE), E5 -

TEST(CodeBuffersTest, ANewEncoderHasEmptyBuffersAndReturnsThePrimaryOne) {
  KXMetaphone encoder;
  EXPECT_FALSE(isAlternate(encoder));
  EXPECT_EQ(primary(encoder), u"");
  EXPECT_EQ(secondary(encoder), u"");
}

TEST(CodeBuffersTest, ACodeIsAppendedToBothBuffers) {
  KXMetaphone encoder;
  encoder._append(u"T");
  encoder._append(u"");
  encoder._append(u"SK");
  EXPECT_EQ(primary(encoder), u"TSK");
  EXPECT_EQ(secondary(encoder), u"TSK");
}

TEST(CodeBuffersTest, TwoCodesAreAppendedToABufferEach) {
  KXMetaphone encoder;
  encoder._append(u"H");
  encoder._append_alt(u"TS", u"FX");
  encoder._append_alt(u"", u"F");
  encoder._append_alt(u"L", u" ");
  EXPECT_EQ(primary(encoder), u"HTSL");
  EXPECT_EQ(secondary(encoder), u"HFXF ");
  EXPECT_FALSE(isAlternate(encoder));
}

TEST(CodeBuffersTest, ResetEmptiesBothBuffersAndTakesTheFlagBack) {
  KXMetaphone encoder;
  encoder._append_alt(u"K", u"J");
  isAlternate(encoder) = true;
  encoder.reset();
  EXPECT_EQ(primary(encoder), u"");
  EXPECT_EQ(secondary(encoder), u"");
  EXPECT_FALSE(isAlternate(encoder));
}

TEST(CodeBuffersTest, NoWordSetsTheFlagOrLeavesACode) {
  KXMetaphone encoder;
  for (const std::u16string_view word : {u"horowitz", u"joseph", u"sarkozy", u"smith", u""}) {
    encoder._translateWord(word);
    EXPECT_FALSE(isAlternate(encoder));
    EXPECT_EQ(primary(encoder), u"");
    EXPECT_EQ(secondary(encoder), u"");
  }
  encoder.translate(u"horowitz, joseph and sarkozy");
  EXPECT_FALSE(isAlternate(encoder));
  EXPECT_EQ(primary(encoder), u"");
  EXPECT_EQ(secondary(encoder), u"");
}

TEST(CodeBuffersTest, AnEmptyPaddedLengthLeavesTheFlagAlone) {
  KXMetaphone encoder;
  encoder._append_alt(u"K", u"J");
  isAlternate(encoder) = true;
  EXPECT_EQ(encoder._translateWord(std::u16string(65534, u'B')), u"");
  EXPECT_TRUE(isAlternate(encoder));
  EXPECT_EQ(encoder._translateWord(u"sign"), u"J SKN ");
  EXPECT_FALSE(isAlternate(encoder));
}

TEST(CodeBuffersTest, AllWordsOfATextAfterTheFirstGiveThePrimaryCode) {
  KXMetaphone encoder;
  isAlternate(encoder) = true;
  EXPECT_EQ(encoder.translate(u"sign sign"), u" SKN   SN  ");
}

}  // namespace
}  // namespace wordcatcher
