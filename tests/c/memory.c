#include <stdlib.h>

#include "support.h"

/* Each call here is made with its first allocation failing, then its second, and so on, until it
   gets all that it asks for. */

struct scene {
  wordcatcher_index* index;
  wordcatcher_builder* builder;
};

typedef wordcatcher_code (*attempt)(struct scene* scene, wordcatcher_error* error);

static wordcatcher_code open_places(const wordcatcher_open_options* options,
                                    wordcatcher_error* error) {
  wordcatcher_index* index = NULL;
  const wordcatcher_code code = wordcatcher_index_open(file("places.wci"), options, &index, error);
  wordcatcher_index_close(index);
  return code;
}

static wordcatcher_code attempt_open(struct scene* scene, wordcatcher_error* error) {
  (void)scene;
  return open_places(NULL, error);
}

static wordcatcher_code attempt_copy(struct scene* scene, wordcatcher_error* error) {
  (void)scene;
  wordcatcher_open_options options;
  wordcatcher_open_options_init(&options, sizeof options);
  options.load = WORDCATCHER_LOAD_COPY;
  return open_places(&options, error);
}

static wordcatcher_code attempt_info(struct scene* scene, wordcatcher_error* error) {
  wordcatcher_info info;
  return wordcatcher_index_info(scene->index, &info, sizeof info, error);
}

static wordcatcher_code attempt_verify(struct scene* scene, wordcatcher_error* error) {
  return wordcatcher_index_verify(scene->index, error);
}

static wordcatcher_code attempt_query(struct scene* scene, wordcatcher_error* error) {
  wordcatcher_matches* matches = NULL;
  const wordcatcher_code code =
      wordcatcher_index_query(scene->index, "papua niu guinea", WORDCATCHER_NUL, &matches, error);
  CHECK((matches != NULL) == (code == WORDCATCHER_OK));
  wordcatcher_matches_free(matches);
  return code;
}

static wordcatcher_code attempt_search(struct scene* scene, wordcatcher_error* error) {
  wordcatcher_matches* matches = NULL;
  const wordcatcher_code code =
      wordcatcher_index_search(scene->index, "zeeland", WORDCATCHER_NUL, 3, &matches, error);
  wordcatcher_matches_free(matches);
  return code;
}

static wordcatcher_code attempt_find(struct scene* scene, wordcatcher_error* error) {
  wordcatcher_findings* findings = NULL;
  const wordcatcher_code code = wordcatcher_index_find(
      scene->index, "papua niu guinea and trinidad", WORDCATCHER_NUL, NULL, &findings, error);
  CHECK((findings != NULL) == (code == WORDCATCHER_OK));
  wordcatcher_findings_free(findings);
  return code;
}

static wordcatcher_code attempt_explain(struct scene* scene, wordcatcher_error* error) {
  wordcatcher_explanation* explanation = NULL;
  const wordcatcher_code code =
      wordcatcher_index_explain(scene->index, "niu zeeland", WORDCATCHER_NUL, "New Zealand{ NZ }",
                                WORDCATCHER_NUL, NULL, &explanation, error);
  wordcatcher_explanation_free(explanation);
  return code;
}

static wordcatcher_code attempt_explain_query(struct scene* scene, wordcatcher_error* error) {
  wordcatcher_explanation* explanation = NULL;
  const wordcatcher_code code =
      wordcatcher_index_explain_query(scene->index, "niu zeeland", WORDCATCHER_NUL,
                                      "New Zealand{ NZ }", WORDCATCHER_NUL, &explanation, error);
  wordcatcher_explanation_free(explanation);
  return code;
}

static wordcatcher_code attempt_create(struct scene* scene, wordcatcher_error* error) {
  (void)scene;
  wordcatcher_builder* builder = NULL;
  const wordcatcher_code code = wordcatcher_builder_create(
      "./a directory of a name that is not short/dogs.wci", NULL, &builder, error);
  wordcatcher_builder_free(builder);
  return code;
}

/* A failure leaves no half of a phrase behind. */
static wordcatcher_code attempt_add(struct scene* scene, wordcatcher_error* error) {
  const uint64_t phrases = wordcatcher_builder_phrase_count(scene->builder);
  const uint64_t words = wordcatcher_builder_word_count(scene->builder);
  const wordcatcher_code code =
      wordcatcher_builder_add(scene->builder, "soft coated wheaten terrier", WORDCATCHER_NUL,
                              "soft coated wheaten terrier{ 9 }", WORDCATCHER_NUL, error);
  if (code != WORDCATCHER_OK) {
    CHECK(wordcatcher_builder_phrase_count(scene->builder) == phrases);
    CHECK(wordcatcher_builder_word_count(scene->builder) == words);
  }
  return code;
}

/* A failure leaves the old file, and all that was added. */
static wordcatcher_code attempt_commit(struct scene* scene, wordcatcher_error* error) {
  const uint64_t phrases = wordcatcher_builder_phrase_count(scene->builder);
  const wordcatcher_code code = wordcatcher_builder_commit(scene->builder, NULL, error);
  if (code != WORDCATCHER_OK) {
    fail_allocations_after(-1);
    CHECK(wordcatcher_builder_phrase_count(scene->builder) == phrases);
    wordcatcher_index* index = opened("dogs.wci");
    wordcatcher_info info;
    CHECK(wordcatcher_index_info(index, &info, sizeof info, NULL) == WORDCATCHER_OK);
    CHECK(info.phrases == 5);
    wordcatcher_index_close(index);
  }
  return code;
}

static void starve(const char* name, attempt attempt, struct scene* scene) {
  enum { kMost = 100000 };
  long failing = 0;
  for (bool starved = true; starved && failing < kMost; ++failing) {
    wordcatcher_error error;
    fail_allocations_after(failing);
    const wordcatcher_code code = attempt(scene, &error);
    starved = allocation_failed();
    fail_allocations_after(-1);
    CHECK(error.code == code);
    if (code != WORDCATCHER_OK && code != WORDCATCHER_NO_MEMORY) {
      printf("%s, allocation %ld: %s\n", name, failing, error.message);
    }
    CHECK(code == WORDCATCHER_OK || (starved && code == WORDCATCHER_NO_MEMORY));
  }
  CHECK(failing < kMost);
  CHECK(failing > 1);
}

void test_memory(void) {
  struct scene scene = {.index = places(), .builder = NULL};
  build_places(file("dogs.wci"), WORDCATCHER_MODE_WORDS);
  CHECK(wordcatcher_builder_create(file("dogs.wci"), NULL, &scene.builder, NULL) == WORDCATCHER_OK);
  starve("open", attempt_open, &scene);
  starve("copy", attempt_copy, &scene);
  starve("info", attempt_info, &scene);
  starve("verify", attempt_verify, &scene);
  starve("query", attempt_query, &scene);
  starve("search", attempt_search, &scene);
  starve("find", attempt_find, &scene);
  starve("explain", attempt_explain, &scene);
  starve("explain_query", attempt_explain_query, &scene);
  starve("create", attempt_create, &scene);
  starve("add", attempt_add, &scene);
  starve("commit", attempt_commit, &scene);
  wordcatcher_builder_free(scene.builder);
  wordcatcher_index_close(scene.index);
}
