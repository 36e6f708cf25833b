"""The page of the module that scripts/docs-python makes."""

import importlib.machinery
import importlib.util
import inspect
import re
from pathlib import Path
from types import ModuleType

import pytest

import wordcatcher

PROGRAM = Path(__file__).parents[2] / "scripts" / "docs-python"
PUBLIC = [name for name in wordcatcher.__all__ if name != "__version__"]


@pytest.fixture(scope="module")
def program() -> ModuleType:
    loader = importlib.machinery.SourceFileLoader("docs_python", str(PROGRAM))
    module = importlib.util.module_from_spec(importlib.util.spec_from_loader("docs_python", loader))
    loader.exec_module(module)
    return module


@pytest.fixture(scope="module")
def sections(program: ModuleType) -> dict[str, str]:
    """What stands below each heading."""
    _, *parts = re.split(r"^##+ (.*)\n", program.page(), flags=re.MULTILINE)
    return dict(zip(parts[::2], parts[1::2], strict=True))


def plain(text: str) -> str:
    unescaped = re.sub(r"&#(\d+);", lambda match: chr(int(match[1])), text)
    return " ".join(unescaped.replace("`", "").split())


@pytest.mark.parametrize("name", PUBLIC)
def test_a_class_has_its_section(name: str, sections: dict[str, str]) -> None:
    cls = getattr(wordcatcher, name)
    assert inspect.getdoc(cls).splitlines()[0] in plain(sections[name])
    for member, value in vars(cls).items():
        if member.startswith("_"):
            continue
        if isinstance(value, property):
            assert re.search(rf"^- `{member}`, `[^`]+`: \w", sections[name], re.MULTILINE)
            assert " ".join(inspect.getdoc(value).split()) in plain(sections[name])
        else:
            first = inspect.getdoc(getattr(cls, member)).splitlines()[0]
            assert first in plain(sections[f"{name}.{member}"])


@pytest.mark.parametrize("name", ["open", "find", "find_many", "explain", "query", "search"])
def test_a_method_shows_its_parameters_with_types_and_defaults(
    name: str, sections: dict[str, str]
) -> None:
    shown = re.match(r"\n```python\n(.*?)\n```", sections[f"Index.{name}"], re.DOTALL)[1]
    made: dict = {}
    exec("from __future__ import annotations\ndef " + shown + ": ...", made)
    signature = inspect.signature(made[name])
    actual = inspect.signature(getattr(wordcatcher.Index, name))
    parameters = [
        [(each.name, each.kind, each.default) for each in told.parameters.values()]
        for told in (signature, actual)
    ]
    assert parameters[0] == [each for each in parameters[1] if each[0] != "self"]
    assert all(each.annotation is not each.empty for each in signature.parameters.values())
    assert "_Path" not in shown and "_Overlaps" not in shown


def test_results_say_what_they_hold(sections: dict[str, str]) -> None:
    for result, held in (("Find", "FoundPhrase"), ("Query", "QueryMatch"), ("Search", "WordMatch")):
        assert f"- `matches`, `tuple[{held}, ...]`: " in sections[f"{result}Result"]


def test_lists_and_examples_stay_what_they_are(program: ModuleType) -> None:
    text = (
        "Some words.\n\n    first = 1\n\n    second = 2\n\n"
        "limit     At most so many\n          of them.\nmax_cost  The cost."
    )
    assert program.blocks(text) == (
        "Some words.\n\n```python\nfirst = 1\n\nsecond = 2\n```\n\n"
        "- `limit`: At most so many of them.\n- `max_cost`: The cost."
    )
    assert program.inline("find() of a*b, as text[a:b] <all>") == (
        "`find()` of a&#42;b, as `text[a:b]` &#60;all&#62;"
    )


def test_what_is_not_documented_is_an_error(program: ModuleType) -> None:
    def bare() -> None: ...

    with pytest.raises(SystemExit, match="Index.bare has no docstring"):
        program.docstring(bare, "Index.bare")
