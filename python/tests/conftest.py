"""What the tests of the Python module share."""

from pathlib import Path

import pytest

import wordcatcher

NAMES = (
    "Trinidad and Tobago",
    "Bosnia and Herzegovina",
    "Papua New Guinea",
    "New Zealand",
    "Guinea-Bissau",
)


@pytest.fixture
def image(tmp_path: Path) -> Path:
    """An index of names of countries."""
    path = tmp_path / "names.wci"
    with wordcatcher.IndexBuilder(path) as builder:
        for name in NAMES:
            builder.add(name)
    return path


@pytest.fixture
def index(image: Path) -> wordcatcher.Index:
    return wordcatcher.Index.open(image)
