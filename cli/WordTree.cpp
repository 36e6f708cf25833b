#include "cli/WordTree.h"

#include <algorithm>
#include <utility>
#include <vector>

#include "cli/Failure.h"
#include "cli/IndexDirectory.h"
#include "cli/OpenIndex.h"
#include "cli/TableLog.h"
#include "cli/WaitingNote.h"
#include "wordcatcher/fuzzy/TableImage.h"
#include "wordcatcher/storage/PLXDFA.h"
#include "wordcatcher/storage/SearchImage.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher::cli {

namespace {

constexpr std::int32_t kReading = 1;

/// The first word, in their order, that does not come before the prefix.
std::uint32_t lowerBound(const SearchImage& image, std::u16string_view prefix) {
  std::uint32_t first = 0;
  std::uint32_t count = image.wordCount();
  while (count > 0) {
    const std::uint32_t half = count / 2;
    if (image.textOf(first + half) < prefix) {
      first += half + 1;
      count -= half + 1;
    } else {
      count = half;
    }
  }
  return first;
}

std::string described(std::u16string_view prefix) {
  return prefix.empty() ? "" : " that begin with " + inQuotes(displayUtf8(prefix));
}

std::vector<std::u16string> wordsFrom(const SearchImage& image, std::u16string_view prefix,
                                      std::size_t mostWords) {
  std::vector<std::u16string> words;
  for (std::uint32_t i = lowerBound(image, prefix); i < image.wordCount(); ++i) {
    auto word = image.textOf(i);
    if (!word.starts_with(prefix)) {
      break;
    }
    if (words.size() == mostWords) {
      throw Failure("More than " + std::to_string(mostWords) + " words" + described(prefix) +
                    " are stored, and no drawing of them can be read: give " +
                    (prefix.empty() ? "a PREFIX, such as " : "a longer PREFIX, such as ") +
                    inQuotes(displayUtf8(words.back().substr(0, prefix.size() + 1))) + '.');
    }
    words.push_back(std::move(word));
  }
  return words;
}

/// The tree of words that ascend, from the code unit `depth` on, before which they are the same.
WordTree treeOf(const std::u16string* begin, const std::u16string* end, std::size_t depth) {
  WordTree tree;
  while (begin != end) {
    if (begin->size() <= depth) {
      tree.isWord = true;
      ++begin;
      continue;
    }
    const auto* next = std::find_if(begin, end, [&](const std::u16string& word) {
      return word.size() <= depth || word[depth] != (*begin)[depth];
    });
    // The first and the last of them differ first.
    const auto& last = *(next - 1);
    const auto parting = static_cast<std::size_t>(
        std::mismatch(begin->begin(), begin->end(), last.begin(), last.end()).first -
        begin->begin());
    tree.edges.push_back({begin->substr(depth, parting - depth), treeOf(begin, next, parting)});
    begin = next;
  }
  return tree;
}

}  // namespace

WordTree wordTreeOf(const SearchImage& image, std::u16string_view prefix, std::size_t mostWords) {
  const auto words = wordsFrom(image, prefix, mostWords);
  if (words.empty()) {
    throw Failure("No words" + described(prefix) +
                  " are stored: give a PREFIX of words of the index.");
  }
  return treeOf(words.data(), words.data() + words.size(), prefix.size());
}

std::shared_ptr<const SearchImage> openWords(const std::string& name, bool verbose) {
  if (name.empty()) {
    throw Failure("The name of the index is empty: give a file or a directory.");
  }
  if (!namesDirectory(name)) {
    return SearchImage::open(name, SearchImage::Load::map);
  }
  const IndexDirectory directory(name);
  const TableLog log(verbose);
  const WaitingNote note("Reading " + name);
  PLXDFA tables(directory.path());
  directory.openForReading(log, [&] { tables.setMode(kReading); });
  return makeTableImage(tables);
}

}  // namespace wordcatcher::cli
