"""What the verbs find, explain and dot promise, and how the command feels, tried on the built program.

Usage: cli_find_test.py PROGRAM [unittest arguments]
"""

import contextlib
import fcntl
import json
import os
import pty
import re
import select
import shutil
import signal
import subprocess
import sys
import threading
import time
import unittest

import cli_test
from cli_test import BRIDGE, DATA, DOGS, EDGES, PATIENCE, PUPPY, locked

GREEN, YELLOW, RESET = "\x1b[32m", "\x1b[33m", "\x1b[0m"


@contextlib.contextmanager
def slowed_down(process):
    """Lets a process run for a fiftieth of the time only, until what is yielded is called."""
    enough = threading.Event()

    def hold():
        while not enough.is_set() and process.poll() is None:
            process.send_signal(signal.SIGSTOP)
            enough.wait(0.1)
            process.send_signal(signal.SIGCONT)
            time.sleep(0.002)

    holder = threading.Thread(target=hold)
    holder.start()
    try:
        yield enough.set
    finally:
        enough.set()
        holder.join()


class TerminalTest(cli_test.CommandTest):
    def on_terminal(self, *arguments, meanwhile=lambda: None, environment=None, stdout=None,
                    stdin=subprocess.DEVNULL, slow_until=None, when_shown=()):
        """What the command shows on a terminal, its standard output as well unless it is given.
        It is slowed down until it has shown `slow_until`, if that is given. `when_shown` are pairs
        of what comes to the screen, one after the other, and what is called as soon as it is there."""
        environment = {**os.environ, "NO_COLOR": "", **(environment or {})}
        master, terminal = pty.openpty()
        shown = b""
        awaited = [(sentence.encode(), call) for sentence, call in when_shown]
        with open(master, "rb", buffering=0) as screen:
            process = subprocess.Popen([cli_test.PROGRAM, *arguments], stdin=stdin,
                                       stdout=stdout or terminal, stderr=terminal, env=environment)
            os.close(terminal)
            meanwhile()
            slowing = slowed_down(process) if slow_until else contextlib.nullcontext()
            with slowing as let_go, contextlib.suppress(OSError):
                while chunk := self.chunk_of(screen, process):
                    shown += chunk
                    if slow_until and slow_until.encode() in shown:
                        let_go()
                    while awaited and awaited[0][0] in shown:
                        awaited.pop(0)[1]()
            self.code = process.wait(PATIENCE)
        return shown.decode().replace("\r\n", "\n")

    def chunk_of(self, screen, process):
        if not select.select([screen], [], [], PATIENCE)[0]:
            process.kill()
            self.fail("nothing came")
        return screen.read(4096)

    def briefly(self, work):
        """What comes of something that takes less than a second, after which the command tells what it
        does. A busy machine may need several tries."""
        deadline = time.monotonic() + PATIENCE
        while True:
            start = time.monotonic()
            result = work()
            if time.monotonic() - start < 1:
                return result
            self.assertLess(time.monotonic(), deadline, "it was never done within a second")


class FindTest(TerminalTest):
    def setUp(self):
        super().setUp()
        self.index()

    def found(self, *arguments, **options):
        """The values found for each text."""
        self.assertIn(self.run_it("find", "--json", *arguments, **options), (0, 1), self.err)
        return [[match["value"] for match in json.loads(line)["matches"]]
                for line in self.out.splitlines()]

    def test_a_line_has_cost_value_and_range(self):
        self.assertEqual(self.succeed("find", self.dogs, "The goldan gate bridge!"),
                         f"3\t{BRIDGE}\t4-22\n11\t{PUPPY}\t4-10\n")

    def test_several_texts_have_headings(self):
        texts = ["gate", "xyzzy", "", "goldan gate bridge"]
        expected = (f"gate\n4\t{BRIDGE}\t0-4\nxyzzy\n\n"
                    f"goldan gate bridge\n1\t{BRIDGE}\t0-18\n9\t{PUPPY}\t0-6\n")
        self.assertEqual(self.succeed("find", self.dogs, *texts), expected)
        self.assertEqual(self.succeed("find", self.dogs, stdin="\n".join(texts)), expected)
        self.assertEqual(self.succeed("find", self.dogs, stdin="\r\n".join(texts)), expected)

    def test_json_is_one_object_a_line_with_its_keys_in_order(self):
        out = self.succeed("find", "--json", self.dogs, "a goldan gate brige", "xyzzy")
        self.assertEqual(
            out,
            '{"query":"a goldan gate brige","matches":['
            f'{{"value":"{BRIDGE}","cost":4,"begin":2,"end":19,"hits":['
            '{"begin":2,"end":8,"word":"golden","edits":1},'
            '{"begin":9,"end":13,"word":"gate","edits":0},'
            '{"begin":14,"end":19,"word":"bridge","edits":1}]},'
            f'{{"value":"{PUPPY}","cost":11,"begin":2,"end":8,"hits":['
            '{"begin":2,"end":8,"word":"golden","edits":1}]}],"truncated":false}\n'
            '{"query":"xyzzy","matches":[],"truncated":false}\n')

    def test_offsets_are_bytes_of_the_text_as_given(self):
        self.index("Łódź\nSão Tomé\n")
        text = "Züge nach Łodź und Sao Tomé"
        for match in json.loads(self.succeed("find", "--json", self.dogs, text))["matches"]:
            for hit in match["hits"]:
                word = text.encode()[hit["begin"]:hit["end"]].decode()
                self.assertIn(word, ("Łodź", "Sao", "Tomé"))
                self.assertEqual(hit["edits"], 0 if word == "Tomé" else 1)

    def test_text_that_is_not_utf8_is_searched_and_its_offsets_hold_in_json(self):
        text = b"caf\xe9 golden\xff\xfegate \xc3"
        out = self.succeed("find", "--json", self.dogs, stdin=text + b"\n")
        self.assertIn("\\u001a", out)
        answer = json.loads(out)
        shown = answer["query"].encode()
        self.assertEqual(shown, b"caf\x1a golden\x1a\x1agate \x1a")
        hits = answer["matches"][0]["hits"]
        self.assertEqual([text[hit["begin"]:hit["end"]] for hit in hits], [b"golden", b"gate"])
        self.assertEqual([shown[hit["begin"]:hit["end"]] for hit in hits], [b"golden", b"gate"])
        done = subprocess.run([cli_test.PROGRAM, "find", self.dogs], input=text,
                              capture_output=True, timeout=PATIENCE)
        self.assertTrue(done.stdout.startswith(text + b"\n"))

    def test_exit_code_tells_whether_anything_matched(self):
        self.assertEqual(self.run_it("find", self.dogs, "xyzzy"), 1)
        self.assertEqual((self.out, self.err), ("", ""))
        self.assertEqual(self.run_it("find", self.dogs, "xyzzy", "golden"), 0)
        self.assertEqual(self.run_it("find", self.dogs, stdin=""), 1)

    def test_limit_max_cost_and_min_words_cut_the_list(self):
        text = "goldan gate bridge"
        self.assertEqual(self.found(self.dogs, text), [[BRIDGE, PUPPY]])
        self.assertEqual(self.found("--limit", "1", self.dogs, text), [[BRIDGE]])
        self.assertEqual(self.found("--max-cost", "8", self.dogs, text), [[BRIDGE]])
        self.assertEqual(self.found("--max-cost=0", self.dogs, text), [[]])
        self.assertEqual(self.found("--min-words", "2", self.dogs, text), [[BRIDGE]])

    def test_edits_are_limits_by_length(self):
        def found(edits):
            return self.found("--edits", edits, self.dogs, "gatt", "ritrivar")
        self.assertEqual(found("0,1,2"), [[BRIDGE], []])
        self.assertEqual(found("0,1,3"), [[BRIDGE], [PUPPY]])
        self.assertEqual(found("0,0,3"), [[], [PUPPY]])
        self.index("The Great Gatsby\n", None, "--mode", "text")
        self.assertEqual(self.found("--edits", "0,0,0,2", self.dogs, "the grate gatsby"),
                         [["The Great Gatsby"]])
        self.assertEqual(self.found("--edits", "3,3,3,0", self.dogs, "the grate gatsby"), [[]])

    def test_words_with_a_digit_are_found_exactly_unless_they_may_have_edits(self):
        self.index("room b117\n")
        self.assertEqual(self.found(self.dogs, "b118", "b117"), [[], ["room b117"]])
        self.assertEqual(self.found("--number-edits", "1", self.dogs, "b118", "b129"),
                         [["room b117"], []])
        self.assertEqual(self.found("--number-edits=3", "--edits", "0,0,0", self.dogs, "b118"),
                         [[]])

    def test_lengths_say_which_words_are_short_and_medium(self):
        self.assertEqual(self.found("--lengths", "4,5", self.dogs, "gatt"), [[]])
        self.assertEqual(self.found("--lengths", "1,3", self.dogs, "gutt"), [[BRIDGE]])
        self.assertEqual(self.found("--lengths", "0,4", self.dogs, "gutt"), [[]])
        self.assertEqual(self.found("--lengths=0,0", "--edits", "0,0,2", self.dogs, "gutt"),
                         [[BRIDGE]])

    def test_transpositions_are_one_edit_unless_they_are_not_wanted(self):
        def cost(*options):
            return json.loads(self.succeed("find", "--json", *options, self.dogs,
                                           "glodne gate bridge"))["matches"][0]["cost"]
        self.assertEqual(cost(), 2)
        self.assertGreater(cost("--no-transpositions"), 2)

    def test_overlaps(self):
        self.index("new york\nyork\nnew york city\n")
        def found(overlaps):
            return self.found("--overlaps", overlaps, self.dogs, "new york city")[0]
        self.assertEqual(sorted(found("all")), ["new york", "new york city", "york"])
        self.assertEqual(found("no-sub"), ["new york city"])
        self.assertEqual(found("longest"), ["new york city"])

    def test_a_budget_that_cuts_says_so(self):
        self.index("".join(f"golden retriever {name}\n" for name in ("Rex", "Bella", "Luna")))
        self.succeed("find", "--max-postings", "1", self.dogs, "golden")
        self.assertIn("--max-postings", self.err)
        self.assertEqual(self.err.count("\n"), 1)
        self.succeed("find", "--json", "--max-postings", "1", self.dogs, "golden")
        self.assertEqual(self.err, "")
        self.assertIs(json.loads(self.out)["truncated"], True)

    def test_wrong_options_name_what_is_right(self):
        find = ["find", self.dogs, "golden"]
        for option, value in (("--limit", "-1"), ("--limit", "many"), ("--max-cost", "-1"),
                              ("--min-words", "0"), ("--max-postings", "1e3"),
                              ("--limit", "99999999999999999999")):
            self.fail_with(f"{option}: give a whole number from", of=[*find, option, value])
        for edits in ("1", "0,1", "0,1,4", "0,1,x", "0,1,2,3,1", "0,,1", "-1,0,0"):
            self.fail_with("such as 0,1,2", of=[*find, f"--edits={edits}"])
        for edits in ("4", "-1", "x", "1,1"):
            self.fail_with("--number-edits: give a number from 0 to 3",
                           of=[*find, f"--number-edits={edits}"])
        for lengths in ("2", "2,5,7", "5,2", "-1,2", "2,x", ",5", "2,99999999999999999999"):
            self.fail_with("such as 2,5", of=[*find, f"--lengths={lengths}"])
        self.fail_with("--threads", "1 to 64", of=[*find, "--threads", "0"])
        self.fail_with("no-sub", of=[*find, "--overlaps", "some"])
        self.fail_with("--highlight", of=[*find, "--highlight", "--json"])
        self.fail_with("--json excludes --color always",
                       of=[*find, "--json", "--color", "always"])
        self.succeed(*find, "--json", "--color", "never")
        self.fail_with("wordcatcher find --help", of=["find"])

    def test_mode_of_an_image_is_remembered(self):
        self.fail_with("mode words", of=["find", "--mode", "text", self.dogs, "golden"])


class TablesFindTest(FindTest):
    """Tables do not remember their mode, nor the order of the words of their phrases."""
    tables = True

    def found(self, *arguments, **options):
        mode = ["--mode", "text"] if "the grate gatsby" in arguments else []
        return super().found(*mode, *arguments, **options)

    def test_mode_of_an_image_is_remembered(self):
        self.index("Catherine Schmidt\n", None, "--mode", "phonetic")
        self.assertEqual(self.found("--mode", "phonetic", self.dogs, "Kathryn Shmit"),
                         [["Catherine Schmidt"]])


class HighlightTest(TerminalTest):
    def setUp(self):
        super().setUp()
        self.index()

    coloured = f"a {YELLOW}goldan{RESET} {GREEN}gate{RESET}\n"

    def test_exact_words_are_green_and_words_with_edits_yellow(self):
        for option in (["--highlight"], ["--color", "always"]):
            out = self.succeed("find", "--limit", "1", *option, self.dogs, "a goldan gate")
            self.assertEqual(out, f"{self.coloured}5\t{BRIDGE}\t2-13\n")

    def test_a_text_without_matches_is_shown_as_it_is(self):
        self.assertEqual(self.run_it("find", "--highlight", self.dogs, "xyzzy"), 1)
        self.assertEqual(self.out, "xyzzy\n")

    def test_colours_come_by_themselves_only_on_a_terminal(self):
        find = ["find", "--limit", "1", self.dogs, "a goldan gate"]
        plain = f"5\t{BRIDGE}\t2-13\n"
        self.assertEqual(self.succeed(*find), plain)

        def shown(*options, **environment):
            return self.briefly(lambda: self.on_terminal(*find, *options, environment=environment))

        self.assertEqual(shown(), self.coloured + plain)
        self.assertEqual(shown(NO_COLOR="1"), plain)
        self.assertEqual(shown("--color", "never"), plain)
        self.assertNotIn("\x1b", shown("--json"))
        self.assertEqual(shown("--color", "always", NO_COLOR="1"), self.coloured + plain)


class StreamTest(TerminalTest):
    def setUp(self):
        super().setUp()
        self.index()

    def test_each_line_is_answered_before_the_next_one_comes(self):
        for threads in ("1", "4"):
            process = self.start("find", "--json", "--threads", threads, self.dogs)
            for text in ("golden", "xyzzy", "gate"):
                process.stdin.write(text.encode() + b"\n")
                process.stdin.flush()
                self.assertEqual(json.loads(self.line_of(process.stdout))["query"], text)
            process.stdin.close()
            self.assertEqual(process.wait(PATIENCE), 0)

    def test_threads_keep_the_order_and_the_answers(self):
        # Long texts are slow ones, so that answers are ready out of order.
        texts = "".join(f"text {i}: {'goldan retriver ' * (200 if i % 7 == 0 else 1)}\n"
                        for i in range(400))
        alone = self.succeed("find", "--json", self.dogs, stdin=texts)
        self.assertEqual(alone.count("\n"), 400)
        for threads in ("2", "8", "64"):
            self.assertEqual(
                self.succeed("find", "--json", "--threads", threads, self.dogs, stdin=texts), alone)
        words = [f"golden {i}" for i in range(50)]
        self.assertEqual(self.succeed("find", "--threads", "8", self.dogs, *words),
                         self.succeed("find", self.dogs, *words))

    def test_reading_stays_a_few_lines_ahead_of_a_reader_that_stopped(self):
        read_end, write_end = os.pipe()
        process = subprocess.Popen(
            [cli_test.PROGRAM, "find", "--threads", "4", self.dogs], stdin=read_end,
            stdout=subprocess.PIPE, stderr=subprocess.PIPE)
        self.addCleanup(process.communicate)
        self.addCleanup(process.kill)
        os.close(read_end)
        line = b"golden " * 150 + b"\n"
        sent = 0
        os.set_blocking(write_end, False)
        idle = time.monotonic()
        while time.monotonic() - idle < 1 and sent < 100_000_000:
            try:
                sent += os.write(write_end, line)
                idle = time.monotonic()
            except BlockingIOError:
                time.sleep(0.01)
        # Two pipes of at most 1 MiB, a block, and 64 lines.
        self.assertLess(sent, 4_000_000)
        os.close(write_end)

    def test_it_ends_when_the_reader_of_the_answers_goes_though_more_input_may_come(self):
        for threads in ("1", "4"):
            process = self.start("find", "--threads", threads, self.dogs)
            process.stdin.write(b"golden\n")
            process.stdin.flush()
            self.line_of(process.stdout)
            process.stdout.close()
            process.stdin.write(b"gate\n")
            process.stdin.flush()
            self.assertEqual(process.wait(PATIENCE), 0)
            self.assertEqual(process.stderr.read(), b"")

    def test_input_that_cannot_be_read(self):
        for threads in ("1", "4"):
            directory = os.open(self.root, os.O_RDONLY)
            done = subprocess.run([cli_test.PROGRAM, "find", "--threads", threads, self.dogs],
                                  stdin=directory, capture_output=True, timeout=PATIENCE)
            os.close(directory)
            self.assertEqual((done.returncode, done.stdout), (2, b""))
            self.assertEqual(done.stderr.count(b"\n"), 1)
            self.assertIn(b"give a text file", done.stderr)

    def test_output_that_cannot_be_written(self):
        for threads in ("1", "4"):
            with open("/dev/full", "wb") as full:
                done = subprocess.run([cli_test.PROGRAM, "find", "--threads", threads, self.dogs],
                                      input=b"golden\n" * 100, stdout=full, stderr=subprocess.PIPE,
                                      timeout=PATIENCE)
            self.assertEqual(done.returncode, 2)
            self.assertEqual(done.stderr.count(b"\n"), 1, done.stderr)

    def test_progress_over_a_file_when_it_takes_longer_than_a_second(self):
        for verb in ("find", "query"):
            with self.subTest(verb=verb):
                self.expect_progress(verb)

    def expect_progress(self, verb):
        texts = self.write("texts.txt", "goldan retriver\n" * 20000)
        reader, writer = os.pipe()
        answers = bytearray()
        is_shown = threading.Event()

        def read_late():
            # The pipe is full long before, so that the work must wait.
            is_shown.wait(PATIENCE)
            while chunk := os.read(reader, 65536):
                answers.extend(chunk)
            os.close(reader)

        late = threading.Thread(target=read_late)
        late.start()
        with open(texts, "rb") as stdin:
            shown = self.on_terminal(verb, self.dogs, stdin=stdin, stdout=writer,
                                     meanwhile=lambda: os.close(writer),
                                     when_shown=[(" % of 320000 bytes", is_shown.set)])
        late.join()
        self.assertRegex(shown, r"^\r\x1b\[K\[#* *\] \d+ % of 320000 bytes")
        self.assertTrue(shown.endswith("\r\x1b[K"), shown[-200:])
        self.assertEqual(answers.count(b"goldan retriver\n"), 20000)

    def test_no_progress_over_a_short_file(self):
        texts = self.write("texts.txt", "goldan retriver\n")

        def shown():
            with open(texts, "rb") as stdin:
                return self.on_terminal("find", self.dogs, stdin=stdin, stdout=subprocess.DEVNULL)

        self.assertEqual(self.briefly(shown), "")

    def test_progress_over_a_pipe_counts_what_came(self):
        for verb in ("find", "query"):
            with self.subTest(verb=verb):
                reader, writer = os.pipe()
                os.write(writer, b"goldan\n")
                # Each part of the input comes when what came before was counted.
                when_shown = [("\r\x1b[K7 bytes read", lambda: os.write(writer, b"retriver\n")),
                              ("\r\x1b[K16 bytes read", lambda: os.close(writer))]
                with open(reader, "rb") as stdin:
                    shown = self.on_terminal(verb, self.dogs, stdin=stdin,
                                             stdout=subprocess.DEVNULL, when_shown=when_shown)
                self.assertRegex(shown, r"^(\r\x1b\[K7 bytes read \.\.\. \d+ s)+"
                                        r"(\r\x1b\[K16 bytes read \.\.\. \d+ s)+\r\x1b\[K$")

    def test_nothing_is_shown_while_somebody_types(self):
        master, terminal = pty.openpty()
        with open(terminal, "rb") as stdin:
            def type_late():
                time.sleep(1.3)
                os.write(master, b"xyzzy\n\x04")
            shown = self.on_terminal("find", self.dogs, stdin=stdin, stdout=subprocess.DEVNULL,
                                     meanwhile=type_late)
        os.close(master)
        self.assertEqual(shown, "")


class WaitingTest(TerminalTest):
    tables = True

    def test_reading_tables_says_for_how_long_it_has_been_at_it(self):
        self.index()
        for verb in (["find", "--color", "never"], ["verify"], ["dot", "tree"]):
            with self.subTest(verb=verb):
                self.expect_waiting(verb)

    def expect_waiting(self, verb):
        arguments = [*verb, self.dogs] + (["golden"] if verb[0] == "find" else [])
        with open(self.path("dogs", EDGES), "rb") as table:
            fcntl.flock(table, fcntl.LOCK_EX)
            shown = self.on_terminal(*arguments, when_shown=[
                (f"\r\x1b[KReading {self.dogs} ... ", lambda: None),
                ("wordcatcher: waiting for", lambda: fcntl.flock(table, fcntl.LOCK_UN))])
        self.assertEqual(self.code, 0)
        self.assertIn(f"\r\x1b[KReading {self.dogs} ... ", shown)
        self.assertIn("\r\x1b[Kwordcatcher: waiting for", shown)
        self.assertRegex(shown, r"\r\x1b\[K[^\r]*(is whole: |\tgolden |digraph )[^\r]*$")

    def test_short_work_says_nothing(self):
        self.index()
        shown = self.briefly(lambda: self.on_terminal("verify", self.dogs))
        self.assertNotIn("Checking", shown)
        self.assertNotIn("Reading", shown)


class LongWorkTest(TerminalTest):
    def expect(self, note, *arguments, last):
        """The note appears when the work lasts, and is gone when `last` is printed."""
        # Nobody can tell which share of the machine the command gets after all.
        deadline = time.monotonic() + PATIENCE
        while True:
            shown = self.on_terminal(*arguments, slow_until=f"\r\x1b[K{note} ... ")
            self.assertIn(self.code, (0, 1), shown)
            if f"{note} ... " in shown or time.monotonic() > deadline:
                break
        self.assertRegex(shown, rf"\r\x1b\[K{re.escape(note)} \.\.\. \d+ s")
        self.assertIn(last, shown.rsplit("\r\x1b[K", 1)[1])
        self.assertNotIn(note, shown.rsplit("\r\x1b[K", 1)[1])

    def test_says_what_it_does_and_for_how_long(self):
        names = self.write("names.txt", cli_test.many_phrases(30_000))
        self.expect("Writing the index", "index", self.dogs, names, last="Indexed 30000 phrases")
        self.index(cli_test.many_phrases(100_000))
        self.expect(f"Checking {self.dogs}", "verify", self.dogs, last="is whole")
        self.expect("Explaining", "explain", self.dogs, "retriever number99999",
                    "retriever number50000 kennel50000", "--max-cost", "100", "--limit", "1000000",
                    last="Cost: ")
        # A text that is slow by itself, as are all the others, of which none comes.
        text = " ".join(f"retriver nunber{i} kenel" for i in range(900))
        self.expect("Answering", "find", "--color", "never", "--max-postings", "1000000000",
                    self.dogs, text, last="retriever")
        self.expect("Answering", "query", self.dogs, text, last="")


class ExplainTest(cli_test.CommandTest):
    def setUp(self):
        super().setUp()
        self.index()

    def test_the_cost_is_the_one_that_find_gives(self):
        text = "my goldan gate brigde"
        for match in json.loads(self.succeed("find", "--json", self.dogs, text))["matches"]:
            told = json.loads(self.succeed("explain", "--json", self.dogs, text, match["value"]))
            self.assertEqual(told["cost"], match["cost"])
            self.assertEqual(told["pairs"], match["hits"])
            self.assertIs(told["isFound"], True)

    def test_text_form_tells_pairs_missing_words_and_cost(self):
        out = self.succeed("explain", self.dogs, "a goldan gate", BRIDGE)
        for word in ("goldan", "golden", "bridge", "Cost: 5"):
            self.assertIn(word, out)

    def test_a_value_that_is_not_found_ends_with_1_and_a_reason(self):
        self.assertEqual(self.run_it("explain", self.dogs, "golden", "poodle"), 1)
        self.assertIn("no such", self.out)
        self.assertEqual(self.run_it("explain", self.dogs, "golden", "golden gate"), 1)
        self.assertIn(f'such as "{BRIDGE}"', self.out)
        self.assertEqual(self.run_it("explain", "--json", "--max-cost", "1", self.dogs, "a golden",
                                     BRIDGE), 1)
        told = json.loads(self.out)
        self.assertEqual((told["isStored"], told["isFound"]), (True, False))
        self.assertEqual(len(told["objections"]), 1)

    def test_a_match_that_the_limit_or_an_overlap_cuts_off_has_a_reason(self):
        text = "my goldan retriver"
        self.succeed("explain", "--limit", "2", self.dogs, text, BRIDGE)
        for cut, reason in ((("--limit", "1"), "first 1 "), (("--overlaps", "no-sub"), "range")):
            self.assertEqual(self.run_it("explain", *cut, self.dogs, text, BRIDGE), 1, self.out)
            self.assertIn(reason, self.out)

    def test_query_explains_the_classic_distance(self):
        text = "goldan retriver pupy"
        distance = json.loads(self.succeed("query", "--json", self.dogs, text))["matches"][0]
        told = json.loads(self.succeed("explain", "--query", "--json", self.dogs, text, PUPPY))
        self.assertEqual(told["distance"], distance["distance"])
        self.assertEqual(told["steps"][-1]["distance"], distance["distance"])
        self.assertIn("retriver", self.succeed("explain", "--query", self.dogs, text, PUPPY))

    def test_wrong_usage(self):
        self.fail_with("VALUE", of=["explain", self.dogs, "golden"])
        self.fail_with("--query", "--max-cost",
                       of=["explain", "--query", "--max-cost", "1", self.dogs, "golden", BRIDGE])
        self.fail_with("--query", "--limit",
                       of=["explain", "--query", "--limit", "1", self.dogs, "golden", BRIDGE])
        for option, value in (("--number-edits", "1"), ("--lengths", "2,5")):
            self.fail_with("--query", option,
                           of=["explain", "--query", option, value, self.dogs, "golden", BRIDGE])


class TablesExplainTest(ExplainTest):
    tables = True


class DotTest(cli_test.CommandTest):
    def dot(self, *arguments):
        """The nodes by their numbers, and the edges as (from, label, to), of a well-formed graph."""
        text = self.succeed("dot", *arguments)
        if shutil.which("dot"):
            drawn = subprocess.run(["dot", "-Tsvg"], input=text.encode(), capture_output=True,
                                   timeout=PATIENCE)
            self.assertEqual((drawn.returncode, drawn.stderr), (0, b""))
            self.svg = drawn.stdout.decode()
        label = r'label="((?:[^"\\]|\\.)*)"'
        nodes = {number: (name, bool(final)) for number, name, final
                 in re.findall(rf"^  n(\d+) \[{label}(, peripheries=2)?\];$", text, re.M)}
        edges = re.findall(rf"^  n(\d+) -> n(\d+) \[{label}\];$", text, re.M)
        self.assertIn("  start -> n0;\n", text)
        self.assertEqual(len(nodes) + len(edges) + 7, text.count("\n"))
        return nodes, [(source, symbol, target) for source, target, symbol in edges]

    @staticmethod
    def nfa_accepts(nodes, edges, word):
        def closed(states):
            while more := {target for source, symbol, target in edges
                           if source in states and symbol == ""} - states:
                states |= more
            return states
        states = closed({"0"})
        for letter in word:
            states = closed({target for source, symbol, target in edges
                             if source in states and symbol in (letter, "*")})
        return any(nodes[state][1] for state in states)

    @staticmethod
    def dfa_accepts(nodes, edges, word):
        targets = {(source, symbol): target for source, symbol, target in edges}
        state = "0"
        for letter in word:
            state = targets.get((state, letter), targets.get((state, "*")))
            if state is None:
                return False
        return nodes[state][1]

    def test_nfa_and_dfa_accept_what_is_near(self):
        nfa, dfa = self.dot("nfa", "gate", "1"), self.dot("dfa", "gate", "1")
        for word in ("gate", "gates", "gat", "game", "great", "gum", "gathers", "boat", "g"):
            near = word in ("gate", "gates", "gat", "game")
            self.assertEqual(self.nfa_accepts(*nfa, word), near, word)
            self.assertEqual(self.dfa_accepts(*dfa, word), near, word)

    def test_nfa_has_a_state_for_each_letter_and_edit(self):
        nodes, _ = self.dot("nfa", "bridge", "2")
        self.assertEqual(len(nodes), 7 * 3)
        self.assertEqual(nodes["0"], ("(0_0)", False))
        self.assertEqual(sum(final for _, final in nodes.values()), 3)

    def test_labels_are_quoted(self):
        for word, label, drawn in (('"', '\\"', "&quot;"), ("\\", "\\\\", "\\"), ("&", "&amp;", "&amp;"),
                            ("é", "é", "é"), ("\n", "U+000A", "U+000A"), ("<", "<", "&lt;")):
            _, edges = self.dot("nfa", word, "0")
            self.assertEqual([symbol for _, symbol, _ in edges], [label])
            if shutil.which("dot"):
                self.assertIn(drawn, self.svg.replace("&#45;", "-").replace("&#39;", "'"))
        _, edges = self.dot("nfa", "😀", "0")
        self.assertEqual([symbol for _, symbol, _ in edges], ["U+D83D", "U+DE00"])
        self.dot("nfa", "--", "-5", "1")

    def words(self, nodes, edges):
        def below(node, text):
            found = [text] if nodes[node][1] else []
            for source, symbol, target in edges:
                if source == node:
                    found += below(target, text + symbol)
            return found
        return sorted(below("0", nodes["0"][0]))

    def test_tree_spells_the_words_of_an_index(self):
        self.index("golden retriever\ngolden gate\ngold\nÅngström\n")
        self.assertEqual(self.words(*self.dot("tree", self.dogs)),
                         ["gate", "gold", "golden", "retriever", "ångström"])
        nodes, edges = self.dot("tree", self.dogs, "go")
        self.assertEqual(self.words(nodes, edges), ["gold", "golden"])
        self.assertEqual([symbol for _, symbol, _ in edges], ["ld", "en"])
        self.assertEqual(self.words(*self.dot("tree", self.dogs, "golden")), ["golden"])

    def test_tree_of_whole_texts_shows_their_spaces(self):
        self.index("The Great Gatsby\n", None, "--mode", "text")
        nodes, edges = self.dot("tree", self.dogs)
        self.assertIn("theU+0020greatU+0020gatsby", self.words(nodes, edges))

    def test_too_large_drawings_say_what_to_do(self):
        self.index(cli_test.many_phrases(300))
        self.fail_with("More than 200 words", 'such as "', of=["dot", "tree", self.dogs])
        self.fail_with("longer PREFIX", 'such as "number', of=["dot", "tree", self.dogs, "number"])
        self.assertEqual(len(self.words(*self.dot("tree", self.dogs, "number29"))), 11)
        self.fail_with("No words", '"zebra"', of=["dot", "tree", self.dogs, "zebra"])
        self.fail_with("smaller K", of=["dot", "dfa", "retriever", "4"])
        self.fail_with("shorter", of=["dot", "nfa", "retriever" * 8, "1"])

    def test_wrong_usage(self):
        self.fail_with("wordcatcher dot nfa --help", "0 to 4", of=["dot", "nfa", "gate", "5"])
        self.fail_with("wordcatcher dot dfa --help", of=["dot", "dfa", "gate", "-1"])
        self.fail_with("wordcatcher dot --help", of=["dot"])
        self.fail_with("UTF-8", of=["dot", "nfa", b"caf\xe9", "1"])
        self.fail_with("There is no index", of=["dot", "tree", self.path("absent.wci")])
        self.fail_with("name of the index is empty", of=["dot", "tree", ""])


class TablesDotTest(DotTest):
    tables = True

    def test_a_table_that_another_process_holds_is_waited_for(self):
        self.index()
        with locked(self.path("dogs", DATA)):
            process = self.start("dot", "tree", self.dogs)
            time.sleep(0.3)
            self.assertIsNone(process.poll())
        self.assertIn(b"digraph", process.communicate(timeout=PATIENCE)[0])
        self.assertEqual(process.returncode, 0)


class FirstStepsTest(cli_test.CommandTest):
    def test_the_three_commands_shown_work_as_they_stand(self):
        self.assertEqual(self.run_it(), 2)
        commands = re.findall(r"^  (\S.*)$", self.err, re.M)
        self.assertEqual(len(commands), 3)
        path = os.path.dirname(cli_test.PROGRAM) + ":" + os.environ["PATH"]
        for command, verb in zip(commands, ("index", "find", "explain")):
            self.assertIn(f"wordcatcher {verb} ", command)
            done = subprocess.run(command, shell=True, cwd=self.root, capture_output=True,
                                  env={**os.environ, "PATH": path}, timeout=PATIENCE)
            self.assertEqual(done.returncode, 0, done.stderr)


if __name__ == "__main__":
    cli_test.heed_interrupts()
    cli_test.PROGRAM = os.path.abspath(sys.argv[1])
    unittest.main(argv=[sys.argv[0], *sys.argv[2:]])
