#ifndef WORDCATCHER_CLI_GRAPH_H
#define WORDCATCHER_CLI_GRAPH_H

#include <cstddef>
#include <string>
#include <string_view>

namespace wordcatcher::cli {

/// A directed graph in Graphviz's language, written left to right.
class Graph {
 public:
  /// `title` stands below the drawing.
  explicit Graph(std::string_view title);

  /// Adds a node and returns its number. One that is final has two borders.
  std::size_t addNode(std::string_view label, bool final);

  /// An arrow from nowhere, to where reading starts.
  void markStart(std::size_t node);

  void addEdge(std::size_t from, std::size_t to, std::string_view label);

  /// All of it.
  std::string text() const { return _text + "}\n"; }

 private:
  std::string _text;
  std::size_t _nodes = 0;
};

/// A string of UTF-16 code units for a label: characters that cannot be seen, and halves of
/// surrogate pairs that stand alone, are written as U+000A.
std::string visible(std::u16string_view units);

}  // namespace wordcatcher::cli

#endif
