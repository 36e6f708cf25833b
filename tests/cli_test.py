"""What the wordcatcher command promises, tried on the built program.

Usage: cli_test.py PROGRAM VERSION [unittest arguments]
"""

import contextlib
import fcntl
import json
import os
import pty
import re
import resource
import select
import shutil
import signal
import subprocess
import sys
import tempfile
import termios
import time
import unittest

PROGRAM = ""
VERSION = ""

EDGES, DATA, FINALS = TABLES = ("edgeTable.tdb", "dataTable.tdb", "finalTable.tdb")
PATIENCE = 120  # seconds, on a busy machine and with sanitizers too

VERBS = ("index", "find", "explain", "query", "search", "info", "verify", "encode", "dot")

DOGS = "golden retriever puppy\t7\ngolden gate bridge\t8\n"
PUPPY = "golden retriever puppy{ 7 }"
BRIDGE = "golden gate bridge{ 8 }"


def limit_file_size(limit):
    return lambda: resource.setrlimit(resource.RLIMIT_FSIZE, (limit, limit))


def many_phrases(count):
    return "".join(f"retriever number{i} kennel{i}\n" for i in range(count))


@contextlib.contextmanager
def locked(path):
    """Holds a file's lock as another process with the table open does."""
    with open(path, "rb") as file:
        fcntl.flock(file, fcntl.LOCK_EX)
        yield


class CommandTest(unittest.TestCase):
    """Tests index into images; those with `tables` set, into the tables of classic indexes."""
    tables = False

    def setUp(self):
        self.root = tempfile.mkdtemp(prefix="wordcatcher-cli-")
        self.addCleanup(shutil.rmtree, self.root)
        self.dogs = self.path("dogs" if self.tables else "dogs.wci")
        self.index_verb = ["index", "--tables"] if self.tables else ["index"]

    def path(self, *names):
        return os.path.join(self.root, *names)

    def write(self, name, content):
        with open(self.path(name), "wb") as file:
            file.write(content if isinstance(content, bytes) else content.encode())
        return self.path(name)

    def run_it(self, *arguments, stdin="", **options):
        stdin = stdin if isinstance(stdin, bytes) else stdin.encode()
        done = subprocess.run([PROGRAM, *arguments], input=stdin, capture_output=True,
                              timeout=PATIENCE, **options)
        self.out, self.err = done.stdout.decode(), done.stderr.decode()
        return done.returncode

    def succeed(self, *arguments, **options):
        code = self.run_it(*arguments, **options)
        self.assertEqual(code, 0, self.err)
        return self.out

    def fail_with(self, *words, of, **options):
        """The command must fail with one line on standard error that holds these words."""
        self.assertEqual(self.run_it(*of, **options), 2, self.err)
        self.assertEqual(self.out, "")
        self.assertEqual(self.err.count("\n"), 1, self.err)
        self.assertTrue(self.err.startswith("wordcatcher: "), self.err)
        for word in words:
            self.assertIn(word, self.err)

    def index(self, phrases=DOGS, directory=None, *options):
        self.succeed(*self.index_verb, *options, directory or self.dogs, stdin=phrases)

    def start(self, *arguments, **options):
        process = subprocess.Popen([PROGRAM, *arguments], stdin=subprocess.PIPE,
                                   stdout=subprocess.PIPE, stderr=subprocess.PIPE, **options)
        self.addCleanup(self.stop, process)
        return process

    @staticmethod
    def stop(process):
        if process.poll() is None:
            process.kill()
        process.wait()
        for stream in (process.stdin, process.stdout, process.stderr):
            if not stream.closed:
                with contextlib.suppress(BrokenPipeError):
                    stream.close()

    def line_of(self, stream):
        ready, _, _ = select.select([stream], [], [], PATIENCE)
        self.assertTrue(ready, "nothing came")
        return stream.readline().decode()

    def wait_until(self, condition):
        deadline = time.monotonic() + PATIENCE
        while not condition():
            self.assertLess(time.monotonic(), deadline, "waited in vain")
            time.sleep(0.01)

    @staticmethod
    def unread(stream):
        """How many bytes lie in a pipe."""
        return int.from_bytes(fcntl.ioctl(stream, termios.FIONREAD, bytes(4)), sys.byteorder)

    @staticmethod
    def has_open(process, table):
        """Whether a process that waits for a table's lock has got so far."""
        descriptors = f"/proc/{process.pid}/fd"
        names = []
        for descriptor in os.listdir(descriptors):
            with contextlib.suppress(FileNotFoundError):
                names.append(os.readlink(os.path.join(descriptors, descriptor)))
        # Every other table is open only for a moment before the waiting begins.
        return any(name.endswith(table) for name in names) and \
            any(name.endswith(EDGES) for name in names)

    def snapshot(self, directory):
        content = {}
        for parent, _, names in os.walk(directory):
            for name in names:
                path = os.path.join(parent, name)
                with open(path, "rb") as file:
                    content[os.path.relpath(path, directory)] = file.read()
        return content


class ProgramTest(CommandTest):
    def test_without_arguments_shows_what_to_do_on_standard_error(self):
        self.assertEqual(self.run_it(), 2)
        self.assertEqual(self.out, "")
        for verb in VERBS:
            self.assertIn(verb, self.err)

    def test_version(self):
        self.assertEqual(self.succeed("--version"), f"wordcatcher {VERSION}\n")

    def test_help_has_examples(self):
        self.assertIn("Examples:", self.succeed("--help"))
        for verb in VERBS:
            help_text = self.succeed(verb, "--help")
            self.assertIn(f"Usage: wordcatcher {verb}", help_text)
            self.assertIn(f"  wordcatcher {verb} ", help_text.split("Examples:")[1])
            self.assertEqual(self.err, "")

    def test_wrong_usage(self):
        self.fail_with("--help", of=["fetch"])
        self.fail_with("wordcatcher query --help", of=["query"])
        self.fail_with("--nonsense", of=["query", "--nonsense", self.dogs])
        self.fail_with("sounds", "words", "text", of=["query", "--mode", "sounds", self.dogs])
        self.fail_with("sounds", of=[*self.index_verb, "--mode", "sounds", self.dogs])
        self.assertFalse(os.path.exists(self.dogs))

    def test_a_word_that_is_no_verb_is_named_with_the_nearest_verb(self):
        for word, verb in (("fnid", "find"), ("qeury", "query"), ("inf", "info"), ("hlep", "help")):
            self.fail_with(f'"{word}" is no verb; did you mean "{verb}"? '
                           'See "wordcatcher --help".', of=[word, self.dogs])
        for word in ("fetch", "x", "", "é"):
            self.fail_with('is no verb. See "wordcatcher --help".', of=[word])
        self.fail_with('"nfaa" is no verb; did you mean "nfa"? See "wordcatcher dot --help".',
                       of=["dot", "nfaa", "gate", "1"])
        self.fail_with("VERB is required", '"wordcatcher dot --help"', of=["dot"])

    def test_help_is_a_verb_too(self):
        for path in ([], ["find"], ["dot"], ["dot", "nfa"]):
            self.assertEqual(self.succeed("help", *path), self.succeed(*path, "--help"))
        self.assertIn("Usage: wordcatcher [OPTIONS] VERB\n", self.succeed("help"))
        self.assertIn("Usage: wordcatcher dot [OPTIONS] VERB\n", self.succeed("help", "dot"))
        self.assertNotIn("ubcommand", self.succeed("help").lower())
        self.fail_with('"fnid" is no verb; did you mean "find"?', of=["help", "fnid"])

    def test_an_index_behind_its_text_is_recognised(self):
        self.index()
        os.mkdir(self.path("tables"))
        self.succeed("index", "--tables", self.path("tables"), stdin=DOGS)
        for index in (self.dogs, self.path("tables")):
            hint = f'There is no index at "lake geneva", but "{index}" is one: give the INDEX first'
            for verb in (["find"], ["query"], ["search"], ["dot", "tree"]):
                self.fail_with(hint, of=[*verb, "lake geneva", index])
            self.fail_with(hint, of=["find", "lake geneva", "lakes", index])
            self.fail_with(hint, of=["explain", "lake geneva", "Lake Geneva", index])
        self.write("notes.txt", "lake geneva\n")
        for other in ("absent.wci", self.path("notes.txt"), self.root):
            self.assertEqual(self.run_it("find", "lake geneva", other), 2)
            self.assertIn("There is no index at lake geneva", self.err)
            self.assertNotIn("first", self.err)

    def test_a_dash_alone_is_standard_input(self):
        self.index()
        for verb, text in (("find", "golden"), ("query", BRIDGE), ("search", "goldan")):
            lines = self.succeed(verb, self.dogs, stdin=f"{text}\n{text}\n")
            self.assertTrue(lines.startswith(f"{text}\n"))
            self.assertEqual(self.succeed(verb, self.dogs, "-", stdin=f"{text}\n{text}\n"), lines)
            self.assertIn('"-" alone', self.succeed(verb, "--help"))
        self.assertEqual(self.succeed("encode", "-", stdin="golden\n"),
                         self.succeed("encode", "golden"))
        # Among others, and behind "--", it is a text.
        self.assertIn("-\n", self.succeed("find", self.dogs, "golden", "-"))
        self.assertEqual(self.run_it("find", self.dogs, "--", "-", stdin="golden\n"), 1)

    def test_help_that_cannot_be_written(self):
        with open("/dev/full", "wb") as full:
            done = subprocess.run([PROGRAM, "--help"], stdout=full, stderr=subprocess.PIPE)
        self.assertEqual(done.returncode, 2)


class IndexTest(CommandTest):
    def values(self, *texts, options=()):
        lines = self.succeed("query", "--json", *options, self.dogs, *texts).splitlines()
        return [[match["value"] for match in json.loads(line)["matches"] or []] for line in lines]

    def content(self):
        """The index's bytes, of all its files."""
        if self.tables:
            return self.snapshot(self.dogs)
        with open(self.dogs, "rb") as file:
            return file.read()


class InputTest(IndexTest):
    def test_data_is_the_phrase_with_its_fields_in_braces(self):
        self.index("golden retriever\t7, gold\nborder collie\ngreat dane\t\n")
        self.assertEqual(self.values("golden retriever", "border collie", "great dane"),
                         [["golden retriever{ 7, gold }"], ["border collie"], ["great dane"]])

    def test_reads_files_and_standard_input(self):
        names = self.write("names.txt", "border collie\n")
        more = self.write("more.txt", "great dane")
        self.succeed(*self.index_verb, self.dogs, names, "-", more, stdin="golden retriever\n")
        self.assertIn("Indexed 3 phrases (6 words)", self.err)
        self.assertEqual(self.values("border collie", "great dane", "golden retriever"),
                         [["border collie"], ["great dane"], ["golden retriever"]])

    def test_files_of_other_systems(self):
        self.index(b"\xef\xbb\xbfborder collie\r\n\r\n  \t \r\ngreat dane\t3\r\n")
        self.assertIn("Indexed 2 phrases", self.err)
        self.assertEqual(self.values("border collie", "great dane"),
                         [["border collie"], ["great dane{ 3 }"]])

    def test_text_mode(self):
        self.index("The Great Gatsby\t1925\n", None, "--mode", "text")
        self.assertEqual(self.values("the grate gatsby", options=["--mode", "text"]),
                         [["the great gatsby"]])
        self.assertEqual(self.run_it("query", "--mode", "text", self.dogs, "gatsby"), 1)

    def test_no_phrases_make_an_empty_index(self):
        self.index("\n")
        self.assertIn("Indexed 0 phrases (0 words)", self.err)
        self.assertEqual(self.run_it("query", self.dogs, "golden"), 1)

    def test_invalid_utf8_leaves_everything_as_it_was(self):
        self.index()
        before = self.content()
        bad = self.write("names.txt", b"border collie\ngr\xf6\xdfe\n")
        self.fail_with(f"{bad}, line 2", "UTF-8", of=[*self.index_verb, self.dogs, bad])
        self.fail_with("standard input, line 1", of=[*self.index_verb, self.dogs], stdin=b"\xff\n")
        self.assertEqual(self.content(), before)
        self.fail_with("line 2", of=[*self.index_verb, self.path("new"), bad])
        self.assertFalse(os.path.exists(self.path("new")))
        self.assertEqual(sorted(os.listdir(self.root)), [os.path.basename(self.dogs), "names.txt"])

    def test_input_that_cannot_be_stored(self):
        self.fail_with("line 2", "zero byte", of=[*self.index_verb, self.dogs], stdin="collie\nda\0ne\n")
        self.fail_with("line 1", "no phrase", of=[*self.index_verb, self.dogs], stdin="\t7\n")
        self.fail_with("absent.txt", of=[*self.index_verb, self.dogs, self.path("absent.txt")])
        self.fail_with(self.root, of=[*self.index_verb, self.dogs, self.root])
        self.fail_with("empty", of=[*self.index_verb, ""])
        self.assertFalse(os.path.exists(self.dogs))

    def test_progress_only_on_a_terminal(self):
        names = self.write("names.txt", DOGS)
        master, terminal = pty.openpty()
        with open(master, "rb", buffering=0) as screen:
            done = subprocess.run([PROGRAM, *self.index_verb, self.dogs, names], stderr=terminal,
                                  timeout=PATIENCE)
            os.close(terminal)
            shown = b""
            with contextlib.suppress(OSError):
                while chunk := screen.read(4096):
                    shown += chunk
        self.assertEqual(done.returncode, 0)
        self.assertIn(b"0 phrases read", shown)
        self.assertEqual(b"% of 2 phrases" in shown, self.tables)
        self.assertIn(b"\r\x1b[KIndexed 2 phrases", shown)
        self.succeed(*self.index_verb, self.dogs, names)
        self.assertNotIn("\r", self.err)


class TablesInputTest(InputTest):
    tables = True


class ImageIndexTest(IndexTest):
    def stood(self):
        """Indexes, so that an image stands there, and returns its bytes."""
        self.index()
        return self.content()

    def check_whole(self, before):
        self.assertEqual(self.content(), before)
        self.assertEqual(self.others(), [])
        self.assertEqual(self.values("golden gate bridge"), [[BRIDGE]])

    def others(self):
        return [name for name in os.listdir(self.root) if name not in ("dogs.wci", "names.txt")]

    def test_reports_phrases_words_bytes_and_time(self):
        self.index()
        size = os.path.getsize(self.dogs)
        self.assertRegex(self.err,
                         rf"^Indexed 2 phrases \(6 words\) into {size} bytes in \d+\.\d\d s\.\n$")
        self.assertEqual(self.out, "")
        self.assertEqual(os.listdir(self.root), ["dogs.wci"])

    def test_directory_needs_tables(self):
        os.mkdir(self.path("kennel"))
        self.fail_with("is a directory", "names.wci", "--tables",
                       of=["index", self.path("kennel")], stdin=DOGS)
        self.fail_with("--tables", of=["index", self.path("new/")], stdin=DOGS)
        self.assertEqual(os.listdir(self.path("kennel")), [])
        self.succeed("index", "--tables", self.path("kennel"), stdin=DOGS)
        self.assertEqual(sorted(os.listdir(self.path("kennel"))), sorted(TABLES))

    def test_place_that_cannot_be_written(self):
        self.write("names.txt", DOGS)
        for place in ("no", "names.txt"):
            # Before any input is looked at.
            self.fail_with("no directory", f'{place}"', "create it",
                           of=["index", self.path(place, "dogs.wci"), self.path("missing")])
        os.mkfifo(self.path("pipe"))
        self.fail_with("regular file", of=["index", self.path("pipe")], stdin=DOGS)

    def test_full_disk_leaves_the_old_image_whole(self):
        before = self.stood()
        self.fail_with("cannot be written", "File too large", "room",
                       of=["index", self.dogs], stdin=many_phrases(300),
                       preexec_fn=limit_file_size(4096))
        self.check_whole(before)

    def test_readers_of_the_old_image_are_not_disturbed(self):
        self.index()
        reader = self.start("query", "--json", self.dogs)
        for phrases in ("golden gate bridge\n", "great dane\n"):
            self.index(phrases)
            reader.stdin.write(b"golden gate bridge\n")
            reader.stdin.flush()
            self.assertEqual(json.loads(self.line_of(reader.stdout))["query"], "golden gate bridge")
        self.assertEqual(self.values("great dane"), [["great dane"]])

    def test_interrupt_leaves_the_old_image_whole(self):
        before = self.stood()
        for number in (signal.SIGINT, signal.SIGTERM, signal.SIGHUP):
            process = self.start("index", self.dogs)
            process.stdin.write(many_phrases(1000).encode())
            process.stdin.flush()
            self.wait_until(lambda: self.unread(process.stdin) == 0)
            process.send_signal(number)
            self.assertEqual(process.wait(PATIENCE), -number)
            self.check_whole(before)

    def test_interrupt_while_writing_leaves_nothing_behind(self):
        before = self.stood()
        names = self.write("names.txt", many_phrases(40000))
        interrupted = 0
        deadline = time.monotonic() + 2 * PATIENCE
        while interrupted < 3:
            self.assertLess(time.monotonic(), deadline, "no signal met the writing")
            process = self.start("index", self.dogs, names, preexec_fn=lambda: os.nice(10))
            # Without a pause: the writing may take but some milliseconds.
            while not self.others() and process.poll() is None:
                pass
            process.send_signal(signal.SIGTERM)
            process.wait(PATIENCE)
            self.assertEqual(self.others(), [])
            self.assertIn("is whole", self.succeed("verify", self.dogs))
            if process.returncode == -signal.SIGTERM:
                interrupted += 1
            if self.content() != before:
                before = self.stood()


class TablesIndexTest(IndexTest):
    tables = True

    def test_reports_phrases_words_bytes_and_time(self):
        self.index()
        size = sum(len(content) for content in self.snapshot(self.dogs).values())
        self.assertRegex(self.err,
                         rf"^Indexed 2 phrases \(6 words\) into {size} bytes in \d+\.\d\d s\.\n$")
        self.assertEqual(self.out, "")
        self.assertEqual(sorted(os.listdir(self.dogs)), sorted(TABLES))

    def test_counts_only_the_new_tables_when_a_larger_index_stood_there(self):
        self.index("poodle\n")
        small = self.err.split(" in ")[0]
        self.index(many_phrases(50))
        self.index("poodle\n")
        self.assertEqual(self.err.split(" in ")[0], small)
        self.assertEqual(self.values("retriever", "poodle"), [[], ["poodle"]])

    def test_directory_with_a_slash_and_without(self):
        self.index(DOGS, self.dogs + "/")
        self.succeed("query", self.dogs, "golden gate bridge")
        self.succeed("search", self.dogs + "/", "golden")
        self.assertEqual(os.listdir(self.root), ["dogs"])

    def test_directory_that_cannot_be_written(self):
        file = self.write("names.txt", "")
        self.fail_with("not a directory", of=[*self.index_verb, file], stdin=DOGS)
        self.fail_with("parent", of=[*self.index_verb, self.path("names.txt", "dogs")], stdin=DOGS)
        self.fail_with("parent", of=[*self.index_verb, self.path("no", "dogs")], stdin=DOGS)
        self.fail_with("/proc/self", "writable", of=[*self.index_verb, "/proc/self"], stdin=DOGS)

    def test_table_that_cannot_be_written(self):
        os.mkdir(self.dogs)
        os.symlink(self.path("elsewhere"), self.path("dogs", DATA))
        self.fail_with(DATA, of=[*self.index_verb, self.dogs], stdin=DOGS)
        self.assertEqual(os.listdir(self.dogs), [DATA])
        self.assertFalse(os.path.exists(self.path("elsewhere")))
        os.remove(self.path("dogs", DATA))
        os.mkfifo(self.path("dogs", FINALS))
        self.fail_with(FINALS, "regular file", of=[*self.index_verb, self.dogs], stdin=DOGS)
        self.assertEqual(os.listdir(self.dogs), [FINALS])

    def test_full_disk_leaves_no_directory_behind(self):
        for limit in (1024, 4096, 20000):
            self.fail_with("Cannot write the index", "File too large", "room",
                           of=[*self.index_verb, self.dogs], stdin=many_phrases(300),
                           preexec_fn=limit_file_size(limit))
            self.assertFalse(os.path.exists(self.dogs), limit)

    def test_full_disk_leaves_no_new_tables_behind(self):
        os.mkdir(self.dogs)
        self.write("dogs/notes.txt", "mine")
        self.fail_with("Cannot write the index", of=[*self.index_verb, self.dogs],
                       stdin=DOGS, preexec_fn=limit_file_size(1024))
        self.assertEqual(os.listdir(self.dogs), ["notes.txt"])

    def test_full_disk_leaves_no_half_made_index_in_place_of_the_old_one(self):
        self.index()
        self.fail_with("Cannot write the index", of=[*self.index_verb, self.dogs],
                       stdin=many_phrases(300), preexec_fn=limit_file_size(20000))
        self.fail_with("unfinished", "wordcatcher index", of=["query", self.dogs, "golden"])
        self.index()
        self.assertEqual(self.values("golden gate bridge"), [[BRIDGE]])

    def test_failed_run_marks_the_tables_that_it_had_not_reached(self):
        """Only edges grow before the failure; the other tables would still pass for the old ones."""
        self.index("poodle\n", None, "--mode", "text")
        self.fail_with("Cannot write the index", of=[*self.index_verb, "--mode", "text", self.dogs],
                       stdin="retriever " * 120, preexec_fn=limit_file_size(100000))
        for table, content in self.snapshot(self.dogs).items():
            self.assertEqual(content[:2048], b"\0" * 2048, table)

    def test_verbose_shows_the_storage_log(self):
        self.succeed(*self.index_verb, "--verbose", self.dogs, stdin=DOGS)
        self.assertIn(f"-[TinyCDB setMode:] Finalizing {self.dogs}/{EDGES}\n", self.err)
        self.succeed(*self.index_verb, self.dogs, stdin=DOGS)
        self.assertNotIn("TinyCDB", self.err)


class QueryTest(CommandTest):
    def setUp(self):
        super().setUp()
        self.index()

    def test_plain_output(self):
        self.assertEqual(self.succeed("query", self.dogs, "a goldan retriver"), f"4\t{PUPPY}\n")

    def test_several_texts_have_headings_and_counts_of_their_own(self):
        texts = ["a goldan retriver", "xyzzy", "goldan xyzzy", "a goldan retriver"]
        found = f"a goldan retriver\n4\t{PUPPY}\n"
        expected = f"{found}xyzzy\ngoldan xyzzy\n{found}"
        self.assertEqual(self.succeed("query", self.dogs, *texts), expected)
        self.assertEqual(self.succeed("query", self.dogs, stdin="\n".join(texts)), expected)

    def test_json(self):
        out = self.succeed("query", "--json", self.dogs, "a goldan retriver", "xyzzy",
                           "goldan xyzzy")
        self.assertEqual(out, '{"query":"a goldan retriver","matches":[{"value":"' + PUPPY +
                         '","distance":4}]}\n'
                         '{"query":"xyzzy","matches":null}\n'
                         '{"query":"goldan xyzzy","matches":[]}\n')

    def test_json_keeps_utf8_and_its_order(self):
        self.index("größe ﬀ\ngröße 𝄞\ngröße a\n")
        line = self.succeed("query", "--json", self.dogs, "GRÖßE")
        self.assertEqual(line, '{"query":"GRÖßE","matches":['
                         '{"value":"größe a","distance":0},'
                         '{"value":"größe 𝄞","distance":0},'
                         '{"value":"größe ﬀ","distance":0}]}\n')

    def test_text_mode_has_data_and_one_order(self):
        self.index("coats\nCoats\ncats\nbat\tb\ncart\n", None, "--mode", "text")
        out = self.succeed("query", "--mode", "text", "--json", self.dogs, "cat")
        self.assertEqual(out, '{"query":"cat","matches":['
                         '{"value":"bat","distance":1,"data":["bat{ b }"]},'
                         '{"value":"cart","distance":1,"data":["cart"]},'
                         '{"value":"cats","distance":1,"data":["cats"]},'
                         '{"value":"coats","distance":2,"data":["Coats","coats"]}]}\n')
        self.assertEqual(self.succeed("query", "--mode", "text", self.dogs, "cat"),
                         "1\tbat\n1\tcart\n1\tcats\n2\tcoats\n")
        self.assertEqual(self.run_it("query", "--mode", "text", "--json", self.dogs, "zebra"), 1)
        self.assertEqual(self.out, '{"query":"zebra","matches":[]}\n')

    def test_exit_code_tells_whether_anything_matched(self):
        self.assertEqual(self.run_it("query", self.dogs, "xyzzy"), 1)
        self.assertEqual((self.out, self.err), ("", ""))
        self.assertEqual(self.run_it("query", self.dogs, "goldan xyzzy"), 1)
        self.assertEqual(self.run_it("query", self.dogs, "xyzzy", "golden gate bridge"), 0)
        self.assertEqual(self.run_it("query", self.dogs, stdin=""), 1)

    def test_texts_arrive_as_they_are_written(self):
        texts = ["[golden, bridge]", "{}", "", "--json", "-x", "index", "%%", "\x01", 'a "b"\\']
        out = self.succeed("query", "--json", self.dogs, "--", *texts)
        self.assertEqual([json.loads(line)["query"] for line in out.splitlines()], texts)
        out = self.succeed("query", self.dogs, "[golden gate bridge]", "--json")
        self.assertEqual(json.loads(out)["query"], "[golden gate bridge]")

    def test_lines_of_standard_input(self):
        out = self.succeed("query", "--json", self.dogs,
                           stdin=b"\xef\xbb\xbfgolden gate bridge\r\n\nxyzzy")
        self.assertEqual([json.loads(line)["query"] for line in out.splitlines()],
                         ["golden gate bridge", "", "xyzzy"])

    def test_invalid_utf8(self):
        self.fail_with("Text 2", "UTF-8", of=["query", self.dogs, "golden", b"\xff"])
        self.fail_with("standard input, line 1", of=["query", self.dogs], stdin=b"\xff\n")
        code = self.run_it("query", "--json", self.dogs, stdin=b"golden gate bridge\n\xff\n")
        self.assertEqual(code, 2)
        self.assertEqual(len(self.out.splitlines()), 1)
        self.assertIn("standard input, line 2", self.err)

    def test_answers_each_line_before_the_next_one_comes(self):
        process = self.start("query", "--json", self.dogs)
        for text in ("golden gate bridge", "xyzzy", "goldan"):
            process.stdin.write(text.encode() + b"\n")
            process.stdin.flush()
            self.assertEqual(json.loads(self.line_of(process.stdout))["query"], text)
        process.stdin.close()
        self.assertEqual(process.wait(PATIENCE), 0)

    def test_reader_that_goes_away(self):
        texts = self.write("texts.txt", "golden gate bridge\n" * 5000)
        for verb in ("query", "search"):
            with open(texts, "rb") as stdin:
                process = subprocess.Popen([PROGRAM, verb, "--json", self.dogs], stdin=stdin,
                                           stdout=subprocess.PIPE, stderr=subprocess.PIPE)
            self.assertTrue(process.stdout.readline())
            process.stdout.close()
            self.assertEqual(process.stderr.read(), b"")
            process.stderr.close()
            self.assertIn(process.wait(PATIENCE), (0, 1))

    def test_output_that_cannot_be_written(self):
        for redirection in (">/dev/full", ">&-"):
            done = subprocess.run(["sh", "-c", f'"$0" query "$1" golden gate bridge {redirection}',
                                   PROGRAM, self.dogs], capture_output=True, timeout=PATIENCE)
            self.assertEqual(done.returncode, 2, done.stderr)
            self.assertIn(b"Cannot write standard output", done.stderr)
        self.succeed("query", self.dogs, "golden gate bridge")

    def test_closed_standard_input(self):
        done = subprocess.run(["sh", "-c", '"$0" query "$1" <&-', PROGRAM, self.dogs],
                              capture_output=True, timeout=PATIENCE)
        self.assertEqual(done.returncode, 2)
        self.assertIn(b"standard input", done.stderr)


class TablesQueryTest(QueryTest):
    tables = True


class ModeTest(CommandTest):
    def setUp(self):
        super().setUp()
        self.titles = self.path("titles.wci")
        self.index("The Great Gatsby\t1925\n", self.titles, "--mode", "text")

    def test_images_remember_their_mode(self):
        self.assertEqual(self.succeed("query", self.titles, "the grate gatsby"),
                         self.succeed("query", "--mode", "text", self.titles, "the grate gatsby"))
        self.assertIn("the great gatsby", self.out)
        names = self.path("names.wci")
        self.index("Catherine Schmidt\n", names, "--mode", "phonetic")
        self.assertEqual(self.succeed("query", names, "Kathryn Shmit"), "0\tCatherine Schmidt\n")

    def test_another_mode_than_the_image_s(self):
        for mode in ("words", "phonetic"):
            self.fail_with("text", mode, "--mode",
                           of=["query", "--mode", mode, self.titles, "gatsby"])
        self.index()
        self.fail_with("words", "text", of=["query", "--mode", "text", self.dogs, "golden"])

    def test_tables_are_read_in_words_mode_unless_told(self):
        titles = self.path("titles")
        self.succeed("index", "--tables", "--mode", "text", titles, stdin="The Great Gatsby\n")
        self.assertEqual(self.run_it("query", titles, "the grate gatsby"), 1)
        self.succeed("query", "--mode", "text", titles, "the grate gatsby")


class BudgetTest(CommandTest):
    def setUp(self):
        super().setUp()
        self.index()

    def test_long_texts_are_cut_and_it_says_so(self):
        text = "golden gate bridge " + "xyzzy " * 5000
        short = "golden gate bridge"
        self.run_it("query", self.dogs, stdin=text)
        self.assertIn("limits", self.err)
        self.assertEqual(self.err.count("\n"), 1)
        self.run_it("query", "--json", self.dogs, stdin=f"{text}\n{short}")
        self.assertEqual(self.err, "")
        long, plain = (json.loads(line) for line in self.out.splitlines())
        self.assertEqual(list(long), ["query", "matches", "truncated"])
        self.assertIs(long["truncated"], True)
        self.assertNotIn("truncated", plain)

    def test_long_words_are_not_looked_up_and_it_says_so(self):
        word = "golden" * 1000
        self.assertEqual(self.run_it("search", self.dogs, word), 1)
        self.assertIn("limits", self.err)
        self.assertEqual(self.run_it("search", "--json", self.dogs, word), 1)
        self.assertEqual(json.loads(self.out), {"word": word, "matches": [], "truncated": True})
        self.assertEqual(self.err, "")


class InfoTest(CommandTest):
    def test_image(self):
        self.index()
        told = json.loads(self.succeed("info", "--json", self.dogs))
        self.assertRegex(told.pop("generation"), "^[0-9a-f]{32}$")
        self.assertEqual(told, {"mode": "words", "phrases": 2, "words": 5, "data": 2,
                                "bytes": os.path.getsize(self.dogs), "version": 2})
        lines = self.succeed("info", self.dogs).splitlines()
        self.assertEqual(lines[:4], ["mode\twords", "phrases\t2", "words\t5", "data\t2"])
        self.assertEqual(len(lines), 7)

    def test_tables(self):
        dogs = self.path("dogs")
        self.succeed("index", "--tables", dogs, stdin=DOGS)
        size = sum(len(content) for content in self.snapshot(dogs).values())
        self.assertEqual(self.succeed("info", dogs), f"words\t5\ndata\t2\nbytes\t{size}\n")
        told = json.loads(self.succeed("info", "--json", dogs))
        self.assertEqual(told, {"mode": None, "phrases": None, "words": 5, "data": 2,
                                "bytes": size, "generation": None, "version": None})


class VerifyTest(CommandTest):
    def test_whole(self):
        self.index()
        self.assertEqual(self.succeed("verify", self.dogs),
                         f"{self.dogs} is whole: 2 phrases, 5 words, 2 data strings.\n")
        dogs = self.path("dogs")
        self.succeed("index", "--tables", dogs, stdin=DOGS)
        self.assertEqual(self.succeed("verify", dogs),
                         f"{dogs} is whole: 5 words, 2 data strings.\n")

    def test_any_altered_byte_of_the_content_is_found(self):
        self.index()
        with open(self.dogs, "rb") as file:
            image = file.read()
        for place in (9, 70, len(image) // 2, len(image) - 1):
            altered = bytearray(image)
            altered[place] ^= 0x10
            self.write("dogs.wci", bytes(altered))
            self.fail_with("dogs.wci", of=["verify", self.dogs])

    def test_truncated_missing_and_foreign_files(self):
        verbs = (["verify"], ["info"], ["query"], ["search"])
        self.index()
        os.truncate(self.dogs, os.path.getsize(self.dogs) - 1)
        for verb in verbs:
            self.fail_with("damaged", "dogs.wci", of=[*verb, self.dogs], stdin="golden\n")
        self.write("dogs.wci", b"golden retriever\n" * 100)
        for verb in verbs:
            self.fail_with("not a search image", of=[*verb, self.dogs], stdin="golden\n")
        os.remove(self.dogs)
        for verb in verbs:
            self.fail_with("There is no index", of=[*verb, self.dogs], stdin="golden\n")
            self.fail_with("name of the index is empty", of=[*verb, ""], stdin="golden\n")
        self.assertEqual(os.listdir(self.root), [])


class SearchTest(CommandTest):
    def setUp(self):
        super().setUp()
        self.index()

    def test_plain_output(self):
        self.assertEqual(self.succeed("search", self.dogs, "Goldan"),
                         f"golden\t1\t{BRIDGE} | {PUPPY}\n")

    def test_several_words_have_headings(self):
        expected = f"gold\ngolden\t2\t{BRIDGE} | {PUPPY}\nxyzzy\npupy\npuppy\t1\t{PUPPY}\n"
        self.assertEqual(self.succeed("search", self.dogs, "gold", "xyzzy", "pupy"), expected)
        self.assertEqual(self.succeed("search", self.dogs, stdin="gold\nxyzzy\r\npupy"), expected)

    def test_json(self):
        out = self.succeed("search", "--json", self.dogs, "goldan", "xyzzy")
        self.assertEqual(out, '{"word":"goldan","matches":[{"value":"golden","distance":1,'
                         f'"data":["{BRIDGE}","{PUPPY}"]}}]}}\n'
                         '{"word":"xyzzy","matches":[]}\n')

    def test_order_is_the_search_s_own(self):
        self.index("cart\nbat\nbat\tb\ncat\n")
        out = self.succeed("search", "--json", self.dogs, "cat")
        self.assertEqual([match["value"] for match in json.loads(out)["matches"]],
                         ["bat", "cat", "cart"])

    def test_max_distance(self):
        def found(distance):
            return self.run_it("search", "--max-distance", str(distance), self.dogs, "gilden gite")
        self.index("golden gate\n", None, "--mode", "text")
        self.assertEqual([found(distance) for distance in (0, 1, 2, 3, 16)], [1, 1, 0, 0, 0])
        for distance in ("17", "-1", "many", "1.5"):
            self.fail_with("--max-distance",
                           of=["search", "--max-distance", distance, self.dogs, "golden"])

    def test_exit_code_tells_whether_anything_matched(self):
        self.assertEqual(self.run_it("search", self.dogs, "xyzzy"), 1)
        self.assertEqual((self.out, self.err), ("", ""))
        self.assertEqual(self.run_it("search", self.dogs, "xyzzy", "golden"), 0)

    def test_answers_each_line_before_the_next_one_comes(self):
        process = self.start("search", "--json", self.dogs)
        for word in ("golden", "xyzzy"):
            process.stdin.write(word.encode() + b"\n")
            process.stdin.flush()
            self.assertEqual(json.loads(self.line_of(process.stdout))["word"], word)


class TablesSearchTest(SearchTest):
    tables = True


class EncodeTest(CommandTest):
    def test_codes_stand_one_space_apart(self):
        self.assertEqual(self.succeed("encode", "Catherine  Schmidt", "Kathryn Shmit"),
                         "K0RN XMT\nK0RN XMT\n")

    def test_lines_of_standard_input(self):
        self.assertEqual(self.succeed("encode", stdin="Knight, Night!\n\n?\n"), "KNT NT\n\n\n")

    def test_json(self):
        self.assertEqual(self.succeed("encode", "--json", "Peña Łódź", "..."),
                         '{"text":"Peña Łódź","codes":["PN","T"]}\n{"text":"...","codes":[]}\n')

    def test_no_text_has_no_codes_and_is_no_miss(self):
        self.assertEqual(self.succeed("encode", stdin=""), "")
        self.assertEqual(self.succeed("encode", "--json", stdin=""), "")
        with open(os.devnull, "rb") as nothing:
            done = subprocess.run([PROGRAM, "encode"], stdin=nothing, capture_output=True,
                                  timeout=PATIENCE)
        self.assertEqual((done.returncode, done.stdout, done.stderr), (0, b"", b""))

    def test_invalid_utf8(self):
        self.fail_with("UTF-8", of=["encode", b"caf\xe9"])

    def test_phonetic_mode_finds_what_sounds_alike(self):
        self.index("Catherine Schmidt\nKonrad Zuse\n", None, "--mode", "phonetic")
        self.assertEqual(self.succeed("query", "--mode", "phonetic", self.dogs, "Kathryn Shmit"),
                         "0\tCatherine Schmidt\n")
        self.assertEqual(self.run_it("query", "--mode", "phonetic", self.dogs, "Konrad Shmit"), 1)


class DamagedIndexTest(CommandTest):
    tables = True

    def check(self, *words):
        for verb in ("query", "search"):
            self.fail_with(*words, of=[verb, self.dogs, "golden"])

    def test_missing_directory(self):
        for verb in ("query", "search"):
            self.fail_with("dogs/", "wordcatcher index --tables", of=[verb, self.dogs + "/", "x"])
        self.assertFalse(os.path.exists(self.dogs))
        self.write("dogs", "a file")
        for verb in ("query", "search"):
            self.fail_with("Not a directory", of=[verb, self.dogs + "/", "x"])

    def test_missing_table(self):
        os.mkdir(self.dogs)
        self.check(EDGES, "wordcatcher index")
        self.assertEqual(os.listdir(self.dogs), [])
        self.index()
        os.remove(self.path("dogs", FINALS))
        self.check(FINALS)

    def test_table_that_is_no_file(self):
        self.index()
        os.remove(self.path("dogs", DATA))
        os.mkdir(self.path("dogs", DATA))
        self.check(DATA, "regular file")
        os.rmdir(self.path("dogs", DATA))
        os.mkfifo(self.path("dogs", DATA))
        self.check(DATA, "regular file")

    def test_file_that_is_no_table(self):
        for table in TABLES:
            for content in (b"", b"x" * 2047, b"\0" * 2048, b"golden " * 1000, b"\xff" * 4096):
                self.index()
                self.write(f"dogs/{table}", content)
                self.check(table, "wordcatcher index")

    def test_truncated_table(self):
        for table in TABLES:
            self.index()
            os.truncate(self.path("dogs", table), os.path.getsize(self.path("dogs", table)) - 1)
            self.check(table, "damaged")


LONG_WAIT = 2  # seconds, after which the command tells which table it waits for


class LockTest(CommandTest):
    tables = True

    def test_says_which_table_it_waits_for_and_goes_on(self):
        self.index()
        self.index(DOGS, self.path("other"))
        for table in TABLES[1:]:
            with locked(self.path("dogs", table)), locked(self.path("other", table)):
                start = time.monotonic()
                waiting = [self.start("query", self.dogs, "golden gate bridge"),
                           self.start(*self.index_verb, self.path("other"))]
                waiting[1].stdin.write(b"great dane\n")
                waiting[1].stdin.close()
                self.assertIn(f"waiting for \"{self.path('dogs', table)}\"",
                              self.line_of(waiting[0].stderr))
                self.assertGreater(time.monotonic() - start, 1.5)
                self.assertIn(f"waiting for \"{self.path('other', table)}\"",
                              self.line_of(waiting[1].stderr))
                self.assertTrue(all(process.poll() is None for process in waiting))
            self.assertEqual(waiting[0].wait(PATIENCE), 0)
            self.assertEqual(waiting[0].stdout.read().decode(), f"0\t{BRIDGE}\n")
            self.assertEqual(waiting[1].wait(PATIENCE), 0)
            self.assertIn("Indexed 1 phrase", waiting[1].stderr.read().decode())
        self.succeed("query", self.path("other"), "great dane")

    def test_short_wait_is_silent(self):
        self.index()
        deadline = time.monotonic() + PATIENCE
        waited = LONG_WAIT
        # On a busy machine a short wait may become a long one, which tells nothing.
        while waited >= LONG_WAIT:
            self.assertLess(time.monotonic(), deadline, "no wait was short")
            with locked(self.path("dogs", EDGES)):
                start = time.monotonic()
                process = self.start("search", self.dogs, "golden")
                self.wait_until(lambda: self.has_open(process, EDGES))
                time.sleep(0.5)
                self.assertIsNone(process.poll())
            self.assertEqual(process.wait(PATIENCE), 0)
            waited = time.monotonic() - start
        self.assertEqual(process.stderr.read(), b"")

    def test_reads_what_another_process_finished_meanwhile(self):
        os.mkdir(self.dogs)
        self.index(DOGS, self.path("other"))
        for table in TABLES:
            self.write(f"dogs/{table}", b"")
        with locked(self.path("dogs", EDGES)):
            process = self.start("query", self.dogs, "golden gate bridge")
            self.wait_until(lambda: self.has_open(process, EDGES))
            time.sleep(0.1)
            for name, content in self.snapshot(self.path("other")).items():
                self.write(f"dogs/{name}", content)
        self.assertEqual(process.wait(PATIENCE), 0)

    def interrupt_waiting(self, number, *arguments):
        process = self.start(*arguments)
        process.stdin.write(DOGS.encode())
        process.stdin.close()
        self.wait_until(lambda: self.has_open(process, DATA))
        process.send_signal(number)
        self.assertEqual(process.wait(PATIENCE), -number)
        # But for the note on its waiting, for which a busy machine may give it the time.
        said = re.sub(r"^wordcatcher: waiting for .*\n", "", process.stderr.read().decode())
        self.assertEqual(said, "")

    def test_interrupt_ends_waiting_and_keeps_the_old_index(self):
        self.index()
        before = self.snapshot(self.dogs)
        with locked(self.path("dogs", DATA)):
            for number in (signal.SIGINT, signal.SIGTERM, signal.SIGHUP):
                self.interrupt_waiting(number, *self.index_verb, self.dogs)
            self.interrupt_waiting(signal.SIGINT, "query", self.dogs, "golden")
            self.interrupt_waiting(signal.SIGINT, "search", self.dogs, "golden")
        self.assertEqual(self.snapshot(self.dogs), before)

    def test_interrupt_while_waiting_takes_new_tables_away(self):
        os.mkdir(self.dogs)
        self.write(f"dogs/{DATA}", b"")
        with locked(self.path("dogs", DATA)):
            self.interrupt_waiting(signal.SIGINT, *self.index_verb, self.dogs)
        self.assertEqual(os.listdir(self.dogs), [DATA])


class InterruptTest(CommandTest):
    tables = True

    def interrupt_indexing(self):
        """Interrupts while table files are growing: the edges under one prefix make finishing slow."""
        names = self.write("names.txt", many_phrases(40000))
        edges = self.path("dogs", EDGES)
        before = os.stat(edges).st_mtime_ns if os.path.exists(edges) else None

        def growing():
            return (os.path.exists(edges) and os.path.getsize(edges) > 0
                    and os.stat(edges).st_mtime_ns != before)

        process = self.start(*self.index_verb, self.dogs, names)
        self.wait_until(growing)
        process.send_signal(signal.SIGINT)
        self.assertEqual(process.wait(5), -signal.SIGINT)
        self.assertEqual(process.stderr.read(), b"")

    def test_interrupt_leaves_no_directory_behind(self):
        self.interrupt_indexing()
        self.assertFalse(os.path.exists(self.dogs))

    def test_interrupt_leaves_no_half_made_index_in_place_of_the_old_one(self):
        self.index()
        self.interrupt_indexing()
        self.fail_with("unfinished", of=["query", self.dogs, "golden"])

    def test_ignored_signals_stay_ignored(self):
        self.index()
        with locked(self.path("dogs", EDGES)):
            process = self.start(*self.index_verb, self.dogs,
                                 preexec_fn=lambda: signal.signal(signal.SIGHUP, signal.SIG_IGN))
            process.stdin.write(b"great dane\n")
            process.stdin.close()
            self.wait_until(lambda: self.has_open(process, EDGES))
            process.send_signal(signal.SIGHUP)
            time.sleep(0.2)
            self.assertIsNone(process.poll())
        self.assertEqual(process.wait(PATIENCE), 0)
        self.succeed("query", self.dogs, "great dane")


def heed_interrupts():
    """A job in the background ignores some, as one does that outlives its terminal, and so would every
    command that it starts."""
    signal.signal(signal.SIGINT, signal.default_int_handler)
    for number in (signal.SIGTERM, signal.SIGHUP):
        signal.signal(number, signal.SIG_DFL)
    signal.pthread_sigmask(signal.SIG_UNBLOCK, (signal.SIGINT, signal.SIGTERM, signal.SIGHUP))


if __name__ == "__main__":
    heed_interrupts()
    PROGRAM, VERSION = os.path.abspath(sys.argv[1]), sys.argv[2]
    unittest.main(argv=[sys.argv[0], *sys.argv[3:]])
