// Every rule of every letter that can fit, by a word worked out by hand. The working names each
// letter with its position, from 1, and what it adds; "-" is nothing, "(2)" the places that its
// rule takes if there are more than one. tests/data/TestDBLMetaphone.txt holds many more words.

#include <gtest/gtest.h>

#include <ostream>
#include <string>

#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {
namespace {

struct Case {
  std::u16string_view word;
  std::u16string_view code;
};

std::ostream& operator<<(std::ostream& stream, const Case& traced) {
  return writeUtf8(stream, traced.word);
}

class LetterRulesTest : public ::testing::TestWithParam<Case> {};

TEST_P(LetterRulesTest, EncodesAsWorkedOut) {
  std::u16string code = KXMetaphone()._translateWord(GetParam().word);
  code.erase(0, code.find_first_not_of(u' '));
  code.erase(code.find_last_not_of(u' ') + 1);
  EXPECT_EQ(code, GetParam().code);
}

#define LETTER(name, ...) \
  INSTANTIATE_TEST_SUITE_P(name, LetterRulesTest, ::testing::Values(__VA_ARGS__))

LETTER(Vowels,                   //
       Case{u"adler", u"ATLR"},  // A1 A, D2 T, L3 L, E4 -, R5 R
       Case{u"eend", u"ANT"},    // E1 A, E2 -, N3 N, D4 T
       Case{u"igel", u"AJL"},    // I1 A, G2 J (2; an E follows), L4 L
       Case{u"oud", u"AT"},      // O1 A, U2 -, D3 T
       Case{u"ulm", u"ALM"},     // U1 A, L2 L, M3 M
       Case{u"you", u"A"},       // Y1 A, O2 -, U3 -
       Case{u"kuyper", u"KPR"},  // K1 K, U2 -, Y3 -, P4 P, E5 -, R6 R
       Case{u"école", u"KL"});   // É1 -, C2 K, O3 -, L4 L, E5 -

LETTER(B,                      //
       Case{u"berg", u"PRK"},  // B1 P, E2 -, R3 R, G4 K
       Case{u"ebbe", u"AP"});  // E1 A, B2 P (2), E4 -

LETTER(C,                              //
       Case{u"bach", u"PK"},           // B1 P, A2 -, C3 K (2; ACH after a consonant, no I or E)
       Case{u"macher", u"MKR"},        // M1 M, A2 -, C3 K (2; MACHER), E5 -, R6 R
       Case{u"bacher", u"PKR"},        // B1 P, A2 -, C3 K (2; BACHER), E5 -, R6 R
       Case{u"machine", u"MXN"},       // M1 M, A2 -, C3 X (2; ACHI goes on to CH), I5 -, N6 N, E7 -
       Case{u"teacher", u"TXR"},       // T1 T, E2 -, A3 -, C4 X (2; vowel before ACH), E6 -, R7 R
       Case{u"caesar", u"SSR"},        // C1 S (2; CAESAR), E3 -, S4 S, A5 -, R6 R
       Case{u"chianti", u"KNT"},       // C1 K (2; CHIA), I3 -, A4 -, N5 N, T6 T, I7 -
       Case{u"michael", u"MKL"},       // M1 M, I2 -, C3 K (2; CHAE), A5 -, E6 -, L7 L
       Case{u"character", u"KRKTR"},   // C1 K (2; HARAC), A3 -, R4 R, A5 -, C6 K, T7 T, E8 -, R9 R
       Case{u"charisma", u"KRSM"},     // C1 K (2; HARIS), A3 -, R4 R, I5 -, S6 S, M7 M, A8 -
       Case{u"chorus", u"KRS"},        // C1 K (2; HOR), O3 -, R4 R, U5 -, S6 S
       Case{u"chyme", u"KM"},          // C1 K (2; HYM), Y3 -, M4 M, E5 -
       Case{u"chemist", u"KMST"},      // C1 K (2; HEM), E3 -, M4 M, I5 -, S6 S, T7 T
       Case{u"chore", u"XR"},          // C1 X (2; HOR, but CHORE), O3 -, R4 R, E5 -
       Case{u"architect", u"ARKTKT"},  // A1 A, R2 R, C3 K (2; ARCHIT), I5 -, T6 T, E7 -, C8 K, T9 T
       Case{u"orchid", u"ARKT"},       // O1 A, R2 R, C3 K (2; ORCHID), I5 -, D6 T
       Case{u"licht", u"LKT"},         // L1 L, I2 -, C3 K (2; before T), T5 T
       Case{u"fuchs", u"FKS"},         // F1 F, U2 -, C3 K (2; before S), S5 S
       Case{u"chlor", u"KLR"},         // C1 K (2; first, before L), L3 L, O4 -, R5 R
       Case{u"technik", u"TKNK"},      // T1 T, E2 -, C3 K (2; E before, N after), N5 N, I6 -, K7 K
       Case{u"teach", u"TK"},          // T1 T, E2 -, A3 -, C4 K (2; A before, the end after)
       Case{u"loch", u"LK"},           // L1 L, O2 -, C3 K (2; O before, the end after)
       Case{u"milch", u"MLX"},         // M1 M, I2 -, L3 L, C4 X (2)
       Case{u"child", u"XLT"},         // C1 X (2), I3 -, L4 L, D5 T
       Case{u"czech", u"SK"},          // C1 S (2; CZ), E3 -, C4 K (2; E before, the end after)
       Case{u"scwicz", u"SKKS"},       // S1 SK (3, with the W), I4 -, C5 K (CZ, but WICZ), Z6 S
       Case{u"muscwicz", u"MSKKS"},    // M1 M, U2 -, S3 SK (3), I6 -, C7 K (WICZ), Z8 S
       Case{u"breccia", u"PRX"},       // B1 P, R2 R, E3 -, C4 X (3; CIA after it), A7 -
       Case{u"acciaio",
            u"AX"},  // A1 A, C2 X (3; CIA after it comes before the first A), A5 -, I6 -, O7 -
       Case{u"accept", u"AKSPT"},       // A1 A, C2 KS (3; first A, CCE), P5 P, T6 T
       Case{u"succeed", u"SKST"},       // S1 S, U2 -, C3 KS (3; UCCEE), E6 -, D7 T
       Case{u"success", u"SKSS"},       // S1 S, U2 -, C3 KS (3; UCCES), S6 S (2)
       Case{u"vaccine", u"FXN"},        // V1 F, A2 -, C3 X (3; CCI), N6 N, E7 -
       Case{u"zucchini", u"SXN"},       // Z1 S, U2 -, C3 X (3; CCH), I6 -, N7 N, I8 -
       Case{u"bacchus", u"PKS"},        // B1 P, A2 -, C3 K (2; CCHU), H5 -, U6 -, S7 S
       Case{u"accord", u"AKRT"},        // A1 A, C2 K (2; CCO), O4 -, R5 R, D6 T
       Case{u"acclaim", u"AKLM"},       // A1 A, C2 K (2), L4 L, A5 -, I6 -, M7 M
       Case{u"mcgee", u"MK"},           // M1 M, C2 K (2; CG), E4 -, E5 -
       Case{u"black", u"PLK"},          // B1 P, L2 L, A3 -, C4 K (2; CK)
       Case{u"acquit", u"AKT"},         // A1 A, C2 K (2; CQ), U4 -, I5 -, T6 T
       Case{u"social", u"SSL"},         // S1 S, O2 -, C3 S (2; CIA), A5 -, L6 L
       Case{u"city", u"ST"},            // C1 S (2; CI), T3 T, Y4 -
       Case{u"cent", u"SNT"},           // C1 S (2; CE), N3 N, T4 T
       Case{u"cyclone", u"SKLN"},       // C1 S (2; CY), C3 K, L4 L, O5 -, N6 N, E7 -
       Case{u"crown", u"KRN"},          // C1 K, R2 R, O3 -, W4 -, N5 N
       Case{u"mac queen", u"MKN"},      // M1 M, A2 -, C3 K (3; " Q"), U6 -, E7 -, E8 -, N9 N
       Case{u"mac gregor", u"MKRKR"});  // M1 M, A2 -, C3 K (3; " G"), R6 R, E7 -, G8 K, O9 -, R10 R

// Words that come near a rule and miss it.

LETTER(CNearMisses,                  //
       Case{u"baccy", u"PK"},        // B1 P, A2 -, C3 K (2; CC, but before Y), Y5 -
       Case{u"bachelor", u"PXLR"},   // B1 P, A2 -, C3 X (2; not BACHER), E5 -, L6 L, O7 -, R8 R
       Case{u"chess", u"XS"},        // C1 X (2; HES is none of the first), E3 -, S4 S (2)
       Case{u"orchard", u"ARXRT"});  // O1 A, R2 R, C3 X (2; not ORCHID), A5 -, R6 R, D7 T

LETTER(D,                        //
       Case{u"badger", u"PJR"},  // B1 P, A2 -, D3 J (3; DGE), R6 R
       Case{u"budgie", u"PJ"},   // B1 P, U2 -, D3 J (3; DGI), E6 -
       Case{u"dodgy", u"TJ"},    // D1 T, O2 -, D3 J (3; DGY)
       Case{u"edgar", u"ATKR"},  // E1 A, D2 TK (2), A4 -, R5 R
       Case{u"stadt", u"STT"},   // S1 S, T2 T, A3 -, D4 T (2)
       Case{u"ladder", u"LTR"},  // L1 L, A2 -, D3 T (2), E5 -, R6 R
       Case{u"udo", u"AT"});     // U1 A, D2 T, O3 -

LETTER(F,                       //
       Case{u"effen", u"AFN"},  // E1 A, F2 F (2), E4 -, N5 N
       Case{u"ofen", u"AFN"});  // O1 A, F2 F, E3 -, N4 N

LETTER(GBeforeH,                    //
       Case{u"ghent", u"KNT"},      // G1 K (2; no vowel before), E3 -, N4 N, T5 T
       Case{u"ghi", u"K"},          // G1 K (2; first, though an I follows), I3 -
       Case{u"burgher", u"PRKR"},   // B1 P, U2 -, R3 R, G4 K (2), E6 -, R7 R
       Case{u"burghley", u"PRKL"},  // B1 P, U2 -, R3 R, G4 K (2), L6 L, E7 -, Y8 -
       Case{u"hugh", u"H"},         // H1 H (2), G3 - (2; H two places before)
       Case{u"daghap", u"TP"},      // D1 T, A2 -, G3 - (2; D two places before), A5 -, P6 P
       Case{u"baghdad", u"PTT"},    // B1 P, A2 -, G3 - (2; B two before), D5 T, A6 -, D7 T
       Case{u"bighe", u"P"},        // B1 P, I2 -, G3 - (2; B two before), E5 -
       Case{u"ightham", u"ATM"},    // I1 A, G2 - (2; I before), T4 T (2; before AM), A6 -, M7 M
       Case{u"aghast", u"AKST"},    // A1 A, G2 K (2), A4 -, S5 S, T6 T
       Case{u"daughter", u"TTR"},   // D1 T, A2 -, U3 -, G4 - (2; D three before), T6 T, E7 -, R8 R
       Case{u"brought", u"PRT"},    // B1 P, R2 R, O3 -, U4 -, G5 - (2; B four before), T7 T
       Case{u"through", u"0R"},     // T1 0 (2), R3 R, O4 -, U5 -, G6 - (2; H four before)
       Case{u"laugh", u"LF"},       // L1 L, A2 -, U3 -, G4 F (2; U before, L three before)
       Case{u"cough", u"KF"},       // C1 K, O2 -, U3 -, G4 F (2; C three before)
       Case{u"gough", u"KF"},       // G1 K, O2 -, U3 -, G4 F (2; G three before)
       Case{u"rough", u"RF"},       // R1 R, O2 -, U3 -, G4 F (2; R three before)
       Case{u"tough", u"TF"},       // T1 T, O2 -, U3 -, G4 F (2; T three before)
       Case{u"night", u"NT"},       // N1 N, I2 -, G3 - (2; I before), T5 T
       Case{u"enough", u"ANK"});    // E1 A, N2 N, O3 -, U4 -, G5 K (2; N three before)

LETTER(GBeforeNOrLi,                  //
       Case{u"sign", u"SN"},          // S1 S, I2 -, G3 N (2)
       Case{u"signboard", u"SNPRT"},  // S1 S, I2 -, G3 N (2), B5 P, O6 -, A7 -, R8 R, D9 T
       Case{u"gnat", u"NT"},          // G1 N (2), A3 -, T4 T
       Case{u"rigney", u"RKN"},       // R1 R, I2 -, G3 KN (2; before EY), E5 -, Y6 -
       Case{u"signbook",
            u"SKNPK"},             // S1 S, I2 -, G3 KN (2; a K in the word), B5 P, O6 -, O7 -, K8 K
       Case{u"wagner", u"AKNR"},   // W1 A, A2 -, G3 KN (2; a W in the word), E5 -, R6 R
       Case{u"glide", u"KLT"},     // G1 KL (2), I3 -, D4 T, E5 -
       Case{u"gliwice", u"KLS"});  // G1 K (a W in the word), L2 L, I3 -, W4 -, I5 -, C6 S (2)

LETTER(GAtTheStart,                 //
       Case{u"gypsy", u"KPS"},      // G1 K (2; GY), P3 P, S4 S, Y5 -
       Case{u"gestern", u"KSTRN"},  // G1 K (2; ES), S3 S, T4 T, E5 -, R6 R, N7 N
       Case{u"gepard", u"KPRT"},    // G1 K (2; EP), P3 P, A4 -, R5 R, D6 T
       Case{u"gebed", u"KPT"},      // G1 K (2; EB), B3 P, E4 -, D5 T
       Case{u"gel", u"KL"},         // G1 K (2; EL), L3 L
       Case{u"geyer", u"KR"},       // G1 K (2; EY), Y3 -, E4 -, R5 R
       Case{u"gibson", u"KPSN"},    // G1 K (2; IB), B3 P, S4 S, O5 -, N6 N
       Case{u"gilde", u"KLT"},      // G1 K (2; IL), L3 L, D4 T, E5 -
       Case{u"ginger", u"KNKR"},    // G1 K (2; IN), N3 N, G4 K (2; ER), R6 R
       Case{u"gier", u"KR"},        // G1 K (2; IE, before the end IER is asked for), E3 -, R4 R
       Case{u"geist", u"KST"},      // G1 K (2; EI), I3 -, S4 S, T5 T
       Case{u"german", u"KRMN"});   // G1 K (2; ER), R3 R, M4 M, A5 -, N6 N

LETTER(GBeforeEIY,                  //
       Case{u"danger", u"TNKR"},    // D1 T, A2 -, N3 N, G4 K (2; ER), R6 R
       Case{u"stingy", u"STNK"},    // S1 S, T2 T, I3 -, N4 N, G5 K (2; GY)
       Case{u"tiger", u"TJR"},      // T1 T, I2 -, G3 J (2; I before, so not by ER), R5 R
       Case{u"clergy", u"KLRJ"},    // C1 K, L2 L, E3 -, R4 R, G5 J (2; RGY)
       Case{u"biology", u"PLJ"},    // B1 P, I2 -, O3 -, L4 L, O5 -, G6 J (2; OGY)
       Case{u"forget", u"FRKT"},    // F1 F, O2 -, R3 R, G4 K (2; ET), T6 T
       Case{u"ogier", u"AJR"},      // O1 A, G2 J (2; IER and the end), E4 -, R5 R
       Case{u"magic", u"MJK"},      // M1 M, A2 -, G3 J (2; GI), C5 K
       Case{u"gem", u"JM"},         // G1 J (2; EM is not in the list of the start), M3 M
       Case{u"maggie", u"MJ"},      // M1 M, A2 -, G3 J (2; AGGI), I5 -, E6 -
       Case{u"jogging", u"JJNK"});  // J1 J, O2 -, G3 J (2; OGGI), I5 -, N6 N, G7 K

LETTER(GElsewhere,                //
       Case{u"nugget", u"NKT"},   // N1 N, U2 -, G3 K (2; GG), E5 -, T6 T
       Case{u"buggier", u"PKR"},  // B1 P, U2 -, G3 K (2; GG), I5 -, E6 -, R7 R
       Case{u"gut", u"KT"});      // G1 K, U2 -, T3 T

LETTER(GNearMisses,             //
       Case{u"sough", u"SK"},   // S1 S, O2 -, U3 -, G4 K (2; S is not among the letters before)
       Case{u"genre", u"JNR"},  // G1 J (2; EN is not in the list of the start), N3 N, R4 R, E5 -
       Case{u"getto", u"KT"});  // G1 K (2; ET, though not in that list), T3 T (2), O5 -

LETTER(H,                            //
       Case{u"homme", u"HM"},        // H1 H (2), M3 M (2), E5 -
       Case{u"ahoy", u"AH"},         // A1 A, H2 H (2), Y4 -
       Case{u"hlohovec", u"LHFK"},   // H1 -, L2 L, O3 -, H4 H (2), V6 F, E7 -, C8 K
       Case{u"alhambra", u"ALMPR"},  // A1 A, L2 L, H3 -, A4 -, M5 M, B6 P, R7 R, A8 -
       Case{u"john", u"JN"});        // J1 J, O2 -, H3 -, N4 N

LETTER(J,                        //
       Case{u"jose", u"HS"},     // J1 H (JOSE, the end after it), O2 -, S3 S, E4 -
       Case{u"joseph", u"JSF"},  // J1 J (JOSE), O2 -, S3 S, E4 -, P5 F (2)
       Case{u"jlo", u"JL"},      // J1 J (first), L2 L, O3 -
       Case{u"hijo", u"HJ"},     // H1 H (2), J3 J (I before, O after), O4 -
       Case{u"twoja", u"TJ"},    // T1 T, W2 -, O3 -, J4 J (a W in the word: by the last rule), A5 -
       Case{u"bajt", u"PT"},     // B1 P, A2 -, J3 - (before T), T4 T
       Case{u"sjesta", u"SST"},  // S1 S, J2 - (after S), E3 -, S4 S, T5 T, A6 -
       Case{u"boje", u"PJ"},     // B1 P, O2 -, J3 J, E4 -
       Case{u"hajji", u"HJ"});   // H1 H (2), J3 J (2), I5 -

LETTER(JNearMisses,               //
       Case{u"hajduk", u"HJTK"},  // H1 H (2), J3 J (before D), D4 T, U5 -, K6 K
       Case{u"adjacent",
            u"ATJSNT"});  // A1 A, D2 T, J3 J (no vowel before), A4 -, C5 S (2), N7 N, T8 T

LETTER(K,                        //
       Case{u"lekko", u"LK"},    // L1 L, E2 -, K3 K (2), O5 -
       Case{u"knife", u"KNF"});  // K1 K, N2 N, I3 -, F4 F, E5 -

LETTER(L,                            //
       Case{u"llama", u"LM"},        // L1 L (2), A3 -, M4 M, A5 -
       Case{u"allspice", u"ALSPS"},  // A1 A, L2 L (2), S4 S, P5 P, I6 -, C7 S (2)
       Case{u"tortilla", u"TRTL"},   // T1 T, O2 -, R3 R, T4 T, I5 -, L6 L (2), A8 -
       Case{u"ulm", u"ALM"});        // U1 A, L2 L, M3 M

LETTER(M,                       //
       Case{u"umber", u"AMR"},  // U1 A, M2 M (2; UMB before ER), E4 -, R5 R
       Case{u"dumb", u"TMP"},   // D1 T, U2 -, M3 M, B4 P
       Case{u"mamma", u"MM"},   // M1 M, A2 -, M3 M (2), A5 -
       Case{u"gem", u"JM"});    // G1 J (2), M3 M

LETTER(N,                      //
       Case{u"panna", u"PN"},  // P1 P, A2 -, N3 N (2), A5 -
       Case{u"john", u"JN"});  // J1 J, O2 -, H3 -, N4 N

LETTER(P,                           //
       Case{u"philip", u"FLP"},     // P1 F (2), I3 -, L4 L, I5 -, P6 P
       Case{u"phrase", u"FRS"},     // P1 F (2), R3 R, A4 -, S5 S, E6 -
       Case{u"appel", u"APL"},      // A1 A, P2 P (2), E4 -, L5 L
       Case{u"campbell", u"KMPL"},  // C1 K, A2 -, M3 M, P4 P (2; before B), E6 -, L7 L (2)
       Case{u"page", u"PJ"});       // P1 P, A2 -, G3 J (2)

LETTER(Q,                         //
       Case{u"saqqara", u"SKR"},  // S1 S, A2 -, Q3 K (2), A5 -, R6 R, A7 -
       Case{u"queen", u"KN"});    // Q1 K, U2 -, E3 -, E4 -, N5 N

LETTER(R,                         //
       Case{u"zorro", u"SR"},     // Z1 S, O2 -, R3 R (2), O5 -
       Case{u"rogier", u"RJR"});  // R1 R, O2 -, G3 J (2; IER and the end), E5 -, R6 R

LETTER(S,                           //
       Case{u"island", u"ALNT"},    // I1 A, S2 - (ISL), L3 L, A4 -, N5 N, D6 T
       Case{u"ysleta", u"ALT"},     // Y1 A, S2 - (YSL), L3 L, E4 -, T5 T, A6 -
       Case{u"sugar", u"XKR"},      // S1 X (SUGAR), U2 -, G3 K, A4 -, R5 R
       Case{u"sinsheim", u"SNSM"},  // S1 S, I2 -, N3 N, S4 S (2; HEIM), E6 -, I7 -, M8 M
       Case{u"boshoek", u"PSK"},    // B1 P, O2 -, S3 S (2; HOEK), O5 -, E6 -, K7 K
       Case{u"rusholme", u"RSLM"},  // R1 R, U2 -, S3 S (2; HOLM), O5 -, L6 L, M7 M, E8 -
       Case{u"reisholz", u"RSLS"},  // R1 R, E2 -, I3 -, S4 S (2; HOLZ), O6 -, L7 L, Z8 S
       Case{u"sushi", u"SX"},       // S1 S, U2 -, S3 X (2), I5 -
       Case{u"shrimp", u"XRMP"},    // S1 X (2), R3 R, I4 -, M5 M, P6 P
       Case{u"vision", u"FSN"},     // V1 F, I2 -, S3 S (3; SIO), N6 N
       Case{u"asian", u"ASN"},      // A1 A, S2 S (3; SIA), N5 N
       Case{u"kasia", u"KS"},       // K1 K, A2 -, S3 S (3; SIA, a K in the word)
       Case{u"small", u"SML"},      // S1 S (first, before M), M2 M, A3 -, L4 L (2)
       Case{u"snow", u"SN"},        // S1 S (first, before N), N2 N, O3 -, W4 -
       Case{u"slip", u"SLP"},       // S1 S (first, before L), L2 L, I3 -, P4 P
       Case{u"swim", u"SM"},        // S1 S (first, before W), W2 -, I3 -, M4 M
       Case{u"szene", u"SN"},       // S1 S (2; before Z), E3 -, N4 N, E5 -
       Case{u"maszyna", u"MSN"},    // M1 M, A2 -, S3 S (2; before Z), Y5 -, N6 N, A7 -
       Case{u"passion", u"PSN"},    // P1 P, A2 -, S3 S (2), I5 -, O6 -, N7 N
       Case{u"haus", u"HS"});       // H1 H (2), U3 -, S4 S

LETTER(SNearMisses,                   //
       Case{u"threshold", u"0RXLT"},  // T1 0 (2), R3 R, E4 -, S5 X (2; HOLD), O7 -, L8 L, D9 T
       Case{u"sheik", u"XK"},         // S1 X (2; HEIK), E3 -, I4 -, K5 K
       Case{u"sugared", u"XKRT"});    // S1 X (SUGAR), U2 -, G3 K, A4 -, R5 R, E6 -, D7 T

LETTER(Sc,                          //
       Case{u"school", u"SKL"},     // S1 SK (3; OO), O4 -, O5 -, L6 L
       Case{u"schuyler", u"SKLR"},  // S1 SK (3; UY), U4 -, Y5 -, L6 L, E7 -, R8 R
       Case{u"schedule", u"SKTL"},  // S1 SK (3; ED), E4 -, D5 T, U6 -, L7 L, E8 -
       Case{u"scheme", u"SKM"},     // S1 SK (3; EM), E4 -, M5 M, E6 -
       Case{u"schere", u"XR"},      // S1 X (3; ER), E4 -, R5 R, E6 -
       Case{u"menschen", u"MNXN"},  // M1 M, E2 -, N3 N, S4 X (3; EN), E7 -, N8 N
       Case{u"schmidt", u"XMT"},    // S1 X (3; first), M4 M, I5 -, D6 T (2)
       Case{u"schiff", u"XF"},      // S1 X (3; first), I4 -, F5 F (2)
       Case{u"mosche", u"MX"},      // M1 M, O2 -, S3 X (3), E6 -
       Case{u"deutschland",
            u"TTXLNT"},             // D1 T, E2 -, U3 -, T4 T, S5 X (3), L8 L, A9 -, N10 N, D11 T
       Case{u"scene", u"SN"},       // S1 S (3; SCE), N4 N, E5 -
       Case{u"science", u"SNS"},    // S1 S (3; SCI), E4 -, N5 N, C6 S (2)
       Case{u"scyzoryk", u"SSRK"},  // S1 S (3; SCY), Z4 S, O5 -, R6 R, Y7 -, K8 K
       Case{u"screw", u"SK"});      // S1 SK (3, with the R), E4 -, W5 -

LETTER(T,                          //
       Case{u"nation", u"NXN"},    // N1 N, A2 -, T3 X (3; TION), N6 N
       Case{u"martian", u"MRXN"},  // M1 M, A2 -, R3 R, T4 X (3; TIA), N7 N
       Case{u"match", u"MX"},      // M1 M, A2 -, T3 X (3; TCH)
       Case{u"thomas", u"TMS"},    // T1 T (2; OM), O3 -, M4 M, A5 -, S6 S
       Case{u"chatham", u"XTM"},   // C1 X (2), A3 -, T4 T (2; AM), A6 -, M7 M
       Case{u"thumb", u"0MP"},     // T1 0 (2), U3 -, M4 M, B5 P
       Case{u"otthom", u"A0M"},    // O1 A, T2 0 (2; TTH, two places on stands HO), H4 -, O5 -, M6 M
       Case{u"gottheit", u"K0T"},  // G1 K, O2 -, T3 0 (2), H5 -, E6 -, I7 -, T8 T
       Case{u"cottbus", u"KTPS"},  // C1 K, O2 -, T3 T (2), B5 P, U6 -, S7 S
       Case{u"hotdog", u"HTK"},    // H1 H (2), T3 T (2; before D), O5 -, G6 K
       Case{u"theme", u"0M"},      // T1 0 (2; EM is neither OM nor AM), E3 -, M4 M, E5 -
       Case{u"gut", u"KT"});       // G1 K, U2 -, T3 T

LETTER(V,                        //
       Case{u"savvy", u"SF"},    // S1 S, A2 -, V3 F (2), Y5 -
       Case{u"vivid", u"FFT"});  // V1 F, I2 -, V3 F, I4 -, D5 T

LETTER(W,                             //
       Case{u"wrack", u"RK"},         // W1 R (2), A3 -, C4 K (2)
       Case{u"wrrong", u"RRNK"},      // W1 R (2), R3 R, O4 -, N5 N, G6 K
       Case{u"playwright", u"PLRT"},  // P1 P, L2 L, A3 -, Y4 -, W5 R (2), I7 -, G8 - (2), T10 T
       Case{u"weert", u"ART"},        // W1 A (before E), E2 -, E3 -, R4 R, T5 T
       Case{u"where", u"AR"},         // W1 A (WH), H2 -, E3 -, R4 R, E5 -
       Case{u"wlosok", u"LSK"},       // W1 -, L2 L, O3 -, S4 S, O5 -, K6 K
       Case{u"lewandowski",
            u"LNTSK"},                // L1 L, E2 -, W3 -, A4 -, N5 N, D6 T, O7 -, W8 -, S9 S, K10 K
       Case{u"kowalewsky", u"KLSK"},  // K1 K, O2 -, W3 -, A4 -, L5 L, E6 -, W7 -, S8 S, K9 K, Y10 -
       Case{u"mickiewicz", u"MKTS"},  // M1 M, I2 -, C3 K (2), I5 -, E6 -, W7 TS (4)
       Case{u"horowitz", u"HRTS"},    // H1 H (2), R3 R, O4 -, W5 TS (4)
       Case{u"witzel", u"ATSL"},      // W1 A (before I), then TS (4), E5 -, L6 L
       Case{u"witzbold", u"ATSPLT"},  // W1 A (before I), then TS (4), B5 P, O6 -, L7 L, D8 T
       Case{u"witzhelden", u"ATSLTN"},  // W1 A, then TS (4, with the Z), H5 -, L7 L, D8 T, N10 N
       Case{u"wittig", u"ATK"},         // W1 A (before I; WITT), I2 -, T3 T (2), I5 -, G6 K
       Case{u"owl", u"AL"});            // O1 A, W2 -, L3 L

LETTER(X,                            //
       Case{u"taxi", u"TKS"},        // T1 T, A2 -, X3 KS, I4 -
       Case{u"bordeaux", u"PRTKS"},  // B1 P, O2 -, R3 R, D4 T, E5 -, A6 -, U7 -, X8 KS
       Case{u"excusa", u"AKSS"},     // E1 A, X2 KS (2; before C), U4 -, S5 S, A6 -
       Case{u"maxxi", u"MKS"});      // M1 M, A2 -, X3 KS (2), I5 -

LETTER(Z,                          //
       Case{u"muzhik", u"MJK"},    // M1 M, U2 -, Z3 J (2), I5 -, K6 K
       Case{u"mezzo", u"MS"},      // M1 M, E2 -, Z3 S (2; ZO), O5 -
       Case{u"pozzi", u"PS"},      // P1 P, O2 -, Z3 S (2; ZI), I5 -
       Case{u"pizza", u"PS"},      // P1 P, I2 -, Z3 S (2; ZA), A5 -
       Case{u"klotz", u"KLTS"},    // K1 K, L2 L, O3 -, T4 T, Z5 S (a K in the word, T before)
       Case{u"sarkozy", u"SRKS"},  // S1 S, A2 -, R3 R, K4 K, O5 -, Z6 S (a K in the word), Y7 -
       Case{u"zorn", u"SRN"},      // Z1 S, O2 -, R3 R, N4 N
       Case{u"nozze", u"NS"});     // N1 N, O2 -, Z3 S (2), E5 -

LETTER(CedillaAndTilde,            //
       Case{u"ça", u"S"},          // Ç1 S, A2 -
       Case{u"çlirim", u"SLRM"},   // Ç1 S, L2 L, I3 -, R4 R, I5 -, M6 M
       Case{u"señrita", u"SNRT"},  // S1 S, E2 -, Ñ3 N, R4 R, I5 -, T6 T, A7 -
       Case{u"ñandú", u"NNT"});    // Ñ1 N, A2 -, N3 N, D4 T, Ú5 -

}  // namespace
}  // namespace wordcatcher
