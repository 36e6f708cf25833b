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
#include "cli/Program.h"
#include "cli/VerbNames.h"

namespace wordcatcher::cli {

namespace {

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

/// The words of the command line that name what was asked for: wordcatcher dot nfa
std::string chosenPath(const CLI::App& app) {
  const auto verbs = app.get_subcommands();
  return app.get_name() + (verbs.empty() ? "" : ' ' + chosenPath(*verbs.front()));
}

/// Prints what --help and --version ask for; everything else that ends parsing is wrong usage.
ExitCode endParsing(const CLI::App& program, const CLI::ParseError& error) {
  if (error.get_exit_code() != static_cast<int>(CLI::ExitCodes::Success)) {
    std::string what = error.what();
    if (what == CLI::RequiredError::Subcommand(1).what()) {
      what = "VERB is required";
    }
    return fail(what + "; see \"" + chosenPath(program) + " --help\".");
  }
  std::ostringstream text;
  program.exit(error, text, text);
  Output output;
  output.write(text.str());
  output.flush();
  return kMatched;
}

ExitCode run(int argc, char** argv) {
  CLI::App program;
  ChosenVerb chosen;
  defineProgram(program, chosen);
  if (argc <= 1) {
    std::cerr << kFirstSteps;
    return kFailed;
  }
  try {
    const auto arguments = withHelpAsOption({argv + 1, argv + argc});
    checkVerbNames(program, arguments);
    program.parse(shieldedArguments(arguments));
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
