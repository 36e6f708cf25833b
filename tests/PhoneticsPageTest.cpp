// The examples on the page docs/phonetics.md are what the encoder gives. After a change of the
// examples below, run this test once with WORDCATCHER_UPDATE_DOCS=1 in its environment: it then
// writes the page instead of checking it.

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "TestSupport.h"
#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/text/TextForm.h"

namespace wordcatcher {
namespace {

constexpr const char* kPage = WORDCATCHER_SOURCE_DIR "/docs/phonetics.md";
constexpr std::string_view kBegin = "<!-- examples -->\n";
constexpr std::string_view kEnd = "<!-- end of examples -->\n";

struct Example {
  const char16_t* text;
  const char* shows;
};

constexpr Example kExamples[] = {
    {u"Catherine Schmidt", "found by *Kathryn Shmit*: the codes are the same"},
    {u"Kathryn Shmit", "TH is 0; a first SCH and SH are X; DT is one T"},
    {u"Stephen Phillips", "PH is F, as V is; vowels after the first letter are not heard"},
    {u"aerie", "a first vowel is A, whichever it is"},
    {u"yellow", "Y is a vowel, also as the first letter"},
    {u"water", "so is a first W before a vowel; elsewhere a W is silent"},
    {u"knight", "a silent first letter is kept; the GH after I is silent"},
    {u"wrist", "but WR is R"},
    {u"psalm", "the P is kept"},
    {u"xavier", "an X is KS wherever it stands"},
    {u"bordeaux", "at the end too: silent French endings are heard"},
    {u"laugh", "GH is F after U in words such as this"},
    {u"danger", "a G before ER is K"},
    {u"magic", "elsewhere before E, I and Y it is mostly J"},
    {u"dumb", "a final B is heard"},
    {u"teach", "a final CH after A, E, O or U is K"},
    {u"milch", "after other letters it is X"},
    {u"school", "SCH is SK in words such as this"},
    {u"nation", "TION, TIA and TCH are X"},
    {u"horowitz", "WITZ and WICZ are TS"},
    {u"garçon", "Ç is S and Ñ is N; other letters with marks add nothing"},
    {u"école", "the É is not heard"},
    {u"O'Neil", "punctuation inside a word is taken out"},
    {u"internationalisation", "a code is as long as its word needs"},
    {u"b2b", "digits add nothing"},
    {u"1984", "a word may have no code"},
};

std::string trimmedUtf8(const std::u16string& codes) {
  std::string text;
  for (const char16_t unit : codes) {
    if (unit != u' ' || (!text.empty() && text.back() != ' ')) {
      text += static_cast<char>(unit);
    }
  }
  text.erase(text.find_last_not_of(' ') + 1);
  return text;
}

std::string table() {
  std::string rows = "| Text | Code | What it shows |\n|---|---|---|\n";
  KXMetaphone encoder;
  for (const Example& example : kExamples) {
    std::ostringstream text;
    writeUtf8(text, example.text);
    const std::string code = trimmedUtf8(encoder.translate(example.text));
    rows += "| " + text.str() + " | " + (code.empty() ? "" : '`' + code + "` ") + "| " +
            example.shows + " |\n";
  }
  return rows;
}

TEST(PhoneticsPageTest, TheExamplesAreWhatTheEncoderGives) {
  const std::string page = testing::readFile(kPage);
  const std::size_t begin = page.find(kBegin);
  const std::size_t end = page.find(kEnd);
  ASSERT_NE(begin, page.npos);
  ASSERT_NE(end, page.npos);
  const std::string expected =
      page.substr(0, begin + kBegin.size()) + "\n" + table() + "\n" + page.substr(end);
  if (std::getenv("WORDCATCHER_UPDATE_DOCS") != nullptr) {
    testing::writeFile(kPage, expected);
    return;
  }
  EXPECT_EQ(page, expected) << "Run this test with WORDCATCHER_UPDATE_DOCS=1 to write the page.";
}

}  // namespace
}  // namespace wordcatcher
