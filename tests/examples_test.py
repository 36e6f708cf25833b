"""The tutorials' programs with input that their pages do not show.

Usage: examples_test.py DIRECTORY...; the programs stand in the directories.
"""

import os
import shutil
import subprocess
import sys
import tempfile
import unittest

PATH = os.pathsep.join([*sys.argv[1:], os.environ["PATH"]])


class ExampleTest(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.root = directory.name

    def run_it(self, *command, stdin=""):
        return subprocess.run(command, input=stdin, capture_output=True, text=True, cwd=self.root,
                              env=dict(os.environ, PATH=PATH), timeout=120)

    def write(self, name, content):
        with open(os.path.join(self.root, name), "wb") as file:
            file.write(content if isinstance(content, bytes) else content.encode())

    def expect_complaint(self, words, *command):
        done = self.run_it(*command)
        self.assertNotEqual(done.returncode, 0)
        self.assertEqual((done.stdout, done.stderr.count("\n")), ("", 1), done.stderr)
        for word in words:
            self.assertIn(word, done.stderr)


class TagTextsTest(ExampleTest):
    def tags(self, phrases, texts):
        self.write("phrases", "".join(f"{phrase}\n" for phrase in phrases))
        done = self.run_it("tag_texts", "phrases", stdin="".join(f"{text}\n" for text in texts))
        self.assertEqual((done.returncode, done.stderr), (0, ""))
        return [tuple(line.split("\t")) for line in done.stdout.splitlines()]

    def test_every_phrase_finds_itself(self):
        names = ["Guinea-Bissau", "Saint Kitts & Nevis", "Côte d'Ivoire", "İstanbul", "日本語",
                 "foo_bar", "U.S. Virgin Islands", "3.14 m²", "Åland  Islands", "A {small} b",
                 "Straße", "Ⅷ. Bezirk"]
        for number, name in enumerate(names):
            self.assertIn(("1", name, f"key{number}", "0"),
                          self.tags([f"{each}\tkey{i}" for i, each in enumerate(names)], [name]))

    def test_a_phrase_that_lacks_a_word_is_no_tag(self):
        names = ["Guinea-Bissau\tGW", "Saint Kitts & Nevis\tKN"]
        self.assertEqual(self.tags(names, ["Guinea", "Saint Kitts", "Nevis", "saint bissau"]), [])
        self.assertEqual(self.tags(names, ["kits or nevis, saint", "bissau, guinea"]),
                         [("1", "Saint Kitts & Nevis", "KN", "1"), ("2", "Guinea-Bissau", "GW", "0")])

    def test_a_phrase_without_a_key_has_an_empty_one(self):
        self.assertEqual(self.tags(["New Zealand", "Guinea\tGN"], ["guinea", "new zeeland"]),
                         [("1", "Guinea", "GN", "0"), ("2", "New Zealand", "", "1")])

    def test_phrases_that_lack_words_are_in_nobodys_way(self):
        # With two words of three they come first.
        names = [f"island number zone{i}\tkey{i}" for i in range(200)] + ["island\tI"]
        self.assertEqual(self.tags(names, ["island number"]), [("1", "island", "I", "0")])

    def test_phrases_that_cannot_be_read_are_named(self):
        self.expect_complaint(["absent"], "tag_texts", "absent")
        self.write("bad", b"Fran\xe7ois\n")
        self.expect_complaint(["bad, line 1"], "tag_texts", "bad")
        self.expect_complaint(["usage"], "tag_texts")


class NamesRegisterTest(ExampleTest):
    def test_a_register_that_cannot_be_read_is_named(self):
        self.expect_complaint(["register absent"], "names_register", "absent", ".")
        self.expect_complaint(["register ."], "names_register", ".", ".")

    def test_an_empty_register_is_one(self):
        self.write("register", "")
        done = self.run_it("names_register", "register", ".", stdin="Jon Smith\n")
        self.assertEqual((done.returncode, done.stdout, done.stderr), (0, "", ""))


# The module is not there when everything else is built with a sanitizer.
@unittest.skipUnless(shutil.which("search_box.py", path=PATH), "the search box is not tried")
class SearchBoxTest(ExampleTest):
    def test_names_that_cannot_be_read_are_named(self):
        script = shutil.which("search_box.py", path=PATH)
        self.expect_complaint(["Cannot read", "absent"], "/usr/bin/python3", script, "absent")
        self.write("bad", b"Fran\xe7ois\n")
        self.expect_complaint(["Cannot read"], "/usr/bin/python3", script, "bad")


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1])
