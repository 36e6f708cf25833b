#include "support.h"

/* What a call left behind that failed must be NULL, not what stood there before. */
static char stale;
#define STALE ((void*)&stale)

static void reading_calls(const wordcatcher_index* index) {
  wordcatcher_error error;
  wordcatcher_index* other = STALE;
  CHECK_FAILS(wordcatcher_index_open(NULL, NULL, &other, &error), WORDCATCHER_BAD_INPUT);
  CHECK(other == NULL);
  CHECK_FAILS(wordcatcher_index_open(file("places.wci"), NULL, NULL, &error),
              WORDCATCHER_BAD_INPUT);
  wordcatcher_info info;
  CHECK_FAILS(wordcatcher_index_info(NULL, &info, sizeof info, &error), WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_info(index, NULL, sizeof info, &error), WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_verify(NULL, &error), WORDCATCHER_BAD_INPUT);

  wordcatcher_findings* findings = STALE;
  CHECK_FAILS(wordcatcher_index_find(NULL, "new", 3, NULL, &findings, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK(findings == NULL);
  CHECK_FAILS(wordcatcher_index_find(index, NULL, 3, NULL, &findings, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_find(index, NULL, WORDCATCHER_NUL, NULL, &findings, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_find(index, "new", 3, NULL, NULL, &error), WORDCATCHER_BAD_INPUT);

  wordcatcher_matches* matches = STALE;
  CHECK_FAILS(wordcatcher_index_query(NULL, "new", 3, &matches, &error), WORDCATCHER_BAD_INPUT);
  CHECK(matches == NULL);
  CHECK_FAILS(wordcatcher_index_query(index, NULL, 3, &matches, &error), WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_query(index, "new", 3, NULL, &error), WORDCATCHER_BAD_INPUT);
  matches = STALE;
  CHECK_FAILS(wordcatcher_index_search(NULL, "new", 3, 1, &matches, &error), WORDCATCHER_BAD_INPUT);
  CHECK(matches == NULL);
  CHECK_FAILS(wordcatcher_index_search(index, NULL, 3, 1, &matches, &error), WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_search(index, "new", 3, 1, NULL, &error), WORDCATCHER_BAD_INPUT);

  wordcatcher_explanation* explanation = STALE;
  CHECK_FAILS(wordcatcher_index_explain(NULL, "new", 3, "NZ", 2, NULL, &explanation, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK(explanation == NULL);
  CHECK_FAILS(wordcatcher_index_explain(index, NULL, 3, "NZ", 2, NULL, &explanation, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_explain(index, "new", 3, NULL, 2, NULL, &explanation, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_explain(index, "new", 3, "NZ", 2, NULL, NULL, &error),
              WORDCATCHER_BAD_INPUT);
  explanation = STALE;
  CHECK_FAILS(wordcatcher_index_explain_query(NULL, "new", 3, "NZ", 2, &explanation, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK(explanation == NULL);
  CHECK_FAILS(wordcatcher_index_explain_query(index, NULL, 3, "NZ", 2, &explanation, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_explain_query(index, "new", 3, NULL, 2, &explanation, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_index_explain_query(index, "new", 3, "NZ", 2, NULL, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK(strstr(error.message, "\"explanation\"") != NULL);
}

static void building_calls(void) {
  wordcatcher_error error;
  wordcatcher_builder* builder = STALE;
  CHECK_FAILS(wordcatcher_builder_create(NULL, NULL, &builder, &error), WORDCATCHER_BAD_INPUT);
  CHECK(builder == NULL);
  CHECK_FAILS(wordcatcher_builder_create(file("dogs.wci"), NULL, NULL, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_builder_add(NULL, "poodle", 6, NULL, 0, &error), WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_builder_commit(NULL, NULL, &error), WORDCATCHER_BAD_INPUT);
  CHECK(wordcatcher_builder_phrase_count(NULL) == 0);
  CHECK(wordcatcher_builder_word_count(NULL) == 0);

  CHECK(wordcatcher_builder_create(file("dogs.wci"), NULL, &builder, NULL) == WORDCATCHER_OK);
  CHECK_FAILS(wordcatcher_builder_add(builder, NULL, 6, NULL, 0, &error), WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_builder_add(builder, NULL, WORDCATCHER_NUL, NULL, 0, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK_FAILS(wordcatcher_builder_add(builder, "poodle", 6, NULL, 6, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK(wordcatcher_builder_phrase_count(builder) == 0);
  CHECK(wordcatcher_builder_add(builder, "poodle", 6, NULL, WORDCATCHER_NUL, NULL) ==
        WORDCATCHER_OK);
  wordcatcher_builder_free(builder);
}

static void results(void) {
  size_t length = 7;
  CHECK(wordcatcher_matches_count(NULL) == 0);
  CHECK(wordcatcher_matches_at(NULL, 0) == NULL);
  CHECK(wordcatcher_matches_data(NULL, 0, 0, &length) == NULL && length == 0);
  CHECK(wordcatcher_matches_data(NULL, 0, 0, NULL) == NULL);
  CHECK(!wordcatcher_matches_found(NULL));
  CHECK(!wordcatcher_matches_truncated(NULL));
  CHECK(wordcatcher_findings_count(NULL) == 0);
  CHECK(wordcatcher_findings_at(NULL, 0) == NULL);
  CHECK(wordcatcher_findings_hit(NULL, 0, 0) == NULL);
  CHECK(!wordcatcher_findings_truncated(NULL));
  length = 7;
  CHECK(wordcatcher_explanation_json(NULL, &length) == NULL && length == 0);
  length = 7;
  CHECK(wordcatcher_explanation_text(NULL, &length) == NULL && length == 0);
  CHECK(!wordcatcher_explanation_is_stored(NULL));
  CHECK(!wordcatcher_explanation_is_found(NULL));
}

static void giving_back(void) {
  wordcatcher_index_close(NULL);
  wordcatcher_builder_free(NULL);
  wordcatcher_matches_free(NULL);
  wordcatcher_findings_free(NULL);
  wordcatcher_explanation_free(NULL);
}

void test_nulls(void) {
  wordcatcher_index* const index = places();
  reading_calls(index);
  building_calls();
  results();
  giving_back();
  wordcatcher_index_close(index);
}
