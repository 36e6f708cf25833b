"""Offsets count code points of the str, whatever its characters."""

import unicodedata
from pathlib import Path

import pytest

from wordcatcher import Index, IndexBuilder

PHRASES = (
    "golden retriever",
    "İstanbul",
    "Straße",
    "Café Müller",
    "東京 タワー",
    "𝒜nna",
)


@pytest.fixture
def index(tmp_path: Path) -> Index:
    path = tmp_path / "phrases.wci"
    with IndexBuilder(path) as builder:
        for phrase in PHRASES:
            builder.add(phrase)
    return Index.open(path)


def pieces(index: Index, text: str, value: str) -> list[str]:
    """The parts of the text at which the words of a value were found."""
    (match,) = [match for match in index.find(text) if match.value == value]
    assert match.begin == min(hit.begin for hit in match.hits)
    assert match.end == max(hit.end for hit in match.hits)
    return [text[hit.begin : hit.end] for hit in match.hits]


@pytest.mark.parametrize("noise", ["x", "ß", "東", "\N{DOG}", "\N{DOG}\N{ZERO WIDTH JOINER}", "\ud800"])
def test_whatever_stands_before(index: Index, noise: str) -> None:
    text = f"{noise} goldn {noise} retriver {noise}"
    assert pieces(index, text, "golden retriever") == ["goldn", "retriver"]
    assert index.find_many([text] * 3) == [index.find(text)] * 3


@pytest.mark.parametrize(
    ("text", "value", "found"),
    [
        ("nach İstanbul!", "İstanbul", ["İstanbul"]),
        ("die STRAßE, die Strasse", "Straße", ["STRAßE"]),
        ("𝒜nna und 𝒜nna", "𝒜nna", ["𝒜nna"]),
        ("im Café Müler", "Café Müller", ["Café", "Müler"]),
    ],
)
def test_letters_of_several_bytes(index: Index, text: str, value: str, found: list[str]) -> None:
    assert pieces(index, text, value) == found


def test_accents_of_their_own(index: Index) -> None:
    text = unicodedata.normalize("NFD", "beim Müller")
    assert len(text) == 12
    # The stored letter is one, so this is two edits, which a long word may have.
    assert pieces(index, text, "Café Müller") == [unicodedata.normalize("NFD", "Müller")]


def test_scripts_without_spaces(index: Index) -> None:
    text = "昨日東京タワーへ"
    assert "".join(pieces(index, text, "東京 タワー")) == "東京タワー"


@pytest.mark.parametrize("surrogate", ["\ud800", "\udbff", "\udc00", "\udcff", "\udfff"])
def test_lone_surrogates_separate_words(index: Index, surrogate: str) -> None:
    text = f"goldn{surrogate}retriver"
    assert pieces(index, text, "golden retriever") == ["goldn", "retriver"]
    assert index.query(text).matches == index.query("goldn retriver").matches
    explanation = index.explain(text, "golden retriever")
    assert [text[word.begin : word.end] for word in explanation.words] == ["goldn", "retriver"]


def test_hangul_beside_the_surrogates_bytes(index: Index) -> None:
    # U+D7A3 begins with the byte with which surrogates begin.
    text = "\ud7a3 \ud800\ud7a3 retriver"
    assert pieces(index, text, "golden retriever") == ["retriver"]
    assert index.explain(text, "x").text == text.replace("\ud800", "\N{REPLACEMENT CHARACTER}")


def test_explanations_count_code_points_as_well(index: Index) -> None:
    text = "\N{DOG}\N{DOG} ß retriver"
    explanation = index.explain(text, "golden retriever")
    assert [text[word.begin : word.end] for word in explanation.words] == ["ß", "retriver"]
    assert "Paired: retriver with retriever, 1 edit\n" in str(explanation)
