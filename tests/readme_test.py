"""The README's examples, as they stand: the C++ ones are compiled and run, the shell one typed."""

import os
import pathlib
import re
import subprocess
import sys
import tempfile
import unittest

SOURCE, WORDCATCHER, QUICK_START, INDEX = (pathlib.Path(path) for path in sys.argv[1:5])
README = (SOURCE / "README.md").read_text(encoding="utf-8")


def block(language):
    return re.search(rf"```{re.escape(language)}\n(.*?)```", README, re.DOTALL).group(1)


def printed_by(program):
    with tempfile.TemporaryDirectory() as directory:
        return subprocess.run([program], cwd=directory, check=True, text=True,
                              stdout=subprocess.PIPE).stdout


class ReadmeTest(unittest.TestCase):
    def test_quick_start_prints_what_the_readme_says(self):
        self.assertEqual(printed_by(QUICK_START), block("text"))

    def test_index_example_prints_what_its_comment_says(self):
        self.assertEqual(printed_by(INDEX), re.search(r"// (.*\n)", block("c++")).group(1))

    def test_shell_example_prints_what_the_readme_says(self):
        environment = dict(os.environ, PATH=f"{WORDCATCHER.parent}:{os.environ['PATH']}")
        with tempfile.TemporaryDirectory() as directory:
            for step in block("console").split("$ ")[1:]:
                command, _, expected = step.partition("\n")
                with self.subTest(command=command):
                    printed = subprocess.run(
                        command, shell=True, cwd=directory, env=environment, text=True,
                        check=False, stdout=subprocess.PIPE, stderr=subprocess.DEVNULL).stdout
                    self.assertEqual(printed, expected)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
