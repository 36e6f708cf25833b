#!/usr/bin/env python3
"""How much faster Index.find_many of the Python module is with two threads than with one.

    PYTHONPATH=build/release/python /usr/bin/python3 bench/python_find_many.py [TEXTS [RUNS]]

Indexes WordNet's lemmas and finds 100,000 of them, misspelled, with one thread and with two, in
turns, after a pass of a tenth of the texts to warm up. Prints the seconds of each run, the best ones,
the ratio of the best ones, and what the part is that Python's lock makes serial: the texts' UTF-8
forms before, and the results' objects after, measured with texts in which there is nothing to find.
"""

import os
import platform
import random
import sys
import tempfile
import time
from collections.abc import Callable
from datetime import date
from pathlib import Path

sys.path.insert(0, str(Path(__file__).parent / "data"))
from debian_texts import lemmas, word_frequencies  # noqa: E402
from mistakes import misspelled  # noqa: E402

import wordcatcher  # noqa: E402

TEXTS = 100_000
RUNS = 5
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


def machine() -> str:
    models = [
        line.split(":", 1)[1].strip()
        for line in Path("/proc/cpuinfo").read_text(encoding="utf-8").splitlines()
        if line.startswith("model name")
    ]
    return f"{models[0] if models else platform.machine()}, {os.cpu_count()} cores"


def main(count: int, runs: int) -> None:
    phrases = lemmas()
    asked = texts(phrases, count)
    with tempfile.TemporaryDirectory() as directory:
        index = build(phrases, Path(directory, "lemmas.wci"))
        index.find_many(asked[: count // 10])
        taken: dict[int, list[float]] = {threads: [] for threads in THREADS}
        for _ in range(runs):
            for threads in THREADS:
                taken[threads].append(seconds(lambda: index.find_many(asked, threads)))
        serial = min(seconds(lambda: index.find_many([""] * count, 1)) for _ in range(runs))

    print(f"# {date.today()}, {machine()}, Python {platform.python_version()}")
    print(f"{len(phrases)} phrases, {count} texts, the best of {runs} runs")
    for threads, each in taken.items():
        shown = " ".join(f"{one:.2f}" for one in each)
        print(f"{threads} threads: {min(each):.2f} s ({shown})")
    print(f"nothing to find, 1 thread: {serial:.3f} s")
    print(f"ratio: {min(taken[2]) / min(taken[1]):.2f}")


if __name__ == "__main__":
    numbers = [int(argument) for argument in sys.argv[1:3]]
    main(*(numbers + [TEXTS, RUNS][len(numbers) :]))
