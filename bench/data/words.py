#!/usr/bin/env python3
"""Work W1: words, and misspellings to look up.

Writes w1-words.txt, w1-queries.txt and w1-sample.txt, a fifth of the queries for the slow engines,
one word a line, into the directory given.
"""

import sys
from pathlib import Path

from debian_texts import dictionary_words, misspellings, require_packages, write_lines

QUERIES = 5000
SAMPLE = 1000


def evenly(items, count):
    return [items[i * len(items) // count] for i in range(count)]


def main(directory):
    require_packages()
    words = dictionary_words()
    wrong = misspellings()
    write_lines(directory / "w1-words.txt", words)
    queries = evenly(wrong, QUERIES)
    write_lines(directory / "w1-queries.txt", queries)
    write_lines(directory / "w1-sample.txt", evenly(queries, SAMPLE))
    print(f"W1: {len(words)} words, {QUERIES} queries of {len(wrong)} misspellings", file=sys.stderr)


if __name__ == "__main__":
    main(Path(sys.argv[1]))
