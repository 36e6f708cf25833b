"""The figures on docs/choosing.md are those of the newest comparison, to which the page links.

Usage: figures_test.py SOURCE
"""

import pathlib
import re
import sys
import unittest

SOURCE = pathlib.Path(sys.argv[1])
RESULTS = SOURCE / "bench/results"
PAGE = (SOURCE / "docs/choosing.md").read_text(encoding="utf-8")
FIGURE = re.compile(r"[\d.,]+(?:×| %)")


class FiguresTest(unittest.TestCase):
    def setUp(self):
        self.newest = max(RESULTS.glob("*-compare.md"))

    def test_the_page_links_to_the_newest_comparison(self):
        linked = set(re.findall(r"bench/results/(\S+-compare)\.(?:md|svg)\)", PAGE))
        self.assertEqual(linked, {self.newest.stem})

    def test_every_figure_was_measured(self):
        measured = FIGURE.findall(self.newest.read_text(encoding="utf-8"))
        cited = FIGURE.findall(PAGE)
        self.assertTrue(cited)
        self.assertEqual([figure for figure in cited if figure not in measured], [])


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
