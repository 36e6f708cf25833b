#include "support.h"

#include <stdlib.h>

static int failed_checks = 0;

void check(bool holds, const char* condition, const char* file, int line) {
  if (!holds) {
    ++failed_checks;
    printf("%s:%d: this does not hold: %s\n", file, line, condition);
  }
}

void check_text(const char* actual, const char* expected, const char* what, const char* file,
                int line) {
  if (actual == NULL || strcmp(actual, expected) != 0) {
    ++failed_checks;
    printf("%s:%d: %s\n  is        %s\n  should be %s\n", file, line, what,
           actual == NULL ? "NULL" : actual, expected);
  }
}

void check_fails(wordcatcher_code actual, wordcatcher_code expected, const wordcatcher_error* error,
                 const char* what, const char* file, int line) {
  if (actual != expected || error->code != expected || strlen(error->message) < 20) {
    ++failed_checks;
    printf("%s:%d: %s\n  gives \"%s\" (%s)\n  and should give \"%s\"\n", file, line, what,
           wordcatcher_code_name(actual), error->message, wordcatcher_code_name(expected));
  }
}

int failures(void) { return failed_checks; }

const char* file(const char* name) {
  static char paths[4][512];
  static int next = 0;
  next = (next + 1) % 4;
  snprintf(paths[next], sizeof paths[next], "./%s", name);
  return paths[next];
}

char* read_file(const char* path, size_t* length) {
  FILE* stream = fopen(path, "rb");
  if (stream == NULL || fseek(stream, 0, SEEK_END) != 0) {
    perror(path);
    exit(2);
  }
  *length = (size_t)ftell(stream);
  rewind(stream);
  char* bytes = malloc(*length + 1);
  if (bytes == NULL || fread(bytes, 1, *length, stream) != *length) {
    perror(path);
    exit(2);
  }
  fclose(stream);
  return bytes;
}

void write_file(const char* path, const char* bytes, size_t length) {
  FILE* stream = fopen(path, "wb");
  if (stream == NULL || fwrite(bytes, 1, length, stream) != length || fclose(stream) != 0) {
    perror(path);
    exit(2);
  }
}

void build_places(const char* path, int32_t mode) {
  static const char* const kPlaces[][2] = {
      {"Trinidad and Tobago", "Trinidad and Tobago{ TT }"},
      {"Bosnia and Herzegovina", "Bosnia and Herzegovina{ BA }"},
      {"Papua New Guinea", "Papua New Guinea{ PG }"},
      {"New Zealand", "New Zealand{ NZ }"},
      {"C\xC3\xB4te d'Ivoire", "C\xC3\xB4te d'Ivoire{ CI }"},
  };
  wordcatcher_builder_options options;
  wordcatcher_builder_options_init(&options, sizeof options);
  options.mode = mode;
  wordcatcher_builder* builder = NULL;
  wordcatcher_error error;
  wordcatcher_code code = wordcatcher_builder_create(path, &options, &builder, &error);
  for (size_t i = 0; code == WORDCATCHER_OK && i < sizeof kPlaces / sizeof *kPlaces; ++i) {
    code = wordcatcher_builder_add(builder, kPlaces[i][0], WORDCATCHER_NUL, kPlaces[i][1],
                                   WORDCATCHER_NUL, &error);
  }
  if (code == WORDCATCHER_OK) {
    code = wordcatcher_builder_commit(builder, NULL, &error);
  }
  if (code != WORDCATCHER_OK) {
    fprintf(stderr, "%s\n", error.message);
    exit(2);
  }
  wordcatcher_builder_free(builder);
}

wordcatcher_index* opened(const char* name) {
  wordcatcher_index* index = NULL;
  wordcatcher_error error;
  if (wordcatcher_index_open(file(name), NULL, &index, &error) != WORDCATCHER_OK) {
    fprintf(stderr, "%s\n", error.message);
    exit(2);
  }
  return index;
}

wordcatcher_index* places(void) {
  build_places(file("places.wci"), WORDCATCHER_MODE_WORDS);
  return opened("places.wci");
}
