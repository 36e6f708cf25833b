#!/usr/bin/env python3
"""Work W2: WordNet's lemmas as phrases, and misspelled ones to ask for.

Writes w2-phrases.txt, one phrase a line, and w2-queries.tsv, lines of the number of a phrase (the
first is 0), a tab and a question, into the directory given.
"""

import random
import sys
from pathlib import Path

from debian_texts import lemmas, require_packages, word_frequencies, write_lines
from mistakes import questions

QUERIES = 2000
SEED = 2


def main(directory):
    require_packages()
    phrases = lemmas()
    words = sorted(word_frequencies(phrases))
    asked = questions(phrases, words, QUERIES, random.Random(SEED))
    write_lines(directory / "w2-phrases.txt", phrases)
    write_lines(directory / "w2-queries.tsv", asked)
    print(f"W2: {len(phrases)} phrases of {len(words)} words", file=sys.stderr)


if __name__ == "__main__":
    main(Path(sys.argv[1]))
