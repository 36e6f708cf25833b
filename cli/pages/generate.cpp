// Writes the command's man pages and completions below a directory: man1, bash and zsh.

#include <CLI/CLI.hpp>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <string>

#include "cli/Program.h"
#include "cli/pages/Command.h"

namespace wordcatcher::cli {

namespace {

namespace fs = std::filesystem;

void write(const fs::path& path, const std::string& text) {
  fs::create_directories(path.parent_path());
  std::ofstream file(path, std::ios::binary);
  file << text;
  file.close();
  if (!file) {
    throw std::runtime_error("Cannot write " + path.string() + '.');
  }
}

void writeManPages(const fs::path& directory, const Command& command) {
  write(directory / (command.joined("-") + ".1"), manPage(command));
  for (const auto& verb : command.verbs) {
    writeManPages(directory, verb);
  }
}

void generate(const fs::path& directory) {
  CLI::App app;
  ChosenVerb chosen;
  defineProgram(app, chosen);
  const Command program = readCommand(app);
  writeManPages(directory / "man1", program);
  write(directory / "bash" / "wordcatcher", bashCompletion(program));
  write(directory / "zsh" / "_wordcatcher", zshCompletion(program));
}

}  // namespace

}  // namespace wordcatcher::cli

int main(int argc, char** argv) {
  try {
    if (argc != 2) {
      throw std::runtime_error("Usage: generate-pages DIRECTORY");
    }
    wordcatcher::cli::generate(argv[1]);
    return 0;
  } catch (const std::exception& failure) {
    std::cerr << failure.what() << '\n';
    return 1;
  }
}
