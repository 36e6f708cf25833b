#include <memory>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "cli/Arguments.h"
#include "cli/Failure.h"
#include "cli/Joined.h"
#include "cli/Output.h"
#include "cli/Questions.h"
#include "cli/Verbs.h"
#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher::cli {

namespace {

using Json = nlohmann::ordered_json;

constexpr const char* kEncodeFooter = R"(
Prints the codes of each TEXT, or of each line of standard input: a line of one code a
word, a space between them. Words that sound alike have equal codes. A word of which
no letter sounds has none.

--json prints one object a TEXT instead:
  {"text": "...", "codes": ["...", "..."]}

Examples:
  wordcatcher encode 'Catherine Schmidt' 'Kathryn Shmit'
  wordcatcher encode --json < names.txt)";

struct EncodeArguments {
  bool json = false;
  std::vector<std::string> texts;
};

/// The codes of a translated text, which stand several spaces apart.
std::vector<std::string> codesOf(const std::u16string& translation) {
  std::vector<std::string> codes;
  std::size_t begin = 0;
  while ((begin = translation.find_first_not_of(u' ', begin)) != std::u16string::npos) {
    const std::size_t end = translation.find(u' ', begin);
    codes.push_back(displayUtf8(translation.substr(begin, end - begin)));
    begin = end;
  }
  return codes;
}

ExitCode runEncode(const EncodeArguments& arguments) {
  const Questions questions(arguments.texts, false);
  KXMetaphone encoder;
  questions.answerEach([&](const InputLine& question, Output& output) {
    const auto codes = codesOf(encoder.translate(question.text));
    output.write(arguments.json ? Json{{"text", question.utf8}, {"codes", codes}}.dump() + '\n'
                                : joined(codes, " ") + '\n');
    return true;
  });
  // Nothing is looked for, so that no text, and a text without codes, is no miss.
  return kMatched;
}

}  // namespace

void addEncodeVerb(CLI::App& program, ChosenVerb& chosen) {
  CLI::App& verb = addVerb(program, "encode", "Print the codes of how words sound", kEncodeFooter);
  const auto arguments = std::make_shared<EncodeArguments>();
  addFlag(verb, "--json", arguments->json, "Print a JSON object a text");
  addTexts(verb, "TEXT", arguments->texts, "Texts");
  whenNamed(verb, chosen, [arguments] { return runEncode(*arguments); });
}

}  // namespace wordcatcher::cli
