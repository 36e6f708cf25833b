#ifndef WORDCATCHER_TESTS_C_SUPPORT_H
#define WORDCATCHER_TESTS_C_SUPPORT_H

#include <inttypes.h>
#include <stdbool.h>
#include <stddef.h>
#include <stdio.h>
#include <string.h>
#include <wordcatcher/wordcatcher.h>

/* Counts a failure, and says where, when the condition does not hold. */
#define CHECK(condition) check((condition), #condition, __FILE__, __LINE__)
void check(bool holds, const char* condition, const char* file, int line);

/* Whether two texts are the same, where neither is NULL; and shows both when they are not. */
#define CHECK_TEXT(actual, expected) check_text((actual), (expected), #actual, __FILE__, __LINE__)
void check_text(const char* actual, const char* expected, const char* what, const char* file,
                int line);

/* Whether a call failed with the code, told in `error` by a sentence. */
#define CHECK_FAILS(call, expected) \
  check_fails((call), (expected), &error, #call, __FILE__, __LINE__)
void check_fails(wordcatcher_code actual, wordcatcher_code expected, const wordcatcher_error* error,
                 const char* what, const char* file, int line);

/* How many checks have failed. */
int failures(void);

/* The path of a file in the test's own directory; valid until the next four calls. */
const char* file(const char* name);

/* The bytes of a file, to be freed. */
char* read_file(const char* path, size_t* length);
void write_file(const char* path, const char* bytes, size_t length);

/* Writes an index of places in this mode, with data strings such as "New Zealand{ NZ }". */
void build_places(const char* path, int32_t mode);

/* The index in a file of the tests' directory; ends the program if there is none. */
wordcatcher_index* opened(const char* name);

/* The same, opened. */
wordcatcher_index* places(void);

/* Lets the allocation of C++ memory fail after so many more; a negative number: never. */
void fail_allocations_after(long count);

/* Whether one has failed since they were last told to. */
bool allocation_failed(void);

/* The tests, one file each. */
void test_building(void);
void test_damage(void);
void test_errors(void);
void test_explaining(void);
void test_finding(void);
void test_log(void);
void test_memory(void);
void test_nulls(void);
void test_options(void);
void test_reading(void);

#endif
