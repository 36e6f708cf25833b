#define _XOPEN_SOURCE 700

#include <sys/stat.h>
#include <unistd.h>

#include "support.h"

static wordcatcher_code open_code(const char* path, wordcatcher_error* error) {
  wordcatcher_index* index = NULL;
  const wordcatcher_code code = wordcatcher_index_open(path, NULL, &index, error);
  CHECK((index != NULL) == (code == WORDCATCHER_OK));
  wordcatcher_index_close(index);
  return code;
}

static void files_that_cannot_be_opened(void) {
  wordcatcher_error error;
  CHECK_FAILS(open_code(file("atlantis.wci"), &error), WORDCATCHER_NOT_FOUND);
  CHECK(strstr(error.message, "atlantis.wci") != NULL);
  CHECK_FAILS(open_code("", &error), WORDCATCHER_NOT_FOUND);
  CHECK(mkdir(file("empty"), 0777) == 0);
  CHECK_FAILS(open_code(file("empty"), &error), WORDCATCHER_NOT_FOUND);
  CHECK(symlink("circle", file("circle")) == 0);
  CHECK_FAILS(open_code(file("circle"), &error), WORDCATCHER_NOT_READABLE);
  write_file(file("letter.txt"), "Dear Ada, ", 10);
  CHECK_FAILS(open_code(file("letter.txt"), &error), WORDCATCHER_NOT_AN_INDEX);
  /* The same without a place for the sentence. */
  CHECK(open_code(file("letter.txt"), NULL) == WORDCATCHER_NOT_AN_INDEX);
  /* Success clears what an earlier call left. */
  build_places(file("places.wci"), WORDCATCHER_MODE_WORDS);
  CHECK(open_code(file("places.wci"), &error) == WORDCATCHER_OK);
  CHECK(error.code == WORDCATCHER_OK && error.message[0] == '\0');
}

/* A long path leaves the head and the end of the sentence, and cuts no character apart. */
static void long_sentences_lose_their_middle(void) {
  for (size_t shift = 0; shift < 3; ++shift) {
    char path[3000] = "atlantis/";
    memset(path + 9, '-', shift);
    size_t length = 9 + shift;
    while (length + 3 < sizeof path) {
      memcpy(path + length, "\xE2\x82\xAC", 3);
      length += 3;
    }
    path[length] = '\0';
    wordcatcher_error error;
    CHECK_FAILS(open_code(path, &error), WORDCATCHER_NOT_FOUND);
    const size_t kept = strlen(error.message);
    CHECK(kept > 1000 && kept < sizeof error.message);
    CHECK(strstr(error.message, "atlantis/") != NULL);
    const char* const gap = strstr(error.message, "...");
    CHECK(gap != NULL && memcmp(gap - 3, "\xE2\x82\xAC", 3) == 0);
    CHECK(gap != NULL && memcmp(gap + 3, "\xE2\x82\xAC", 3) == 0);
    CHECK(error.message[kept - 1] == '.');
  }
}

static void codes_have_names(void) {
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_OK), "ok");
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_NOT_FOUND), "not found");
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_NOT_READABLE), "not readable");
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_NOT_WRITABLE), "not writable");
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_NOT_AN_INDEX), "not an index");
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_DAMAGED), "damaged");
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_BAD_INPUT), "bad input");
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_TOO_LARGE), "too large");
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_NO_MEMORY), "no memory");
  CHECK_TEXT(wordcatcher_code_name(WORDCATCHER_INTERNAL), "internal");
  CHECK_TEXT(wordcatcher_code_name(-1), "unknown");
  CHECK_TEXT(wordcatcher_code_name(8), "unknown");
}

static void the_version_is_that_of_the_build(void) {
  CHECK_TEXT(wordcatcher_version(), WORDCATCHER_TEST_VERSION);
}

void test_errors(void) {
  files_that_cannot_be_opened();
  long_sentences_lose_their_middle();
  codes_have_names();
  the_version_is_that_of_the_build();
}
