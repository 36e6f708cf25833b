#include "wordcatcher/storage/TableExport.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <set>
#include <system_error>

#include "wordcatcher/Error.h"
#include "wordcatcher/storage/PLXDFA.h"
#include "wordcatcher/storage/TableFile.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {

namespace {

constexpr std::array kTableFiles = {"edgeTable.tdb", "dataTable.tdb", "finalTable.tdb"};

[[noreturn]] void throwNotWritable(const std::string& path, const std::string& reason) {
  throw Error(ErrorCode::notWritable, "The table file " + path + " cannot be written (" + reason +
                                          "); check that its directory exists, can be written and "
                                          "has room, and try again.");
}

/// Opens a table file in the way in which the table will, for which the table only has a log line
/// when it fails; and syncs it.
void probe(const std::string& path, int flags) {
  const int file = open(path.c_str(), flags | O_CLOEXEC, kPermissions);
  int code = file < 0 ? errno : 0;
  if (file >= 0) {
    while (code == 0 && fsync(file) != 0) {
      code = errno == EINTR ? 0 : errno;
    }
    close(file);
  }
  if (code != 0) {
    throwNotWritable(path, std::generic_category().message(code));
  }
}

std::u16string textOf(std::string_view value) { return fromUtf8(value).value_or(std::u16string()); }

/// Calls `visit(word, known)` for every word, of which the first `known` code units are those of
/// the word before: their edges have been visited with that.
template <typename Visit>
void forEachWord(const SearchImageWriter::Content& content, Visit visit) {
  std::u16string_view previous;
  for (std::uint32_t number = 0; number < content.wordCount(); ++number) {
    const std::u16string_view word = content.word(number);
    const auto differs = std::mismatch(previous.begin(), previous.end(), word.begin(), word.end());
    visit(number, word, static_cast<std::size_t>(differs.second - word.begin()));
    previous = word;
  }
}

void write(PLXDFA& tables, const SearchImageWriter::Content& content) {
  forEachWord(content, [&](std::uint32_t number, std::u16string_view word, std::size_t known) {
    for (std::size_t i = known; i < word.size(); ++i) {
      tables.addEdge_fromState_toState(word.substr(i, 1), word.substr(0, i), word.substr(0, i + 1));
    }
    tables.addFinalState(word);
    for (const std::uint32_t value : content.postingsOf(number)) {
      tables.setDataFor_to(word, textOf(content.value(value)));
    }
  });
}

/// Whether the tables hold an edge; halves of surrogate pairs have no UTF-8 form, and so no edges.
bool holdsEdge(PLXDFA& tables, std::u16string_view from, std::u16string_view symbol) {
  return !toUtf8(symbol) || !toUtf8(from) ||
         tables.edgesFromState(from).contains(std::u16string(symbol));
}

bool holdsValues(PLXDFA& tables, std::u16string_view word,
                 const SearchImageWriter::Content& content, std::uint32_t number) {
  const auto postings = content.postingsOf(number);
  if (postings.empty()) {
    return true;
  }
  const auto values = tables.dataFor(word);
  return values.size() == postings.size() &&
         std::all_of(postings.begin(), postings.end(), [&](std::uint32_t posting) {
           return values.contains(textOf(content.value(posting)));
         });
}

void check(PLXDFA& tables, const std::string& prefix, const SearchImageWriter::Content& content) {
  const auto require = [&prefix](bool held, std::size_t table) {
    if (!held) {
      throwNotWritable(prefix + kTableFiles[table], "it does not hold what was written to it");
    }
  };
  forEachWord(content, [&](std::uint32_t number, std::u16string_view word, std::size_t known) {
    for (std::size_t i = known; i < word.size(); ++i) {
      require(holdsEdge(tables, word.substr(0, i), word.substr(i, 1)), 0);
    }
    require(holdsValues(tables, word, content, number), 1);
    require(tables.isFinalState(word), 2);
  });
}

}  // namespace

void exportTables(const std::string& prefix, const SearchImageWriter::Content& content) {
  for (const char* file : kTableFiles) {
    probe(prefix + file, O_RDWR | O_CREAT | O_NOFOLLOW);
  }
  {
    PLXDFA tables(prefix);
    tables.setMode(2);
    write(tables, content);
    tables.setMode(1);
    check(tables, prefix, content);
  }
  for (const char* file : kTableFiles) {
    probe(prefix + file, O_RDONLY);
  }
}

}  // namespace wordcatcher
