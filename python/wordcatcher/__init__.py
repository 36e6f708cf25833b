"""Finds stored phrases in free text, tolerating spelling mistakes.

    import wordcatcher

    with wordcatcher.IndexBuilder("names.wci") as builder:
        builder.add("Trinidad and Tobago")
        builder.add("Papua New Guinea")

    index = wordcatcher.Index.open("names.wci")
    for match in index.find("holidays in trinidat and tobbago"):
        print(match.value, match.cost)

Offsets in texts count code points, as slices do. All results are immutable; they compare by what
they hold, and can be pickled. What goes wrong with a file is an Error; a wrong argument is a
TypeError or a ValueError, as everywhere.
"""

from ._wordcatcher import (
    EditLimits,
    Error,
    FindExplanation,
    FindResult,
    FoundPhrase,
    FoundWord,
    Index,
    IndexBuilder,
    IndexInfo,
    PhraseWord,
    QueryExplanation,
    QueryMatch,
    QueryResult,
    QueryStep,
    SearchResult,
    TextWord,
    WordComparison,
    WordMatch,
    __version__,
)

__all__ = [
    "EditLimits",
    "Error",
    "FindExplanation",
    "FindResult",
    "FoundPhrase",
    "FoundWord",
    "Index",
    "IndexBuilder",
    "IndexInfo",
    "PhraseWord",
    "QueryExplanation",
    "QueryMatch",
    "QueryResult",
    "QueryStep",
    "SearchResult",
    "TextWord",
    "WordComparison",
    "WordMatch",
    "__version__",
]


def _unpickled(kind: type, parts: tuple) -> object:
    """What a pickle of an object of this package calls, with the object's class and its parts."""
    return kind._unpickled(parts)
