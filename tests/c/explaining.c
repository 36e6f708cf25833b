#include "support.h"

static const char kText[] = "new zeeland";
static const char kValue[] = "New Zealand{ NZ }";

/* That both forms are there, with their lengths, and name what was asked. */
static void check_forms(const wordcatcher_explanation* explanation) {
  size_t length = 0;
  const char* const json = wordcatcher_explanation_json(explanation, &length);
  CHECK(json != NULL && strlen(json) == length);
  CHECK(json != NULL && json[0] == '{' && strchr(json, '\n') == NULL);
  CHECK(json != NULL && strstr(json, kValue) != NULL);
  CHECK(wordcatcher_explanation_json(explanation, NULL) == json);
  const char* const text = wordcatcher_explanation_text(explanation, &length);
  CHECK(text != NULL && strlen(text) == length && length > 0 && text[length - 1] == '\n');
  CHECK(text != NULL && strstr(text, kValue) != NULL);
  CHECK(wordcatcher_explanation_text(explanation, NULL) == text);
}

static void explains_find(const wordcatcher_index* index) {
  wordcatcher_explanation* explanation = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_index_explain(index, kText, WORDCATCHER_NUL, kValue, WORDCATCHER_NUL, NULL,
                                  &explanation, &error) == WORDCATCHER_OK);
  CHECK(error.code == WORDCATCHER_OK);
  check_forms(explanation);
  CHECK(wordcatcher_explanation_is_stored(explanation));
  CHECK(wordcatcher_explanation_is_found(explanation));
  wordcatcher_explanation_free(explanation);

  wordcatcher_find_options options;
  wordcatcher_find_options_init(&options, sizeof options);
  options.max_cost = 0;
  CHECK(wordcatcher_index_explain(index, kText, sizeof kText - 1, kValue, sizeof kValue - 1,
                                  &options, &explanation, NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_explanation_is_stored(explanation));
  CHECK(!wordcatcher_explanation_is_found(explanation));
  wordcatcher_explanation_free(explanation);

  CHECK(wordcatcher_index_explain(index, kText, WORDCATCHER_NUL, "Atlantis", WORDCATCHER_NUL, NULL,
                                  &explanation, NULL) == WORDCATCHER_OK);
  CHECK(!wordcatcher_explanation_is_stored(explanation));
  CHECK(!wordcatcher_explanation_is_found(explanation));
  wordcatcher_explanation_free(explanation);

  options.long_edits = 4;
  CHECK_FAILS(wordcatcher_index_explain(index, kText, WORDCATCHER_NUL, kValue, WORDCATCHER_NUL,
                                        &options, &explanation, &error),
              WORDCATCHER_BAD_INPUT);
  CHECK(explanation == NULL);
}

static void explains_query(const wordcatcher_index* index) {
  wordcatcher_explanation* explanation = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_index_explain_query(index, kText, WORDCATCHER_NUL, kValue, WORDCATCHER_NUL,
                                        &explanation, &error) == WORDCATCHER_OK);
  CHECK(error.code == WORDCATCHER_OK);
  check_forms(explanation);
  CHECK(wordcatcher_explanation_is_stored(explanation));
  CHECK(wordcatcher_explanation_is_found(explanation));
  wordcatcher_explanation_free(explanation);

  CHECK(wordcatcher_index_explain_query(index, "xyzzy", 5, kValue, sizeof kValue - 1, &explanation,
                                        NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_explanation_is_stored(explanation));
  CHECK(!wordcatcher_explanation_is_found(explanation));
  wordcatcher_explanation_free(explanation);
}

void test_explaining(void) {
  wordcatcher_index* const index = places();
  explains_find(index);
  explains_query(index);
  wordcatcher_index_close(index);
}
