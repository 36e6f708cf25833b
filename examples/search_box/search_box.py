#!/usr/bin/env python3
"""A search box over a list of names: what people type, however they spell it, brings suggestions.

    search_box.py PHRASES

PHRASES is a file with one name a line. Each line of standard input is what somebody typed; the
answer is up to five names, the best one first, with the words of the text that led to them.
"""

import sys
import tempfile
from collections.abc import Iterable
from dataclasses import dataclass
from pathlib import Path

import wordcatcher

SUGGESTIONS = 5


@dataclass(frozen=True)
class Suggestion:
    """A name, and the text that was typed with the words in brackets that belong to it."""

    name: str
    typed: str
    is_exact: bool


class SearchBox:
    """Suggests names for what people type. Any number of threads may ask at once."""

    def __init__(self, index: wordcatcher.Index) -> None:
        self._index = index

    @classmethod
    def of(cls, names: Iterable[str], path: Path) -> "SearchBox":
        """A search box over these names, whose index is written to the path."""
        with wordcatcher.IndexBuilder(path) as builder:
            for name in names:
                builder.add(name)
        return cls(wordcatcher.Index.open(path))

    def suggest(self, typed: str) -> list[Suggestion]:
        return [
            Suggestion(match.value, marked(typed, match.hits), match.cost == 0)
            for match in self._index.find(typed, limit=SUGGESTIONS)
        ]


def marked(text: str, hits: Iterable[wordcatcher.FoundWord]) -> str:
    """The text with brackets around the words that were found."""
    pieces = []
    done = 0
    for hit in hits:
        pieces += [text[done : hit.begin], "[", text[hit.begin : hit.end], "]"]
        done = hit.end
    return "".join(pieces) + text[done:]


def main(phrases: str) -> None:
    try:
        names = Path(phrases).read_text(encoding="utf-8").splitlines()
    except (OSError, UnicodeError) as error:
        sys.exit(f"Cannot read the names: {error}")
    with tempfile.TemporaryDirectory() as directory:
        box = SearchBox.of(names, Path(directory, "names.wci"))
        for line in sys.stdin:
            typed = line.rstrip("\n")
            suggestions = box.suggest(typed)
            if not suggestions:
                print(f"{typed}: nothing")
            for suggestion in suggestions:
                exact = " (exactly)" if suggestion.is_exact else ""
                print(f"{suggestion.typed}: {suggestion.name}{exact}")


if __name__ == "__main__":
    if len(sys.argv) != 2:
        sys.exit(__doc__)
    main(sys.argv[1])
