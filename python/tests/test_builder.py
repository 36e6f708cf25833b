"""What IndexBuilder promises."""

import os
import threading
from pathlib import Path

import pytest

from wordcatcher import Error, Index, IndexBuilder


def test_leaving_the_block_commits(tmp_path: Path) -> None:
    with IndexBuilder(tmp_path / "dogs.wci") as builder:
        builder.add("golden retriever")
        assert not (tmp_path / "dogs.wci").exists()
    assert [match.value for match in Index.open(tmp_path / "dogs.wci").find("golden")] == [
        "golden retriever"
    ]


def test_an_exception_that_leaves_the_block_writes_nothing(image: Path) -> None:
    before = image.read_bytes()
    with pytest.raises(KeyError):
        with IndexBuilder(image) as builder:
            builder.add("golden retriever")
            raise KeyError("retriever")
    assert image.read_bytes() == before
    assert os.listdir(image.parent) == [image.name]
    with pytest.raises(ValueError, match="closed"):
        builder.commit()


def test_a_commit_in_the_block_is_the_only_one(tmp_path: Path) -> None:
    path = tmp_path / "dogs.wci"
    with IndexBuilder(path) as builder:
        builder.add("golden retriever")
        size = builder.commit()
        assert size == path.stat().st_size
        with pytest.raises(ValueError, match="closed"):
            builder.add("border collie")
    assert Index.open(path).info().phrases == 1


def test_data_is_the_phrase_unless_something_else_is_given(tmp_path: Path) -> None:
    with IndexBuilder(tmp_path / "dogs.wci") as builder:
        builder.add("golden retriever")
        builder.add("border collie", "border collie{ 7 }")
        builder.add("irish setter", data=None)
    index = Index.open(tmp_path / "dogs.wci")
    assert index.find("retriever")[0].value == "golden retriever"
    assert index.find("collie")[0].value == "border collie{ 7 }"
    assert len(index.find("setter")) == 0
    assert index.search("setter", 0)[0].data == ()


def test_counts_go_on_after_the_commit(tmp_path: Path) -> None:
    builder = IndexBuilder(tmp_path / "dogs.wci")
    assert (builder.phrase_count, builder.word_count) == (0, 0)
    builder.add("golden retriever")
    builder.add("golden gate")
    builder.add("golden gate")
    assert (builder.phrase_count, builder.word_count) == (3, 3)
    assert repr(builder) == f"<wordcatcher.IndexBuilder '{tmp_path / 'dogs.wci'}', 3 phrases>"
    builder.commit()
    assert (builder.phrase_count, builder.word_count) == (3, 3)
    assert repr(builder).endswith("3 phrases, closed>")


def test_a_failed_commit_may_be_tried_again(tmp_path: Path) -> None:
    builder = IndexBuilder(tmp_path / "kennel" / "dogs.wci")
    builder.add("golden retriever")
    with pytest.raises(Error) as failure:
        builder.commit()
    assert failure.value.code == "not_writable"
    (tmp_path / "kennel").mkdir()
    builder.commit()
    assert Index.open(tmp_path / "kennel" / "dogs.wci").info().phrases == 1


@pytest.mark.parametrize("phrase", ["golden\0retriever", "golden \ud83d retriever"])
def test_what_cannot_be_stored_is_bad_input(tmp_path: Path, phrase: str) -> None:
    builder = IndexBuilder(tmp_path / "dogs.wci")
    with pytest.raises(Error) as failure:
        builder.add(phrase)
    assert failure.value.code == "bad_input"
    with pytest.raises(Error):
        builder.add("golden retriever", phrase)
    assert builder.phrase_count == 0


def test_wrong_arguments(tmp_path: Path) -> None:
    with pytest.raises(ValueError, match="'words', 'text', 'phonetic', not 'letters'"):
        IndexBuilder(tmp_path / "dogs.wci", mode="letters")  # type: ignore[arg-type]
    with pytest.raises(TypeError):
        IndexBuilder(7)  # type: ignore[arg-type]
    with pytest.raises(ValueError, match="null"):
        IndexBuilder("dogs\0.wci")
    builder = IndexBuilder(tmp_path / "dogs.wci")
    with pytest.raises(TypeError):
        builder.add(b"golden retriever")  # type: ignore[arg-type]
    with pytest.raises(TypeError, match="str or None"):
        builder.add("golden retriever", 7)  # type: ignore[arg-type]


@pytest.mark.parametrize("mode", ["words", "text", "phonetic"])
def test_the_index_remembers_its_mode(tmp_path: Path, mode: str) -> None:
    with IndexBuilder(tmp_path / "dogs.wci", mode) as builder:  # type: ignore[arg-type]
        builder.add("golden retriever")
    assert Index.open(tmp_path / "dogs.wci").info().mode == mode


def test_tables_of_a_classic_index(tmp_path: Path) -> None:
    tables = tmp_path / "tables"
    tables.mkdir()
    with IndexBuilder(tmp_path / "dogs.wci", tables=tables) as builder:
        builder.add("golden retriever")
    assert sorted(os.listdir(tables)) == ["dataTable.tdb", "edgeTable.tdb", "finalTable.tdb"]
    classic = Index.open(tables)
    assert classic.info().phrases == 0
    assert [match.value for match in classic.query("goldn retriver")] == ["golden retriever"]


def test_paths_that_are_not_utf8(tmp_path: Path) -> None:
    name = os.fsencode(tmp_path) + b"/dogs\xff.wci"
    with IndexBuilder(name) as builder:
        builder.add("golden retriever")
    index = Index.open(Path(os.fsdecode(name)))
    assert os.fsencode(index.path) == name
    assert "dogs\\udcff.wci" in repr(index)
    with pytest.raises(Error) as failure:
        Index.open(name + b"\xfe")
    assert failure.value.code == "not_found"


def test_a_builder_that_commits_is_closed_to_other_threads(tmp_path: Path) -> None:
    builder = IndexBuilder(tmp_path / "dogs.wci")
    for number in range(20000):
        builder.add(f"retriever number{number} kennel{number}")
    closed = []

    def add() -> None:
        try:
            while True:
                builder.add("golden retriever")
        except ValueError as error:
            closed.append(str(error))

    thread = threading.Thread(target=add)
    thread.start()
    builder.commit()
    thread.join()
    assert closed == ["The builder is closed; make another one."]
    Index.open(tmp_path / "dogs.wci").verify()
