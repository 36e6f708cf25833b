#ifndef WORDCATCHER_CLI_WORDTREE_H
#define WORDCATCHER_CLI_WORDTREE_H

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace wordcatcher {
class SearchImage;
}

namespace wordcatcher::cli {

/// A place of a prefix tree: the words that go on from here, by what they go on with. An edge has
/// all code units up to the next place where words part or end.
struct WordTree {
  struct Edge;

  bool isWord = false;
  std::vector<Edge> edges;  // ascending
};

struct WordTree::Edge {
  std::u16string units;
  WordTree below;
};

/// The tree of the stored words that begin with a prefix, without the prefix. Failure if there are
/// none, or more than `mostWords`.
WordTree wordTreeOf(const SearchImage& image, std::u16string_view prefix, std::size_t mostWords);

/// The words of an index file or, locked while they are read, of the tables in a directory.
std::shared_ptr<const SearchImage> openWords(const std::string& name, bool verbose);

}  // namespace wordcatcher::cli

#endif
