#!/usr/bin/python3
"""Joins the page, its scripts and the two modules into one file that needs nothing else.

    join.py MODULES OUTPUT VERSION     MODULES is the folder of morvik.wasm and morvik-simd.wasm

A file of scripts imports no other: the modules of JavaScript are written one after the other, without their imports and
exports. Names of the top level are therefore unique.
"""

import base64
import gzip
import pathlib
import re
import sys

HERE = pathlib.Path(__file__).resolve().parent
REPORT = HERE.parents[2] / "report"
IMPORTS = re.compile(r'^(?:import \{[^}]*\} from "[^"]*"|export \{[^}]*\});\n', re.MULTILINE)
SCRIPTS = ["../package/morvik.js", "form.js", "block.js", "sweep.js", "rates.js", "main.js"]


def joined(names):
    # A worker that comes from a file is a classic script, which has no address of its own.
    text = "\n".join(IMPORTS.sub("", (HERE / name).read_text()) for name in names).replace("import.meta.url", "location.href")
    if re.search(r"^(import|export)\b", text, re.MULTILINE) or "</script" in text:
        sys.exit("join.py: a script has what cannot be joined")
    return text


def packed(path):
    return base64.b64encode(gzip.compress(path.read_bytes(), 9, mtime=0)).decode()


def main():
    modules, output, version = pathlib.Path(sys.argv[1]), pathlib.Path(sys.argv[2]), sys.argv[3]
    parts = {
        "STYLE": (REPORT / "page.css").read_text() + (HERE / "page.css").read_text(),
        "CHART": (REPORT / "page.js").read_text(),
        "WORKER": joined(["../package/morvik.js", "worker.js"]),
        "SCRIPT": joined(SCRIPTS).replace("@VERSION@", version),
        "MODULE_PLAIN": packed(modules / "morvik.wasm"),
        "MODULE_SIMD": packed(modules / "morvik-simd.wasm"),
    }
    page = re.sub(r"@([A-Z_]+)@", lambda found: parts[found[1]], (HERE / "page.html").read_text())
    output.write_text(page, encoding="utf-8")


if __name__ == "__main__":
    main()
