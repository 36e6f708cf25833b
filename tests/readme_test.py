"""The examples of the README and of the page about the classic interface, as they stand: those in C and
C++ are compiled and run, those for the shell typed."""

import os
import pathlib
import re
import subprocess
import sys
import tempfile
import unittest

SOURCE, WORDCATCHER, CPP, C, QUICK_START, IMAGE = (pathlib.Path(path) for path in sys.argv[1:7])
README = (SOURCE / "README.md").read_text(encoding="utf-8")
CLASSIC = (SOURCE / "docs/classic.md").read_text(encoding="utf-8")


def block(page, language):
    return re.search(rf"```{re.escape(language)}\n(.*?)```", page, re.DOTALL).group(1)


def printed_by(*programs):
    """What the last of the programs prints when they run in one directory."""
    with tempfile.TemporaryDirectory() as directory:
        for program in programs:
            printed = subprocess.run([program], cwd=directory, check=True, text=True,
                                     stdout=subprocess.PIPE).stdout
        return printed


class ReadmeTest(unittest.TestCase):
    def test_example_in_cpp_prints_what_the_readme_says(self):
        self.assertEqual(printed_by(CPP), block(README, "text"))

    def test_example_in_c_prints_what_its_comment_says(self):
        comment = re.search(r"/\* (.*) \*/\n", block(README, "c")).group(1)
        self.assertEqual(printed_by(CPP, C), comment + "\n")

    def test_shell_example_prints_what_the_readme_says(self):
        environment = dict(os.environ, PATH=f"{WORDCATCHER.parent}:{os.environ['PATH']}")
        with tempfile.TemporaryDirectory() as directory:
            for step in block(README, "console").split("$ ")[1:]:
                command, _, expected = step.partition("\n")
                with self.subTest(command=command):
                    printed = subprocess.run(
                        command, shell=True, cwd=directory, env=environment, text=True,
                        check=False, stdout=subprocess.PIPE, stderr=subprocess.DEVNULL).stdout
                    self.assertEqual(printed, expected)


class ClassicPageTest(unittest.TestCase):
    def test_quick_start_prints_what_the_page_says(self):
        self.assertEqual(printed_by(QUICK_START), block(CLASSIC, "text"))

    def test_index_example_prints_what_its_comment_says(self):
        comment = re.search(r"// (.*\n)", block(CLASSIC, "c++")).group(1)
        self.assertEqual(printed_by(IMAGE), comment)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
