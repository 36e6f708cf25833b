"""A page shows its examples as they are, and what they print: its shell examples are typed in.

Usage: pages_test.py SOURCE PAGE [DIRECTORY...]

A listing behind a comment with a file's name is that file, whole. Shell examples run in one directory
of their own, one after the other, with the DIRECTORYs in PATH. After a change run this with
WORDCATCHER_UPDATE_DOCS=1 in the environment: it then writes the page instead of checking it.
"""

import os
import pathlib
import re
import subprocess
import sys
import tempfile
import unittest

SOURCE = pathlib.Path(sys.argv[1])
PAGE = SOURCE / sys.argv[2]
PATH = os.pathsep.join([*sys.argv[3:], os.environ["PATH"]])

LISTING = re.compile(r"<!-- (\S+) -->\n\n```(\w+)\n(.*?)```\n", re.DOTALL)
SHELL = re.compile(r"```console\n(.*?)```\n", re.DOTALL)


def with_listing(match):
    name, language, _ = match.groups()
    code = (SOURCE / name).read_text(encoding="utf-8")
    return f"<!-- {name} -->\n\n```{language}\n{code}```\n"


def typed(match, directory):
    lines = ["```console"]
    for step in match.group(1).split("$ ")[1:]:
        command = step.partition("\n")[0]
        printed = subprocess.run(
            command, shell=True, cwd=directory, env=dict(os.environ, PATH=PATH), check=True,
            encoding="utf-8", stdout=subprocess.PIPE, stderr=subprocess.DEVNULL).stdout
        lines += [f"$ {command}", *printed.splitlines()]
    return "\n".join([*lines, "```", ""])


class PageTest(unittest.TestCase):
    maxDiff = None

    def test_shows_its_examples_and_what_they_print(self):
        page = PAGE.read_text(encoding="utf-8")
        expected = LISTING.sub(with_listing, page)
        with tempfile.TemporaryDirectory() as directory:
            expected = SHELL.sub(lambda match: typed(match, directory), expected)
        self.assertRegex(expected, SHELL)
        if "WORDCATCHER_UPDATE_DOCS" in os.environ:
            PAGE.write_text(expected, encoding="utf-8")
        else:
            self.assertEqual(page, expected)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
