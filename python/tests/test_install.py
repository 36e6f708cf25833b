"""What `cmake --install --component python` gives."""

import os
import shutil
import subprocess
import sys
from pathlib import Path

import pytest

BUILD = os.environ.get("WORDCATCHER_BUILD")


@pytest.mark.skipif(BUILD is None, reason="ctest tells where the build tree is")
def test_the_installed_package_finds_its_library(tmp_path: Path) -> None:
    prefix = tmp_path / "prefix"
    installation = ["cmake", "--install", BUILD, "--component", "python", "--prefix", prefix]
    subprocess.run(
        installation,
        check=True,
        stdout=subprocess.DEVNULL,
        env={name: value for name, value in os.environ.items() if name != "LD_PRELOAD"},
    )
    packages = prefix / os.environ["WORDCATCHER_PYTHON_DIR"]
    installed = {path.relative_to(packages) for path in prefix.rglob("*") if path.is_file()}
    modules = {path for path in installed if path.suffix == ".so"}
    assert len(modules) == 1
    assert {str(path) for path in installed - modules} == {
        "wordcatcher/__init__.py",
        "wordcatcher/__init__.pyi",
        "wordcatcher/py.typed",
    }

    libraries = prefix / os.environ["WORDCATCHER_LIBDIR"]
    libraries.mkdir(exist_ok=True)
    shutil.copy(os.environ["WORDCATCHER_LIBRARY"], libraries)
    told = (
        "import wordcatcher; print(wordcatcher.__file__);"
        "print([line.split()[-1] for line in open('/proc/self/maps') if 'libwordcatcher' in line][0])"
    )
    environment = dict(os.environ, PYTHONPATH=str(packages))
    environment.pop("LD_LIBRARY_PATH", None)
    package, library = subprocess.run(
        [sys.executable, "-c", told],
        cwd=tmp_path,
        env=environment,
        check=True,
        text=True,
        stdout=subprocess.PIPE,
    ).stdout.splitlines()
    assert Path(package) == packages / "wordcatcher" / "__init__.py"
    assert Path(library).parent == libraries
