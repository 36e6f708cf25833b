"""bench/python_find_many.py, with few texts, and with times that are made up."""

import importlib.util
from pathlib import Path
from types import ModuleType

import pytest

PROGRAM = Path(__file__).parents[2] / "bench" / "python_find_many.py"


@pytest.fixture
def bench() -> ModuleType:
    source = importlib.util.spec_from_file_location("python_find_many", PROGRAM)
    module = importlib.util.module_from_spec(source)
    source.loader.exec_module(module)
    return module


def test_threads_take_turns(bench: ModuleType) -> None:
    asked = []

    class Asked:
        def find_many(self, texts: list[str], threads: int) -> None:
            asked.append((len(texts), threads))

    taken = bench.measured(Asked(), ["tobbago"] * 7, 3)
    assert asked == [(7, 1), (7, 2)] * 3
    assert [len(each) for each in taken.values()] == [3, 3]


def test_the_ratio_is_the_median_of_the_rounds_ratios(bench: ModuleType) -> None:
    # The best times of all rounds would give 0.4 / 1.0, and their medians 0.9 / 1.5.
    taken = {1: [1.0, 2.0, 1.5], 2: [0.58, 0.4, 0.9]}
    assert "two threads take 58 % of the time of one: within 60 %\n" in bench.report(taken)
    taken[2][0] = 0.61
    assert "two threads take 60 % of the time of one: within 60 %\n" in bench.report(taken)
    taken[2][2] = 1.2
    assert "two threads take 61 % of the time of one: beyond 60 %\n" in bench.report(taken)


def test_a_whole_run_prints_its_results(
    bench: ModuleType, monkeypatch: pytest.MonkeyPatch, capsys: pytest.CaptureFixture[str]
) -> None:
    monkeypatch.setattr(bench, "lemmas", lambda: ["new zealand", "papua new guinea", "tobago"])
    bench.main(20, 2)
    printed = capsys.readouterr().out
    assert "3 phrases, 20 texts, 2 rounds, Python " in printed
    assert "\n2 threads, s " in printed
    assert "\nnothing to find, 1 thread: " in printed
