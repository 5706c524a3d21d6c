#!/usr/bin/env python3
"""Each folder, but for the tests in it, includes only what stands below it, and rules/ allocates nothing.

  floors.py ROOT
"""

import pathlib
import re
import sys

# What each folder may include, besides itself and include/. The map in CONTRIBUTING.md is this table in words.
BELOW = {
    "rules": "",
    "base": "",
    "lanes": "rules",
    "src": "lanes rules",
    "link/random": "",
    "link/kernels": "",
    "link/coding": "link/kernels rules",
    "link/modulation": "link/kernels",
    "link/tables": "",
    "link/channel": "link/kernels link/random rules",
    "link": "link/channel link/coding link/kernels link/modulation link/random link/tables rules",
    "simulation": "base link link/channel link/coding link/modulation link/tables rules",
    "report": "base simulation rules",
    "hardware/testbench": "base rules src",
    "hardware/tables": "base",
    "hardware/vectors": "base hardware/comparison hardware/coverage hardware/tables hardware/testbench link link/channel link/coding link/random rules simulation",
    "hardware/trace": "base hardware/tables hardware/testbench rules",
    "hardware/comparison": "base hardware/testbench rules src",
    "hardware/coverage": "base hardware/comparison hardware/testbench rules",
    "hardware/units": "base hardware/tables hardware/testbench rules",
    "hardware/checker": "base hardware/comparison hardware/coverage hardware/testbench rules",
    "hardware/diagnosis": "base hardware/testbench link/coding rules simulation",
    "hardware/diagnosis/chain": "base hardware/diagnosis hardware/testbench link link/coding link/modulation rules simulation",
    "app": "base hardware/comparison hardware/coverage hardware/diagnosis hardware/diagnosis/chain hardware/tables hardware/testbench hardware/trace hardware/units hardware/vectors link link/coding link/modulation link/random report rules simulation src",
    "bindings/icarus": "bindings/simulator hardware/testbench hardware/units rules",
    "bindings/javascript/core": "app base link link/channel link/coding link/random rules simulation",
    "bindings/octave": "bindings link link/coding rules",
    "bindings/python/module": "base hardware/testbench hardware/units link link/channel link/coding link/random rules simulation src",
    "bindings/simulator": "base bindings hardware/testbench hardware/units",
    "bindings/systemverilog": "bindings/simulator",
    "bindings/vhdl": "bindings/simulator",
    "bindings": "",
    "validation": "link link/channel link/coding link/modulation link/random rules src",
}


def floor_of(path):
    """The folder of the table that a file belongs to."""
    return next((str(parent) for parent in path.parents if str(parent) in BELOW), None)


def found(header, path, folder, root):
    """Where the header lies, relative to the root: beside the file, in its folder, from the root or in include/."""
    places = (path.parent / header, root / folder / header, root / header, root / "include" / header)
    return next((place.relative_to(root) for place in places if place.exists()), None)


def includes(text, root):
    """The project's own headers, however the include is written."""
    for mark, header in re.findall(r'^\s*#\s*include\s*([<"])([^">]+)[">]', text, re.MULTILINE):
        if mark == '"' or (root / header.split("/")[0]).is_dir():
            yield header


def allocations(root):
    for path in sorted((root / "rules").rglob("*.h")):
        code = re.sub(r"//.*", "", path.read_text())
        for word in re.findall(r"\bnew\b|\b[mc]alloc\b|\bstd::(?:vector|string|unique_ptr)\b", code):
            yield f"{path.relative_to(root)} allocates: {word}"


def main():
    root = pathlib.Path(sys.argv[1])
    included = 0
    mistakes = list(allocations(root))
    for folder, below in BELOW.items():
        allowed = {folder, *below.split()}
        sources = (path for path in (root / folder).rglob("*") if path.suffix in (".h", ".cpp", ".def", ".in")
                   and floor_of(path.relative_to(root)) == folder and not path.stem.endswith("_test"))
        read = 0
        for path in sources:
            read += 1
            for header in includes(path.read_text(), root):
                included += 1
                place = found(header, path, folder, root)
                if place is None:
                    mistakes.append(f"{path.relative_to(root)} includes {header}, which is nowhere")
                elif place.parts[0] != "include" and floor_of(place) not in allowed:
                    mistakes.append(f"{path.relative_to(root)} includes {header}")
        if read == 0:
            mistakes.append(f"{folder}/ has no source")
    print("\n".join(mistakes) or f"{included} includes in {len(BELOW)} folders lead down")
    return 1 if mistakes or included == 0 else 0


if __name__ == "__main__":
    sys.exit(main())
