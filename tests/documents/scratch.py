"""The folder in which the commands of documents run: a copy of the tree, on what has been built already."""

import os
import pathlib
import shutil
import signal
import subprocess

TREE = pathlib.Path(__file__).resolve().parents[2]
TIME_LIMIT = 100  # seconds for a block

# In the place of the scripts that set up and build.
STAND_INS = {
    "run": """
if [ $# -eq 0 ] || [ "$1" = bench ]; then
    echo "run $*: takes minutes, mark the block as not run" >&2
    exit 1
fi
exec "BUILD/bin/morvik" "$@"
""",
    "scripts/build": r"""
grep -qF "\"configurePreset\": \"$1\"" "TREE/CMakePresets.json" || { echo "build: no preset $1" >&2; exit 1; }
for target in "${@:2}"; do
    ninja -C "BUILD" -t query "$target" >/dev/null || exit 1
done
""",
    "scripts/setup": r"""
for group; do
    grep -qE -e "^ +$group\)" "TREE/scripts/setup" || { echo "setup: no group $group" >&2; exit 1; }
done
""",
}


class Scratch:
    """A folder in which commands run; what they have in /tmp is in a folder of its own."""

    def __init__(self, folder, environment):
        self.folder = pathlib.Path(folder) / "clone"
        self.folder.mkdir()
        self.temporary = pathlib.Path(folder) / "tmp"
        self.temporary.mkdir()
        self.environment = {**os.environ, "LC_ALL": "C.UTF-8", **environment}

    def run(self, commands):
        """Runs commands of a shell, returns their exit status and what they print on both streams."""
        commands = commands.replace("/tmp/", f"{self.temporary}/")
        process = subprocess.Popen(["bash", "-euo", "pipefail", "-c", commands], cwd=self.folder, env=self.environment,
                                   stdin=subprocess.DEVNULL, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                                   text=True, start_new_session=True)
        try:
            printed, _ = process.communicate(timeout=TIME_LIMIT)
        except subprocess.TimeoutExpired:
            os.killpg(process.pid, signal.SIGKILL)
            raise
        status = process.returncode
        return status if status >= 0 else 128 - status, printed.replace(f"{self.temporary}/", "/tmp/")


def copy_of_tree(folder, build):
    """A scratch folder with a copy of the tree, whose scripts take what is built in the folder BUILD."""
    build = pathlib.Path(build).resolve()
    scratch = Scratch(folder, {
        "PATH": f"{build}/bin:{os.environ['PATH']}",
        "PYTHONPATH": f"{build}/python",
        "PYTHONDONTWRITEBYTECODE": "1",
        "MPLBACKEND": "Agg",
        # What Verilator makes is compiled without optimisation, and its own sources once.
        "MAKEFLAGS": "OPT_FAST=-O0 OPT_SLOW=-O0 OPT_GLOBAL=-O0",
        "OBJCACHE": f"{TREE}/bindings/systemverilog/tests/compile_once",
        "KEPT_OBJECTS": str(build / "tests/documents/objects"),
        "OMPI_ALLOW_RUN_AS_ROOT": "1",
        "OMPI_ALLOW_RUN_AS_ROOT_CONFIRM": "1",
    })
    shutil.copytree(TREE, scratch.folder, dirs_exist_ok=True,
                    ignore=lambda at, _: {"build", ".git"} if at == str(TREE) else {"__pycache__"})
    (scratch.folder / "build" / build.name).mkdir(parents=True)
    for built in build.iterdir():
        if built.name != "octave":  # which a document builds, and other tests use at the same time
            (scratch.folder / "build" / build.name / built.name).symlink_to(built)
    for name, text in STAND_INS.items():
        (scratch.folder / name).write_text("#!/bin/bash" + text.replace("BUILD", str(build)).replace("TREE", str(TREE)))
    return scratch
