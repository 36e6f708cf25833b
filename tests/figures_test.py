"""The figures on docs/choosing.md are those of the newest comparison, to which the page links, and so is
the comparison's chart; what compare.py writes holds what it should.

Usage: figures_test.py SOURCE

On the page a comment before each figure tells its place in the comparison, as bench/comparison.py
explains: <!-- W2: query: Lucene 8: ratio -->28.6×. After a new comparison run this with
WORDCATCHER_UPDATE_DOCS=1 in the environment: it then writes links and figures of the page, and the
chart, instead of checking them. Read the sentences around the figures afterwards.
"""

import contextlib
import io
import os
import pathlib
import re
import sys
import tempfile
import unittest
import unittest.mock
import xml.etree.ElementTree

SOURCE = pathlib.Path(sys.argv[1]).resolve()
UPDATE = "WORDCATCHER_UPDATE_DOCS" in os.environ
sys.dont_write_bytecode = True
sys.path.insert(0, str(SOURCE / "bench"))

import chart  # noqa: E402
import compare  # noqa: E402
import limits  # noqa: E402
from comparison import Figures, value  # noqa: E402

RESULTS = SOURCE / "bench/results"
CHOOSING = SOURCE / "docs/choosing.md"
NEWEST = max(RESULTS.glob("*-compare.md"))
FIGURE = r"[\d.,]+(?:×| %)"
CITED = re.compile(rf"<!-- ([^>]*?: [^>]*?) -->({FIGURE})")
SVG = "{http://www.w3.org/2000/svg}"


def text_of(path):
    return path.read_text(encoding="utf-8")


def brought_up_to_date(page, comparison, name):
    """The page with the figures of a comparison, and links to it."""
    figures = Figures(comparison)
    linked = re.sub(r"(bench/results/)[\d-]+-compare(?=\.(?:md|svg)\))", rf"\g<1>{name}", page)
    return CITED.sub(lambda match: f"<!-- {match[1]} -->{figures.at(match[1])}", linked)


class ChoosingTest(unittest.TestCase):
    maxDiff = None

    def test_figures_and_links_are_those_of_the_newest_comparison(self):
        page = text_of(CHOOSING)
        expected = brought_up_to_date(page, text_of(NEWEST), NEWEST.stem)
        if UPDATE:
            CHOOSING.write_text(expected, encoding="utf-8")
        else:
            self.assertEqual(page, expected)

    def test_each_figure_tells_its_place(self):
        page = text_of(CHOOSING)
        self.assertEqual(re.findall(FIGURE, CITED.sub("", page)), [])
        self.assertEqual(len(re.findall(r"<!-- W", page)), len(CITED.findall(page)))
        self.assertNotRegex(page, r"(?m)^<!-- W", "a comment that begins a line ends the paragraph")

    def test_exchanged_figures_are_seen(self):
        comparison = text_of(NEWEST)
        page = brought_up_to_date(text_of(CHOOSING), comparison, NEWEST.stem)
        one, other, *_ = dict.fromkeys(figure for _, figure in CITED.findall(page))
        exchanged = page.replace(one, "\0").replace(other, one).replace("\0", other)
        self.assertNotEqual(exchanged, page)
        self.assertEqual(brought_up_to_date(exchanged, comparison, NEWEST.stem), page)

    def test_another_comparison_changes_figures_and_links(self):
        comparison = re.sub(r"\d(?= %)", "5", text_of(NEWEST).replace("×)", "7×)"))
        changed = brought_up_to_date(text_of(CHOOSING), comparison, "2031-01-02-compare")
        figures = [figure for _, figure in CITED.findall(changed)]
        self.assertEqual([f for f in figures if not re.search("5 %|7×", f)], [])
        self.assertIn("(../bench/results/2031-01-02-compare.md)", changed)
        self.assertNotIn(NEWEST.stem, changed)

    def test_a_place_that_there_is_not_is_told(self):
        figures = Figures(text_of(NEWEST))
        for place in ("W9: query: Lucene 8", "W2: source: Lucene 8", "W2: query: Lucene 9: p50",
                      "W2: query: wordcatcher find: ratio", "W1: k=3: Lucene terms: p50"):
            with self.subTest(place), self.assertRaises(KeyError):
                figures.at(place)


def bars_of(figures):
    """What has to be drawn, as "phrases: MiniSearch"."""
    bars = [f"phrases: {engine}" for engine in figures.rows("W2")["query, µs: mean / p50 / p99"]]
    for row, cells in figures.rows("W1").items():
        bars += [f"words, {row}: {engine}" for engine, cell in cells.items()
                 if cell != "not offered" and engine != "wordcatcher, all queries"]
    return bars


class ChartTest(unittest.TestCase):
    maxDiff = None

    def test_is_drawn_from_the_comparisons_page(self):
        drawn = NEWEST.with_suffix(".svg")
        expected = chart.of_page(text_of(NEWEST))
        if UPDATE:
            drawn.write_text(expected, encoding="utf-8")
        else:
            self.assertEqual(text_of(drawn), expected)

    def test_each_engine_has_its_bars_and_stands_in_the_legend(self):
        drawn = xml.etree.ElementTree.parse(NEWEST.with_suffix(".svg")).getroot()
        rectangles = drawn.findall(f"{SVG}rect")
        bars = {bar.find(f"{SVG}title").text: bar.get("fill")
                for bar in rectangles if bar.find(f"{SVG}title") is not None}
        self.assertCountEqual(bars, bars_of(Figures(text_of(NEWEST))))
        legend = {}
        for box in rectangles:
            for text in drawn.findall(f"{SVG}text[@class='legend']"):
                if (int(text.get("x")) - int(box.get("x", "0")) == 16
                        and int(text.get("y")) - int(box.get("y", "0")) == 10):
                    legend[text.text] = box.get("fill")
                    self.assertLess(int(text.get("x")) + 7 * len(text.text), int(drawn.get("width")))
        self.assertEqual({title.partition(": ")[2]: fill for title, fill in bars.items()}, legend)
        self.assertEqual(len(set(legend.values())), len(legend), "a colour for each")

    def test_more_engines_than_colours_are_an_error(self):
        many = {f"engine {number}": 1.0 + number for number in range(len(chart.COLOURS) + 1)}
        with self.assertRaises(ValueError):
            chart.svg("Many", [("all", many)])
        many.popitem()
        self.assertIn("engine 7", chart.svg("Many", [("all", many)]))

    def test_a_long_legend_wraps(self):
        engines = [f"engine number {number}" for number in range(8)]
        entries = list(chart.legend(engines))
        self.assertGreater(entries[-1][2], entries[0][2])
        for engine, left, _ in entries:
            self.assertLessEqual(left + 16 + 7 * len(engine), chart.WIDTH)


TIMES = {"mean": 4.0, "p50": 3.0, "p99": 9.0}
PHRASES = {
    "query": TIMES, "questions": 4, "found": 3, "foundFirst": 2, "spelledFirst": 1, "foundWithinTen": 3,
    "indexBytes": 5e6, "heapBytes": 6e6, "buildPeakBytes": 7e6, "buildSeconds": 0.5,
    "openSeconds": 1e-4,
}
WORDS = {"indexBytes": 8e6, "buildSeconds": 0.25, "openSeconds": 1e-4}
WORDS |= {name: TIMES for name in ("k1", "k2", "k3", "terms1", "terms2")}


def slowed(output, factor):
    return {key: slowed(part, factor) if isinstance(part, dict) else part * factor
            for key, part in output.items()}


class CompareTest(unittest.TestCase):
    """What compare.py makes of drivers' outputs that are made up."""

    def setUp(self):
        made = tempfile.TemporaryDirectory()
        self.addCleanup(made.cleanup)
        self.directory = pathlib.Path(made.name)
        for folder in ("data", "results"):
            (self.directory / folder).mkdir()
        for name in ("w1-words.txt", "w1-sample.txt", "w1-queries.txt", "w2-phrases.txt",
                     "w2-queries.tsv", "w2-other-queries.tsv", "w2-more-queries.tsv"):
            (self.directory / "data" / name).write_text("one\ntwo\n", encoding="utf-8")
        self.results = self.directory / "results"

    def page(self, works=compare.WORKS, rounds=3):
        def words_or_phrases(driver, *_):
            return WORDS if pathlib.Path(driver).name in ("search_work", "brute_force") else PHRASES

        replaced = {
            "run": words_or_phrases,
            "lucene": lambda work, *_: slowed(WORDS if work == "words" else PHRASES, 10),
            "minisearch": lambda *_: slowed(PHRASES, 20),
            "COMPARE": self.directory, "DATA": self.directory / "data", "RESULTS": self.results,
            "ROUNDS": rounds,
        }
        agreed = ({1: 1, 2: 2, 3: 3}, {1: 0, 2: 0, 3: 0})
        with unittest.mock.patch.multiple(compare, **replaced), \
                unittest.mock.patch("agreement.check", lambda *_: agreed), \
                contextlib.redirect_stdout(io.StringIO()), contextlib.redirect_stderr(io.StringIO()):
            compare.main(works)
        (page,) = [*self.results.glob("*.md"), *self.directory.glob("*.md")]
        return text_of(page)

    def test_what_people_wrote_is_kept(self):
        hand_written = [line for line in text_of(limits.TEXT).splitlines() if "{" not in line]
        self.assertGreater(len(hand_written), 10)
        for _ in range(2):
            lines = self.page().splitlines()
            self.assertEqual([line for line in hand_written if line not in lines], [])

    def test_figures_in_what_people_wrote_are_those_measured(self):
        self.assertNotRegex(self.page(), r"[{}]")
        self.assertIn("The 99th percentile, 9 µs\nbeside 3 µs in the median",
                      self.page().replace("\n  ", "\n"))

    def test_aims_are_judged_by_what_was_measured(self):
        page = self.page()
        self.assertIn("| W1 k=1, mean | 2 µs | 4 µs | missed |", page)
        self.assertIn("| W1 k=3, mean | 170 µs | 4 µs | reached |", page)
        self.assertIn("| W2 find, source's words first | 99.5 % | 50.00 % | missed |", page)
        self.assertIn("| W2 build | 1 s | 0.5 s | reached |", page)
        self.assertIn("| W3, 5 M against 1 M: query, p50 | 3 times | 1 times | reached |", page)

    def test_rounds_are_told_as_they_were(self):
        self.assertIn("warm, medians of 3 rounds in which", self.page())
        self.assertIn("1,000,000 phrases: medians of 3 rounds; 5,000,000 phrases: one round.", self.page())
        alone = self.page(rounds=1)
        self.assertIn("warm, one round in which", alone)
        self.assertNotRegex(alone, r"medians of|1 rounds")

    def test_others_work_meanwhile_is_told(self):
        with unittest.mock.patch.object(compare.machine.Watch, "others", lambda _: 0.123):
            self.assertIn("of whose time other processes took 12 % meanwhile", self.page())

    def test_the_chart_is_that_of_the_page(self):
        page = self.page()
        (drawn,) = self.results.glob("*.svg")
        self.assertEqual(text_of(drawn), chart.of_page(page))
        self.assertIn(f"]({drawn.name})", page)

    def test_some_of_the_works_are_no_result(self):
        self.assertIn("## W1", self.page(["w1"]))
        self.assertEqual(list(self.results.iterdir()), [])

    def test_the_pages_figures_can_be_cited(self):
        page = self.page()
        cited = brought_up_to_date(text_of(CHOOSING), page, "2031-01-02-compare")
        self.assertEqual({figure for _, figure in CITED.findall(cited)},
                         {"10×", "20×", "50.00 %", "25.00 %"})


class MachineTest(unittest.TestCase):
    def test_others_are_all_but_this_process_and_its_children(self):
        machine = compare.machine
        seconds = iter([(100.0, 50.0), (120.0, 60.0)])
        own = iter([3.0, 8.0])
        with unittest.mock.patch.object(machine, "processor_seconds", lambda: next(seconds)), \
                unittest.mock.patch.object(machine, "own_seconds", lambda: next(own)):
            self.assertEqual(machine.Watch().others(), 0.25)

    def test_the_system_counts_seconds(self):
        passed, busy = compare.machine.processor_seconds()
        self.assertGreater(passed, busy)
        self.assertGreater(busy, 0)
        self.assertEqual(value("1,434 µs"), 1434)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
