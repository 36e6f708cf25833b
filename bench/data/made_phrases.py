#!/usr/bin/env python3
"""Work W3: as many phrases as asked for, made of the words of WordNet's lemmas.

A word is drawn as often as lemmas hold it, and a phrase's length as often as lemmas have it. So
short phrases repeat; the drivers number them, which makes each a record of its own. A longer list
begins with a shorter one, and both are asked the same questions.

Writes w3-COUNT.txt, one phrase a line, and w3-queries.tsv as for W2, into the directory given.
"""

import itertools
import random
import sys
from collections import Counter
from pathlib import Path

from debian_texts import lemmas, require_packages, word_frequencies, write_lines
from mistakes import one_word_each, questions

ASKED_FOR = 1_000_000
QUERIES = 2000
PHRASE_SEED = 3
QUERY_SEED = 4


def made(count, source):
    frequencies = word_frequencies(source)
    words = sorted(frequencies)
    weights = list(itertools.accumulate(frequencies[word] for word in words))
    lengths = Counter(len(phrase.split()) for phrase in source)
    # One stream of chance for each, so that a longer list begins with a shorter one.
    of_length = random.Random(PHRASE_SEED)
    of_words = random.Random(PHRASE_SEED + 1000)
    drawn = of_length.choices(sorted(lengths), [lengths[n] for n in sorted(lengths)], k=count)
    stream = iter(of_words.choices(words, cum_weights=weights, k=sum(drawn)))
    return [" ".join(itertools.islice(stream, length)) for length in drawn]


def main(directory, count):
    require_packages()
    source = lemmas()
    phrases = made(count, source)
    words = sorted(word_frequencies(source))
    asked = questions(
        phrases[:ASKED_FOR], one_word_each(words), QUERIES, random.Random(QUERY_SEED)
    )
    write_lines(directory / f"w3-{count}.txt", phrases)
    write_lines(directory / "w3-queries.tsv", asked)
    print(f"W3: {count} phrases, {len(set(phrases))} distinct", file=sys.stderr)


if __name__ == "__main__":
    main(Path(sys.argv[1]), int(sys.argv[2]))
