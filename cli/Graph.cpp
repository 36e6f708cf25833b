#include "cli/Graph.h"

#include <unicode/uchar.h>
#include <unicode/utf16.h>

#include <iomanip>
#include <sstream>

#include "wordcatcher/text/Unicode.h"

namespace wordcatcher::cli {

namespace {

std::string numbered(UChar32 character) {
  std::ostringstream text;
  text << "U+" << std::uppercase << std::hex << std::setfill('0') << std::setw(4) << character;
  return text.str();
}

/// A label in quotes. Graphviz takes a backslash for the begin of an escape, and "&amp;" for what
/// it is in HTML; control characters have no place in a drawing.
std::string quotedLabel(std::string_view label) {
  std::string text = "\"";
  for (const char c : label) {
    if (c == '&') {
      text += "&amp;";
    } else if (c == '"' || c == '\\') {
      text += {'\\', c};
    } else if (u_iscntrl(static_cast<unsigned char>(c)) != 0 && static_cast<signed char>(c) >= 0) {
      text += numbered(c);
    } else {
      text += c;
    }
  }
  return text += '"';
}

}  // namespace

Graph::Graph(std::string_view title)
    : _text("digraph wordcatcher {\n  rankdir=LR;\n  label=" + quotedLabel(title) +
            ";\n  node [shape=circle];\n") {}

std::size_t Graph::addNode(std::string_view label, bool final) {
  _text += "  n" + std::to_string(_nodes) + " [label=" + quotedLabel(label) +
           (final ? ", peripheries=2" : "") + "];\n";
  return _nodes++;
}

void Graph::markStart(std::size_t node) {
  _text += "  start [shape=none, label=\"\", width=0, height=0];\n  start -> n" +
           std::to_string(node) + ";\n";
}

void Graph::addEdge(std::size_t from, std::size_t to, std::string_view label) {
  _text += "  n" + std::to_string(from) + " -> n" + std::to_string(to) +
           " [label=" + quotedLabel(label) + "];\n";
}

std::string visible(std::u16string_view units) {
  std::string text;
  for (std::size_t i = 0; i < units.size();) {
    const std::size_t begin = i;
    UChar32 character = 0;
    U16_NEXT(units.data(), i, units.size(), character);
    text += U_IS_SURROGATE(character) || u_isgraph(character) == 0
                ? numbered(character)
                : displayUtf8(units.substr(begin, i - begin));
  }
  return text;
}

}  // namespace wordcatcher::cli
