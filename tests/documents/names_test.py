#!/usr/bin/python3
"""What documents name is there, and what is there has been named.

    names_test.py MORVIK

CONTRIBUTING.md is read for paths and for names of the code; the documents that list instruction sets or subcommands, for
each of them, as lanes/InstructionSets.def and `MORVIK --help` have them.
"""

import re
import subprocess
import sys

sys.dont_write_bytecode = True
from scratch import TREE

LISTS_OF_INSTRUCTION_SETS = ["include/morvik_v1_0_batch.h", "docs/batch.md", "docs/glossary.md", "docs/python.md",
                             "docs/selftest.md"]
LISTS_OF_SUBCOMMANDS = ["README.md", "docs/tools.md"]
SOURCES = {".cpp", ".h", ".def", ".py", ".sh", ".txt", ".cmake", ".json", ".sv", ".vhd", ".js", ".mjs", ""}

# Placeholders, and files that a build writes.
PLACEHOLDER = re.compile(r"NAME|FOLDER|PRESET|[<*]|^build/")


def tree_files():
    for path in TREE.rglob("*"):
        name = path.relative_to(TREE).as_posix()
        if path.is_file() and not re.match(r"(\.git|build|node_modules)/", name):
            yield name


def quoted(document):
    text = re.sub(r"^```.*?^```$", "", (TREE / document).read_text(), flags=re.MULTILINE | re.DOTALL)
    spans = re.findall(r"`([^`]+)`", text)
    return sorted({re.sub(r"\s+", " ", span).removeprefix("./") for span in spans})


def paths(document):
    """Those quoted with a folder, or as a folder, or with the ending of a source."""
    path = re.compile(r"[\w.-]+(/[\w.-]+)+/?|[\w.-]+/|[\w.-]+\.(cpp|h|def|py|pyi|sh|cmake|json|txt|md|sv|vhd|js|css|cfg)")
    return [name for name in quoted(document) if path.fullmatch(name) and not PLACEHOLDER.search(name)]


def names(document):
    """Those of the code: in mixed case, with an underscore or a namespace."""
    return [name for name in quoted(document)
            if re.fullmatch(r"[A-Za-z]\w*(::\w+)*", name) and re.search(r"[a-z][A-Z]|_|::", name)
            and not PLACEHOLDER.search(name)]


def missing_paths(document, files):
    """A part of the tree is enough, as are names without an extension, such as `hardware/testbench/Passes`."""
    text = "\n" + "\n".join(files) + "\n"
    for path in paths(document):
        if not re.search(rf"[\n/]{re.escape(path)}" + ("" if path.endswith("/") else r"[./\n]"), text):
            yield f"{document} names `{path}`, which is not there"


def missing_names(document, files):
    words = set(re.findall(r"\w+", "\n".join(files)))
    for file in files:
        path = TREE / file
        if path.suffix in SOURCES and path.stat().st_size < 1 << 20:
            words.update(re.findall(r"\w+", path.read_text(errors="replace")))
    for name in names(document):
        if not words.issuperset(name.split("::")):
            yield f"{document} names `{name}`, which no source has"


def unnamed(kind, names, documents):
    for document in documents:
        text = (TREE / document).read_text()
        yield from (f"{document} lacks the {kind} {name}" for name in names if not re.search(rf"\b{name}\b", text))


def instruction_sets():
    return re.findall(r"^MORVIK_\w*INSTRUCTION_SET\((\w+),", (TREE / "lanes/InstructionSets.def").read_text(), re.MULTILINE)


def help_of(*command):
    return subprocess.run([*command, "--help"], stdout=subprocess.PIPE, text=True, check=True).stdout


def without_placeholder(morvik, subcommands):
    """Options whose value is named by its type alone."""
    for subcommand in subcommands:
        for option in re.findall(r"^ +(-\S+) (?:UINT|INT|FLOAT|TEXT)\b", help_of(morvik, subcommand), re.MULTILINE):
            yield f"morvik {subcommand} --help: {option} lacks a word for its value (type_name)"


def main():
    [morvik] = sys.argv[1:]
    files = sorted(tree_files())
    sets = instruction_sets()
    subcommands = re.findall(r"^  (\w+) +[A-Z]", help_of(morvik).split("\nSubcommands", 1)[1], re.MULTILINE)
    wrong = [*missing_paths("CONTRIBUTING.md", files), *missing_names("CONTRIBUTING.md", files),
             *unnamed("instruction set", sets, LISTS_OF_INSTRUCTION_SETS),
             *unnamed("subcommand", [f"morvik {name}" for name in subcommands], LISTS_OF_SUBCOMMANDS),
             *without_placeholder(morvik, subcommands)]
    if wrong or not sets or not subcommands:
        sys.exit("\n".join(wrong) or __doc__)
    print(f"{len(paths('CONTRIBUTING.md'))} paths, {len(names('CONTRIBUTING.md'))} names, {len(sets)} instruction sets, {len(subcommands)} subcommands")


if __name__ == "__main__":
    main()
