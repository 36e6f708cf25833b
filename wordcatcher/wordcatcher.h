#ifndef WORDCATCHER_WORDCATCHER_H
#define WORDCATCHER_WORDCATCHER_H

/** @file

   Wordcatcher for C, and for every language that can call C: finds, inside free text, phrases that
   were stored earlier, tolerating spelling mistakes.

       #include <stdio.h>
       #include "wordcatcher/wordcatcher.h"

       int main(void) {
         wordcatcher_index* index = NULL;
         wordcatcher_findings* findings = NULL;
         wordcatcher_error error;
         if (wordcatcher_index_open("names.wci", NULL, &index, &error) != WORDCATCHER_OK ||
             wordcatcher_index_find(index, "holidays in tobbago", WORDCATCHER_NUL, NULL, &findings,
                                    &error) != WORDCATCHER_OK) {
           fprintf(stderr, "%s\n", error.message);
         }
         for (size_t i = 0; i < wordcatcher_findings_count(findings); ++i) {
           puts(wordcatcher_findings_at(findings, i)->value);
         }
         wordcatcher_findings_free(findings);
         wordcatcher_index_close(index);
         return error.code == WORDCATCHER_OK ? 0 : 1;
       }

   1. Handles. Types without a body are opaque. Whatever a function hands out through a `**`
      argument is the caller's, who gives it back to the one function that takes it back
      (..._close, ..._free), once. Giving back NULL does nothing. A result does not depend on the
      index that it came from, and may outlive it.

   2. What is inside a result (strings, records) belongs to it, never changes, and is valid until
      the result is given back. Records are only handed out by pointer: a later version may add
      members at their ends, so do not count on their sizes.

   3. Strings are UTF-8. One that is passed in is a pointer and a length in bytes, which may hold
      U+0000 where the function does not say otherwise; the length WORDCATCHER_NUL says that it ends
      at its NUL. NULL with the length 0 is the empty string. Nothing passed in is kept after the
      call but where a function says so. Paths are just NUL-terminated. Strings handed out have a
      length and a NUL behind it. Offsets are in bytes of the text as it was passed in, and ranges
      are half-open: [begin, end).

   4. Errors. A function that can fail returns WORDCATCHER_OK or another code. It fails wholly or
      not at all: what it would have handed out is NULL then, and nothing else has changed. The
      last argument, which may be NULL, takes the code and a sentence for people that says what to
      do; success clears it. Later versions may have further codes: treat those that you do not
      know as WORDCATCHER_INTERNAL.

   5. NULL for a handle or for an argument that does not say that it may be NULL, and an enumerator
      that does not exist, is WORDCATCHER_BAD_INPUT; functions that return no code return 0, false
      or NULL. An index that is too great is answered with NULL. A handle that was given back, and
      a pointer to anything else, are undefined behaviour.

   6. Options. A struct of options begins with its size and is filled by its ..._init function,
      given sizeof, before members are set; NULL stands for all defaults. A program may be compiled
      with an older or a newer header than the library that it runs with: members that the program
      does not know have their defaults, and those that the library does not know must be left as
      ..._init set them (else: WORDCATCHER_BAD_INPUT).

   7. Threads. An index and a result may be used by any number of threads at once; a builder by one
      at a time. Giving back must be the last use. The library starts no thread, has no state of
      its own that changes but the log handler, never prints, never exits and takes no signals. A
      thread must not be cancelled (pthread_cancel) or left (longjmp) inside a call.

   8. No C++ exception leaves a function. Memory that runs out is WORDCATCHER_NO_MEMORY, and leaves
      everything as it was.

   9. Versions. Names and meanings stay within a major version; the symbols of the shared library
      carry the version node WORDCATCHER_1.

   The functions have the meanings of the C++ interface, whose headers say more about what is found
   and how it is scored: matcher/Index.h, matcher/Find.h and matcher/IndexBuilder.h. */

/* NOLINTBEGIN(modernize-*): this is C. */
#include <stdbool.h>
#include <stddef.h>
#include <stdint.h>

#include "wordcatcher/Export.h"

#ifdef __cplusplus
extern "C" {
#endif

/** Stands for the length of a string that ends at its NUL. */
#define WORDCATCHER_NUL ((size_t)-1)

/* ---- Errors ---------------------------------------------------------------------------------- */

/** What a call came to: one of the enumerators. */
typedef int32_t wordcatcher_code;

/** The codes. */
enum {
  WORDCATCHER_OK = 0,           /**< All went well. */
  WORDCATCHER_NOT_FOUND = 1,    /**< There is no such file or directory. */
  WORDCATCHER_NOT_READABLE = 2, /**< The file exists and cannot be read or mapped. */
  WORDCATCHER_NOT_WRITABLE = 3, /**< The target cannot be written; what stood there is whole. */
  WORDCATCHER_NOT_AN_INDEX = 4, /**< Something else, or of a version that cannot be read. */
  WORDCATCHER_DAMAGED = 5,      /**< The file was an index and is cut short or altered. */
  WORDCATCHER_BAD_INPUT = 6,    /**< An argument, a text or an option that cannot be taken. */
  WORDCATCHER_TOO_LARGE = 7,    /**< More than the format, or memory, can count. */
  WORDCATCHER_NO_MEMORY = 101,  /**< Memory ran out. */
  WORDCATCHER_INTERNAL = 102    /**< A failure that no other code tells: report it. */
};

/** Why a call failed. It belongs to the caller, and needs no giving back. */
typedef struct wordcatcher_error {
  wordcatcher_code code; /**< why, or WORDCATCHER_OK */
  char message[1020];    /**< One sentence; of a longer one the middle is left out. Empty for OK. */
} wordcatcher_error;

/** A short English name of a code, such as "not found"; "unknown" for any other number. Static. */
WORDCATCHER_EXPORT const char* wordcatcher_code_name(wordcatcher_code code);

/** The version of the library that is loaded, as "major.minor.patch". Static. */
WORDCATCHER_EXPORT const char* wordcatcher_version(void);

/* ---- Reading --------------------------------------------------------------------------------- */

/** How phrases are stored and found. */
enum {
  WORDCATCHER_MODE_WORDS = 0,         /**< by their words, each within an edit distance */
  WORDCATCHER_MODE_WHOLE_TEXT = 1,    /**< as one string, within an edit distance */
  WORDCATCHER_MODE_PHONETIC_WORDS = 2 /**< by codes of how their words sound */
};

/** How an index file gets into memory. */
enum {
  WORDCATCHER_LOAD_MAP = 0, /**< map it: opens in constant time, whatever its size */
  WORDCATCHER_LOAD_COPY = 1 /**< copy it: for storage on which files may shrink while they are read,
                               which ends a process that has mapped them (SIGBUS) */
};

/** An index opened for reading. It never changes, and calls on it take no lock. Every call may fail
   with WORDCATCHER_DAMAGED when the file turns out to be damaged, and does nothing worse, whatever
   the file holds. */
typedef struct wordcatcher_index wordcatcher_index;

/** How an index is opened, and the budgets of its queries. */
typedef struct wordcatcher_open_options {
  size_t size;            /**< set by wordcatcher_open_options_init() */
  int32_t load;           /**< WORDCATCHER_LOAD_...; map */
  int32_t mode;           /**< WORDCATCHER_MODE_...; words. Of a classic index, which does not
                             remember; not looked at for a file, which does */
  size_t max_query_words; /**< words of a text that are looked at; 4096 */
  size_t max_word_units;  /**< UTF-16 code units of a word (whole text) that is looked up; 1024 */
} wordcatcher_open_options;

/** Fills the options with the defaults named above. `size`: sizeof *options. NULL does nothing. */
WORDCATCHER_EXPORT void wordcatcher_open_options_init(wordcatcher_open_options* options,
                                                      size_t size);

/** Opens an index: a file, or a classic index (a directory, or the prefix of its files' names), of
   which an image is built in memory; its files are locked only while they are read, and waited for
   while another process writes them. `options` may be NULL.

   Constant time for a mapped file, linear in the size else. Fails with NOT_FOUND, NOT_READABLE,
   NOT_AN_INDEX, DAMAGED; BAD_INPUT for a load or mode that does not exist. */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_index_open(const char* path,
                                                           const wordcatcher_open_options* options,
                                                           wordcatcher_index** index,
                                                           wordcatcher_error* error);

/** Gives an index back: its file is unmapped. No call on it may be under way. */
WORDCATCHER_EXPORT void wordcatcher_index_close(wordcatcher_index* index);

/** What an index holds. */
typedef struct wordcatcher_info {
  int32_t mode;        /**< WORDCATCHER_MODE_... */
  uint32_t version;    /**< of the format */
  uint64_t phrases;    /**< phrases added; 0 for a classic index, which does not count them */
  uint64_t words;      /**< distinct stored words (whole texts, codes) */
  uint64_t values;     /**< distinct data strings */
  uint64_t bytes;      /**< of the image */
  char generation[40]; /**< 32 hexadecimal digits and a NUL; random for each build */
} wordcatcher_info;

/** Fills `info`, the caller's, of `size` bytes (sizeof *info). Constant time. */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_index_info(const wordcatcher_index* index,
                                                           wordcatcher_info* info, size_t size,
                                                           wordcatcher_error* error);

/** Checks the whole image. Fails with DAMAGED, and names what is wrong. Linear in its size. */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_index_verify(const wordcatcher_index* index,
                                                             wordcatcher_error* error);

/* ---- Finding phrases in a text --------------------------------------------------------------- */

/** What becomes of matches whose ranges in the text overlap. */
enum {
  WORDCATCHER_OVERLAPS_ALL = 0,    /**< every match */
  WORDCATCHER_OVERLAPS_NO_SUB = 1, /**< none whose range lies within the larger one of another */
  WORDCATCHER_OVERLAPS_LONGEST = 2 /**< of those that overlap the longest; then the first one */
};

/** No bound on the cost of a match. */
#define WORDCATCHER_ANY_COST UINT64_MAX

/** What wordcatcher_index_find() looks for and how much of it. The lengths that make a word short,
   medium or long are UTF-16 code units of a stored word in lower case; an edit is one code unit
   replaced, inserted or left out. Edits are at most 3 each. Words that hold a digit are only found
   exactly, which `number_edits` alone relaxes. */
typedef struct wordcatcher_find_options {
  size_t size;               /**< set by wordcatcher_find_options_init() */
  size_t limit;              /**< matches at the most: the first ones of all; 10 */
  uint64_t max_cost;         /**< the greatest cost of a match; WORDCATCHER_ANY_COST */
  size_t min_words;          /**< words of a phrase that the text must hold; 1, as for 0 */
  size_t short_length;       /**< a stored word of up to so many code units is short; 2 */
  size_t medium_length;      /**< a longer one of up to so many is medium, others are long; 5 */
  uint32_t short_edits;      /**< edits from a short word to the text's; 0 */
  uint32_t medium_edits;     /**< a medium one; 1 */
  uint32_t long_edits;       /**< a long one; 2 */
  uint32_t whole_text_edits; /**< the whole text, in an index of whole texts; 3 */
  int32_t transpositions;    /**< not 0: two neighbours swapped are one edit, not two; 1 */
  int32_t overlaps;          /**< WORDCATCHER_OVERLAPS_...; all */
  uint64_t max_postings;     /**< postings (phrases under a word) that are looked at; 2,000,000 */
  uint64_t number_edits;     /**< edits of a word when it or the stored word holds a digit: at most
                                those that the stored word's length allows; 0 */
} wordcatcher_find_options;

/** Fills the options with the defaults named above. `size`: sizeof *options. NULL does nothing. */
WORDCATCHER_EXPORT void wordcatcher_find_options_init(wordcatcher_find_options* options,
                                                      size_t size);

/** The phrases that a text holds. */
typedef struct wordcatcher_findings wordcatcher_findings;

/** A phrase found in a text. */
typedef struct wordcatcher_finding {
  const char* value;   /**< its data string */
  size_t value_length; /**< its bytes, without the NUL */
  uint64_t cost;       /**< edits of its words, and 2 for each word that one side has more */
  size_t begin;        /**< the range of the text that spans the hits, in bytes */
  size_t end;          /**< the byte behind it */
  size_t hit_count;    /**< at least 1 */
} wordcatcher_finding;

/** A word of a phrase found in a text. */
typedef struct wordcatcher_hit {
  const char* word;   /**< as stored; two that the text joins stand with a space between */
  size_t word_length; /**< its bytes, without the NUL */
  size_t begin;       /**< its range of the text, in bytes */
  size_t end;         /**< the byte behind it */
  uint32_t edits;     /**< between the two */
} wordcatcher_hit;

/** The phrases that a text holds, wholly or in part, the best one first; see Index::find in
   matcher/Index.h for the costs and the order. Bytes that are not UTF-8 separate words. `options`
   may be NULL. The time is bounded by the budgets of the options, and of those that the index was
   opened with. Fails with BAD_INPUT for edits above 3 and for overlaps that do not exist. */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_index_find(const wordcatcher_index* index,
                                                           const char* text, size_t text_length,
                                                           const wordcatcher_find_options* options,
                                                           wordcatcher_findings** findings,
                                                           wordcatcher_error* error);

/** How many phrases were found. */
WORDCATCHER_EXPORT size_t wordcatcher_findings_count(const wordcatcher_findings* findings);

/** One of them, counted from 0 in the order of the result. Constant time. */
WORDCATCHER_EXPORT const wordcatcher_finding* wordcatcher_findings_at(
    const wordcatcher_findings* findings, size_t finding);

/** One of its hits, counted from 0 in the order of the text. Constant time. */
WORDCATCHER_EXPORT const wordcatcher_hit* wordcatcher_findings_hit(
    const wordcatcher_findings* findings, size_t finding, size_t hit);

/** Whether a budget cut something off. Then there may be better phrases than these, and another
   limit may list others. */
WORDCATCHER_EXPORT bool wordcatcher_findings_truncated(const wordcatcher_findings* findings);

/** Gives the result back. */
WORDCATCHER_EXPORT void wordcatcher_findings_free(wordcatcher_findings* findings);

/* ---- Queries and words ----------------------------------------------------------------------- */

/** What a query or a search found. */
typedef struct wordcatcher_matches wordcatcher_matches;

/** One phrase that a query found, or one word that a search found. */
typedef struct wordcatcher_match {
  const char* value;   /**< of a query: the data string, or the stored text of an index of whole
                          texts; of a search: the stored word (text, code) */
  size_t value_length; /**< its bytes, without the NUL */
  int64_t distance;    /**< how far away: edits, and for words too many or too few */
  size_t data_count;   /**< its data strings: of searches and queries of whole texts; else 0 */
} wordcatcher_match;

/** The phrases near a text, by ascending distance, then by value (in UTF-16 code units): those of
   Index::query, which answers as the classic matcher does. Bytes that are not UTF-8 separate
   words. The words that are looked up are bounded by the budgets that the index was opened with;
   the time is also linear in the phrases under all words found, which no budget bounds. */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_index_query(const wordcatcher_index* index,
                                                            const char* text, size_t text_length,
                                                            wordcatcher_matches** matches,
                                                            wordcatcher_error* error);

/** The stored words (whole texts, codes) within a distance of one word: at most 16 edits, where a
   negative distance finds nothing. In the word "*" stands for any one character, "_" for none.
   Fails with BAD_INPUT for a greater distance, and for a word that is not UTF-8. */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_index_search(const wordcatcher_index* index,
                                                             const char* word, size_t word_length,
                                                             int64_t max_distance,
                                                             wordcatcher_matches** matches,
                                                             wordcatcher_error* error);

/** How many matches there are. */
WORDCATCHER_EXPORT size_t wordcatcher_matches_count(const wordcatcher_matches* matches);

/** One of them, counted from 0 in the order of the result. Constant time. */
WORDCATCHER_EXPORT const wordcatcher_match* wordcatcher_matches_at(
    const wordcatcher_matches* matches, size_t match);

/** One of its data strings, counted from 0, ascending by UTF-16 code units. `length`, which may be
   NULL, takes its bytes; 0 where NULL is returned. Constant time. */
WORDCATCHER_EXPORT const char* wordcatcher_matches_data(const wordcatcher_matches* matches,
                                                        size_t match, size_t data, size_t* length);

/** Of a query: whether any word of the text was found with data, always true for an index of whole
   texts; of a search: whether there is a match. */
WORDCATCHER_EXPORT bool wordcatcher_matches_found(const wordcatcher_matches* matches);

/** Whether a budget cut something off. */
WORDCATCHER_EXPORT bool wordcatcher_matches_truncated(const wordcatcher_matches* matches);

/** Gives the result back. */
WORDCATCHER_EXPORT void wordcatcher_matches_free(wordcatcher_matches* matches);

/* ---- Explanations ---------------------------------------------------------------------------- */

/** Why a phrase is found in a text, or is not. */
typedef struct wordcatcher_explanation wordcatcher_explanation;

/** Why a value (a data string) has its cost for a text, or why wordcatcher_index_find() does not
   list it with these options, which may be NULL. Linear in the values of the index, beside some
   calls of wordcatcher_index_find(), as which it fails. */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_index_explain(
    const wordcatcher_index* index, const char* text, size_t text_length, const char* value,
    size_t value_length, const wordcatcher_find_options* options,
    wordcatcher_explanation** explanation, wordcatcher_error* error);

/** The same for the distance of wordcatcher_index_query(), step by step. */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_index_explain_query(
    const wordcatcher_index* index, const char* text, size_t text_length, const char* value,
    size_t value_length, wordcatcher_explanation** explanation, wordcatcher_error* error);

/** One JSON object on one line. `length`, which may be NULL, takes its bytes. */
WORDCATCHER_EXPORT const char* wordcatcher_explanation_json(
    const wordcatcher_explanation* explanation, size_t* length);

/** Several lines for people, each ended by a line feed. `length` as above. */
WORDCATCHER_EXPORT const char* wordcatcher_explanation_text(
    const wordcatcher_explanation* explanation, size_t* length);

/** Whether the index holds the value. */
WORDCATCHER_EXPORT bool wordcatcher_explanation_is_stored(
    const wordcatcher_explanation* explanation);

/** Whether the explained call lists the value. */
WORDCATCHER_EXPORT bool wordcatcher_explanation_is_found(
    const wordcatcher_explanation* explanation);

/** Gives the explanation back. */
WORDCATCHER_EXPORT void wordcatcher_explanation_free(wordcatcher_explanation* explanation);

/* ---- Building -------------------------------------------------------------------------------- */

/** Builds an index of phrases. Its memory: the distinct words, 8 bytes for each phrase under a
   word, the distinct data strings; in wordcatcher_builder_commit() about twice the image beside
   them. */
typedef struct wordcatcher_builder wordcatcher_builder;

/** What a builder makes beside the index file, and in which mode. */
typedef struct wordcatcher_builder_options {
  size_t size;        /**< set by wordcatcher_builder_options_init() */
  int32_t mode;       /**< WORDCATCHER_MODE_...; words */
  const char* tables; /**< where to write the files of a classic index as well: a prefix of their
                         names, such as a directory with its trailing "/"; NULL: nowhere */
} wordcatcher_builder_options;

/** Fills the options with the defaults named above. `size`: sizeof *options. NULL does nothing. */
WORDCATCHER_EXPORT void wordcatcher_builder_options_init(wordcatcher_builder_options* options,
                                                         size_t size);

/** A builder that will write to `path`, of which it keeps a copy. No file is touched yet. `options`
   may be NULL. Fails with BAD_INPUT for a mode that does not exist. */
WORDCATCHER_EXPORT wordcatcher_code
wordcatcher_builder_create(const char* path, const wordcatcher_builder_options* options,
                           wordcatcher_builder** builder, wordcatcher_error* error);

/** Adds one phrase with its data string. A `data` of NULL with the length 0 or WORDCATCHER_NUL is
   none: such a phrase's words are found by wordcatcher_index_search(), and the phrase by nothing. A
   data string that begins with the phrase, and puts any further fields after "{ ", lets queries
   judge the phrase's length. The same phrase and data added again change nothing but the count.
   Linear in the strings.

   Fails with BAD_INPUT for strings that are not UTF-8 or hold U+0000; TOO_LARGE beyond 2^30 words
   or data strings, 2^32 code units of all words, or 2^28 bytes of one string. The builder is then
   as before. */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_builder_add(wordcatcher_builder* builder,
                                                            const char* phrase,
                                                            size_t phrase_length, const char* data,
                                                            size_t data_length,
                                                            wordcatcher_error* error);

/** Phrases added so far, each time that one was added. */
WORDCATCHER_EXPORT uint64_t wordcatcher_builder_phrase_count(const wordcatcher_builder* builder);

/** Distinct stored words (whole texts, codes) so far. */
WORDCATCHER_EXPORT uint64_t wordcatcher_builder_word_count(const wordcatcher_builder* builder);

/** Writes the index in one step: who opens the path sees the old index or the new one, whole,
   whatever happens meanwhile. The builder is empty afterwards and may be used again. `bytes`, which
   may be NULL, takes the size of the file. n log n in what was added.

   Fails with NOT_WRITABLE, or TOO_LARGE; the target is then as it was, and what was added is kept,
   so that the call may be tried again (matcher/IndexBuilder.h names the one limit of this, and what
   holds for classic tables). */
WORDCATCHER_EXPORT wordcatcher_code wordcatcher_builder_commit(wordcatcher_builder* builder,
                                                               uint64_t* bytes,
                                                               wordcatcher_error* error);

/** Gives the builder back. What was not committed is dropped. */
WORDCATCHER_EXPORT void wordcatcher_builder_free(wordcatcher_builder* builder);

/* ---- The log --------------------------------------------------------------------------------- */

/** Takes one line without its line feed, valid during the call. It is called on whatever thread the
   library runs on, on several at once, and must return; it must not throw. */
typedef void (*wordcatcher_log_handler)(void* context, const char* line, size_t length);

/** Sends the lines that the library logs to `handler`, for the whole process: the tables of classic
   indexes log what they cannot do. NULL sends them where they go at the start: to the system log.
   Any thread may call this at any time; a handler that was replaced may still be called by those
   calls that are under way, and its context must outlive them. */
WORDCATCHER_EXPORT void wordcatcher_log_set_handler(wordcatcher_log_handler handler, void* context);

#ifdef __cplusplus
}
#endif
/* NOLINTEND(modernize-*) */

#endif
