#!/usr/bin/env python3
"""Which systems can load a library: its C library may be any glibc from 2.17 on.

  symbols.py FILE...

No symbol may be of a later version. A function that glibc 2.34 took into libc from another library has both versions
there; the older one is found by those who name that library, which only libpthread may be.
"""

import re
import subprocess
import sys

LATEST = (2, 17)
LIBRARIES = re.compile(r"lib(c|m)\.so\.6|libpthread\.so\.0|ld-linux.*\.so\.[12]")
MOVED = re.compile(r"_?_?pthread_(once|key_|[gs]etspecific|rwlock_|create|join|detach)")


def read(*arguments):
    return subprocess.run(["readelf", "--wide", *arguments], check=True, text=True, stdout=subprocess.PIPE).stdout


def mistakes_of(path):
    needed = re.findall(r"\(NEEDED\).*\[(.*)\]", read("--dynamic", path))
    yield from (f"needs {name}" for name in needed if not LIBRARIES.fullmatch(name))
    wanted = re.findall(r" UND +(\S+)@(\w+?)_([0-9.]+)(?: |$)", read("--dyn-syms", path), re.MULTILINE)
    if len(wanted) < 10:
        yield f"wants {len(wanted)} symbols of a version, too few to be believed"
    for name, system, version in wanted:
        if system != "GLIBC" or tuple(map(int, version.split(".")))[:2] > LATEST:
            yield f"wants {name} of {system}_{version}"
        if MOVED.match(name) and "libpthread.so.0" not in needed:
            yield f"wants {name}, but does not name libpthread.so.0"


def main():
    found = [f"{path} {mistake}" for path in sys.argv[1:] for mistake in mistakes_of(path)]
    print("\n".join(found) or f"{len(sys.argv) - 1} files want nothing newer than glibc {'.'.join(map(str, LATEST))}")
    return 1 if found or len(sys.argv) == 1 else 0


if __name__ == "__main__":
    sys.exit(main())
