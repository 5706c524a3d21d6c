"""`pip install` of the package, without a network."""

import os
import shutil
import subprocess
import sys

USE = """
import morvik, numpy
print(morvik.__file__)
bits = numpy.random.default_rng(1).integers(0, 2, (10, 40))
decoded = morvik.Decoder().decode(*morvik.awgn(morvik.encode(bits), 10.0, rng=1))
assert numpy.array_equal(decoded.bits, bits)
"""


def test_pip_installs(repository, tmp_path):
    environment = {name: value for name, value in os.environ.items() if name != "PYTHONPATH"}
    # Compiling several sources at a time, without optimisation, takes a fraction of the time, and less with clang.
    environment["CMAKE_ARGS"] = "-DCMAKE_BUILD_TYPE= -DMORVIK_JOIN_SOURCES=ALL -DMORVIK_KERNEL_OPTIMISATION=-O0"
    if shutil.which("clang++"):
        environment |= {"CC": "clang", "CXX": "clang++"}

    def run(*command):
        done = subprocess.run(
            command, env=environment, cwd=tmp_path, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True
        )
        assert done.returncode == 0, done.stdout
        return done.stdout

    # Of the interpreter itself, which may be that of an environment already.
    run(getattr(sys, "_base_executable", sys.executable), "-m", "venv", "--system-site-packages", tmp_path / "env")
    python = tmp_path / "env/bin/python"
    source = tmp_path / "source"
    copied = ["--exclude=./build", "--exclude=./.git", "--exclude=./tests", "--exclude=./bindings/python/build"]
    subprocess.run(f"mkdir {source}; tar -C {repository} {' '.join(copied)} -c . | tar -C {source} -x", shell=True, check=True)
    run(python, "-m", "pip", "install", "--no-index", "--no-build-isolation", source / "bindings/python")
    assert run(python, "-c", USE).startswith(str(tmp_path / "env"))
    files = run(python, "-m", "pip", "show", "-f", "morvik")
    for file in ("morvik/py.typed", "morvik/_core.pyi", "morvik/_core.cpython"):
        assert file in files
