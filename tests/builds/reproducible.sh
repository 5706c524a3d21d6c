#!/usr/bin/env bash
# Compiles a few of the library's sources with a build's own flags in two folders of different names: the objects are the
# same. What else of a folder might get into the files that are shipped, hardening.sh looks for there.
#   reproducible.sh SOURCE COMPILE_COMMANDS
set -euo pipefail
source=$1 commands=$2
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT

compile_in() {
    mkdir -p "$1/build"
    cp -r "$source/src" "$source/lanes" "$source/include" "$source/rules" "$1/"
    python3 - "$source" "$commands" "$1" <<'PYTHON'
import json
import pathlib
import shlex
import subprocess
import sys

source, commands, folder = sys.argv[1:]
wanted = {f"{source}/{name}" for name in ("src/Components.cpp", "src/TDecoder.cpp", "src/TNumberFormat.cpp")}
found = {entry["file"]: entry["command"] for entry in json.load(open(commands)) if entry["file"] in wanted}
assert found.keys() == wanted, found.keys()
for file, command in found.items():
    words = shlex.split(command.replace(f"{source}/", f"{folder}/"))
    words[words.index("-o") + 1] = f"{folder}/build/{pathlib.Path(file).stem}.o"
    subprocess.run([*words, "-g"], check=True, cwd=f"{folder}/build")
PYTHON
}

compile_in "$folder/one"
compile_in "$folder/another/place"
diff -r "$folder/one/build" "$folder/another/place/build"
