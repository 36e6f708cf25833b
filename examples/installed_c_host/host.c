/* Finds the phrases of an index in each line of standard input. */
#include <stdio.h>
#include <string.h>
#include <wordcatcher/wordcatcher.h>

/* Prints cost, value and the part of the text; returns whether that worked. */
static bool print_findings(const wordcatcher_index* index, const char* text,
                           const wordcatcher_find_options* options, wordcatcher_error* error) {
  wordcatcher_findings* findings;
  if (wordcatcher_index_find(index, text, WORDCATCHER_NUL, options, &findings, error) !=
      WORDCATCHER_OK) {
    return false;
  }
  for (size_t i = 0; i < wordcatcher_findings_count(findings); ++i) {
    const wordcatcher_finding* const found = wordcatcher_findings_at(findings, i);
    printf("%llu\t%s\t%.*s\n", (unsigned long long)found->cost, found->value,
           (int)(found->end - found->begin), text + found->begin);
  }
  wordcatcher_findings_free(findings);
  return true;
}

int main(int count, char** arguments) {
  if (count != 2) {
    fprintf(stderr, "usage: %s INDEX <TEXTS\n", arguments[0]);
    return 2;
  }
  wordcatcher_index* index;
  wordcatcher_error error;
  if (wordcatcher_index_open(arguments[1], NULL, &index, &error) != WORDCATCHER_OK) {
    fprintf(stderr, "%s\n", error.message);
    return 2;
  }
  wordcatcher_find_options options;
  wordcatcher_find_options_init(&options, sizeof options);
  options.limit = 3;
  options.min_words = 2;

  bool works = true;
  char line[4096];
  while (works && fgets(line, sizeof line, stdin) != NULL) {
    line[strcspn(line, "\n")] = '\0';
    works = print_findings(index, line, &options, &error);
  }
  if (!works) {
    fprintf(stderr, "%s\n", error.message);
  }
  wordcatcher_index_close(index);
  return works ? 0 : 2;
}
