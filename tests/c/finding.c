#include "support.h"

/* The text between two offsets. */
static const char* slice(const char* text, size_t begin, size_t end) {
  static char part[256];
  snprintf(part, sizeof part, "%.*s", (int)(end - begin), text + begin);
  return part;
}

static wordcatcher_findings* find(const wordcatcher_index* index, const char* text,
                                  const wordcatcher_find_options* options) {
  wordcatcher_findings* findings = NULL;
  wordcatcher_error error;
  CHECK(wordcatcher_index_find(index, text, WORDCATCHER_NUL, options, &findings, &error) ==
        WORDCATCHER_OK);
  CHECK(error.code == WORDCATCHER_OK);
  CHECK(findings != NULL);
  return findings;
}

/* How many phrases are found with these options. */
static size_t count(const wordcatcher_index* index, const char* text,
                    const wordcatcher_find_options* options) {
  wordcatcher_findings* const findings = find(index, text, options);
  const size_t result = wordcatcher_findings_count(findings);
  wordcatcher_findings_free(findings);
  return result;
}

static void tells_what_and_where(const wordcatcher_index* index) {
  const char* const text = "We flew from C\xC3\xB4te d'Ivoire to Trinidat and Tobbago";
  wordcatcher_findings* const findings = find(index, text, NULL);
  CHECK(!wordcatcher_findings_truncated(findings));
  CHECK(wordcatcher_findings_count(findings) >= 2);

  const wordcatcher_finding* const best = wordcatcher_findings_at(findings, 0);
  CHECK_TEXT(best->value, "Trinidad and Tobago{ TT }");
  CHECK(best->value_length == strlen(best->value));
  CHECK_TEXT(slice(text, best->begin, best->end), "Trinidat and Tobbago");
  CHECK(best->hit_count == 3);
  CHECK(best->cost == 2 + 6 * 2);

  static const struct {
    const char* word;
    const char* there;
    uint32_t edits;
  } kHits[] = {{"trinidad", "Trinidat", 1}, {"and", "and", 0}, {"tobago", "Tobbago", 1}};
  for (size_t i = 0; i < 3; ++i) {
    const wordcatcher_hit* const hit = wordcatcher_findings_hit(findings, 0, i);
    CHECK_TEXT(hit->word, kHits[i].word);
    CHECK(hit->word_length == strlen(kHits[i].word));
    CHECK_TEXT(slice(text, hit->begin, hit->end), kHits[i].there);
    CHECK(hit->edits == kHits[i].edits);
  }
  CHECK(wordcatcher_findings_hit(findings, 0, 3) == NULL);

  const wordcatcher_finding* const second = wordcatcher_findings_at(findings, 1);
  CHECK_TEXT(second->value, "C\xC3\xB4te d'Ivoire{ CI }");
  CHECK_TEXT(slice(text, second->begin, second->end), "C\xC3\xB4te d'Ivoire");
  CHECK(second->cost > best->cost - 2);

  const size_t number = wordcatcher_findings_count(findings);
  CHECK(wordcatcher_findings_at(findings, number) == NULL);
  CHECK(wordcatcher_findings_hit(findings, number, 0) == NULL);
  wordcatcher_findings_free(findings);
}

static void nothing_found_is_a_result(const wordcatcher_index* index) {
  wordcatcher_findings* findings = find(index, "xyzzy", NULL);
  CHECK(wordcatcher_findings_count(findings) == 0);
  CHECK(!wordcatcher_findings_truncated(findings));
  wordcatcher_findings_free(findings);
  CHECK(wordcatcher_index_find(index, NULL, 0, NULL, &findings, NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_findings_count(findings) == 0);
  wordcatcher_findings_free(findings);
}

/* How many phrases `index` finds when one option is not its default. */
#define CHECK_COUNT(text, option, value, expected)     \
  do {                                                 \
    options = defaults;                                \
    options.option = (value);                          \
    CHECK(count(index, text, &options) == (expected)); \
  } while (0)

/* Each option is taken: changed alone, it changes what is found. */
static void every_option_counts(const wordcatcher_index* index) {
  wordcatcher_find_options defaults;
  wordcatcher_find_options_init(&defaults, sizeof defaults);
  wordcatcher_find_options options;
  const char* const two = "new zealand and papua new guinea";
  const size_t all = count(index, two, &defaults);
  CHECK(all >= 2);
  CHECK(count(index, two, NULL) == all);
  CHECK_COUNT(two, limit, 1, 1);
  CHECK_COUNT(two, max_cost, 0, 0);
  CHECK_COUNT("New Zealand", max_cost, 0, 1);
  CHECK_COUNT(two, min_words, 3, 1);

  CHECK(count(index, "nex", &defaults) == 2);
  CHECK_COUNT("nex", medium_edits, 0, 0);
  CHECK_COUNT("nex", short_length, 3, 0);
  options.short_edits = 1;
  CHECK(count(index, "nex", &options) == 2);

  CHECK(count(index, "zaelend", &defaults) == 1);
  CHECK_COUNT("zaelend", transpositions, 0, 0);
  CHECK_COUNT("zaelend", long_edits, 1, 0);
  CHECK_COUNT("zaelend", medium_length, 7, 0);

  CHECK(count(index, "papua new guinea", &defaults) == 2);
  CHECK_COUNT("papua new guinea", overlaps, WORDCATCHER_OVERLAPS_NO_SUB, 1);
  CHECK_COUNT("papua new guinea", overlaps, WORDCATCHER_OVERLAPS_LONGEST, 1);

  options = defaults;
  options.max_postings = 1;
  wordcatcher_findings* const cut = find(index, two, &options);
  CHECK(wordcatcher_findings_truncated(cut));
  wordcatcher_findings_free(cut);
}

static void whole_texts_have_edits_of_their_own(void) {
  build_places(file("whole.wci"), WORDCATCHER_MODE_WHOLE_TEXT);
  wordcatcher_index* index = opened("whole.wci");
  wordcatcher_find_options options;
  wordcatcher_find_options_init(&options, sizeof options);
  CHECK(count(index, "New Zeeelend", &options) == 1);
  options.whole_text_edits = 1;
  CHECK(count(index, "New Zeeelend", &options) == 0);
  wordcatcher_index_close(index);
}

/* A word that holds a digit is found exactly, unless it may have edits of its own. */
static void numbers_have_edits_of_their_own(void) {
  wordcatcher_builder* builder = NULL;
  CHECK(wordcatcher_builder_create(file("rooms.wci"), NULL, &builder, NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_add(builder, "Room b117", WORDCATCHER_NUL, "Room", WORDCATCHER_NUL,
                                NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_commit(builder, NULL, NULL) == WORDCATCHER_OK);
  wordcatcher_builder_free(builder);
  wordcatcher_index* index = opened("rooms.wci");
  wordcatcher_find_options options;
  wordcatcher_find_options_init(&options, sizeof options);
  CHECK(count(index, "b118", &options) == 0);
  options.number_edits = 1;
  CHECK(count(index, "b118", &options) == 1);
  wordcatcher_index_close(index);

  index = places();
  static const uint64_t kTooMany[] = {4, UINT32_MAX, (uint64_t)1 << 32, UINT64_MAX};
  for (size_t i = 0; i < sizeof kTooMany / sizeof *kTooMany; ++i) {
    wordcatcher_findings* findings = NULL;
    wordcatcher_error error;
    options.number_edits = kTooMany[i];
    CHECK_FAILS(wordcatcher_index_find(index, "new", 3, &options, &findings, &error),
                WORDCATCHER_BAD_INPUT);
  }
  wordcatcher_index_close(index);
}

static void refuses_options_that_cannot_be(const wordcatcher_index* index) {
  wordcatcher_find_options options;
  wordcatcher_findings* findings = NULL;
  wordcatcher_error error;
  uint32_t* const edits[] = {&options.short_edits, &options.medium_edits, &options.long_edits,
                             &options.whole_text_edits};
  for (size_t i = 0; i < 4; ++i) {
    wordcatcher_find_options_init(&options, sizeof options);
    *edits[i] = 4;
    CHECK_FAILS(wordcatcher_index_find(index, "new", 3, &options, &findings, &error),
                WORDCATCHER_BAD_INPUT);
    CHECK(findings == NULL);
  }
  static const int32_t kNoOverlaps[] = {-1, 3, INT32_MAX};
  for (size_t i = 0; i < 3; ++i) {
    wordcatcher_find_options_init(&options, sizeof options);
    options.overlaps = kNoOverlaps[i];
    CHECK_FAILS(wordcatcher_index_find(index, "new", 3, &options, &findings, &error),
                WORDCATCHER_BAD_INPUT);
  }
}

void test_finding(void) {
  wordcatcher_index* const index = places();
  tells_what_and_where(index);
  nothing_found_is_a_result(index);
  every_option_counts(index);
  refuses_options_that_cannot_be(index);
  wordcatcher_index_close(index);
  whole_texts_have_edits_of_their_own();
  numbers_have_edits_of_their_own();
}
