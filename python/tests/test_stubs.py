"""The type stubs and the module have the same names and parameters."""

import ast
import enum
import inspect
import pydoc
from pathlib import Path

import pytest

import wordcatcher

PACKAGE = Path(wordcatcher.__file__).parent
STUB = ast.parse((PACKAGE / "__init__.pyi").read_text(encoding="utf-8"))
CLASSES = {node.name: node for node in STUB.body if isinstance(node, ast.ClassDef)}
PUBLIC = sorted(name for name in CLASSES if not name.startswith("_"))

# What every class of the module has, and every type checker knows of.
OF_EVERY_CLASS = {"__eq__", "__hash__", "__repr__", "__str__", "__init__", "__match_args__"}
OF_THE_MACHINERY = {"__doc__", "__module__", "__new__", "__init__", "__reduce__", "_unpickled"}


class Kind(enum.Enum):
    METHOD = "method"
    STATIC = "static method"
    PROPERTY = "property"


def members(name: str) -> dict[str, ast.FunctionDef]:
    """The functions of a class of the stub, with those of its base."""
    node = CLASSES[name]
    found: dict[str, ast.FunctionDef] = {}
    for base in node.bases:
        named = base.value if isinstance(base, ast.Subscript) else base
        if isinstance(named, ast.Name) and named.id in CLASSES:
            found |= members(named.id)
    return found | {each.name: each for each in node.body if isinstance(each, ast.FunctionDef)}


def kind_in_stub(function: ast.FunctionDef) -> Kind:
    decorators = {each.id for each in function.decorator_list if isinstance(each, ast.Name)}
    if "property" in decorators:
        return Kind.PROPERTY
    return Kind.STATIC if "staticmethod" in decorators else Kind.METHOD


def kind_in_module(member: object) -> Kind:
    if isinstance(member, property):
        return Kind.PROPERTY
    return Kind.STATIC if isinstance(member, staticmethod) else Kind.METHOD


def parameters_in_stub(function: ast.FunctionDef) -> list[tuple]:
    """Name, kind and default of each parameter but self."""
    described = {}
    exec(  # The stub is the project's own.
        f"def described({ast.unparse(without_types(function.args))}): ...", {}, described
    )
    return parameters(inspect.signature(described["described"]))


def without_types(arguments: ast.arguments) -> ast.arguments:
    for each in arguments.args + arguments.kwonlyargs:
        each.annotation = None
    return arguments


def parameters(signature: inspect.Signature) -> list[tuple]:
    return [
        (each.name, each.kind, each.default)
        for each in signature.parameters.values()
        if each.name != "self"
    ]


def test_the_package_is_typed() -> None:
    assert (PACKAGE / "py.typed").exists()


def test_the_stub_has_the_modules_names() -> None:
    assert sorted(wordcatcher.__all__) == sorted([*PUBLIC, "__version__"])
    compiled = {name for name in vars(wordcatcher._wordcatcher) if not name.startswith("__")}
    assert compiled == set(PUBLIC)


@pytest.mark.parametrize("name", [name for name in PUBLIC if name != "Error"])
def test_a_class_has_the_stubs_members(name: str) -> None:
    stub = members(name)
    actual = {
        member: value
        for member, value in vars(getattr(wordcatcher, name)).items()
        if member not in OF_EVERY_CLASS | OF_THE_MACHINERY
    }
    assert set(actual) == set(stub) - OF_EVERY_CLASS
    for member, value in actual.items():
        assert kind_in_module(value) is kind_in_stub(stub[member]), member


@pytest.mark.parametrize(
    ("name", "member"),
    [
        (name, member)
        for name in PUBLIC
        for member, function in members(name).items()
        if kind_in_stub(function) is not Kind.PROPERTY
        and (member in ("__init__", "__enter__", "__exit__") or not member.startswith("__"))
    ],
)
def test_a_method_has_the_stubs_parameters(name: str, member: str) -> None:
    cls = getattr(wordcatcher, name)
    actual = inspect.signature(cls if member == "__init__" else getattr(cls, member))
    assert parameters(actual) == parameters_in_stub(members(name)[member])


@pytest.mark.parametrize("name", PUBLIC)
def test_everything_is_documented(name: str) -> None:
    cls = getattr(wordcatcher, name)
    assert cls.__module__ == "wordcatcher"
    assert inspect.getdoc(cls)
    for member, value in vars(cls).items():
        if not member.startswith("_"):
            assert inspect.getdoc(value), member


def test_help_shows_parameters_and_reasons() -> None:
    page = pydoc.plain(pydoc.render_doc(wordcatcher))
    assert "find(text, *, limit=10, max_cost=None" in page.replace("...) method of", "")
    assert "The phrases that a text holds" in page
    assert "IndexBuilder(path, mode='words', tables=None)" in page
    assert "class FindResult" in page


def test_the_version_is_the_librarys() -> None:
    assert wordcatcher.__version__.count(".") == 2
