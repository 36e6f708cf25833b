#include "wordcatcher/matcher/IndexBuilder.h"

#include <algorithm>
#include <utility>
#include <vector>

#include "wordcatcher/Error.h"
#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/storage/CommitImage.h"
#include "wordcatcher/storage/SearchImageWriter.h"
#include "wordcatcher/storage/TableExport.h"
#include "wordcatcher/text/PhraseLength.h"
#include "wordcatcher/text/Unicode.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher {

namespace {

// Far below what ICU can count, also when a text gets longer in lower case or in code.
constexpr std::size_t kMaxStringBytes = (std::size_t{1} << 28U) - 1;

bool isAscii(char16_t unit) { return unit < 0x80; }

/// The UTF-16 form of a string that an index can hold.
std::u16string takeString(std::string_view bytes, const char* what) {
  if (bytes.size() > kMaxStringBytes) {
    throw Error(ErrorCode::tooLarge,
                std::string(what) + " is longer than 268,435,455 bytes; shorten it.");
  }
  auto text = fromUtf8(bytes);
  if (!text) {
    throw Error(ErrorCode::badInput, std::string(what) + " is not UTF-8; convert it.");
  }
  if (bytes.find('\0') != std::string_view::npos) {
    throw Error(ErrorCode::badInput,
                std::string(what) + " holds the character U+0000; take it out.");
  }
  return *std::move(text);
}

}  // namespace

struct IndexBuilder::State {
  using Value = std::optional<SearchImageWriter::Value>;

  State(std::string target, Options chosen)
      : path(std::move(target)),
        options(std::move(chosen)),
        writer(static_cast<std::uint32_t>(options.mode)) {}

  void add(std::string_view phrase, std::optional<std::string_view> data);
  void cut(std::u16string_view text);
  SearchImageWriter::Value valueOf(std::string_view data, std::string_view phrase);
  std::uint32_t addWord(std::u16string_view word);

  std::string path;
  Options options;
  SearchImageWriter writer;
  WordSegmenter segmenter;
  KXMetaphone encoder;
  std::vector<std::u16string_view> tokens;
  std::vector<std::uint32_t> words;
  std::u16string lowered;
};

void IndexBuilder::State::add(std::string_view phrase, std::optional<std::string_view> data) {
  std::u16string text = takeString(phrase, "The phrase");
  if (options.mode == MatchingMode::wholeText) {
    tokens.assign(text.empty() ? 0 : 1, text);
  } else {
    if (options.mode == MatchingMode::phoneticWords) {
      text = encoder.translate(text);
    }
    cut(text);
  }
  Value value;
  if (data) {
    value = valueOf(*data, phrase);
  }
  words.clear();
  for (const auto& word : tokens) {
    words.push_back(addWord(word));
  }
  if (value) {
    writer.addPhrase(words, *value);
  }
  writer.countPhrase();
}

void IndexBuilder::State::cut(std::u16string_view text) {
  tokens.clear();
  segmenter.start(text);
  while (const auto word = segmenter.next()) {
    tokens.push_back(*word);
  }
}

/// Registers the data string of a phrase whose words are in `tokens`. Most data strings begin with
/// the phrase, whose words then need not be found a second time.
SearchImageWriter::Value IndexBuilder::State::valueOf(std::string_view data,
                                                      std::string_view phrase) {
  if (const auto known = writer.findValue(data)) {
    return *known;
  }
  const std::u16string text = takeString(data, "The data string");
  std::int64_t length = 0;
  if (options.mode == MatchingMode::words && phraseOf(data) == phrase) {
    length = std::count_if(tokens.begin(), tokens.end(), [](std::u16string_view word) {
      return static_cast<std::int64_t>(word.size()) > kUncountedWordLength;
    });
  } else {
    length = countedWords(segmenter, phraseOf(std::u16string_view(text)));
  }
  return writer.addValue(data, static_cast<std::uint32_t>(length));
}

std::uint32_t IndexBuilder::State::addWord(std::u16string_view word) {
  if (std::all_of(word.begin(), word.end(), &isAscii)) {
    lowered.assign(word);
    for (char16_t& unit : lowered) {
      unit = u'A' <= unit && unit <= u'Z' ? static_cast<char16_t>(unit + (u'a' - u'A')) : unit;
    }
  } else {
    lowered = toLower(word);
  }
  return writer.addWord(lowered);
}

IndexBuilder::IndexBuilder(std::string path) : IndexBuilder(std::move(path), Options()) {}

IndexBuilder::IndexBuilder(std::string path, Options options) {
  if (options.mode > MatchingMode::phoneticWords) {
    throw Error(ErrorCode::badInput, "There is no such matching mode; choose one of the three.");
  }
  _state = std::make_unique<State>(std::move(path), std::move(options));
}

IndexBuilder::~IndexBuilder() = default;
IndexBuilder::IndexBuilder(IndexBuilder&&) noexcept = default;
IndexBuilder& IndexBuilder::operator=(IndexBuilder&&) noexcept = default;

void IndexBuilder::add(std::string_view phrase, std::optional<std::string_view> data) {
  const auto before = _state->writer.mark();
  try {
    _state->add(phrase, data);
  } catch (...) {
    _state->writer.rollBack(before);
    throw;
  }
}

std::uint64_t IndexBuilder::phraseCount() const noexcept { return _state->writer.phraseCount(); }

std::uint64_t IndexBuilder::wordCount() const noexcept { return _state->writer.wordCount(); }

std::uint64_t IndexBuilder::commit() {
  if (_state->options.tables) {
    exportTables(*_state->options.tables, _state->writer.content());
  }
  const auto bytes = _state->writer.finish();
  FileSystem files;
  commitImage(files, _state->path, bytes);
  _state->writer = SearchImageWriter(static_cast<std::uint32_t>(_state->options.mode));
  return bytes.size();
}

}  // namespace wordcatcher
