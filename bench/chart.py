"""A bar chart with a logarithmic axis, as SVG."""

import math
from xml.sax.saxutils import escape

WIDTH = 760
LABELS = 90
RIGHT = 90
BAR = 15
GAP = 14
HEAD = 62
COLOURS = ["#1b6ca8", "#e08e2b", "#b5563a", "#8a8a8a", "#8e5ea2", "#6d9f5b"]


def svg(title, groups, engines):
    """`groups`: pairs of a label and a mapping from engine to microseconds; engines without a
    figure in a group are left out of it."""
    values = [value for _, bars in groups for value in bars.values()]
    low = math.floor(math.log10(min(values)))
    high = math.ceil(math.log10(max(values)))

    def x(value):
        return LABELS + (math.log10(value) - low) / (high - low) * (WIDTH - LABELS - RIGHT)

    height = HEAD + sum(len(bars) * BAR + GAP for _, bars in groups) + 24
    out = [
        f'<svg xmlns="http://www.w3.org/2000/svg" width="{WIDTH}" height="{height}" '
        'font-family="sans-serif" font-size="12">',
        f'<rect width="{WIDTH}" height="{height}" fill="white"/>',
        f'<text x="10" y="20" font-size="14">{escape(title)}</text>',
    ]
    left = 10
    for engine, colour in zip(engines, COLOURS):
        out.append(f'<rect x="{left}" y="32" width="11" height="11" fill="{colour}"/>')
        out.append(f'<text x="{left + 16}" y="42">{escape(engine)}</text>')
        left += 34 + 7 * len(engine)
    for power in range(low, high + 1):
        at = x(10**power)
        out.append(f'<line x1="{at:.1f}" y1="{HEAD - 8}" x2="{at:.1f}" y2="{height - 22}" stroke="#ddd"/>')
        out.append(
            f'<text x="{at:.1f}" y="{height - 7}" text-anchor="middle" fill="#555">{axis(power)}</text>'
        )
    y = HEAD
    for label, bars in groups:
        middle = y + len(bars) * BAR / 2 + 4
        out.append(f'<text x="{LABELS - 8}" y="{middle:.1f}" text-anchor="end">{escape(label)}</text>')
        for engine, colour in zip(engines, COLOURS):
            if engine not in bars:
                continue
            end = x(bars[engine])
            out.append(
                f'<rect x="{LABELS}" y="{y}" width="{end - LABELS:.1f}" height="{BAR - 2}" fill="{colour}"/>'
            )
            out.append(f'<text x="{end + 4:.1f}" y="{y + 11}" font-size="11">{time(bars[engine])}</text>')
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
