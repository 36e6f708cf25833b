#include <fcntl.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <csignal>
#include <exception>
#include <iostream>
#include <sstream>
#include <string>

#include "cli/Arguments.h"
#include "cli/Failure.h"
#include "cli/Output.h"
#include "cli/Verbs.h"
#include "wordcatcher/Version.h"

namespace wordcatcher::cli {

namespace {

constexpr const char* kSummary =
    "Finds stored phrases in free text, tolerating spelling mistakes.\n";

constexpr const char* kFooter = R"(
Exit codes: 0 matches were found (or the index was written, or codes were printed),
1 nothing matched, 2 wrong usage or a failure.

Examples:
  printf 'golden retriever\ngolden gate bridge\n' | wordcatcher index dogs
  wordcatcher query dogs 'a goldan retriver'
  wordcatcher search --max-distance 1 dogs bridg
  wordcatcher encode 'Catherine Schmidt'
"wordcatcher VERB --help" tells more about a verb.)";

/// Fills the places of standard streams that the caller closed, so that no table file is opened
/// there and mistaken for one. Using such a stream is still an error.
void keepStandardStreams() {
  for (const int descriptor : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
    if (fcntl(descriptor, F_GETFD) < 0) {
      static_cast<void>(open("/dev/null", descriptor == STDIN_FILENO ? O_WRONLY : O_RDONLY));
    }
  }
}

/// A closed pipe and a file that may grow no more are errors of write(), to be dealt with there.
void ignoreWriteSignals() {
  struct sigaction ignore {};
  ignore.sa_handler = SIG_IGN;
  sigaction(SIGPIPE, &ignore, nullptr);
  sigaction(SIGXFSZ, &ignore, nullptr);
}

ExitCode fail(const std::string& message) {
  std::cerr << "wordcatcher: " + message + '\n';
  return kFailed;
}

/// Prints what --help and --version ask for; everything else that ends parsing is wrong usage.
ExitCode endParsing(const CLI::App& program, const CLI::ParseError& error) {
  if (error.get_exit_code() != static_cast<int>(CLI::ExitCodes::Success)) {
    const auto verbs = program.get_subcommands();
    const std::string verb = verbs.empty() ? "" : ' ' + verbs.front()->get_name();
    return fail(std::string(error.what()) + "; see \"wordcatcher" + verb + " --help\".");
  }
  std::ostringstream text;
  program.exit(error, text, text);
  Output output;
  output.write(text.str());
  output.flush();
  return kMatched;
}

ExitCode run(int argc, char** argv) {
  CLI::App program(kSummary, "wordcatcher");
  program.set_version_flag("--version", std::string("wordcatcher ") + versionString,
                           "Print the version and exit");
  program.require_subcommand(1);
  program.footer(kFooter);
  ChosenVerb chosen;
  addIndexVerb(program, chosen);
  addQueryVerb(program, chosen);
  addSearchVerb(program, chosen);
  addEncodeVerb(program, chosen);
  if (argc <= 1) {
    std::cerr << program.help();
    return kFailed;
  }
  try {
    program.parse(shieldedArguments(argc, argv));
  } catch (const CLI::ParseError& error) {
    return endParsing(program, error);
  }
  return chosen();
}

}  // namespace

}  // namespace wordcatcher::cli

int main(int argc, char** argv) {
  using namespace wordcatcher::cli;
  keepStandardStreams();
  ignoreWriteSignals();
  try {
    return run(argc, argv);
  } catch (const OutputClosed&) {
    return kMatched;
  } catch (const std::bad_alloc&) {
    return fail("There is not enough memory: give shorter texts or a smaller distance.");
  } catch (const std::exception& failure) {
    return fail(failure.what());
  }
}
