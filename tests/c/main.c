/* The C interface as a C program sees it. Works in a directory of its own, which it removes. */
#define _XOPEN_SOURCE 700

#include <ftw.h>
#include <stdlib.h>
#include <unistd.h>

#include "support.h"

static int remove_entry(const char* path, const struct stat* status, int type,
                        struct FTW* position) {
  (void)status;
  (void)type;
  (void)position;
  return remove(path);
}

int main(void) {
  setvbuf(stdout, NULL, _IONBF, 0); /* what was found is told, however the program ends */
  char directory[] = "/tmp/wordcatcher-c-XXXXXX";
  if (mkdtemp(directory) == NULL || chdir(directory) != 0) {
    perror(directory);
    return 2;
  }
  static void (*const kTests[])(void) = {
      test_building, test_reading, test_finding, test_explaining, test_options,
      test_nulls,    test_errors,  test_damage,  test_memory,     test_log,
  };
  const size_t count = sizeof kTests / sizeof *kTests;
  for (size_t i = 0; i < count; ++i) {
    kTests[i]();
  }
  if (chdir("/") != 0 || nftw(directory, remove_entry, 8, FTW_DEPTH | FTW_PHYS) != 0) {
    perror(directory);
    return 2;
  }
  printf("%zu tests, %d failures\n", count, failures());
  return failures() == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
}
