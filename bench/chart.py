#!/usr/bin/env python3
"""A bar chart with a logarithmic axis of the times on a page that compare.py wrote, as SVG.

    bench/chart.py PAGE.md...

draws the chart of a page anew, beside it.
"""

import math
import sys
from pathlib import Path
from xml.sax.saxutils import escape

from comparison import Figures, value

TITLE = "Time of a query, logarithmic (words: mean, phrases: median)"
WIDTH = 760
MARGIN = 10
LABELS = 90
RIGHT = 90
BAR = 15
GAP = 14
LEGEND = 32
LINE = 18
LETTER = 7  # hardly any letter is wider
COLOURS = [
    "#1b6ca8", "#e08e2b", "#b5563a", "#8a8a8a", "#8e5ea2", "#6d9f5b", "#d16ba5", "#2a9d9d",
]  # fmt: skip


def groups_of(figures):
    """Pairs of a label and a mapping from engine to microseconds."""
    groups = []
    for table, rows, label, part in (("W1", "k=", "words, ", "mean"), ("W2", "query", "phrases", "p50")):
        if table not in figures:
            continue
        for row, cells in figures.rows(table).items():
            if row.startswith(rows):
                # The last column of W1 is not of the others' questions.
                bars = {
                    engine: value(figures.part(cell, part))
                    for engine, cell in cells.items()
                    if cell != "not offered" and not engine.endswith("all queries")
                }
                groups.append((label + row if label.endswith(" ") else label, bars))
    return groups


def legend(engines):
    """For each engine where its entry begins: in lines that end before the chart does."""
    left, top = MARGIN, LEGEND
    for engine in engines:
        width = 16 + LETTER * len(engine)
        if left + width > WIDTH - MARGIN and left > MARGIN:
            left, top = MARGIN, top + LINE
        yield engine, left, top
        left += width + 18


def svg(title, groups):
    """`groups`: pairs of a label and a mapping from engine to microseconds."""
    engines = list(dict.fromkeys(engine for _, bars in groups for engine in bars))
    colours = dict(zip(engines, COLOURS[: len(engines)], strict=True))
    values = [each for _, bars in groups for each in bars.values()]
    low = math.floor(math.log10(min(values)))
    high = max(math.ceil(math.log10(max(values))), low + 1)

    def x(microseconds):
        return LABELS + (math.log10(microseconds) - low) / (high - low) * (WIDTH - LABELS - RIGHT)

    entries = list(legend(engines))
    head = entries[-1][2] + 30
    height = head + sum(len(bars) * BAR + GAP for _, bars in groups) + 24
    out = [
        f'<svg xmlns="http://www.w3.org/2000/svg" width="{WIDTH}" height="{height}" '
        'font-family="sans-serif" font-size="12">',
        f'<rect width="{WIDTH}" height="{height}" fill="white"/>',
        f'<text x="{MARGIN}" y="20" font-size="14">{escape(title)}</text>',
    ]
    for engine, left, top in entries:
        out.append(f'<rect x="{left}" y="{top}" width="11" height="11" fill="{colours[engine]}"/>')
        out.append(f'<text class="legend" x="{left + 16}" y="{top + 10}">{escape(engine)}</text>')
    for power in range(low, high + 1):
        at = x(10**power)
        out.append(f'<line x1="{at:.1f}" y1="{head - 8}" x2="{at:.1f}" y2="{height - 22}" stroke="#ddd"/>')
        out.append(
            f'<text x="{at:.1f}" y="{height - 7}" text-anchor="middle" fill="#555">{axis(power)}</text>'
        )
    y = head
    for label, bars in groups:
        middle = y + len(bars) * BAR / 2 + 4
        out.append(f'<text x="{LABELS - 8}" y="{middle:.1f}" text-anchor="end">{escape(label)}</text>')
        for engine, microseconds in bars.items():
            end = x(microseconds)
            out.append(
                f'<rect x="{LABELS}" y="{y}" width="{end - LABELS:.1f}" height="{BAR - 2}" '
                f'fill="{colours[engine]}"><title>{escape(f"{label}: {engine}")}</title></rect>'
            )
            out.append(f'<text x="{end + 4:.1f}" y="{y + 11}" font-size="11">{time(microseconds)}</text>')
            y += BAR
        y += GAP
    out.append("</svg>")
    return "\n".join(out) + "\n"


def axis(power):
    return f"{10**power} µs" if power < 3 else f"{10 ** (power - 3)} ms"


def time(microseconds):
    if microseconds >= 1000:
        return f"{microseconds / 1000:.3g} ms"
    return f"{microseconds:.3g} µs"


def of_page(page):
    """The chart of a page, from the page's text."""
    return svg(TITLE, groups_of(Figures(page)))


if __name__ == "__main__":
    for name in sys.argv[1:]:
        written = Path(name)
        written.with_suffix(".svg").write_text(
            of_page(written.read_text(encoding="utf-8")), encoding="utf-8"
        )
