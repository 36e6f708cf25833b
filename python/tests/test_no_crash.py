"""No Python program ends the interpreter: what cannot be done is an exception."""

import os
import subprocess
import sys
from pathlib import Path

import pytest

import wordcatcher


def ends_well(program: str, directory: Path) -> str:
    """What a program prints that is run by itself, as it might crash."""
    ended = subprocess.run(
        [sys.executable, "-X", "faulthandler", "-c", program],
        cwd=directory,
        env=dict(os.environ, PYTHONPATH=str(Path(wordcatcher.__file__).parents[1])),
        encoding="utf-8",
        stdout=subprocess.PIPE,
        stderr=subprocess.STDOUT,
        timeout=120,
    )
    assert ended.returncode == 0, ended.stdout
    return ended.stdout


DAEMONS = {
    "find": "while True: index.find('trinidat and tobbago ' * size)",
    "find_many": "while True: index.find_many(['trinidat and tobbago ' * size] * 100, 3)",
    "find_many of a generator": "while True: index.find_many(itertools.repeat('trinidat'), 2)",
    "find_many of Python code": "while True: index.find_many((each for each in endless()), 2)",
    "query": "while True: index.query('trinidat and tobbago ' * size)",
    "open": "while True: Index.open(index.path).verify()",
    "commit": "while True: built(10 * size).commit()",
}


@pytest.mark.parametrize("name", DAEMONS)
@pytest.mark.parametrize("size", [1, 300])
def test_the_interpreter_ends_while_daemon_threads_work(
    name: str, size: int, image: Path, tmp_path: Path
) -> None:
    program = f"""
import itertools, threading, time
from wordcatcher import Index, IndexBuilder

index, size = Index.open({str(image)!r}), {size}

def endless():
    while True:
        yield "trinidat"

def built(count):
    builder = IndexBuilder(f"{{threading.get_ident()}}.wci")
    for number in range(count):
        builder.add(f"retriever{{number}}")
    return builder

def work():
    {DAEMONS[name]}

for _ in range(4):
    threading.Thread(target=work, daemon=True).start()
time.sleep(0.2)
print("ends")
"""
    assert ends_well(program, tmp_path) == "ends\n"
