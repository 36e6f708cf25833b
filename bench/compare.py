#!/usr/bin/env python3
"""Runs the drivers in turn, several rounds, and writes DATE-compare.md and .svg: to bench/results,
or to build/compare when it runs some of the works only.

Run by scripts/compare, which builds what this runs and says which works there are. What people wrote
about the figures is in what_limits_it.md.
"""

import json
import os
import statistics
import subprocess
import sys
from datetime import date
from pathlib import Path

import agreement
import chart
import machine
from comparison import Figures
from limits import what_limits_it

WORKS = ("w1", "w2", "w3", "w3-large")
ROUNDS = int(os.environ.get("ROUNDS", "3"))
OURS = "wordcatcher"
FIND = "wordcatcher find"
ASK = "wordcatcher query"
QUERY = "Lucene FuzzyQuery"
TERMS = "Lucene terms"
SCAN = "banded scan"
LUCENE = "Lucene 8"
MINISEARCH = "MiniSearch"

ROOT = Path(__file__).resolve().parent.parent
DRIVERS = ROOT / "build/release/bench"
COMPARE = ROOT / "build/compare"
DATA = COMPARE / "data"
RESULTS = ROOT / "bench/results"

LATENCIES = ("mean", "p50", "p99")


def run(*command, cwd=ROOT):
    done = subprocess.run([str(part) for part in command], cwd=cwd, stdout=subprocess.PIPE, check=True)
    return json.loads(done.stdout)


def lucene(*arguments):
    return run("java", "-cp", os.environ["LUCENE_CLASSPATH"], "LuceneFuzzy", *arguments)


def minisearch(phrases, queries):
    program = ROOT / "bench/alternatives/minisearch.mjs"
    return run("node", "--expose-gc", program, phrases, queries, cwd=COMPARE)


def rounds(engines):
    """Runs each engine's driver once a round, in turn; the outputs by engine."""
    outputs = {engine: [] for engine in engines}
    for number in range(ROUNDS):
        for engine, driver in engines.items():
            print(f"round {number + 1} of {ROUNDS}: {engine}", file=sys.stderr)
            outputs[engine].append(driver(number))
    return outputs


def at(output, *path):
    for key in path:
        output = output[key]
    return output


def median(outputs, *path):
    return statistics.median(at(output, *path) for output in outputs)


def ratio(others, ours, path, our_path=None):
    """How many times as long the others take: the median over the rounds."""
    pairs = zip(others, ours)
    return statistics.median(at(other, *path) / at(own, *(our_path or path)) for other, own in pairs)


def number(value):
    return f"{value:,.0f}" if value >= 100 else f"{value:.3g}"


def megabytes(value):
    return f"{value / 1e6:.1f} MB"


def times(outputs, *path):
    return " / ".join(number(median(outputs, *path, name)) for name in LATENCIES)


def table(head, lines):
    cells = [head, ["---"] + ["---:"] * (len(head) - 1), *lines]
    return "".join(f"| {' | '.join(line)} |\n" for line in cells) + "\n"


def words_work():
    """W1: words within k of a misspelling."""
    words = DATA / "w1-words.txt"
    sample = DATA / "w1-sample.txt"
    image = COMPARE / "w1.wci"
    files = {name: COMPARE / f"{name}-found.txt" for name in ("ours", "scan", "lucene")}

    def results(round_number, name):
        return [files[name]] if round_number == 0 else []

    out = rounds({
        OURS: lambda n: run(DRIVERS / "search_work", words, sample, image, *results(n, "ours")),
        LUCENE: lambda n: lucene("words", words, sample, *results(n, "lucene")),
        SCAN: lambda n: run(DRIVERS / "brute_force", words, sample, *results(n, "scan")),
        "all": lambda n: run(DRIVERS / "search_work", words, DATA / "w1-queries.txt", image),
    })
    ours, theirs, scan, whole = out[OURS], out[LUCENE], out[SCAN], out["all"]
    agreeing, only_plain = agreement.check(files["scan"], files["ours"], {LUCENE: files["lucene"]})

    lines = []
    for k in (1, 2, 3):
        name = f"k{k}"
        others = {SCAN: (scan, name)}
        if k < 3:
            others = {QUERY: (theirs, name), TERMS: (theirs, f"terms{k}"), SCAN: (scan, name)}
        row = [f"k={k}", times(ours, name)]
        for engine in (QUERY, TERMS, SCAN):
            if engine not in others:
                row.append("not offered")
                continue
            outputs, key = others[engine]
            faster = ratio(outputs, ours, (key, "mean"), (name, "mean"))
            row.append(f"{times(outputs, key)} ({number(faster)}×)")
        row.append(times(whole, name))
        lines.append(row)

    text = "## W1: all words within k of a misspelling\n\n"
    text += (
        f"{lines_of(words):,} words of wamerican-huge; {lines_of(sample):,} misspellings of codespell, "
        "and in the last column the whole "
        f"{lines_of(DATA / 'w1-queries.txt'):,}. Microseconds: mean / p50 / p99; in brackets how "
        "many times as long as ours on average.\n\n"
    )
    text += table(["look-up", OURS, QUERY, TERMS, SCAN, f"{OURS}, all queries"], lines)
    text += table(["", OURS, LUCENE], [
        ["index", megabytes(median(ours, "indexBytes")), megabytes(median(theirs, "indexBytes"))],
        ["build, s", number(median(ours, "buildSeconds")), number(median(theirs, "buildSeconds"))],
        ["open, ms", number(median(ours, "openSeconds") * 1e3), "not measured"],
    ])
    text += (
        "Agreement: every word that the scan of the whole list finds is found by Lucene (k up to 2), "
        "and by wordcatcher with the same distance, save those that lack the query's first letters "
        "and are within k only when these are left out before anything is read, which its search "
        "does not do. "
    )
    text += "; ".join(
        f"k={k}: {agreeing[k]:,} found by all, {only_plain[k]:,} by plain engines only"
        for k in (1, 2, 3)
    )
    return text + ".\n\n"


def lines_of(path):
    with open(path, "rb") as file:
        return sum(1 for _ in file)


def phrase_driver(driver, name, phrases, kind="plain", queries=None):
    queries = queries or DATA / f"{name}-queries.tsv"
    return run(DRIVERS / driver, phrases, queries, COMPARE / f"{name}.wci", kind)


def percent(part, whole):
    return f"{100 * part / whole:.2f} %"


def found(out, key):
    return [percent(outputs[0][key], outputs[0]["questions"]) for outputs in out.values()]


def compared(out):
    """Latencies, and how many times as long as those of the first engine."""
    ours = next(iter(out.values()))
    return [
        times(outputs, "query")
        + ("" if outputs is ours else f" ({number(ratio(outputs, ours, ('query', 'p50')))}×)")
        for outputs in out.values()
    ]


def phrases_work():
    """W2: a phrase by a misspelled one."""
    phrases = DATA / "w2-phrases.txt"
    queries = DATA / "w2-queries.tsv"
    others = DATA / "w2-other-queries.tsv"
    out = rounds({
        FIND: lambda _: phrase_driver("find_work", "w2", phrases),
        ASK: lambda _: phrase_driver("query_work", "w2", phrases),
        LUCENE: lambda _: lucene("phrases", phrases, queries),
        MINISEARCH: lambda _: minisearch(phrases, queries),
    })
    more = phrase_driver("find_work", "w2", phrases, queries=DATA / "w2-more-queries.tsv")
    other = rounds({
        FIND: lambda _: phrase_driver("find_work", "w2", phrases, queries=others),
        LUCENE: lambda _: lucene("phrases", phrases, others),
        MINISEARCH: lambda _: minisearch(phrases, others),
    })

    def each(show):
        return [show(outputs) for outputs in out.values()]

    text = "## W2: phrases by misspelled ones\n\n"
    text += (
        f"{lines_of(phrases):,} lemmas of wordnet-base, {lines_of(queries):,} questions. In brackets how "
        "many times as long as find in the median. find, Lucene and MiniSearch rank whatever shares "
        "a word, the first ten of them; query answers with what lies within its bound. The source of "
        "a question is found when a phrase of the same words is: some lemmas are there with a hyphen "
        "and with a space, and to an index of words they are one.\n\n"
    )
    opened = number(median(out[ASK], "openSeconds") * 1e3)
    text += table(["", *out], [
        ["query, µs: mean / p50 / p99", *compared(out)],
        ["source first", *found(out, "foundFirst")],
        ["first, spelled just so", *found(out, "spelledFirst")],
        ["source within ten", *found(out, "foundWithinTen")],
        ["index", *each(lambda o: megabytes(median(o, "indexBytes")))],
        ["memory of the index", "mapped", "mapped", "in the index", megabytes(median(out[MINISEARCH], "heapBytes"))],
        ["build from text, s", *each(lambda o: number(median(o, "buildSeconds")))],
        ["open, ms", opened, opened, "not measured", "not measured"],
    ])
    text += (
        f"Of {more['questions']:,} more questions of this kind, which leave less to chance, find has the "
        f"source first for {percent(more['foundFirst'], more['questions'])} (spelled just so for "
        f"{percent(more['spelledFirst'], more['questions'])}) and within ten for "
        f"{percent(more['foundWithinTen'], more['questions'])}.\n\n"
    )
    text += (
        f"Other mistakes, on which nothing was tuned ({lines_of(others):,} questions): two edits in a "
        "word of eight letters or more, neighbours swapped, a word missing, a word split in two, or "
        "two joined. Where a word is missing, the rest is often a lemma of its own.\n\n"
    )
    text += table(["", *other], [
        ["query, µs: mean / p50 / p99", *compared(other)],
        ["source first", *found(other, "foundFirst")],
        ["first, spelled just so", *found(other, "spelledFirst")],
        ["source within ten", *found(other, "foundWithinTen")],
    ])
    return text


def made_work(counts):
    """W3: how a query grows with the number of phrases."""
    lines = []
    turns = {count: min(ROUNDS, max(5_000_000 // count, 1)) for count in counts}
    for count in counts:
        phrases = DATA / f"w3-{count}.txt"
        runs, finds = (
            [phrase_driver(driver, "w3", phrases, "numbered") for _ in range(turns[count])]
            for driver in ("query_work", "find_work")
        )
        lines.append([
            f"{count:,}",
            times(runs, "query"),
            percent(runs[0]["found"], runs[0]["questions"]),
            times(finds, "query"),
            percent(finds[0]["foundWithinTen"], finds[0]["questions"]),
            megabytes(median(runs, "indexBytes")),
            number(median(runs, "buildSeconds")),
            megabytes(median(runs, "buildPeakBytes")),
            number(median(runs, "openSeconds") * 1e3),
        ])
    text = "## W3: many phrases\n\n"
    text += (
        "Phrases made of WordNet's words with their frequencies, numbered; the same questions of "
        "the first million for each. A source is found as the very record, within ten as any phrase "
        "of its words. "
        + "; ".join(f"{count:,} phrases: {in_words(turns[count])}" for count in counts)
        + ".\n\n"
    )
    text += table(
        ["phrases", "query, µs: mean / p50 / p99", "source found", "find, µs", "phrase within ten", "index", "build, s", "peak memory", "open, ms"],
        lines,
    )
    return text


def in_words(turns):
    return "one round" if turns == 1 else f"medians of {turns} rounds"


def introduction(others):
    """`others`: the part of the processors' time that other processes took."""
    text = (
        f"# Comparison, {date.today()}\n\n{machine.model()}, {os.cpu_count()} cores, of whose time other "
        f"processes took {100 * others:.0f} % meanwhile. One thread, warm, {in_words(ROUNDS)} in which the "
        "engines take turns; of each question the median of three passes counts (one pass of the scan)"
    )
    text += "" if ROUNDS == 1 else "; ratios are medians of the rounds' ratios"
    return text + ". Written by scripts/compare.\n\n"


def measured(works, name):
    """The page without its introduction, and its chart, if any."""
    text = words_work() if "w1" in works else ""
    text += phrases_work() if "w2" in works else ""
    drawn = chart.of_page(text) if text else None
    text += f"![Times of queries]({name}.svg)\n\n" if text else ""
    counts = [count for work, count in (("w3", 1_000_000), ("w3-large", 5_000_000)) if work in works]
    text += made_work(counts) if counts else ""
    if set(works) == set(WORKS):
        text += what_limits_it(Figures(text))
    return text, drawn


def main(works):
    unknown = sorted(set(works) - set(WORKS))
    if unknown:
        sys.exit(f"There is no work {', '.join(unknown)}; there are {', '.join(WORKS)}.")
    name = f"{date.today()}-compare"
    # The results are whole pages.
    directory = RESULTS if set(works) == set(WORKS) else COMPARE
    watch = machine.Watch()
    text, drawn = measured(works, name)
    text = introduction(watch.others()) + text
    (directory / f"{name}.md").write_text(text.rstrip() + "\n", encoding="utf-8")
    if drawn:
        (directory / f"{name}.svg").write_text(drawn, encoding="utf-8")
    print(text)


if __name__ == "__main__":
    main(sys.argv[1:] or WORKS)
