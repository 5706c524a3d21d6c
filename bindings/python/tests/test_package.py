"""The package itself: its types, strings and files."""

import doctest
import inspect
import os
import subprocess
import sys
from pathlib import Path

import morvik
import pytest

PACKAGE = Path(morvik.__file__).parent


def run(*command, **environment):
    result = subprocess.run(
        [sys.executable, *command],
        env={**os.environ, "MYPYPATH": str(PACKAGE.parent), **environment},
        stdout=subprocess.PIPE,
        stderr=subprocess.STDOUT,
        text=True,
    )
    assert result.returncode == 0, result.stdout
    return result.stdout


def test_types_are_consistent(tmp_path):
    run("-m", "mypy", "--strict", "--cache-dir", str(tmp_path), str(PACKAGE))


def test_stubs_tell_what_the_module_has(tmp_path):
    config = tmp_path / "mypy.ini"
    config.write_text(f"[mypy]\ncache_dir = {tmp_path}\n")
    metaclasses = tmp_path / "metaclasses"  # pybind11 has one of its own
    metaclasses.write_text("".join(f"morvik._core.{name}\n" for name in ("Checker", "Decoder", "LinkOptions", "StopRules", "Sweep", "Transport")))
    options = ["--ignore-positional-only", "--mypy-config-file", str(config), "--allowlist", str(metaclasses)]
    run("-m", "mypy.stubtest", *options, "morvik._core")


def test_wrong_use_is_a_type_error_before_it_runs(tmp_path):
    script = tmp_path / "use.py"
    script.write_text(
        "import morvik\n"
        "reveal_type(morvik.Decoder(2).decode([0], [0], [0]).bits)\n"
        "morvik.Decoder(2).decode([0], [0], [0], llr=True)\n"
    )
    result = subprocess.run(
        [sys.executable, "-m", "mypy", "--cache-dir", str(tmp_path), str(script)],
        env={**os.environ, "MYPYPATH": str(PACKAGE.parent)},
        capture_output=True,
        text=True,
    )
    assert 'use.py:2: note: Revealed type is "numpy.ndarray[Any, numpy.dtype[numpy.unsignedinteger' in result.stdout
    assert 'use.py:3: error: Unexpected keyword argument "llr"' in result.stdout


def test_everything_has_a_docstring():
    for name in morvik.__all__:
        value = getattr(morvik, name)
        if inspect.isclass(value) or inspect.isfunction(value):
            assert inspect.getdoc(value), name
    for module in (morvik.lte, morvik.units):
        for name in module.__all__:
            assert inspect.getdoc(getattr(module, name)), name
    for kind in (morvik.Decoder, morvik.lte.Transport):
        for name, member in inspect.getmembers(kind):
            if not name.startswith("_"):
                assert inspect.getdoc(member), name


def test_example_of_the_docstring():
    assert doctest.testmod(morvik).failed == 0
    for module in (morvik.lte, morvik.units):
        tested = doctest.testmod(module)
        assert tested.failed == 0 and tested.attempted > 0


def test_version_is_that_of_the_project(repository):
    assert f"project(morvik VERSION {morvik.__version__} " in (repository / "CMakeLists.txt").read_text()


def test_module_shows_nobody_its_copy_of_the_library():
    (module,) = PACKAGE.glob("_core.*.so")
    symbols = subprocess.run(["nm", "-D", "--defined-only", module], capture_output=True, text=True, check=True).stdout
    assert [line.split()[-1] for line in symbols.splitlines()] == ["PyInit__core"]


@pytest.mark.parametrize("before", ["", "import morvik\n"])
def test_a_subinterpreter_is_refused(tmp_path, before):
    script = tmp_path / "subinterpreter.py"
    script.write_text(
        f"{before}"
        "import _xxsubinterpreters as interpreters\n"
        "inner = interpreters.create()\n"
        "try:\n"
        "    interpreters.run_string(inner, 'import morvik')\n"
        "except interpreters.RunFailedError as error:\n"
        "    print(error)\n"
    )
    result = subprocess.run([sys.executable, str(script)], capture_output=True, text=True, timeout=60)
    assert result.returncode == 0, result.stderr
    assert "ImportError" in result.stdout
    assert "morvik works in the main interpreter alone, not in a subinterpreter" in result.stdout
