#define _DEFAULT_SOURCE

#include <sys/mman.h>
#include <sys/stat.h>

#include "support.h"

static wordcatcher_code add(wordcatcher_builder* builder, const char* phrase, const char* data) {
  return wordcatcher_builder_add(builder, phrase, WORDCATCHER_NUL, data, WORDCATCHER_NUL, NULL);
}

static void counts_and_writes(void) {
  wordcatcher_builder* builder = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_builder_create(file("dogs.wci"), NULL, &builder, &error) == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_phrase_count(builder) == 0);
  CHECK(add(builder, "golden retriever", "golden retriever{ 7 }") == WORDCATCHER_OK);
  CHECK(add(builder, "golden retriever", "golden retriever{ 7 }") == WORDCATCHER_OK);
  CHECK(add(builder, "labrador", NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_phrase_count(builder) == 3);
  CHECK(wordcatcher_builder_word_count(builder) == 3);

  struct stat status;
  CHECK(stat(file("dogs.wci"), &status) != 0);
  uint64_t bytes = 0;
  CHECK(wordcatcher_builder_commit(builder, &bytes, &error) == WORDCATCHER_OK);
  CHECK(error.code == WORDCATCHER_OK && strcmp(error.message, "") == 0);
  CHECK(stat(file("dogs.wci"), &status) == 0 && (uint64_t)status.st_size == bytes);

  CHECK(wordcatcher_builder_phrase_count(builder) == 0);
  CHECK(wordcatcher_builder_word_count(builder) == 0);
  CHECK(add(builder, "poodle", "poodle") == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_commit(builder, NULL, NULL) == WORDCATCHER_OK);
  wordcatcher_builder_free(builder);

  wordcatcher_index* index = NULL;
  wordcatcher_info info;
  CHECK(wordcatcher_index_open(file("dogs.wci"), NULL, &index, &error) == WORDCATCHER_OK);
  CHECK(wordcatcher_index_info(index, &info, sizeof info, &error) == WORDCATCHER_OK);
  CHECK(info.phrases == 1);
  wordcatcher_index_close(index);
}

/* Lengths bound strings that go on behind them, and strings with none are just empty. */
static void takes_strings_by_length(void) {
  wordcatcher_builder* builder = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_builder_create(file("names.wci"), NULL, &builder, &error) == WORDCATCHER_OK);
  const char text[] = "Konrad ZuseCatherine Schmidt";
  CHECK(wordcatcher_builder_add(builder, text, 11, text, 11, &error) == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_add(builder, text + 11, 17, NULL, 0, &error) == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_add(builder, NULL, 0, NULL, 0, &error) == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_phrase_count(builder) == 3);
  CHECK(wordcatcher_builder_word_count(builder) == 4);
  CHECK(wordcatcher_builder_commit(builder, NULL, &error) == WORDCATCHER_OK);
  wordcatcher_builder_free(builder);

  wordcatcher_index* index = NULL;
  wordcatcher_matches* matches = NULL;
  CHECK(wordcatcher_index_open(file("names.wci"), NULL, &index, &error) == WORDCATCHER_OK);
  CHECK(wordcatcher_index_search(index, "zuse", 4, 0, &matches, &error) == WORDCATCHER_OK);
  size_t length = 0;
  CHECK_TEXT(wordcatcher_matches_data(matches, 0, 0, &length), "Konrad Zuse");
  CHECK(length == 11);
  wordcatcher_matches_free(matches);
  CHECK(wordcatcher_index_search(index, "schmidt", 7, 0, &matches, &error) == WORDCATCHER_OK);
  CHECK(wordcatcher_matches_count(matches) == 1);
  CHECK(wordcatcher_matches_at(matches, 0) != NULL &&
        wordcatcher_matches_at(matches, 0)->data_count == 0);
  wordcatcher_matches_free(matches);
  wordcatcher_index_close(index);
}

static void refuses_what_it_cannot_store(void) {
  wordcatcher_builder* builder = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_builder_create(file("names.wci"), NULL, &builder, &error) == WORDCATCHER_OK);
  CHECK_FAILS(wordcatcher_builder_add(builder, "\xFF", 1, NULL, 0, &error), WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_builder_add(builder, "Ada\0Lovelace", 12, NULL, 0, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_builder_add(builder, "Ada", 3, "\xC3", 1, &error), WORDCATCHER_BAD_INPUT);

  /* A length that is too great is refused before a byte is looked at. */
  const size_t large = (size_t)1 << 28;
  void* const unreadable = mmap(NULL, large, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  CHECK(unreadable != MAP_FAILED);
  CHECK_FAILS(wordcatcher_builder_add(builder, unreadable, large, NULL, 0, &error),
              WORDCATCHER_TOO_LARGE);
  munmap(unreadable, large);
  CHECK(wordcatcher_builder_phrase_count(builder) == 0);
  CHECK(wordcatcher_builder_word_count(builder) == 0);
  wordcatcher_builder_free(builder);
}

/* What was added is kept, and the next attempt writes it. */
static void keeps_what_it_could_not_write(void) {
  wordcatcher_builder* builder = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_builder_create(file("later/names.wci"), NULL, &builder, &error) ==
        WORDCATCHER_OK);
  CHECK(add(builder, "Konrad Zuse", "Konrad Zuse") == WORDCATCHER_OK);
  uint64_t bytes = 7;
  CHECK_FAILS(wordcatcher_builder_commit(builder, &bytes, &error), WORDCATCHER_NOT_WRITABLE);
  CHECK(bytes == 7);
  CHECK(wordcatcher_builder_phrase_count(builder) == 1);
  CHECK(mkdir(file("later"), 0777) == 0);
  CHECK(wordcatcher_builder_commit(builder, &bytes, &error) == WORDCATCHER_OK);
  CHECK(bytes > 7);
  wordcatcher_builder_free(builder);
}

static void writes_classic_tables_as_well(void) {
  CHECK(mkdir(file("classic"), 0777) == 0);
  wordcatcher_builder_options options;
  wordcatcher_builder_options_init(&options, sizeof options);
  options.tables = "./classic/";
  options.mode = WORDCATCHER_MODE_WHOLE_TEXT;
  wordcatcher_builder* builder = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_builder_create(file("both.wci"), &options, &builder, &error) == WORDCATCHER_OK);
  CHECK(add(builder, "New Zealand", "NZ") == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_commit(builder, NULL, &error) == WORDCATCHER_OK);
  wordcatcher_builder_free(builder);

  /* The directory does not remember its mode; the file does, whatever the options say. */
  const char* const paths[] = {"./classic", "./classic/", "./both.wci"};
  const int32_t modes[] = {WORDCATCHER_MODE_WHOLE_TEXT, WORDCATCHER_MODE_WHOLE_TEXT,
                           WORDCATCHER_MODE_PHONETIC_WORDS};
  for (int i = 0; i < 3; ++i) {
    wordcatcher_open_options open_options;
    wordcatcher_open_options_init(&open_options, sizeof open_options);
    open_options.mode = modes[i];
    wordcatcher_index* index = NULL;
    wordcatcher_matches* matches = NULL;
    CHECK(wordcatcher_index_open(paths[i], &open_options, &index, &error) == WORDCATCHER_OK);
    CHECK(wordcatcher_index_query(index, "new zeeland", WORDCATCHER_NUL, &matches, &error) ==
          WORDCATCHER_OK);
    const wordcatcher_match* const match = wordcatcher_matches_at(matches, 0);
    CHECK(match != NULL && match->distance == 1 && match->data_count == 1);
    CHECK_TEXT(match == NULL ? NULL : match->value, "new zealand");
    CHECK_TEXT(wordcatcher_matches_data(matches, 0, 0, NULL), "NZ");
    CHECK(wordcatcher_matches_data(matches, 0, 1, NULL) == NULL);
    wordcatcher_matches_free(matches);
    wordcatcher_index_close(index);
  }
}

void test_building(void) {
  counts_and_writes();
  takes_strings_by_length();
  refuses_what_it_cannot_store();
  keeps_what_it_could_not_write();
  writes_classic_tables_as_well();
}
