#include <optional>
#include <string_view>

#include "wordcatcher/c/Call.h"
#include "wordcatcher/c/Options.h"
#include "wordcatcher/matcher/IndexBuilder.h"

using wordcatcher::c::call;
using wordcatcher::c::make;
using wordcatcher::c::require;
using wordcatcher::c::textArgument;

struct wordcatcher_builder {
  wordcatcher::IndexBuilder builder;
};

namespace {

std::optional<std::string_view> dataArgument(const char* data, size_t length) {
  if (data == nullptr && (length == 0 || length == WORDCATCHER_NUL)) {
    return std::nullopt;
  }
  return textArgument(data, length, "data");
}

}  // namespace

wordcatcher_code wordcatcher_builder_create(const char* path,
                                            const wordcatcher_builder_options* options,
                                            wordcatcher_builder** builder,
                                            wordcatcher_error* error) {
  return make(builder, "builder", error, [&] {
    require(path, "path");
    return std::make_unique<wordcatcher_builder>(wordcatcher_builder{
        wordcatcher::IndexBuilder(path, wordcatcher::c::builderOptionsOf(options))});
  });
}

wordcatcher_code wordcatcher_builder_add(wordcatcher_builder* builder, const char* phrase,
                                         size_t phrase_length, const char* data, size_t data_length,
                                         wordcatcher_error* error) {
  return call(error, [&] {
    require(builder, "builder");
    builder->builder.add(textArgument(phrase, phrase_length, "phrase"),
                         dataArgument(data, data_length));
  });
}

uint64_t wordcatcher_builder_phrase_count(const wordcatcher_builder* builder) {
  return builder == nullptr ? 0 : builder->builder.phraseCount();
}

uint64_t wordcatcher_builder_word_count(const wordcatcher_builder* builder) {
  return builder == nullptr ? 0 : builder->builder.wordCount();
}

wordcatcher_code wordcatcher_builder_commit(wordcatcher_builder* builder, uint64_t* bytes,
                                            wordcatcher_error* error) {
  return call(error, [&] {
    require(builder, "builder");
    const uint64_t written = builder->builder.commit();
    if (bytes != nullptr) {
      *bytes = written;
    }
  });
}

void wordcatcher_builder_free(wordcatcher_builder* builder) { delete builder; }
