"""What the benchmarks read from Debian packages: words, misspellings and phrases."""

import re
import subprocess
import sys
from collections import Counter
from pathlib import Path

DICTIONARY = ("wamerican-huge", Path("/usr/share/dict/american-english-huge"))
MISSPELLINGS = ("codespell", Path("codespell_lib/data/dictionary.txt"))
WORDNET = ("wordnet-base", Path("/usr/share/wordnet"))

LETTERS = re.compile("[a-z']+")


def require_packages():
    """Ends the program with a sentence when a package is missing."""
    missing = [name for name, _ in (DICTIONARY, MISSPELLINGS, WORDNET) if not is_installed(name)]
    if missing:
        sys.exit(f"These Debian packages are missing: {' '.join(missing)}. Run scripts/setup-bench.")


def is_installed(package):
    query = ["dpkg-query", "-W", "-f", "${db:Status-Status}", package]
    return subprocess.run(query, capture_output=True, text=True).stdout == "installed"


def dictionary_words():
    """The distinct lower-cased words of ASCII letters and apostrophes, ascending."""
    lines = DICTIONARY[1].read_text(encoding="utf-8").lower().split()
    return sorted({word for word in lines if LETTERS.fullmatch(word)})


def misspellings():
    """Misspellings of ASCII letters and apostrophes, in the order of their list."""
    package, name = MISSPELLINGS
    files = subprocess.run(["dpkg", "-L", package], capture_output=True, text=True, check=True)
    path = next(Path(line) for line in files.stdout.split("\n") if line.endswith(str(name)))
    lines = path.read_text(encoding="utf-8").split("\n")
    wrong = (line.split("->")[0] for line in lines if "->" in line)
    return [word for word in wrong if LETTERS.fullmatch(word)]


def lemmas():
    """WordNet's distinct lemmas as phrases, ascending."""
    phrases = set()
    for part in ("noun", "verb", "adj", "adv"):
        with open(WORDNET[1] / f"index.{part}", encoding="utf-8") as lines:
            # The licence at the head of the files is indented.
            phrases |= {line.split(" ", 1)[0] for line in lines if not line.startswith(" ")}
    return sorted(phrase.replace("_", " ") for phrase in phrases)


def word_frequencies(phrases):
    """In how many phrases each word occurs."""
    return Counter(word for phrase in phrases for word in set(phrase.split()))


def write_lines(path, lines):
    path.parent.mkdir(parents=True, exist_ok=True)
    path.write_text("".join(f"{line}\n" for line in lines), encoding="utf-8")
