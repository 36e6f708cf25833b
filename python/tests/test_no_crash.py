"""No Python program ends the interpreter: what cannot be done is an exception."""

import copy
import gc
import os
import pickle
import subprocess
import sys
from collections.abc import Iterator
from pathlib import Path

import pytest

import wordcatcher
from wordcatcher import EditLimits, FoundWord, Index, IndexBuilder

CLASSES = [
    value
    for name in wordcatcher.__all__
    if isinstance(value := getattr(wordcatcher, name), type) and not issubclass(value, Exception)
]
MOST = 2**64 - 1


def ends_well(program: str, directory: Path) -> str:
    """What a program prints that is run by itself, as it might crash."""
    ended = subprocess.run(
        [sys.executable, "-X", "faulthandler", "-c", program],
        cwd=directory,
        env=dict(os.environ, PYTHONPATH=str(Path(wordcatcher.__file__).parents[1])),
        encoding="utf-8",
        stdout=subprocess.PIPE,
        stderr=subprocess.STDOUT,
        timeout=120,
    )
    assert ended.returncode == 0, ended.stdout
    return ended.stdout


def refuses(statements: str, tmp_path: Path) -> None:
    """Whether they raise TypeError; by themselves, as what they would make crashes."""
    indented = "".join(f"    {line}\n" for line in statements.splitlines())
    program = (
        "import wordcatcher\nfrom wordcatcher import *\n"
        f"try:\n{indented}except TypeError as error:\n    print('refused:', error)\n"
    )
    assert ends_well(program, tmp_path).startswith("refused: ")


@pytest.mark.parametrize("name", [each.__name__ for each in CLASSES if each is not EditLimits])
@pytest.mark.parametrize("call", ["{0}()", "{0}.__new__({0})", "{0}.__mro__[1].__new__({0})"])
def test_there_is_no_object_without_a_value(name: str, call: str, tmp_path: Path) -> None:
    refuses(f"x = {call.format(name)}; repr(x); hash(x)", tmp_path)


def test_new_makes_whole_objects_of_classes_with_constructors(tmp_path: Path) -> None:
    made = "EditLimits.__new__(EditLimits{})"
    printed = ends_well(
        f"from wordcatcher import *; print({made.format('')}); "
        f"print({made.format(', long_edits=3')}); "
        "b = IndexBuilder.__new__(IndexBuilder, 'dogs.wci'); b.add('collie'); print(b.commit() > 0)",
        tmp_path,
    )
    assert printed.splitlines() == [repr(EditLimits()), repr(EditLimits(long_edits=3)), "True"]


def test_a_second_init_changes_nothing(tmp_path: Path) -> None:
    builder = IndexBuilder(tmp_path / "dogs.wci")
    builder.add("golden retriever")
    builder.__init__(tmp_path / "cats.wci")  # type: ignore[misc]
    assert builder.phrase_count == 1
    limits = EditLimits(long_edits=3)
    limits.__init__(long_edits=1)  # type: ignore[misc]
    assert limits.long_edits == 3


@pytest.mark.parametrize(
    "statements",
    [
        "Index.__mro__[1].__new__(Index.__mro__[1])",
        "class Mine(Index.__mro__[1]):\n    def __init__(self): pass\nMine()",
        "type(Index)('Mine', (), {})()",
        "class Mine(EditLimits):\n    def __init__(self): pass\nMine().long_edits",
        "Index.__new__ = lambda kind: None\nIndex.__mro__[1].__new__(Index).find('tobago')",
        "x = EditLimits()\nx.__class__ = Index\nx.find('tobago')",
        "class Mine: pass\nMine.__class__ = type(Index)\nMine()",
    ],
)
def test_what_pybind11_leaves_open_is_refused(statements: str, tmp_path: Path) -> None:
    refuses(statements, tmp_path)


def test_a_class_cannot_be_derived_from(tmp_path: Path) -> None:
    for each in CLASSES:
        with pytest.raises(TypeError, match="No class can be derived"):
            type("Mine", (each,), {})


def test_an_index_is_copied_and_pickled_by_its_path(index: Index) -> None:
    expected = index.find("tobbago")
    copies = [copy.copy(index), copy.deepcopy(index), copy.deepcopy([index])[0]]
    for protocol in range(pickle.HIGHEST_PROTOCOL + 1):
        copies.append(pickle.loads(pickle.dumps(index, protocol)))
    for each in copies:
        assert each is not index
        assert (each.path, each.find("tobbago")) == (index.path, expected)
    os.unlink(index.path)
    with pytest.raises(wordcatcher.Error):
        copy.copy(index)
    assert index.find("tobbago") == expected


def test_a_builder_cannot_be_copied_or_pickled(tmp_path: Path) -> None:
    builder = IndexBuilder(tmp_path / "dogs.wci")
    for call in (copy.copy, copy.deepcopy, pickle.dumps):
        with pytest.raises(TypeError, match="cannot pickle"):
            call(builder)


def test_parts_of_a_pickle_that_are_out_of_the_text(index: Index) -> None:
    make, (kind, parts) = index.explain("trinidat", "Trinidad and Tobago").__reduce__()
    words = make(FoundWord, (MOST, 0, "trinidad", 1)), make(FoundWord, (3, MOST, "trinidad", 1))
    (at,) = (
        number
        for number, part in enumerate(parts)
        if isinstance(part, tuple) and part and isinstance(part[0], FoundWord)
    )
    for text in ("trinidat", "é", ""):
        for word in words:
            changed = make(kind, (text, *parts[1:at], (word,), *parts[at + 1 :]))
            assert repr(word) in repr(changed)
            assert changed.to_json()
            try:
                assert str(changed)
            except IndexError:
                pass


DAEMONS = {
    "find": "while True: index.find('trinidat and tobbago ' * size)",
    "find_many": "while True: index.find_many(['trinidat and tobbago ' * size] * 100, 3)",
    "find_many of a generator": "while True: index.find_many(itertools.repeat('trinidat'), 2)",
    "find_many of Python code": "while True: index.find_many((each for each in endless()), 2)",
    "query": "while True: index.query('trinidat and tobbago ' * size)",
    "open": "while True: Index.open(index.path).verify()",
    "commit": "while True: built(10 * size).commit()",
}


@pytest.mark.parametrize("name", DAEMONS)
@pytest.mark.parametrize("size", [1, 300])
def test_the_interpreter_ends_while_daemon_threads_work(
    name: str, size: int, image: Path, tmp_path: Path
) -> None:
    program = f"""
import itertools, threading, time
from wordcatcher import Index, IndexBuilder

index, size = Index.open({str(image)!r}), {size}

def endless():
    while True:
        yield "trinidat"

def built(count):
    builder = IndexBuilder(f"{{threading.get_ident()}}.wci")
    for number in range(count):
        builder.add(f"retriever{{number}}")
    return builder

def work():
    {DAEMONS[name]}

for _ in range(4):
    threading.Thread(target=work, daemon=True).start()
time.sleep(0.2)
print("ends")
"""
    assert ends_well(program, tmp_path) == "ends\n"


def test_a_builders_block_is_left_twice(tmp_path: Path) -> None:
    builder = IndexBuilder(tmp_path / "dogs.wci")
    builder.add("golden retriever")
    for failure in (None, None, ValueError, 3):
        builder.__exit__(failure, None, None)  # type: ignore[arg-type]
    with pytest.raises(ValueError, match="closed"):
        builder.__enter__().add("border collie")
    with pytest.raises(ValueError, match="closed"):
        builder.commit()
    assert Index.open(tmp_path / "dogs.wci").info().phrases == 1


def test_results_outlive_their_index_and_each_other(image: Path) -> None:
    index = Index.open(image)
    result = index.find("trinidat and tobbago")
    expected = list(result)
    matches, word, find = iter(result), result[0].hits[0], index.find
    del index, result
    gc.collect()
    assert list(matches) == expected
    assert word == expected[0].hits[0]
    assert list(find("trinidat and tobbago")) == expected


def test_texts_that_come_from_the_index_itself(image: Path) -> None:
    indexes = [Index.open(image)]

    def deeper(depth: int) -> Iterator[str]:
        if depth > 0:
            indexes[0].find_many(deeper(depth - 1), 2)
        yield "tobbago"

    assert len(indexes[0].find_many(deeper(20))) == 1

    def dropping() -> Iterator[str]:
        indexes.clear()
        gc.collect()
        yield "tobbago"

    (result,) = indexes[0].find_many(dropping())
    assert result[0].value == "Trinidad and Tobago"


def test_texts_that_change_meanwhile(index: Index) -> None:
    texts = ["tobbago"]

    def growing() -> Iterator[str]:
        for text in texts:
            if len(texts) < 20000:
                texts.append("trinidat")
            yield text

    assert len(index.find_many(growing())) == 20000

    def shrinking() -> Iterator[str]:
        for text in texts:
            texts.clear()
            yield text

    assert len(index.find_many(shrinking())) == 1


@pytest.mark.parametrize(
    "options",
    [
        {"limit": MOST},
        {"max_cost": MOST},
        {"min_words": MOST},
        {"max_postings": MOST},
        {"edits": EditLimits(short_length=MOST, medium_length=MOST, short_edits=3)},
        {"edits": EditLimits(short_length=0, medium_length=0, long_edits=3, number_edits=3)},
    ],
)
def test_the_greatest_numbers(index: Index, options: dict) -> None:
    for text in ("", "tobbago", "a " * 5000, "x" * 5000, "\0\ud800tobago\udfff\0", "🐶" * 3000):
        result = index.find(text, **options)
        assert index.find_many([text] * 3, MOST, **options) == [result] * 3
        assert index.explain(text, "Trinidad and Tobago", **options).to_json()


@pytest.mark.parametrize("words", [0, 1, MOST])
@pytest.mark.parametrize("units", [0, 1, MOST])
def test_the_greatest_and_smallest_sizes(image: Path, words: int, units: int) -> None:
    index = Index.open(image, max_query_words=words, max_word_units=units)
    for text in ("", "tobbago", "a " * 500, "x" * 500, "\0\ud800tobago\udfff\0"):
        assert index.find(text) == index.find(text)
        assert index.query(text) == index.query(text)
        assert str(index.explain(text, "Trinidad and Tobago"))
        assert str(index.explain_query(text, "Trinidad and Tobago"))


def test_a_name_that_is_no_text(index: Index, tmp_path: Path) -> None:
    with pytest.raises(TypeError, match="unexpected keyword argument"):
        index.find("tobbago", **{"limit\ud800": 1})  # type: ignore[arg-type]
    with pytest.raises(TypeError, match="unexpected keyword argument"):
        index.query("tobbago", **{"\ud800": 1})


def test_a_number_that_empties_the_call(index: Index) -> None:
    class Emptying:
        def __index__(self) -> int:
            for each in gc.get_objects():
                if type(each) is dict and each.get("limit") is self:
                    each.clear()
            return 1

    assert len(index.find("trinidat and tobbago", min_words=1, limit=Emptying())) <= 2
