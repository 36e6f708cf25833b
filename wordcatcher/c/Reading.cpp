#include <algorithm>
#include <cstring>
#include <iterator>

#include "wordcatcher/c/Call.h"
#include "wordcatcher/c/Options.h"
#include "wordcatcher/c/Results.h"
#include "wordcatcher/matcher/Index.h"

using wordcatcher::c::call;
using wordcatcher::c::make;
using wordcatcher::c::require;
using wordcatcher::c::textArgument;

struct wordcatcher_index {
  wordcatcher::Index index;
};

wordcatcher_code wordcatcher_index_open(const char* path, const wordcatcher_open_options* options,
                                        wordcatcher_index** index, wordcatcher_error* error) {
  return make(index, "index", error, [&] {
    require(path, "path");
    return std::make_unique<wordcatcher_index>(wordcatcher_index{wordcatcher::Index::open(
        path, wordcatcher::c::openOptionsOf(options), wordcatcher::c::modeOf(options))});
  });
}

void wordcatcher_index_close(wordcatcher_index* index) { delete index; }

wordcatcher_code wordcatcher_index_info(const wordcatcher_index* index, wordcatcher_info* info,
                                        size_t size, wordcatcher_error* error) {
  return call(error, [&] {
    require(index, "index");
    require(info, "info");
    const auto known = index->index.info();
    wordcatcher_info filled = {};
    filled.mode = static_cast<int32_t>(known.mode);
    filled.version = known.version;
    filled.phrases = known.phrases;
    filled.words = known.words;
    filled.values = known.values;
    filled.bytes = known.bytes;
    known.generation.copy(filled.generation, std::size(filled.generation) - 1);
    std::memset(info, 0, size);
    std::memcpy(info, &filled, std::min(size, sizeof(filled)));
  });
}

wordcatcher_code wordcatcher_index_verify(const wordcatcher_index* index,
                                          wordcatcher_error* error) {
  return call(error, [&] {
    require(index, "index");
    index->index.verify();
  });
}

wordcatcher_code wordcatcher_index_find(const wordcatcher_index* index, const char* text,
                                        size_t text_length, const wordcatcher_find_options* options,
                                        wordcatcher_findings** findings, wordcatcher_error* error) {
  return make(findings, "findings", error, [&] {
    require(index, "index");
    return wordcatcher_findings::of(index->index.find(textArgument(text, text_length, "text"),
                                                      wordcatcher::c::findOptionsOf(options)));
  });
}

wordcatcher_code wordcatcher_index_query(const wordcatcher_index* index, const char* text,
                                         size_t text_length, wordcatcher_matches** matches,
                                         wordcatcher_error* error) {
  return make(matches, "matches", error, [&] {
    require(index, "index");
    return wordcatcher_matches::of(index->index.query(textArgument(text, text_length, "text")));
  });
}

wordcatcher_code wordcatcher_index_search(const wordcatcher_index* index, const char* word,
                                          size_t word_length, int64_t max_distance,
                                          wordcatcher_matches** matches, wordcatcher_error* error) {
  return make(matches, "matches", error, [&] {
    require(index, "index");
    return wordcatcher_matches::of(
        index->index.search(textArgument(word, word_length, "word"), max_distance));
  });
}

wordcatcher_code wordcatcher_index_explain(const wordcatcher_index* index, const char* text,
                                           size_t text_length, const char* value,
                                           size_t value_length,
                                           const wordcatcher_find_options* options,
                                           wordcatcher_explanation** explanation,
                                           wordcatcher_error* error) {
  return make(explanation, "explanation", error, [&] {
    require(index, "index");
    return wordcatcher_explanation::of(index->index.explain(
        textArgument(text, text_length, "text"), textArgument(value, value_length, "value"),
        wordcatcher::c::findOptionsOf(options)));
  });
}

wordcatcher_code wordcatcher_index_explain_query(const wordcatcher_index* index, const char* text,
                                                 size_t text_length, const char* value,
                                                 size_t value_length,
                                                 wordcatcher_explanation** explanation,
                                                 wordcatcher_error* error) {
  return make(explanation, "explanation", error, [&] {
    require(index, "index");
    return wordcatcher_explanation::of(index->index.explainQuery(
        textArgument(text, text_length, "text"), textArgument(value, value_length, "value")));
  });
}
