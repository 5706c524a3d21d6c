#!/usr/bin/python3
"""The example of each public header can be compiled as C99: the indented lines behind `@par Example`.

    headers_test.py HEADER...
"""

import pathlib
import re
import subprocess
import sys

# What an example takes for granted: a state, and somebody who uses the decisions.
BEFORE = """#include "{name}"
#include <stddef.h>
#include <stdio.h>
static void use(const unsigned char* bits, unsigned size, unsigned tag) {{ (void)bits; (void)size; (void)tag; }}
int example({parameters});
int example({parameters})
{{
"""
AFTER = """
    (void)use;
    return 0;
}
"""


def example_of(header):
    found = re.search(r" \* @par Example: .*\n \*\n((?: \*(?:     .*)?\n)+)", header.read_text())
    if not found:
        sys.exit(f"{header}: there is no example")
    return re.sub(r"^ \* ?", "", found[1], flags=re.MULTILINE)


def main():
    if len(sys.argv) < 2:
        sys.exit(__doc__)
    for header in map(pathlib.Path, sys.argv[1:]):
        lines = example_of(header)
        has_state = "_create" not in lines and "veltra_ip_morvik_v1_0_state" in header.read_text()
        parameters = "veltra_ip_morvik_v1_0_state* state" if has_state else "void"
        program = BEFORE.format(name=header.name, parameters=parameters) + lines + AFTER
        subprocess.run(["cc", "-std=c99", "-Wall", "-Wextra", "-Werror", "-Wno-unused-variable", "-Wno-unused-but-set-variable",
                        f"-I{header.parent}", "-fsyntax-only", "-x", "c", "-"], input=program, text=True, check=True)


if __name__ == "__main__":
    main()
