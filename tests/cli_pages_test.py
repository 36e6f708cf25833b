"""The command's man pages and completions, as they are installed.

Usage: cli_pages_test.py PROGRAM DIRECTORY [unittest arguments]; the pages stand in the directory.
"""

import os
import pty
import re
import select
import subprocess
import sys
import tempfile
import time
import unittest

PROGRAM, PAGES = (os.path.abspath(path) for path in sys.argv[1:3])
BASH_COMPLETION = os.path.join(PAGES, "bash", "wordcatcher")

PATIENCE = 120  # seconds, on a busy machine too

VERBS = ["index", "find", "explain", "query", "search", "info", "verify", "encode", "dot"]
PATHS = [[], *([verb] for verb in VERBS), ["dot", "nfa"], ["dot", "dfa"], ["dot", "tree"]]


def help_of(path):
    return subprocess.run([PROGRAM, *path, "--help"], check=True, capture_output=True,
                          text=True).stdout


def options_of(path):
    """The long options that --help shows at the begin of their lines."""
    return sorted(set(re.findall(r"^ +(?:-h,)?(--[a-z-]+)", help_of(path).split("\n\n\n")[0], re.M)))


class CompletionTest(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.root = directory.name
        for name in ("dogs.wci", "dog names.txt", "cats.wci"):
            open(os.path.join(self.root, name), "w").close()


class BashCompletionTest(CompletionTest):
    def complete(self, *words):
        """What bash offers for the last word, with the words split as bash splits them."""
        script = ('source "$1"; shift; COMP_WORDS=(wordcatcher "$@"); COMP_CWORD=$#; _wordcatcher; '
                  'printf "%s\\n" "${COMPREPLY[@]}"')
        done = subprocess.run(["bash", "-uc", script, "bash", BASH_COMPLETION, *words],
                              cwd=self.root, capture_output=True, text=True)
        self.assertEqual(done.stderr, "")
        return sorted(done.stdout.split("\n")[:-1]) if done.stdout != "\n" else []

    def test_verbs(self):
        self.assertEqual(self.complete(""), sorted(VERBS))
        self.assertEqual(self.complete("e"), ["encode", "explain"])
        self.assertEqual(self.complete("dot", ""), ["dfa", "nfa", "tree"])

    def test_options_are_those_of_the_help(self):
        for path in PATHS:
            self.assertGreater(len(options_of(path)), 0, path)
            self.assertEqual(self.complete(*path, "--"), options_of(path), path)
        self.assertEqual(self.complete("find", "dogs.wci", "golden", "--ma"),
                         ["--max-cost", "--max-postings"])
        self.assertEqual(self.complete("find", "dogs.wci", "--", "--ma"), [])

    def test_values_of_options(self):
        self.assertEqual(self.complete("find", "--overlaps", ""), ["all", "longest", "no-sub"])
        self.assertEqual(self.complete("find", "--overlaps", "=", "l"), ["longest"])
        self.assertEqual(self.complete("find", "--overlaps", "="), ["all", "longest", "no-sub"])
        self.assertEqual(self.complete("index", "--mode", "ph"), ["phonetic"])
        self.assertEqual(self.complete("find", "--limit", ""), [])

    def test_files_where_a_path_is_asked_for(self):
        everything = ["cats.wci", "dog names.txt", "dogs.wci"]
        self.assertEqual(self.complete("find", ""), everything)
        self.assertEqual(self.complete("find", "--limit", "3", "--json", "dog"), everything[1:])
        self.assertEqual(self.complete("find", "--overlaps", "=", "all", "c"), ["cats.wci"])
        self.assertEqual(self.complete("dot", "tree", "do"), everything[1:])
        self.assertEqual(self.complete("index", "new.wci", "dogs.wci", "dog "), ["dog names.txt"])

    def test_no_files_where_a_text_is_asked_for(self):
        for words in (["find", "dogs.wci", ""], ["find", "dogs.wci", "golden", ""],
                      ["encode", ""], ["dot", "nfa", ""], ["explain", "dogs.wci", ""],
                      ["info", "dogs.wci", ""]):
            self.assertEqual(self.complete(*words), [], words)


# Control-O completes what was typed, and writes the line as it then stands.
ZSH_SETUP = r'''
PS1= PS2= RPS1= HISTFILE=
setopt no_beep no_always_to_end
fpath=("$1" $fpath)
autoload -Uz compinit && compinit -u -D
whole-line() { zle expand-or-complete; print -r -- "$BUFFER" >> lines; BUFFER= }
zle -N whole-line
bindkey '^O' whole-line
print ready > lines
'''


class ZshCompletionTest(CompletionTest):
    def setUp(self):
        super().setUp()
        self.script = os.path.join(PAGES, "zsh", "_wordcatcher")

    def lines(self, master, count):
        """What zsh wrote, once that are so many lines; what it shows goes nowhere."""
        deadline = time.monotonic() + PATIENCE
        path = os.path.join(self.root, "lines")
        while time.monotonic() < deadline:
            while select.select([master], [], [], 0.01)[0]:
                os.read(master, 4096)
            if os.path.exists(path):
                with open(path, encoding="utf-8") as file:
                    if len(lines := file.read().split("\n")[:-1]) >= count:
                        return lines
        self.fail(f"zsh wrote no {count} lines")

    def complete(self, *typed):
        """Each line as a person at a terminal gets it completed."""
        setup = os.path.join(self.root, ".setup")
        with open(setup, "w", encoding="utf-8") as file:
            file.write(ZSH_SETUP)
        master, terminal = pty.openpty()
        zsh = subprocess.Popen(["zsh", "-f", "-i"], stdin=terminal, stdout=terminal,
                               stderr=terminal, cwd=self.root, start_new_session=True,
                               env={"PATH": os.environ["PATH"], "TERM": "dumb", "HOME": self.root,
                                    "LC_ALL": "C.UTF-8"})
        os.close(terminal)
        try:
            os.write(master, f". ./.setup '{os.path.dirname(self.script)}'\n".encode())
            self.lines(master, 1)
            for count, line in enumerate(typed, start=2):
                os.write(master, line.encode() + b"\x0f")
                lines = self.lines(master, count)
        finally:
            zsh.kill()
            zsh.wait()
            os.close(master)
        return lines[1:]

    def test_what_is_typed_is_completed(self):
        expected = {
            "wordcatcher fi": "wordcatcher find ",
            "wordcatcher dot tr": "wordcatcher dot tree ",
            "wordcatcher find --overl": "wordcatcher find --overlaps=",
            "wordcatcher find --overlaps=lo": "wordcatcher find --overlaps=longest ",
            "wordcatcher find --json --max-p": "wordcatcher find --json --max-postings=",
            "wordcatcher index --mode=ph": "wordcatcher index --mode=phonetic ",
            "wordcatcher find dogs": "wordcatcher find dogs.wci ",
            "wordcatcher explain --json c": "wordcatcher explain --json cats.wci ",
            "wordcatcher index new.wci dog\\ ": "wordcatcher index new.wci dog\\ names.txt ",
            # A text is no file, and no verb begins so.
            "wordcatcher find dogs.wci ca": "wordcatcher find dogs.wci ca",
            "wordcatcher xy": "wordcatcher xy",
        }
        self.assertEqual(self.complete(*expected), list(expected.values()))

    def test_syntax(self):
        done = subprocess.run(["zsh", "-n", self.script], capture_output=True, text=True)
        self.assertEqual((done.returncode, done.stderr), (0, ""))

    def test_each_verb_has_its_options(self):
        with open(self.script, encoding="utf-8") as file:
            text = file.read()
        self.assertTrue(text.startswith("#compdef wordcatcher\n"))
        for path in PATHS:
            function = re.search(rf"^{'_'.join(['_wordcatcher', *path])}\(\) {{\n(.*?)^}}", text,
                                 re.M | re.S).group(1)
            self.assertEqual(sorted(set(re.findall(r"'(--[a-z-]+)=?\[", function))),
                             options_of(path))


class ManPageTest(unittest.TestCase):
    def test_every_verb_has_a_page(self):
        self.assertEqual(sorted(os.listdir(os.path.join(PAGES, "man1"))),
                         sorted("-".join(["wordcatcher", *path]) + ".1" for path in PATHS))

    def rendered(self, path):
        page = os.path.join(PAGES, "man1", "-".join(["wordcatcher", *path]) + ".1")
        done = subprocess.run(["groff", "-man", "-Tutf8", "-ww", "-P-cbou", "-rLL=200n", "-rHY=0",
                               page],
                              capture_output=True, text=True)
        self.assertEqual((done.returncode, done.stderr), (0, ""), page)
        return done.stdout

    def test_pages_are_without_warnings_and_say_what_the_help_says(self):
        for path in PATHS:
            page, help_text = self.rendered(path), help_of(path)
            for option in options_of(path):
                self.assertRegex(page, rf"(?m)^ +(-h, )?{option}\b")
            # Line breaks and justified spaces aside.
            flat = " ".join(page.split())
            for paragraph in re.split(r"\n\n+", help_text.split("\n\n\n")[1]):
                for part in re.split("^Exit codes: |Examples:\n", paragraph):
                    self.assertIn(" ".join(part.split()), flat)
            headings = re.findall(r"^([A-Z ]+)$", page, re.M)
            self.assertEqual(headings[:2], ["NAME", "SYNOPSIS"])
            self.assertIn("EXAMPLES", headings)

    def test_pages_can_be_found_by_their_summary(self):
        for path in PATHS:
            name = "-".join(["wordcatcher", *path])
            parsed = subprocess.run(["lexgrog", os.path.join(PAGES, "man1", name + ".1")],
                                    capture_output=True, text=True).stdout
            self.assertIn(f'"{name} - ', parsed)


if __name__ == "__main__":
    unittest.main(argv=[sys.argv[0], *sys.argv[3:]])
