"""Whether engines that look up words found the same."""

from collections import defaultdict


class Disagreement(Exception):
    pass


def rows(path):
    """The lines of a file of results: the distance allowed and the query, and what was found."""
    with open(path, encoding="ascii") as lines:
        for line in lines:
            distance, query, found = line.rstrip("\n").split("\t")
            yield (int(distance), query), found.split()


def check(scanned, ours, others):
    """Compares with the scan of the whole list, whose distances it takes as given.

    Plain engines must have found exactly what the scan found; the library what is left of it when
    the head of a query may not be left out before a code unit of the word is read. Returns, per
    distance, how many words agree and how many only plain engines find. Raises Disagreement.
    """
    ours = dict(rows(ours))
    others = {name: dict(rows(path)) for name, path in others.items()}
    agreeing = defaultdict(int)
    only_plain = defaultdict(int)
    for key, found in rows(scanned):
        words = [entry.split(":") for entry in found]
        for name, results in others.items():
            if key in results and set(results[key]) != {word for word, _, _ in words}:
                raise Disagreement(f"{name} and the scan differ on {key}")
        expected = {f"{word}:{headed}" for word, _, headed in words if int(headed) <= key[0]}
        if set(ours[key]) != expected or len(ours[key]) != len(expected):
            raise Disagreement(f"The library and the scan differ on {key}")
        agreeing[key[0]] += len(expected)
        only_plain[key[0]] += len(words) - len(expected)
    return agreeing, only_plain
