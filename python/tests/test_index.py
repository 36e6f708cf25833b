"""What Index promises."""

import copy
import os
import pickle
import subprocess
import sys
from pathlib import Path

import pytest

import wordcatcher
from wordcatcher import EditLimits, Error, Index, IndexBuilder


def values(result) -> list[str]:
    return [match.value for match in result]


def test_find_gives_the_best_phrase_first(index: Index) -> None:
    result = index.find("trinidat and tobbago")
    assert values(result) == ["Trinidad and Tobago", "Bosnia and Herzegovina"]
    best = result[0]
    assert (best.cost, best.begin, best.end) == (2, 0, 20)
    assert [(hit.begin, hit.end, hit.word, hit.edits) for hit in best.hits] == [
        (0, 8, "trinidad", 1),
        (9, 12, "and", 0),
        (13, 20, "tobago", 1),
    ]
    assert not result.truncated


def test_find_options(index: Index) -> None:
    text = "trinidat and tobbago"
    assert len(index.find(text, limit=1)) == 1
    assert len(index.find(text, limit=0)) == 0
    assert len(index.find(text, limit=None)) == 2
    assert values(index.find(text, max_cost=2)) == ["Trinidad and Tobago"]
    assert values(index.find(text, min_words=2)) == ["Trinidad and Tobago"]
    assert values(index.find(text, min_words=2, edits=EditLimits(long_edits=0))) == []
    assert values(index.find(text, overlaps="no_sub")) == ["Trinidad and Tobago"]
    assert values(index.find(text, overlaps="longest")) == ["Trinidad and Tobago"]
    assert index.find(text, max_postings=1).truncated
    swapped = "tirnidad"
    assert index.find(swapped)[0].hits[0].edits == 1
    assert index.find(swapped, transpositions=False)[0].hits[0].edits == 2


@pytest.mark.parametrize(
    ("options", "error"),
    [
        ({"limit": -1}, ValueError),
        ({"limit": "3"}, TypeError),
        ({"max_cost": 2**64}, ValueError),
        ({"min_words": 0}, ValueError),
        ({"min_words": None}, TypeError),
        ({"edits": 2}, TypeError),
        ({"transpositions": "no"}, TypeError),
        ({"overlaps": "some"}, ValueError),
        ({"overlaps": None}, TypeError),
        ({"max_postings": -1}, ValueError),
        ({"max_words": 2}, TypeError),
    ],
)
def test_options_that_cannot_be(index: Index, options: dict, error: type[Exception]) -> None:
    (name,) = options
    for call in (
        lambda: index.find("tobago", **options),
        lambda: index.find_many(["tobago"], **options),
        lambda: index.explain("tobago", "Trinidad and Tobago", **options),
    ):
        with pytest.raises(error, match=name):
            call()


def test_edit_limits() -> None:
    limits = EditLimits(long_edits=3)
    assert repr(limits) == (
        "EditLimits(short_length=2, medium_length=5, short_edits=0, medium_edits=1, "
        "long_edits=3, whole_text_edits=3, number_edits=0)"
    )
    assert limits == EditLimits(long_edits=3) != EditLimits()
    assert len({limits, EditLimits(long_edits=3), EditLimits()}) == 2
    with pytest.raises(ValueError, match="medium_edits is at most 3"):
        EditLimits(medium_edits=4)
    with pytest.raises(ValueError, match="number_edits is at most 3"):
        EditLimits(number_edits=4)
    with pytest.raises(AttributeError):
        limits.long_edits = 1  # type: ignore[misc]


def test_query_tells_nothing_found_from_no_match(index: Index) -> None:
    found = index.query("trinidat and tobbago")
    assert found.found
    assert (found[0].value, found[0].distance, found[0].data) == ("Trinidad and Tobago", 1, ())
    nothing = index.query("xylophone")
    assert not nothing.found
    assert not nothing


def test_whole_texts(tmp_path: Path) -> None:
    with IndexBuilder(tmp_path / "dogs.wci", "text") as builder:
        builder.add("golden retriever", "a dog")
        builder.add("golden retriever", "a friend")
    index = Index.open(tmp_path / "dogs.wci")
    (match,) = index.query("golden retriver")
    assert (match.value, match.distance, match.data) == ("golden retriever", 1, ("a dog", "a friend"))
    assert values(index.find("goldn retriver")) == ["a dog", "a friend"]


def test_search(index: Index) -> None:
    assert values(index.search("guinnnea")) == values(index.search("guinnnea", 2)) == ["guinea"]
    assert values(index.search("guinnnnea")) == []
    (match,) = index.search(word="guinnea", max_distance=1)
    assert (match.value, match.distance) == ("guinea", 1)
    assert match.data == ("Guinea-Bissau", "Papua New Guinea")
    for distance in (17, 10**15):
        with pytest.raises(Error) as failure:
            index.search("guinea", distance)
        assert failure.value.code == "bad_input"
    with pytest.raises(ValueError, match="max_distance"):
        index.search("guinea", -1)
    with pytest.raises(Error) as failure:
        index.search("guinea\ud800", 1)
    assert failure.value.code == "bad_input"


def test_explain(index: Index) -> None:
    explanation = index.explain("\N{DOG} trinidat", "Trinidad and Tobago", max_cost=4)
    assert explanation.is_stored and not explanation.is_found
    assert explanation.cost == 5
    assert explanation.missing == ("and", "tobago")
    (pair,) = explanation.pairs
    assert explanation.text[pair.begin : pair.end] == "trinidat"
    (word,) = explanation.words
    assert (word.begin, word.end) == (2, 10)
    assert [each.within for each in word.comparisons] == [True, False, False]
    assert len(explanation.objections) == 1
    assert "Paired: trinidat with trinidad, 1 edit\n" in str(explanation)
    assert '"begin":2,"end":10' in explanation.to_json()
    assert not index.explain("trinidat", "Tobago").is_stored
    assert index.explain("trinidat", "Trinidad and Tobago", limit=1).is_found
    assert not index.explain("trinidat", "Trinidad and Tobago", limit=0).is_found
    with pytest.raises(Error) as failure:
        index.explain("trinidat", "Tobago\udcff")
    assert failure.value.code == "bad_input"


def test_explain_numbers_and_codes(tmp_path: Path) -> None:
    for mode in ("words", "phonetic"):
        with IndexBuilder(tmp_path / mode, mode) as builder:
            builder.add("Catherine b117")
    numbers = Index.open(tmp_path / "words")
    assert values(numbers.find("b118")) == []
    assert values(numbers.find("b118", edits=EditLimits(number_edits=1))) == ["Catherine b117"]
    explanation = numbers.explain("b118", "Catherine b117")
    (word,) = explanation.words
    assert (word.written, word.is_looked_up) == ("", True)
    assert [each.limit for each in word.comparisons] == [0, 0]
    assert [(each.word, each.length_limit, each.limit) for each in explanation.phrase] == [
        ("catherine", 2, 2),
        ("b117", 1, 0),
    ]
    codes = Index.open(tmp_path / "phonetic").explain("déar "
                                                      "Kathryn", "Catherine b117")
    assert [each.written for each in codes.words] == ["déar",
                                                      "Kathryn"]
    assert codes.words[1].word == "k0rn"
    assert codes.surplus == (f"{codes.words[0].written} ({codes.words[0].word})",)


def test_explain_query(index: Index) -> None:
    explanation = index.explain_query("trinidat and tobbago", "Trinidad and Tobago")
    assert explanation.is_found
    assert explanation.distance == index.query("trinidat and tobbago")[0].distance
    assert explanation.steps[-1].distance == explanation.distance
    assert explanation.steps[0].sentence in str(explanation)
    assert '"isFound":true' in explanation.to_json()


def test_results_are_sequences(index: Index) -> None:
    result = index.find("trinidat and tobbago")
    assert len(result) == 2
    assert list(result) == list(result.matches) == [result[0], result[1]]
    assert (result[-1], result[-2]) == (result[1], result[0])
    assert result[:1] == (result[0],)
    assert result[1] in result
    for number in (2, -3):
        with pytest.raises(IndexError):
            result[number]


def test_results_compare_by_what_they_hold(index: Index) -> None:
    first, again = (index.find("trinidat and tobbago") for _ in range(2))
    assert first == again and hash(first) == hash(again)
    assert first[0] == again[0] != first[1]
    assert first != index.find("trinidad and tobago")
    assert first != first.matches
    assert first[0].hits[0] != first[0].hits[1]


def test_results_are_immutable(index: Index) -> None:
    match = index.find("tobbago")[0]
    for name in ("value", "cost", "name"):
        with pytest.raises(AttributeError):
            setattr(match, name, 1)


def test_results_can_be_pickled_copied_and_matched(index: Index) -> None:
    for result in (
        index.find("trinidat"),
        index.query("trinidat"),
        index.search("trinidat", 1),
        index.explain("trinidat", "Trinidad and Tobago"),
        index.explain_query("trinidat", "Trinidad and Tobago"),
        index.info(),
        EditLimits(long_edits=1),
    ):
        for protocol in range(pickle.HIGHEST_PROTOCOL + 1):
            assert pickle.loads(pickle.dumps(result, protocol)) == result
        assert copy.copy(result) == result
        assert copy.deepcopy(result) == result
    match index.find("tobbago")[0].hits[0]:
        case hit_class if type(hit_class).__match_args__ == ("begin", "end", "word", "edits"):
            assert repr(hit_class) == "FoundWord(begin=0, end=7, word='tobago', edits=1)"
        case other:
            pytest.fail(f"no words are matched by {other}")


def test_names_are_those_of_the_package(index: Index) -> None:
    """Not of the compiled module, which nobody imports."""
    shown = [repr(index), repr(Index), repr(EditLimits), repr(index.find("tobbago"))]
    for wrong in (lambda: IndexBuilder(), lambda: Index.open(), lambda: index.info(3)):
        with pytest.raises(TypeError) as failure:
            wrong()
        shown.append(str(failure.value))
        assert "wordcatcher.Index" in shown[-1]
    for pickled in (index, index.find("tobbago"), index.info(), EditLimits()):
        shown.append(repr(pickle.dumps(pickled)))
    assert [text for text in shown if "_wordcatcher" in text] == []


def test_info(index: Index, image: Path) -> None:
    info = index.info()
    assert (info.mode, info.phrases, info.words, info.values) == ("words", 5, 10, 5)
    assert info.bytes == image.stat().st_size
    assert len(info.generation) == 32
    assert repr(index) == (
        f"<wordcatcher.Index '{image}', mode='words', phrases=5, words=10, values=5>"
    )


def test_a_pickled_index_is_opened_again(image: Path, monkeypatch: pytest.MonkeyPatch) -> None:
    monkeypatch.chdir(image.parent)
    pickled = pickle.dumps(Index.open(image.name, copy=True, max_query_words=1, max_word_units=9))
    asked = (
        "import pickle, sys; index = pickle.loads(sys.stdin.buffer.read());"
        "print(index.path, index.find('tobbago trinidat').truncated,"
        " index.search('herzegovina', 0).truncated, index.find('tobbago')[0].value)"
    )
    packages = Path(wordcatcher.__file__).parents[1]
    told = subprocess.run(
        [sys.executable, "-c", asked],
        input=pickled,
        cwd="/",
        env=dict(os.environ, PYTHONPATH=str(packages)),
        check=True,
        stdout=subprocess.PIPE,
    ).stdout.decode()
    assert told == f"{image} True True Trinidad and Tobago\n"


def test_a_pickled_classic_index_keeps_its_mode(tmp_path: Path) -> None:
    with IndexBuilder(tmp_path / "dogs.wci", "text", tables=tmp_path) as builder:
        builder.add("golden retriever")
    index = pickle.loads(pickle.dumps(Index.open(tmp_path, mode="text")))
    assert index.info().mode == "text"
    assert index.query("goldn retriver")[0].distance == 2


def test_errors_have_codes(tmp_path: Path, image: Path) -> None:
    def code(path: Path) -> str:
        with pytest.raises(Error) as failure:
            Index.open(path).verify()
        copied = pickle.loads(pickle.dumps(failure.value))
        assert (str(copied), copied.code) == (str(failure.value), failure.value.code)
        return failure.value.code

    assert code(tmp_path / "none.wci") == "not_found"
    (tmp_path / "text.wci").write_text("Trinidad and Tobago\n" * 100)
    assert code(tmp_path / "text.wci") == "not_an_index"
    whole = image.read_bytes()
    (tmp_path / "cut.wci").write_bytes(whole[: len(whole) // 2])
    assert code(tmp_path / "cut.wci") == "damaged"
    changed = bytearray(whole)
    changed[-1] ^= 0xFF
    (tmp_path / "changed.wci").write_bytes(changed)
    assert code(tmp_path / "changed.wci") == "damaged"


def test_an_error_of_a_path_that_is_not_utf8_has_its_sentence(tmp_path: Path) -> None:
    with pytest.raises(Error, match="none\N{REPLACEMENT CHARACTER}.wci"):
        Index.open(os.fsencode(tmp_path) + b"/none\xff.wci")


def test_wrong_arguments(index: Index, image: Path) -> None:
    with pytest.raises(ValueError, match="mode is one of"):
        Index.open(image, mode="letters")  # type: ignore[arg-type]
    with pytest.raises(ValueError, match="max_query_words"):
        Index.open(image, max_query_words=-1)
    with pytest.raises(TypeError):
        type("Mine", (Index,), {})


@pytest.mark.parametrize(
    ("call", "sentence"),
    [
        ('Index("names.wci")', "opened with wordcatcher.Index.open(path)"),
        ("Index()", "opened with wordcatcher.Index.open(path)"),
        ("index.find(3)", "text is a str, not int"),
        ('index.find(b"tobago")', "text is a str, not bytes"),
        ("index.find()", "find(text, *, ...) lacks its argument text"),
        ("index.find(limit=3)", "find(text, *, ...) lacks its argument text"),
        ('index.find("tobago", 3)', "takes 1 argument by place, not 2; give options by name"),
        ('index.find("tobago", text="trinidad")', "find(text, *, ...) is given text twice"),
        ("index.find_many(3)", "texts is an iterable of str, not int"),
        ('index.find_many(["tobago"], 2, 3)', "takes 2 arguments by place, not 3"),
        ('index.explain("tobago")', "explain(text, value, *, ...) lacks its argument value"),
        ("index.query(None)", "text is a str, not NoneType"),
        ('index.query("tobago", limit=3)', "unexpected keyword argument 'limit'"),
        ('index.search("tobago", "2")', "max_distance is an int"),
        ("index.search(3)", "word is a str, not int"),
        ('index.explain_query("tobago", 3)', "value is a str, not int"),
        ('IndexBuilder("new.wci").add(3)', "phrase is a str, not int"),
        ('IndexBuilder("new.wci").add("tobago", 3)', "data is a str or None, not int"),
    ],
)
def test_a_wrong_call_is_told_in_one_sentence(index: Index, call: str, sentence: str) -> None:
    with pytest.raises(TypeError) as failure:
        eval(call, {"index": index, "Index": Index, "IndexBuilder": IndexBuilder})
    assert sentence in str(failure.value)
    assert "\n" not in str(failure.value)


def test_a_pickle_of_another_version_says_what_to_do(index: Index) -> None:
    for kept in (index, index.find("tobbago"), index.find("tobbago")[0].hits[0], EditLimits()):
        make, (kind, parts) = kept.__reduce__()
        assert make(kind, parts) == kept or kind is Index
        for others in ((*parts, "new"), parts[1:], (*parts[:1], "wrong", *parts[2:])):
            with pytest.raises(ValueError, match=rf"than {wordcatcher.__version__}.*make it anew"):
                make(kind, others)
