#include <string>
#include <vector>

#include "cli/Joined.h"
#include "cli/pages/Command.h"

namespace wordcatcher::cli {

namespace {

// Bash knows a command by the path of its verbs, each with a space in front: " dot nfa". Names and
// choices are words of plain letters and dashes.
constexpr const char* kHead =
    "# Completion of wordcatcher for bash, made from the command's own definitions.\n\n";

constexpr const char* kTail = R"bash(
_wordcatcher() {
  local verbs options valued places
  local current=${COMP_WORDS[COMP_CWORD]} path='' place=0 ended='' i word
  COMPREPLY=()
  _wordcatcher_command "$path"
  for ((i = 1; i < COMP_CWORD; ++i)); do
    word=${COMP_WORDS[i]}
    if [[ -z $ended && $word == -- ]]; then
      ended=1
    elif [[ -z $ended && $word == -* ]]; then
      if [[ " $valued " == *" $word "* ]]; then
        # Bash takes "=" for a word of its own.
        [[ ${COMP_WORDS[i + 1]} != = || i+1 -eq COMP_CWORD ]] || ((++i))
        if ((++i >= COMP_CWORD)); then
          [[ $current != = ]] || current=''
          mapfile -t COMPREPLY < <(compgen -W "$(_wordcatcher_choices "$path $word")" -- "$current")
          return
        fi
      fi
    elif [[ -z $ended && " $verbs " == *" $word "* ]]; then
      path+=" $word"
      _wordcatcher_command "$path"
    else
      ((++place))
    fi
  done
  if [[ -z $ended && $current == -* ]]; then
    mapfile -t COMPREPLY < <(compgen -W "$options" -- "$current")
  elif [[ -n $verbs ]]; then
    mapfile -t COMPREPLY < <(compgen -W "$verbs" -- "$current")
  else
    read -ra places <<<"$places"
    if ((place >= ${#places[@]})) && [[ ${places[*]: -1} == *... ]]; then
      place=$((${#places[@]} - 1))
    fi
    if [[ ${places[place]-} == path* ]]; then
      compopt -o filenames 2>/dev/null
      mapfile -t COMPREPLY < <(compgen -f -- "$current")
    fi
  fi
}

complete -F _wordcatcher wordcatcher
)bash";

std::string pathOf(const Command& command) {
  std::string path;
  for (std::size_t i = 1; i < command.path.size(); ++i) {
    path += ' ' + command.path[i];
  }
  return path;
}

std::string assigned(const std::string& variable, const std::vector<std::string>& words) {
  return variable + "='" + joined(words, " ") + "'";
}

/// What the command takes, as a branch of a case.
std::string branch(const Command& command) {
  std::vector<std::string> verbs;
  std::vector<std::string> options;
  std::vector<std::string> valued;
  std::vector<std::string> places;
  for (const auto& verb : command.verbs) {
    verbs.push_back(verb.path.back());
  }
  for (const auto& option : command.options) {
    options.insert(options.end(), option.names.begin(), option.names.end());
    if (!option.value.empty()) {
      valued.insert(valued.end(), option.names.begin(), option.names.end());
    }
  }
  for (const auto& argument : command.arguments) {
    places.push_back(std::string(argument.isPath() ? "path" : "text") +
                     (argument.repeated ? "..." : ""));
  }
  std::string text = "    '" + pathOf(command) + "')\n      " + assigned("verbs", verbs) +
                     "\n      " + assigned("options", options) + "\n      " +
                     assigned("valued", valued) + "\n      " + assigned("places", places) + " ;;\n";
  for (const auto& verb : command.verbs) {
    text += branch(verb);
  }
  return text;
}

std::string choices(const Command& command) {
  std::string text;
  for (const auto& option : command.options) {
    for (const auto& name : option.names) {
      if (!option.choices.empty()) {
        text += "    '" + pathOf(command) + ' ' + name + "') echo '" + joined(option.choices, " ") +
                "' ;;\n";
      }
    }
  }
  for (const auto& verb : command.verbs) {
    text += choices(verb);
  }
  return text;
}

}  // namespace

std::string bashCompletion(const Command& program) {
  return std::string(kHead) + "_wordcatcher_command() {\n  case $1 in\n" + branch(program) +
         "  esac\n}\n\n_wordcatcher_choices() {\n  case $1 in\n" + choices(program) +
         "  esac\n}\n" + kTail;
}

}  // namespace wordcatcher::cli
