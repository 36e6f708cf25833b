#define _XOPEN_SOURCE 700

#include <sys/stat.h>

#include "support.h"

struct lines {
  size_t count;
  size_t of_other_lengths;
  char last[512];
};

static void keep(void* context, const char* line, size_t length) {
  struct lines* const lines = context;
  ++lines->count;
  lines->of_other_lengths += strlen(line) == length ? 0 : 1;
  snprintf(lines->last, sizeof lines->last, "%s", line);
}

/* Writes the tables of a classic index, which log each time that one is finished. */
static void log_something(void) {
  wordcatcher_builder_options options;
  wordcatcher_builder_options_init(&options, sizeof options);
  options.tables = "./logged/";
  wordcatcher_builder* builder = NULL;
  CHECK(wordcatcher_builder_create(file("logged.wci"), &options, &builder, NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_add(builder, "labrador", 8, "labrador", 8, NULL) == WORDCATCHER_OK);
  CHECK(wordcatcher_builder_commit(builder, NULL, NULL) == WORDCATCHER_OK);
  wordcatcher_builder_free(builder);
}

void test_log(void) {
  CHECK(mkdir(file("logged"), 0777) == 0);
  struct lines first = {0};
  struct lines second = {0};
  wordcatcher_log_set_handler(keep, &first);
  log_something();
  CHECK(first.count > 0);
  CHECK(first.of_other_lengths == 0);
  CHECK(strstr(first.last, "Table.tdb") != NULL);

  const size_t before = first.count;
  wordcatcher_log_set_handler(keep, &second);
  log_something();
  CHECK(first.count == before);
  CHECK(second.count == before);

  wordcatcher_log_set_handler(NULL, &second);
  log_something();
  CHECK(second.count == before);
}
