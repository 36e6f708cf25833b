"""The README's Python example and the example program, as they stand."""

import os
import re
import subprocess
import sys
from pathlib import Path

import wordcatcher

PROJECT = Path(__file__).parents[2]
PACKAGES = Path(wordcatcher.__file__).parents[1]
ENVIRONMENT = dict(os.environ, PYTHONPATH=str(PACKAGES), PYTHONIOENCODING="utf-8")


def run(arguments: list[str], directory: Path, typed: str = "") -> str:
    return subprocess.run(
        [sys.executable, *arguments],
        cwd=directory,
        env=ENVIRONMENT,
        input=typed,
        encoding="utf-8",
        check=True,
        stdout=subprocess.PIPE,
    ).stdout


def test_the_readmes_example_prints_what_its_comments_say(tmp_path: Path) -> None:
    readme = (PROJECT / "README.md").read_text(encoding="utf-8")
    (example,) = re.findall(r"```python\n(.*?)```", readme, re.DOTALL)
    expected = re.findall(r"^ *# (.*\n)", example, re.MULTILINE)
    assert expected
    assert run(["-c", example], tmp_path) == "".join(expected)


def test_the_packages_first_example_works(tmp_path: Path) -> None:
    example = re.search(r"\n\n((?:    .*\n|\n)+)", wordcatcher.__doc__).group(1)
    unindented = re.sub("^    ", "", example, flags=re.MULTILINE)
    assert run(["-c", unindented], tmp_path) == "Trinidad and Tobago 6\n"


def test_the_search_box_suggests(tmp_path: Path) -> None:
    names = ["Trinidad and Tobago", "Bosnia and Herzegovina", "Papua New Guinea", "New Zealand"]
    (tmp_path / "names").write_text("\n".join(names), encoding="utf-8")
    typed = "tobbago\nfly to new zeelnd \N{AIRPLANE}\nNew Zealand\nxylophone\n"
    program = PROJECT / "examples" / "search_box" / "search_box.py"
    assert run([str(program), "names"], tmp_path, typed).splitlines() == [
        "[tobbago]: Trinidad and Tobago",
        "fly to [new] [zeelnd] \N{AIRPLANE}: New Zealand",
        "fly to [new] zeelnd \N{AIRPLANE}: Papua New Guinea",
        "[New] [Zealand]: New Zealand (exactly)",
        "[New] Zealand: Papua New Guinea",
        "xylophone: nothing",
    ]
