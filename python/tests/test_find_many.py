"""What Index.find_many promises."""

import signal
import threading
from collections.abc import Iterator
from pathlib import Path

import pytest

from wordcatcher import Error, Index

TEXTS = ["trinidat and tobbago", "new zeeland \N{DOG}", "", "xylophone", "papua ginea", "ß bosnia"]


@pytest.mark.parametrize("threads", [None, 1, 2, 7])
@pytest.mark.parametrize("count", [0, 1, 5, 17, 2000])
def test_results_come_in_the_order_of_the_texts(
    index: Index, threads: int | None, count: int
) -> None:
    texts = [TEXTS[number % len(TEXTS)] for number in range(count)]
    assert index.find_many(texts, threads) == [index.find(text) for text in texts]


def test_more_texts_than_are_held_at_once(index: Index) -> None:
    results = index.find_many((TEXTS[number % 6] for number in range(40000)), threads=2, limit=1)
    singles = [index.find(text, limit=1) for text in TEXTS]
    assert len(results) == 40000
    assert all(result == singles[number % 6] for number, result in enumerate(results))


def test_options_are_those_of_find(index: Index) -> None:
    assert index.find_many(TEXTS, min_words=2, limit=1, overlaps="longest") == [
        index.find(text, min_words=2, limit=1, overlaps="longest") for text in TEXTS
    ]


def test_any_iterable_but_a_str(index: Index) -> None:
    expected = [index.find("trinidat"), index.find("zeeland")]
    assert index.find_many(("trinidat", "zeeland")) == expected
    assert index.find_many({"trinidat": 1, "zeeland": 2}) == expected
    assert index.find_many(iter(["trinidat", "zeeland"])) == expected
    with pytest.raises(TypeError, match="one str"):
        index.find_many("trinidat")
    with pytest.raises(TypeError, match="not of bytes"):
        index.find_many(["trinidat", b"zeeland"])  # type: ignore[list-item]
    with pytest.raises(TypeError):
        index.find_many(7)  # type: ignore[arg-type]
    for threads in (0, -1):
        with pytest.raises(ValueError, match="threads"):
            index.find_many(["trinidat"], threads)


def test_exceptions_of_the_iterable(index: Index) -> None:
    def texts() -> Iterator[str]:
        yield "trinidat"
        raise LookupError("no more")

    with pytest.raises(LookupError, match="no more"):
        index.find_many(texts())


@pytest.mark.parametrize("threads", [1, 3])
def test_exceptions_of_a_worker(image: Path, tmp_path: Path, threads: int) -> None:
    whole = image.read_bytes()
    damages = 0
    for place in range(0, len(whole), 8):
        damaged = bytearray(whole)
        damaged[place : place + 8] = b"\xff" * 8
        path = tmp_path / "damaged.wci"
        path.unlink(missing_ok=True)
        path.write_bytes(damaged)
        try:
            index = Index.open(path)
        except Error:
            continue
        try:
            index.find_many(TEXTS * 20, threads)
        except Error as error:
            assert error.code == "damaged"
            damages += 1
    assert damages > 0


def test_several_python_threads_share_an_index(index: Index) -> None:
    expected = [index.find(text) for text in TEXTS]
    wrong = []

    def ask() -> None:
        for _ in range(20):
            if index.find_many(TEXTS, 2) != expected:
                wrong.append(threading.get_ident())

    threads = [threading.Thread(target=ask) for _ in range(4)]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    assert not wrong


def test_a_signal_ends_the_work(index: Index) -> None:
    class Interrupted(Exception):
        pass

    def interrupt(*_: object) -> None:
        raise Interrupted

    text = " ".join(TEXTS) * 100
    previous = signal.signal(signal.SIGALRM, interrupt)
    try:
        with pytest.raises(Interrupted):
            signal.setitimer(signal.ITIMER_REAL, 0.1)
            # Far more than the time that a test may take.
            while True:
                index.find_many([text] * 16000, threads=2)
    finally:
        signal.setitimer(signal.ITIMER_REAL, 0)
        signal.signal(signal.SIGALRM, previous)
