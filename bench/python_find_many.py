#!/usr/bin/env python3
"""How much of the time of one thread Index.find_many of the Python module takes with two.

    PYTHONPATH=build/release/python /usr/bin/python3 bench/python_find_many.py [TEXTS [ROUNDS]]

Indexes WordNet's lemmas and finds 100,000 of them, misspelled, with one thread and with two, in
rounds in which both take their turn, after a pass of a tenth of the texts to warm up. Prints the
seconds of each, the ratio of each round and their median, which is to be at most 0.60; and what the
part is that Python's lock makes serial: the texts' UTF-8 forms before, and the results' objects after,
measured with texts in which there is nothing to find. Run by scripts/bench.
"""

import platform
import random
import statistics
import sys
import tempfile
import time
from collections.abc import Callable
from pathlib import Path

sys.path.insert(0, str(Path(__file__).parent / "data"))
from debian_texts import lemmas, word_frequencies  # noqa: E402
from mistakes import misspelled  # noqa: E402

import wordcatcher  # noqa: E402

TEXTS = 100_000
ROUNDS = 5
BOUND = 0.6
SEED = 5
THREADS = (1, 2)


def texts(phrases: list[str], count: int) -> list[str]:
    chance = random.Random(SEED)
    extra_words = sorted(word_frequencies(phrases))
    return [misspelled(chance.choice(phrases), extra_words, chance) for _ in range(count)]


def build(phrases: list[str], path: Path) -> wordcatcher.Index:
    with wordcatcher.IndexBuilder(path) as builder:
        for phrase in phrases:
            builder.add(phrase)
    return wordcatcher.Index.open(path)


def seconds(work: Callable[[], object]) -> float:
    start = time.perf_counter()
    work()
    return time.perf_counter() - start


def measured(index: wordcatcher.Index, asked: list[str], rounds: int) -> dict[int, list[float]]:
    """The seconds of each round by the number of threads."""
    taken: dict[int, list[float]] = {threads: [] for threads in THREADS}
    for _ in range(rounds):
        for threads in THREADS:
            taken[threads].append(seconds(lambda: index.find_many(asked, threads)))
    return taken


def report(taken: dict[int, list[float]]) -> str:
    ratios = [two / one for one, two in zip(taken[1], taken[2], strict=True)]
    ratio = statistics.median(ratios)
    lines = {f"{threads} thread{'s' * (threads > 1)}, s": each for threads, each in taken.items()}
    lines["2 threads / 1 thread"] = ratios
    text = "".join(
        f"{name:<22}{statistics.median(each):>8.2f}  median of"
        + "".join(f"{one:>7.2f}" for one in each)
        + "\n"
        for name, each in lines.items()
    )
    judged = "within" if ratio <= BOUND else "beyond"
    return text + (
        f"two threads take {100 * ratio:.0f} % of the time of one: {judged} {100 * BOUND:.0f} %\n"
    )


def main(count: int, rounds: int) -> None:
    phrases = lemmas()
    asked = texts(phrases, count)
    with tempfile.TemporaryDirectory() as directory:
        index = build(phrases, Path(directory, "lemmas.wci"))
        index.find_many(asked[: count // 10])
        taken = measured(index, asked, rounds)
        serial = [seconds(lambda: index.find_many([""] * count, 1)) for _ in range(rounds)]

    print(
        f"{len(phrases):,} phrases, {count:,} texts, {rounds} rounds, Python {platform.python_version()}"
    )
    print(report(taken), end="")
    print(f"nothing to find, 1 thread: {statistics.median(serial):.3f} s")


if __name__ == "__main__":
    numbers = [int(argument) for argument in sys.argv[1:3]]
    main(*(numbers + [TEXTS, ROUNDS][len(numbers) :]))
