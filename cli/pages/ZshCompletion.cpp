#include <string>

#include "cli/Joined.h"
#include "cli/pages/Command.h"

namespace wordcatcher::cli {

namespace {

/// The first line of a description, as it may stand in the brackets or between the colons of a
/// description in single quotes.
std::string message(const std::string& description) {
  std::string text;
  for (const char c : description.substr(0, description.find('\n'))) {
    if (c == '\'') {
      text += "'\\'";
    } else if (c == '[' || c == ']' || c == ':' || c == '\\') {
      text += '\\';
    }
    text += c;
  }
  return text;
}

std::string function(const Command& command) { return '_' + command.joined("_"); }

std::string specified(const Command::Option& option) {
  // A space where choices would be: a value that cannot be completed.
  const std::string choices =
      option.choices.empty() ? " " : '(' + joined(option.choices, " ") + ')';
  const std::string value = option.value.empty() ? "" : ':' + option.value + ':' + choices;
  std::string text;
  for (const auto& name : option.names) {
    text += " \\\n    '" + name;
    text += option.value.empty() ? "[" : "=[";
    text += message(option.description) + ']' + value + '\'';
  }
  return text;
}

std::string specified(const Command::Argument& argument) {
  return std::string(" \\\n    '") + (argument.repeated ? "*" : "") +
         (argument.required || argument.repeated ? ":" : "::") + argument.name + ":" +
         (argument.isPath() ? "_files" : " ") + '\'';
}

std::string chooseVerb(const Command& command) {
  std::string verbs;
  std::string branches;
  for (const auto& verb : command.verbs) {
    const auto& name = verb.path.back();
    verbs += "\n        '" + name + ':' + message(verb.summary) + '\'';
    branches += "\n        " + name + ") " + function(verb) + " ;;";
  }
  return R"(
  case $state in
    verb)
      local -a verbs=()" +
         verbs + R"()
      _describe verb verbs ;;
    rest)
      case $words[1] in)" +
         branches + R"(
      esac ;;
  esac)";
}

std::string functions(const Command& command) {
  const bool hasVerbs = !command.verbs.empty();
  std::string text = function(command) + "() {\n";
  if (hasVerbs) {
    text +=
        "  local curcontext=$curcontext context state state_descr line\n"
        "  typeset -A opt_args\n";
  }
  text += std::string("  _arguments") + (hasVerbs ? " -C" : " -S");
  for (const auto& option : command.options) {
    text += specified(option);
  }
  for (const auto& argument : command.arguments) {
    text += specified(argument);
  }
  if (hasVerbs) {
    text += " \\\n    '1: :->verb' \\\n    '*:: :->rest'" + chooseVerb(command);
  }
  text += "\n}\n\n";
  for (const auto& verb : command.verbs) {
    text += functions(verb);
  }
  return text;
}

}  // namespace

std::string zshCompletion(const Command& program) {
  return "#compdef wordcatcher\n# Made from the command's own definitions.\n\n" +
         functions(program) + "_wordcatcher \"$@\"\n";
}

}  // namespace wordcatcher::cli
