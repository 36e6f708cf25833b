#include <stdlib.h>

#include "support.h"

/* Uses an index in every way. Anything may be found; a failure must tell of damage. */
static bool use(const wordcatcher_index* index) {
  wordcatcher_matches* matches = NULL;
  wordcatcher_findings* findings = NULL;
  wordcatcher_explanation* explanation = NULL;
  wordcatcher_explanation* query_explanation = NULL;
  wordcatcher_matches* words = NULL;
  const char* const text = "papua niu guinea";
  const char* const value = "Papua New Guinea{ PG }";
  const wordcatcher_code codes[] = {
      wordcatcher_index_query(index, text, WORDCATCHER_NUL, &matches, NULL),
      wordcatcher_index_search(index, "zeeland", WORDCATCHER_NUL, 2, &words, NULL),
      wordcatcher_index_find(index, text, WORDCATCHER_NUL, NULL, &findings, NULL),
      wordcatcher_index_explain(index, text, WORDCATCHER_NUL, value, WORDCATCHER_NUL, NULL,
                                &explanation, NULL),
      wordcatcher_index_explain_query(index, text, WORDCATCHER_NUL, value, WORDCATCHER_NUL,
                                      &query_explanation, NULL),
      wordcatcher_index_verify(index, NULL),
  };
  wordcatcher_matches_free(matches);
  wordcatcher_matches_free(words);
  wordcatcher_findings_free(findings);
  wordcatcher_explanation_free(explanation);
  wordcatcher_explanation_free(query_explanation);
  bool whole = true;
  for (size_t i = 0; i < sizeof codes / sizeof *codes; ++i) {
    CHECK(codes[i] == WORDCATCHER_OK || codes[i] == WORDCATCHER_DAMAGED);
    whole = whole && codes[i] == WORDCATCHER_OK;
  }
  return whole;
}

/* Opens what is in the file, and uses it if that is possible. */
static bool open_and_use(const char* path) {
  wordcatcher_index* index = NULL;
  wordcatcher_error error;
  const wordcatcher_code code = wordcatcher_index_open(path, NULL, &index, &error);
  CHECK(code == WORDCATCHER_OK || code == WORDCATCHER_DAMAGED || code == WORDCATCHER_NOT_AN_INDEX);
  CHECK(code == WORDCATCHER_OK || strlen(error.message) > 20);
  const bool whole = code == WORDCATCHER_OK && use(index);
  wordcatcher_index_close(index);
  return whole;
}

void test_damage(void) {
  build_places(file("places.wci"), WORDCATCHER_MODE_WORDS);
  size_t length = 0;
  char* const bytes = read_file(file("places.wci"), &length);
  CHECK(open_and_use(file("places.wci")));

  size_t survived = 0;
  for (size_t i = 0; i < length; ++i) {
    bytes[i] = (char)(bytes[i] ^ (1 << i % 8));
    write_file(file("hostile.wci"), bytes, length);
    survived += open_and_use(file("hostile.wci")) ? 1 : 0;
    bytes[i] = (char)(bytes[i] ^ (1 << i % 8));
  }
  CHECK(survived == 0);
  for (size_t cut = 0; cut < length; cut += 13) {
    write_file(file("hostile.wci"), bytes, cut);
    CHECK(!open_and_use(file("hostile.wci")));
  }

  wordcatcher_index* index = NULL;
  wordcatcher_error error;
  write_file(file("hostile.wci"), bytes, length - 1);
  CHECK_FAILS(wordcatcher_index_open(file("hostile.wci"), NULL, &index, &error),
              WORDCATCHER_DAMAGED);
  free(bytes);
}
