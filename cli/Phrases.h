#ifndef WORDCATCHER_CLI_PHRASES_H
#define WORDCATCHER_CLI_PHRASES_H

#include <cstddef>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace wordcatcher::cli {

/// One phrase and its data string, which begins with it.
template <typename Unit>
struct PhraseOf {
  std::basic_string<Unit> data;
  std::size_t length;

  std::basic_string_view<Unit> text() const {
    return std::basic_string_view<Unit>(data).substr(0, length);
  }
};

/// A line's phrase in both of its forms.
struct Phrase {
  PhraseOf<char> utf8;
  PhraseOf<char16_t> utf16;
};

/// Calls `take` with each phrase of the files, "-" and no file at all being standard input, in
/// their order and as they are read. Failure, which names the file and the line, for a line that
/// holds no phrase that can be stored, also when `take` says so by an Error.
void forEachPhrase(std::vector<std::string> files, const std::function<void(Phrase&&)>& take);

}  // namespace wordcatcher::cli

#endif
