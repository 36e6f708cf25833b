#include "support.h"

static void defaults_are_those_of_the_manual(void) {
  wordcatcher_open_options open_options;
  memset(&open_options, 0xAA, sizeof open_options);
  wordcatcher_open_options_init(&open_options, sizeof open_options);
  CHECK(open_options.size == sizeof open_options);
  CHECK(open_options.load == WORDCATCHER_LOAD_MAP);
  CHECK(open_options.mode == WORDCATCHER_MODE_WORDS);
  CHECK(open_options.max_query_words == 4096);
  CHECK(open_options.max_word_units == 1024);

  wordcatcher_find_options find_options;
  memset(&find_options, 0xAA, sizeof find_options);
  wordcatcher_find_options_init(&find_options, sizeof find_options);
  CHECK(find_options.size == sizeof find_options);
  CHECK(find_options.limit == 10);
  CHECK(find_options.max_cost == WORDCATCHER_ANY_COST);
  CHECK(find_options.min_words == 1);
  CHECK(find_options.short_length == 2);
  CHECK(find_options.medium_length == 5);
  CHECK(find_options.short_edits == 0);
  CHECK(find_options.medium_edits == 1);
  CHECK(find_options.long_edits == 2);
  CHECK(find_options.whole_text_edits == 3);
  CHECK(find_options.transpositions == 1);
  CHECK(find_options.overlaps == WORDCATCHER_OVERLAPS_ALL);
  CHECK(find_options.max_postings == 2000000);
  CHECK(find_options.number_edits == 0);

  wordcatcher_builder_options builder_options;
  memset(&builder_options, 0xAA, sizeof builder_options);
  wordcatcher_builder_options_init(&builder_options, sizeof builder_options);
  CHECK(builder_options.size == sizeof builder_options);
  CHECK(builder_options.mode == WORDCATCHER_MODE_WORDS);
  CHECK(builder_options.tables == NULL);

  wordcatcher_open_options_init(NULL, sizeof open_options);
  wordcatcher_find_options_init(NULL, sizeof find_options);
  wordcatcher_builder_options_init(NULL, sizeof builder_options);
}

/* As a program does that was compiled with an older header: members behind its own have defaults,
   and nothing behind its struct is written. */
static void an_older_program_has_defaults_for_what_it_does_not_know(
    const wordcatcher_index* index) {
  const size_t size = offsetof(wordcatcher_find_options, short_edits);
  wordcatcher_find_options options;
  memset(&options, 0xAA, sizeof options);
  wordcatcher_find_options_init(&options, size);
  CHECK(options.size == size);
  CHECK(options.medium_length == 5);
  CHECK(options.short_edits == 0xAAAAAAAA);
  CHECK(options.overlaps == (int32_t)0xAAAAAAAA);
  wordcatcher_findings* findings = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_index_find(index, "new zealand", WORDCATCHER_NUL, &options, &findings,
                               &error) == WORDCATCHER_OK);
  wordcatcher_findings_free(findings);

  /* The first header had no option of numbers. */
  const size_t first = offsetof(wordcatcher_find_options, number_edits);
  memset(&options, 0xAA, sizeof options);
  wordcatcher_find_options_init(&options, first);
  CHECK(options.max_postings == 2000000);
  CHECK(options.number_edits == 0xAAAAAAAAAAAAAAAA);
  CHECK(wordcatcher_index_find(index, "new zealand", WORDCATCHER_NUL, &options, &findings,
                               &error) == WORDCATCHER_OK);
  wordcatcher_findings_free(findings);
}

/* As one does that was compiled with a newer header. */
static void a_newer_program_may_not_use_what_is_not_there_yet(const wordcatcher_index* index) {
  struct {
    wordcatcher_find_options options;
    uint64_t later;
  } newer;
  memset(&newer, 0xAA, sizeof newer);
  wordcatcher_find_options_init(&newer.options, sizeof newer);
  CHECK(newer.options.size == sizeof newer);
  CHECK(newer.options.limit == 10);
  CHECK(newer.later == 0);
  wordcatcher_findings* findings = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_index_find(index, "new zealand", WORDCATCHER_NUL, &newer.options, &findings,
                               &error) == WORDCATCHER_OK);
  wordcatcher_findings_free(findings);
  newer.later = 1;
  CHECK_FAILS(wordcatcher_index_find(index, "new zealand", WORDCATCHER_NUL, &newer.options,
                                     &findings, &error),
              WORDCATCHER_BAD_INPUT);
}

static void options_that_were_not_filled_are_refused(const wordcatcher_index* index) {
  static const size_t kSizes[] = {0, sizeof(size_t) - 1, 4097, SIZE_MAX};
  for (size_t i = 0; i < sizeof kSizes / sizeof *kSizes; ++i) {
    wordcatcher_error error;
    wordcatcher_find_options find_options = {.size = kSizes[i]};
    wordcatcher_findings* findings = NULL;
    CHECK_FAILS(wordcatcher_index_find(index, "new", 3, &find_options, &findings, &error),
                WORDCATCHER_BAD_INPUT);
    wordcatcher_open_options open_options = {.size = kSizes[i]};
    wordcatcher_index* none = NULL;
    CHECK_FAILS(wordcatcher_index_open(file("places.wci"), &open_options, &none, &error),
                WORDCATCHER_BAD_INPUT);
    wordcatcher_builder_options builder_options = {.size = kSizes[i]};
    wordcatcher_builder* builder = NULL;
    CHECK_FAILS(wordcatcher_builder_create(file("dogs.wci"), &builder_options, &builder, &error),
                WORDCATCHER_BAD_INPUT);
  }
}

static void what_is_no_enumerator_is_refused(void) {
  static const int32_t kNumbers[] = {-1, 3, INT32_MIN, INT32_MAX};
  for (size_t i = 0; i < sizeof kNumbers / sizeof *kNumbers; ++i) {
    wordcatcher_error error;
    wordcatcher_open_options open_options;
    wordcatcher_index* index = NULL;
    wordcatcher_open_options_init(&open_options, sizeof open_options);
    open_options.mode = kNumbers[i];
    CHECK_FAILS(wordcatcher_index_open(file("places.wci"), &open_options, &index, &error),
                WORDCATCHER_BAD_INPUT);
    wordcatcher_open_options_init(&open_options, sizeof open_options);
    open_options.load = kNumbers[i];
    CHECK_FAILS(wordcatcher_index_open(file("places.wci"), &open_options, &index, &error),
                WORDCATCHER_BAD_INPUT);
    wordcatcher_builder_options builder_options;
    wordcatcher_builder* builder = NULL;
    wordcatcher_builder_options_init(&builder_options, sizeof builder_options);
    builder_options.mode = kNumbers[i];
    CHECK_FAILS(wordcatcher_builder_create(file("dogs.wci"), &builder_options, &builder, &error),
                WORDCATCHER_BAD_INPUT);
  }
}

void test_options(void) {
  wordcatcher_index* const index = places();
  defaults_are_those_of_the_manual();
  an_older_program_has_defaults_for_what_it_does_not_know(index);
  a_newer_program_may_not_use_what_is_not_there_yet(index);
  options_that_were_not_filled_are_refused(index);
  what_is_no_enumerator_is_refused();
  wordcatcher_index_close(index);
}
