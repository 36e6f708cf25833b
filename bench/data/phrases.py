#!/usr/bin/env python3
"""Work W2: WordNet's lemmas as phrases, and misspelled ones to ask for.

Writes w2-phrases.txt, one phrase a line, and w2-queries.tsv, lines of the number of a phrase (the
first is 0), a tab and a question, into the directory given; and w2-other-queries.tsv, the same with
mistakes of other kinds, on which nothing is tuned; and w2-more-queries.tsv, many more of the first kind,
which tell of how often the answer is right with less left to chance.
"""

import random
import sys
from pathlib import Path

from debian_texts import lemmas, require_packages, word_frequencies, write_lines
from mistakes import one_word_each, other_questions, questions

QUERIES = 2000
SEED = 2
OTHER_SEED = 5
MORE_QUERIES = 20000
MORE_SEED = 9


def main(directory):
    require_packages()
    phrases = lemmas()
    words = sorted(word_frequencies(phrases))
    asked = questions(phrases, one_word_each(words), QUERIES, random.Random(SEED))
    others = other_questions(phrases, QUERIES, random.Random(OTHER_SEED))
    more = questions(phrases, one_word_each(words), MORE_QUERIES, random.Random(MORE_SEED))
    write_lines(directory / "w2-phrases.txt", phrases)
    write_lines(directory / "w2-queries.tsv", asked)
    write_lines(directory / "w2-other-queries.tsv", others)
    write_lines(directory / "w2-more-queries.tsv", more)
    print(f"W2: {len(phrases)} phrases of {len(words)} words", file=sys.stderr)


if __name__ == "__main__":
    main(Path(sys.argv[1]))
