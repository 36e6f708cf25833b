#define _XOPEN_SOURCE 700

#include <stdlib.h>
#include <unistd.h>

#include "support.h"

static void queries(const wordcatcher_index* index) {
  wordcatcher_error error;
  wordcatcher_matches* matches = NULL;
  const char* const text = "trinidat and tobbago";
  CHECK(wordcatcher_index_query(index, text, strlen(text), &matches, &error) == WORDCATCHER_OK);
  CHECK(error.code == WORDCATCHER_OK);
  CHECK(wordcatcher_matches_found(matches));
  CHECK(!wordcatcher_matches_truncated(matches));
  CHECK(wordcatcher_matches_count(matches) == 1);
  const wordcatcher_match* const match = wordcatcher_matches_at(matches, 0);
  CHECK_TEXT(match == NULL ? NULL : match->value, "Trinidad and Tobago{ TT }");
  CHECK(match != NULL && match->value_length == strlen(match->value));
  CHECK(match != NULL && match->distance == 1);
  CHECK(match != NULL && match->data_count == 0);
  CHECK(wordcatcher_matches_at(matches, 1) == NULL);
  size_t length = 7;
  CHECK(wordcatcher_matches_data(matches, 0, 0, &length) == NULL && length == 0);
  wordcatcher_matches_free(matches);

  /* Nothing found is a result as well; a length cuts a text, and ill-formed bytes part words. */
  CHECK(wordcatcher_index_query(index, "xyzzy", WORDCATCHER_NUL, &matches, NULL) == WORDCATCHER_OK);
  CHECK(!wordcatcher_matches_found(matches) && wordcatcher_matches_count(matches) == 0);
  wordcatcher_matches_free(matches);
  CHECK(wordcatcher_index_query(index, "new zealand and more", 11, &matches, NULL) ==
        WORDCATCHER_OK);
  CHECK(wordcatcher_matches_count(matches) > 0 &&
        wordcatcher_matches_at(matches, 0)->distance == 0);
  wordcatcher_matches_free(matches);
  CHECK(wordcatcher_index_query(index, "new\0\xFFzealand", 12, &matches, NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_matches_count(matches) > 0 &&
        wordcatcher_matches_at(matches, 0)->distance == 0);
  wordcatcher_matches_free(matches);
  CHECK(wordcatcher_index_query(index, NULL, 0, &matches, NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_matches_count(matches) == 0);
  wordcatcher_matches_free(matches);
}

static void searches(const wordcatcher_index* index) {
  wordcatcher_error error;
  wordcatcher_matches* matches = NULL;
  CHECK(wordcatcher_index_search(index, "C\xC3\xB4t", WORDCATCHER_NUL, 1, &matches, &error) ==
        WORDCATCHER_OK);
  CHECK(wordcatcher_matches_found(matches) && wordcatcher_matches_count(matches) == 1);
  const wordcatcher_match* const match = wordcatcher_matches_at(matches, 0);
  CHECK_TEXT(match == NULL ? NULL : match->value, "c\xC3\xB4te");
  CHECK(match != NULL && match->value_length == 5 && match->distance == 1);
  CHECK(match != NULL && match->data_count == 1);
  size_t length = 0;
  CHECK_TEXT(wordcatcher_matches_data(matches, 0, 0, &length), "C\xC3\xB4te d'Ivoire{ CI }");
  CHECK(length == 20);
  CHECK(wordcatcher_matches_data(matches, 1, 0, &length) == NULL && length == 0);
  wordcatcher_matches_free(matches);

  CHECK(wordcatcher_index_search(index, "and", 3, 0, &matches, &error) == WORDCATCHER_OK);
  CHECK(wordcatcher_matches_count(matches) == 1);
  CHECK_TEXT(wordcatcher_matches_data(matches, 0, 0, NULL), "Bosnia and Herzegovina{ BA }");
  CHECK_TEXT(wordcatcher_matches_data(matches, 0, 1, NULL), "Trinidad and Tobago{ TT }");
  CHECK(wordcatcher_matches_data(matches, 0, 2, NULL) == NULL);
  wordcatcher_matches_free(matches);

  CHECK(wordcatcher_index_search(index, "zealand", 7, -1, &matches, &error) == WORDCATCHER_OK);
  CHECK(!wordcatcher_matches_found(matches) && wordcatcher_matches_count(matches) == 0);
  wordcatcher_matches_free(matches);
  CHECK_FAILS(wordcatcher_index_search(index, "new", 3, 17, &matches, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK(matches == NULL);
  CHECK_FAILS(wordcatcher_index_search(index, "\xFF", 1, 1, &matches, &error),
              WORDCATCHER_BAD_INPUT);
}

static void tells_and_verifies(const wordcatcher_index* index) {
  wordcatcher_error error;
  wordcatcher_info info;
  memset(&info, 0xAA, sizeof info);
  CHECK(wordcatcher_index_info(index, &info, sizeof info, &error) == WORDCATCHER_OK);
  CHECK(info.mode == WORDCATCHER_MODE_WORDS);
  CHECK(info.version == 2);
  CHECK(info.phrases == 5 && info.values == 5 && info.words == 11);
  size_t bytes = 0;
  free(read_file(file("places.wci"), &bytes));
  CHECK(info.bytes == bytes);
  CHECK(strlen(info.generation) == 32);
  CHECK(strspn(info.generation, "0123456789abcdef") == 32);
  CHECK(wordcatcher_index_verify(index, &error) == WORDCATCHER_OK);
  CHECK(wordcatcher_index_verify(index, NULL) == WORDCATCHER_OK);

  /* A program that knows fewer members, and one that knows more. */
  struct {
    wordcatcher_info info;
    char more[8];
  } later;
  memset(&later, 0xAA, sizeof later);
  CHECK(wordcatcher_index_info(index, &later.info, offsetof(wordcatcher_info, words), &error) ==
        WORDCATCHER_OK);
  CHECK(later.info.phrases == 5);
  CHECK(later.info.words == UINT64_C(0xAAAAAAAAAAAAAAAA));
  CHECK(wordcatcher_index_info(index, &later.info, sizeof later, &error) == WORDCATCHER_OK);
  CHECK(later.info.words == 11);
  CHECK(memcmp(later.more, "\0\0\0\0\0\0\0\0", 8) == 0);
}

static void results_outlive_their_index(void) {
  wordcatcher_index* const index = places();
  wordcatcher_matches* matches = NULL;
  CHECK(wordcatcher_index_query(index, "zeeland", 7, &matches, NULL) == WORDCATCHER_OK);
  wordcatcher_index_close(index);
  CHECK(unlink(file("places.wci")) == 0);
  CHECK(wordcatcher_matches_count(matches) == 1);
  CHECK_TEXT(wordcatcher_matches_at(matches, 0)->value, "New Zealand{ NZ }");
  wordcatcher_matches_free(matches);
}

static void budgets_cut_and_say_so(void) {
  build_places(file("places.wci"), WORDCATCHER_MODE_WORDS);
  wordcatcher_open_options options;
  wordcatcher_open_options_init(&options, sizeof options);
  options.max_query_words = 2;
  options.max_word_units = 10;
  wordcatcher_index* index = NULL;
  wordcatcher_matches* matches = NULL;
  CHECK(wordcatcher_index_open(file("places.wci"), &options, &index, NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_index_query(index, "new zealand guinea", WORDCATCHER_NUL, &matches, NULL) ==
        WORDCATCHER_OK);
  CHECK(wordcatcher_matches_truncated(matches));
  wordcatcher_matches_free(matches);
  CHECK(wordcatcher_index_search(index, "herzegovina", WORDCATCHER_NUL, 0, &matches, NULL) ==
        WORDCATCHER_OK);
  CHECK(wordcatcher_matches_truncated(matches) && wordcatcher_matches_count(matches) == 0);
  wordcatcher_matches_free(matches);
  wordcatcher_index_close(index);
}

/* A copy does not notice that the file shrinks, which would end a process that has mapped it. */
static void copies_survive_their_file(void) {
  build_places(file("places.wci"), WORDCATCHER_MODE_WORDS);
  wordcatcher_open_options options;
  wordcatcher_open_options_init(&options, sizeof options);
  options.load = WORDCATCHER_LOAD_COPY;
  wordcatcher_index* index = NULL;
  CHECK(wordcatcher_index_open(file("places.wci"), &options, &index, NULL) == WORDCATCHER_OK);
  CHECK(truncate(file("places.wci"), 0) == 0);
  CHECK(wordcatcher_index_verify(index, NULL) == WORDCATCHER_OK);
  wordcatcher_index_close(index);
}

static void phonetic_codes_are_found_by_sound(void) {
  build_places(file("sounds.wci"), WORDCATCHER_MODE_PHONETIC_WORDS);
  wordcatcher_index* index = NULL;
  wordcatcher_matches* matches = NULL;
  wordcatcher_info info;
  CHECK(wordcatcher_index_open(file("sounds.wci"), NULL, &index, NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_index_info(index, &info, sizeof info, NULL) == WORDCATCHER_OK);
  CHECK(info.mode == WORDCATCHER_MODE_PHONETIC_WORDS);
  CHECK(wordcatcher_index_query(index, "knew zeelant", WORDCATCHER_NUL, &matches, NULL) ==
        WORDCATCHER_OK);
  CHECK(wordcatcher_matches_count(matches) == 1);
  CHECK_TEXT(wordcatcher_matches_at(matches, 0)->value, "New Zealand{ NZ }");
  wordcatcher_matches_free(matches);
  wordcatcher_index_close(index);
}

void test_reading(void) {
  wordcatcher_index* const index = places();
  queries(index);
  searches(index);
  tells_and_verifies(index);
  wordcatcher_index_close(index);
  results_outlive_their_index();
  budgets_cut_and_say_so();
  copies_survive_their_file();
  phonetic_codes_are_found_by_sound();
}
