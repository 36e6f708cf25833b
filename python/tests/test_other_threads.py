"""Calls that take long let other Python threads run meanwhile."""

import itertools
import sys
import threading
import time
from collections.abc import Callable
from functools import partial
from pathlib import Path

import pytest

from wordcatcher import Index, IndexBuilder

TURNS = 5
LONG = 3.0  # seconds in which a thread that may run does so, on however busy a machine
NEVER = 1000.0
TEXT = "bababu bagedi daduba kelopisa "
SIZES = [2**power for power in range(5, 15)]


def words(count: int) -> list[str]:
    """So many, no two the same."""
    syllables = [first + second for first in "bdfgklmnprst" for second in "aeiou"]
    threes, fours = (itertools.product(syllables, repeat=length) for length in (3, 4))
    return ["".join(word) for word in itertools.islice(itertools.chain(threes, fours), count)]


def filled(builder: IndexBuilder, count: int) -> IndexBuilder:
    for word in words(count):
        builder.add(word)
    return builder


def built(path: Path, count: int, tables: Path | None = None) -> Path:
    filled(IndexBuilder(path, tables=tables), count).commit()
    return path


def turns_within(call: Callable[[], object]) -> tuple[int, float]:
    """How many turns another thread gets from a call's start to its end, and the call's seconds.

    Python takes the lock from no thread meanwhile, so that the other one only gets it when the call
    gives it up: not at its start, nor at its end.
    """
    turns = 0
    done = threading.Event()

    def count() -> None:
        nonlocal turns
        while not done.wait(0.0005):
            turns += 1

    interval = sys.getswitchinterval()
    sys.setswitchinterval(NEVER)
    thread = threading.Thread(target=count)
    thread.start()
    try:
        while turns == 0:
            time.sleep(0.001)
        before, start = turns, time.perf_counter()
        call()
        return turns - before, time.perf_counter() - start
    finally:
        done.set()
        thread.join()
        sys.setswitchinterval(interval)


def explaining(path: Path, size: int) -> Callable[[], object]:
    """Each word of a text beside each of a phrase."""
    phrase = " ".join(words(size))
    with IndexBuilder(path) as builder:
        builder.add(phrase)
    return partial(Index.open(path).explain, phrase, phrase)


# Each makes a call that takes the longer the greater the size is.
CALLS: dict[str, Callable[[Index, Path, int], Callable[[], object]]] = {
    "find": lambda index, path, size: partial(index.find, TEXT * size),
    "find_many with 1 thread": lambda index, path, size: partial(index.find_many, [TEXT] * size, 1),
    "find_many with 2 threads": lambda index, path, size: partial(index.find_many, [TEXT] * size, 2),
    "query": lambda index, path, size: partial(index.query, TEXT * size),
    "search": lambda index, path, size: partial(
        Index.open(built(path, 50 * size)).search, "ba", max_distance=16
    ),
    "explain": lambda index, path, size: explaining(path, size),
    "explain_query": lambda index, path, size: partial(index.explain_query, TEXT * size, "bababa"),
    "verify": lambda index, path, size: Index.open(built(path, 100 * size)).verify,
    "open": lambda index, path, size: partial(
        Index.open, built(path, 10 * size, tables=path.parent).parent
    ),
    "commit": lambda index, path, size: filled(IndexBuilder(path), 10 * size).commit,
}


@pytest.mark.parametrize("name", CALLS)
def test_another_thread_runs_during_a_call(name: str, tmp_path: Path) -> None:
    index = Index.open(built(tmp_path / "words.wci", 2000), max_query_words=2**20)
    tried = []
    for size in SIZES:
        turns, seconds = turns_within(CALLS[name](index, tmp_path / "grown.wci", size))
        if turns >= TURNS:
            return
        tried.append(f"{turns} turns in {seconds:.3f} s")
        if seconds >= LONG:
            break
    pytest.fail(f"the other thread had to wait: {', '.join(tried)}")
