#include "cli/VerbNames.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdint>

#include "cli/Failure.h"
#include "wordcatcher/fuzzy/EditDistance.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher::cli {

namespace {

constexpr const char* kHelp = "help";
constexpr std::uint64_t kMostEdits = 2;

/// "did you mean ...? ", or nothing when no verb is near the word.
std::string suggestion(const std::string& word, const std::vector<std::string>& verbs) {
  const auto wanted = decodeUtf8(word);
  const std::string* nearest = nullptr;
  // More edits than that, or as many as letters, make another word of it.
  std::uint64_t fewest = std::min<std::uint64_t>(kMostEdits + 1, wanted.size());
  for (const auto& verb : verbs) {
    const auto edits = editDistance(wanted, decodeUtf8(verb), true);
    if (edits < fewest) {
      fewest = edits;
      nearest = &verb;
    }
  }
  return nearest == nullptr ? "." : "; did you mean " + inQuotes(*nearest) + '?';
}

}  // namespace

std::vector<std::string> withHelpAsOption(std::vector<std::string> arguments) {
  if (!arguments.empty() && arguments.front() == kHelp) {
    arguments.erase(arguments.begin());
    arguments.emplace_back("--help");
  }
  return arguments;
}

void checkVerbNames(const CLI::App& program, const std::vector<std::string>& arguments) {
  const CLI::App* app = &program;
  std::string path = program.get_name();
  std::vector<std::string> names{kHelp};
  for (const auto& word : arguments) {
    const auto verbs = app->get_subcommands([](const CLI::App*) { return true; });
    if (verbs.empty() || word.starts_with('-')) {
      return;
    }
    const auto named = std::find_if(verbs.begin(), verbs.end(), [&word](const CLI::App* verb) {
      return verb->get_name() == word;
    });
    if (named == verbs.end()) {
      for (const auto* verb : verbs) {
        names.push_back(verb->get_name());
      }
      throw Failure(inQuotes(word) + " is no verb" + suggestion(word, names) + " See " +
                    inQuotes(path + " --help") + '.');
    }
    app = *named;
    path += ' ' + word;
    names.clear();
  }
}

}  // namespace wordcatcher::cli
