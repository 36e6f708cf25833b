#include <memory>
#include <optional>
#include <string>

#include "cli/Arguments.h"
#include "cli/Counted.h"
#include "cli/OpenIndex.h"
#include "cli/Output.h"
#include "cli/Verbs.h"
#include "cli/WaitingNote.h"

namespace wordcatcher::cli {

namespace {

constexpr const char* kVerifyFooter = R"(
Reads all of a search image and checks its checksums and that everything in it fits
together. Prints one line when the image is whole; otherwise the exit code is 2, and
standard error says what is wrong. Of a classic index it is checked that the tables
are finished and can be read through; they have no checksums.

Examples:
  wordcatcher verify dogs.wci)";

ExitCode runVerify(const std::string& name) {
  const Index index = [&] {
    Index opened = openIndex(name, std::nullopt, false);
    const WaitingNote note("Checking " + name);
    opened.verify();
    return opened;
  }();
  const Index::Info info = index.info();
  const std::string phrases = namesDirectory(name) ? "" : counted(info.phrases, "phrase") + ", ";
  Output output;
  output.write(name + " is whole: " + phrases + counted(info.words, "word") + ", " +
               counted(info.values, "data string") + ".\n");
  output.flush();
  return kMatched;
}

}  // namespace

void addVerifyVerb(CLI::App& program, ChosenVerb& chosen) {
  CLI::App& verb = addVerb(program, "verify", "Check that an index is whole", kVerifyFooter);
  const auto name = std::make_shared<std::string>();
  addArgument(verb, "INDEX", *name, "A search image, or the directory of a classic index");
  whenNamed(verb, chosen, [name] { return runVerify(*name); });
}

}  // namespace wordcatcher::cli
