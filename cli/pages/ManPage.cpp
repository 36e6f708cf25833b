#include <cctype>
#include <sstream>
#include <string_view>

#include "cli/Joined.h"
#include "cli/pages/Command.h"
#include "wordcatcher/Version.h"

namespace wordcatcher::cli {

namespace {

/// Text that troff prints as it stands, in ASCII where it has signs of its own.
std::string escaped(std::string_view text) {
  std::string troff;
  for (const char c : text) {
    switch (c) {
      case '\\':
        troff += "\\(rs";
        break;
      case '-':
        troff += "\\-";
        break;
      case '\'':
        troff += "\\(aq";
        break;
      case '`':
        troff += "\\(ga";
        break;
      case '^':
        troff += "\\(ha";
        break;
      case '~':
        troff += "\\(ti";
        break;
      default:
        troff += c;
    }
  }
  // A dot at the start of a line would be a request.
  return troff.starts_with('.') ? "\\&" + troff : troff;
}

std::string bold(std::string_view text) { return "\\fB" + escaped(text) + "\\fR"; }
std::string italic(std::string_view text) { return "\\fI" + escaped(text) + "\\fR"; }

/// The name of a command's page: wordcatcher-find
std::string pageName(const Command& command) { return command.joined("-"); }

std::string synopsis(const Command& command) {
  std::string text = bold(command.joined(" "));
  text += command.verbs.empty() ? " [" + italic("OPTIONS") + ']' : ' ' + italic("VERB") + " ...";
  for (const auto& argument : command.arguments) {
    const std::string name = italic(argument.name) + (argument.repeated ? "..." : "");
    text += ' ' + (argument.required ? name : '[' + name + ']');
  }
  return text + '\n';
}

/// A help text: its indented lines are shown as they stand, and some of its lines begin sections.
class Body {
 public:
  std::string of(const std::string& text) {
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
      add(line);
    }
    endExample();
    return _troff;
  }

 private:
  void add(const std::string& line) {
    constexpr std::string_view kExitCodes = "Exit codes: ";
    if (line.starts_with("  ")) {
      beginExample();
      _troff += escaped(std::string_view(line).substr(2)) + '\n';
      return;
    }
    endExample();
    if (line == "Examples:") {
      _troff += ".SH EXAMPLES\n";
    } else if (line.starts_with(kExitCodes)) {
      _troff +=
          ".SH EXIT STATUS\n" + escaped(std::string_view(line).substr(kExitCodes.size())) + '\n';
    } else if (_troff.empty() && !line.empty()) {
      _troff += ".SH DESCRIPTION\n" + escaped(line) + '\n';
    } else if (!line.empty()) {
      // Two paragraph requests in a row, and one before a section, are one too many.
      _troff += (_wasBlank ? ".PP\n" : "") + escaped(line) + '\n';
    }
    _wasBlank = line.empty();
  }

  void beginExample() {
    if (!_example) {
      _troff += ".PP\n.RS 4\n.EX\n";
      _example = true;
    }
  }

  void endExample() {
    if (_example) {
      _troff += ".EE\n.RE\n";
      _wasBlank = true;
      _example = false;
    }
  }

  std::string _troff;
  bool _wasBlank = false;
  bool _example = false;
};

/// An option's description; each of its lines is one on the page.
std::string described(const Command::Option& option) {
  std::string text;
  std::istringstream lines(option.description);
  for (std::string line; std::getline(lines, line);) {
    text += (text.empty() ? "" : ".br\n") + escaped(line) + '\n';
  }
  // Where there is more to say about the choices, the description lists them.
  if (!option.choices.empty() && option.description.find('\n') == std::string::npos) {
    text += ".br\nOne of " + escaped(joined(option.choices, ", ")) + ".\n";
  }
  if (!option.range.empty()) {
    text += ".br\nFrom " + escaped(option.range) + ".\n";
  }
  if (!option.fallback.empty()) {
    text += ".br\nDefault: " + escaped(option.fallback) + '\n';
  }
  return text;
}

std::string options(const Command& command) {
  std::string text = ".SH OPTIONS\n";
  for (const auto& option : command.options) {
    text += ".TP\n";
    for (const auto& name : option.names) {
      text += (&name == &option.names.front() ? "" : ", ") + bold(name);
    }
    text += (option.value.empty() ? "" : ' ' + italic(option.value)) + '\n' + described(option);
  }
  return text;
}

std::string arguments(const Command& command) {
  std::string text;
  for (const auto& argument : command.arguments) {
    text += ".TP\n" + italic(argument.name) + '\n' + escaped(argument.description) + '\n';
  }
  return text.empty() ? "" : ".SH ARGUMENTS\n" + text;
}

std::string verbs(const Command& command) {
  std::string text;
  for (const auto& verb : command.verbs) {
    text += ".TP\n.BR " + escaped(pageName(verb)) + " (1)\n" + escaped(verb.summary) + '\n';
  }
  return text.empty() ? "" : ".SH VERBS\n" + text;
}

std::string seeAlso(const Command& command) {
  auto parent = command;
  parent.path.pop_back();
  return parent.path.empty() ? "" : ".SH SEE ALSO\n.BR " + escaped(pageName(parent)) + " (1)\n";
}

}  // namespace

std::string manPage(const Command& command) {
  std::string title = pageName(command);
  for (char& c : title) {
    c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  }
  return ".TH " + escaped(title) + R"( 1 "" "wordcatcher )" + versionString +
         R"(" "User Commands")" + "\n.SH NAME\n" + escaped(pageName(command)) + " \\- " +
         escaped(command.summary) + "\n.SH SYNOPSIS\n" + synopsis(command) + arguments(command) +
         verbs(command) + options(command) + Body().of(command.footer) + seeAlso(command);
}

}  // namespace wordcatcher::cli
