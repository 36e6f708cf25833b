#!/usr/bin/env python3
"""Work W1: words, and misspellings to look up.

Writes w1-words.txt and w1-queries.txt, one word a line, into the directory given.
"""

import sys
from pathlib import Path

from debian_texts import dictionary_words, misspellings, require_packages, write_lines

QUERIES = 5000


def main(directory):
    require_packages()
    words = dictionary_words()
    wrong = misspellings()
    write_lines(directory / "w1-words.txt", words)
    write_lines(
        directory / "w1-queries.txt",
        [wrong[i * len(wrong) // QUERIES] for i in range(QUERIES)],
    )
    print(f"W1: {len(words)} words, {QUERIES} queries of {len(wrong)} misspellings", file=sys.stderr)


if __name__ == "__main__":
    main(Path(sys.argv[1]))
