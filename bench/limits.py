"""What a comparison's page says below its tables: what was aimed at, and what stands in the way."""

import re
from dataclasses import dataclass
from pathlib import Path

from comparison import value

TEXT = Path(__file__).with_name("what_limits_it.md")


@dataclass
class Aim:
    what: str
    figure: str
    """A reference, as comparison.py explains them."""
    bound: float
    unit: str = "µs"
    at_least: bool = False
    against: str | None = None
    """Of another figure, by which this one is divided."""

    def row(self, figures):
        here = figures.at(self.figure)
        number = value(here)
        if self.against:
            number /= value(figures.at(self.against))
            here = f"{number:.2g}"
        reached = number >= self.bound if self.at_least else number <= self.bound
        shown = here if here.endswith(self.unit) else f"{here} {self.unit}"
        return f"| {self.what} | {self.bound:,} {self.unit} | {shown} | {'reached' if reached else 'missed'} |\n"


AIMS = [
    Aim("W1 k=1, mean", "W1: k=1: wordcatcher, all queries: mean", 2),
    Aim("W1 k=2, mean", "W1: k=2: wordcatcher, all queries: mean", 25),
    Aim("W1 k=2, p99", "W1: k=2: wordcatcher, all queries: p99", 100),
    Aim("W1 k=3, mean", "W1: k=3: wordcatcher, all queries: mean", 170),
    Aim("W1 image", "W1.2: index: wordcatcher", 20, "MB"),
    Aim("W2 query, p50", "W2: query: wordcatcher query: p50", 50),
    Aim("W2 query, p99", "W2: query: wordcatcher query: p99", 150),
    Aim("W2 find, source's words first", "W2: source first: wordcatcher find", 99.5, "%", at_least=True),
    Aim("W2 find, within ten", "W2: source within: wordcatcher find", 99.95, "%", at_least=True),
    Aim("W2 find, p50", "W2: query: wordcatcher find: p50", 40),
    Aim("W2 find, p99", "W2: query: wordcatcher find: p99", 150),
    Aim("W2 image", "W2: index: wordcatcher find", 20, "MB"),
    Aim("W2 build", "W2: build: wordcatcher find", 1, "s"),
    Aim("W2 open", "W2: open: wordcatcher find", 1, "ms"),
    Aim("W3, 1 M: build", "W3: 1,000,000: build", 8, "s"),
    Aim("W3, 1 M: peak memory", "W3: 1,000,000: peak", 1074, "MB"),
    Aim("W3, 1 M: query, p50", "W3: 1,000,000: query: p50", 300),
    Aim("W3, 1 M: find, p50", "W3: 1,000,000: find: p50", 300),
    Aim(
        "W3, 5 M against 1 M: query, p50", "W3: 5,000,000: query: p50", 3, "times",
        against="W3: 1,000,000: query: p50",
    ),
]  # fmt: skip


def what_limits_it(figures, text=None):
    """The hand-written text with the figures of a page: {aims}, and references in braces."""
    aims = "| figure | aimed at | here | |\n| --- | ---: | ---: | --- |\n"
    aims += "".join(aim.row(figures) for aim in AIMS)
    text = TEXT.read_text(encoding="utf-8") if text is None else text
    return re.sub(
        r"\{([^{}]+)\}",
        lambda match: aims.rstrip("\n") if match.group(1) == "aims" else figures.at(match.group(1)),
        text,
    )
