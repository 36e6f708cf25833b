"""The figures of a page that compare.py writes, told by where they stand.

A reference is "TABLE: ROW: COLUMN" or "TABLE: ROW: COLUMN: PART", such as "W2: query: Lucene 8: p50".
TABLE is the first word of the heading, with ".2" behind it for the second table below. ROW and COLUMN
are a label, or as much of its beginning as no other one has. PART is mean, p50, p99 or ratio, in a cell
such as "396 / 354 / 1,434 (110×)"; without it the reference is to the whole cell.
"""

import re

PARTS = ("mean", "p50", "p99")


def value(figure):
    """The number of a figure such as "1,434" or "18.0 MB"."""
    return float(re.match(r"[\d,.]+", figure).group().replace(",", ""))


def _cells(line):
    return [cell.strip() for cell in line.strip().strip("|").split("|")]


def _labelled(labels, wanted, where):
    if wanted in labels:
        return wanted
    begun = [label for label in labels if label.startswith(wanted)]
    if len(begun) != 1:
        raise KeyError(f"{where} has {len(begun)} labels that begin with {wanted!r}: {labels}")
    return begun[0]


class Figures:
    """The tables of a page, each a mapping from a row's label to the row's cells by column."""

    def __init__(self, page):
        self._tables = {}
        for section in re.split(r"^## ", page, flags=re.MULTILINE)[1:]:
            work = re.match(r"\w+", section).group()
            for number, lines in enumerate(re.findall(r"(?:^\|.*\n)+", section, re.MULTILINE), 1):
                head, _, *rows = [_cells(line) for line in lines.splitlines()]
                name = work if number == 1 else f"{work}.{number}"
                self._tables[name] = {row[0]: dict(zip(head[1:], row[1:], strict=True)) for row in rows}

    def __contains__(self, table):
        return table in self._tables

    def rows(self, table):
        if table not in self._tables:
            raise KeyError(f"the page has no table {table}, but {list(self._tables)}")
        return self._tables[table]

    def at(self, reference):
        """The figure at a reference, as it stands on the page. Raises KeyError."""
        table, row, column, *part = reference.split(": ")
        rows = self.rows(table)
        cells = rows[_labelled(list(rows), row, table)]
        cell = cells[_labelled(list(cells), column, f"{table}: {row}")]
        return self.part(cell, part[0]) if part else cell

    @staticmethod
    def part(cell, name):
        times, _, bracket = cell.partition(" (")
        if name == "ratio" and bracket:
            return bracket.rstrip(")")
        named = dict(zip(PARTS, times.split(" / ")))
        if name not in named:
            raise KeyError(f"{cell!r} has no {name}")
        return named[name]
