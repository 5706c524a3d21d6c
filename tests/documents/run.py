#!/usr/bin/python3
"""Runs the code blocks of documents, in order, in a copy of the tree.

    run.py BUILD DOCUMENT...     BUILD is the folder of a build of all targets; documents as paths from the root

Blocks of `sh` are run by bash, `>>>` of Python compared, other Python run, JSON read. A comment `# prints: TEXT` behind a
command says which line it prints. Sources of other languages are files that commands use; blocks without a language
are what commands print, where `...` stands for what is left out and figures of speed do not count. blocks.py has the
comments that tell these, and which blocks are not run. Every other block is a mistake.
"""

import difflib
import doctest
import json
import os
import re
import subprocess
import sys
import tempfile

sys.dont_write_bytecode = True  # the tree stays as it is
from blocks import Mistake, blocks_of
from scratch import TREE, copy_of_tree

# How a simulator runs the module of a file that has its name, from a folder of its own for what it builds.
SIMULATORS = {
    "iverilog": "iverilog -o /tmp/{top}.vvp {file} && vvp -n /tmp/{top}.vvp",
    "verilator": "verilator --binary --Mdir /tmp/{top} --top {top} {file} >/tmp/{top}.log && /tmp/{top}/V{top}",
}
OWN_LINES = re.compile(r"^(- )?\S+:\d+: (Verilog )?\$finish.*\n", re.MULTILINE)  # what they say of a simulation's end

SPEEDS = ((r"\d[\d.]* (Mbit/s|blocks/s|s\b|seconds)", r"# \1"), (r" +\d+ +\d+:\d\d$", " #"))


def lines_of(text):
    """Without figures of speed, which differ from run to run."""
    for figure, instead in SPEEDS:
        text = re.sub(figure, instead, text, flags=re.MULTILINE)
    return [line.rstrip() for line in text.rstrip("\n").split("\n")]


def pattern_of(shown):
    """A regular expression for what a document shows of an output."""
    parts = []
    for line in lines_of(shown):
        if line.strip() == "...":
            parts.append(r"(?:.*\n)*?")
        elif line.endswith("..."):
            parts.append(re.escape(line[:-3].rstrip()) + r".*\n")
        else:
            parts.append(re.escape(line) + r"\n")
    return "".join(parts)


class Document:
    """The blocks of a document, one after the other."""

    def __init__(self, blocks, scratch):
        self.blocks = blocks
        self.scratch = scratch
        self.names = {}  # of Python
        self.printed = None  # by the commands before

    def run(self):
        """Returns how many blocks were run and how many were not."""
        left_out = 0
        for position, block in enumerate(self.blocks):
            if "not run" in block.told:
                self.printed = None
                left_out += 1
                continue
            self.run_block(block, self.blocks[position:])
            if "check" in block.told:
                self.command(block, block.told["check"])
        return len(self.blocks) - left_out, left_out

    def run_block(self, block, following):
        if "output" in block.told or "output of" in block.told:
            self.compare(block)
        elif "file" in block.told:
            self.write(block, following)
            if "simulate" in block.told:
                self.simulate(block)
        elif block.language == "sh":
            self.printed = self.command(block, self.cut(block))
            self.promised(block)
        elif block.language == "python":
            self.python(block)
        elif block.language == "json":
            self.read_json(block)
        else:
            kind = f"of {block.language}" if block.language else "without a language"
            raise Mistake(f"{block.place}: nobody knows how to run a block {kind}; tests/documents/run.py tells more")

    def command(self, block, commands):
        try:
            status, printed = self.scratch.run(commands)
        except subprocess.TimeoutExpired as late:
            raise Mistake(f"{block.place}: takes more than {late.timeout} s; cut it, or do not run it") from late
        if status != int(block.told.get("status", 0)):
            raise Mistake(f"{block.place}: exit status {status}\n{commands}\n{printed}")
        return printed

    def cut(self, block):
        if "cut" not in block.told:
            return block.text
        shorter = subprocess.run(["sed", "-E", block.told["cut"]], input=block.text, capture_output=True, text=True)
        if shorter.stdout == block.text or shorter.returncode != 0:
            raise Mistake(f"{block.place}: {block.told['cut']} changes nothing {shorter.stderr}")
        return shorter.stdout

    def promised(self, block):
        """Every `# prints: TEXT` is a line of the output, perhaps behind the place that a tool tells, in order."""
        lines = iter(lines_of(self.printed))
        for text in re.findall(r"# prints: (.+)", block.text):
            if not any(f": {line}".endswith(f": {lines_of(text)[0]}") for line in lines):
                raise Mistake(f"{block.place}: does not print '{text}', or not there, but\n{self.printed}")

    def compare(self, block):
        printed = self.printed
        if "output of" in block.told:
            printed = self.command(block, block.told["output of"])
        if printed is None:
            raise Mistake(f"{block.place}: nothing was run whose output this could be")
        if not re.fullmatch(pattern_of(block.text), "".join(line + "\n" for line in lines_of(printed))):
            difference = difflib.unified_diff(lines_of(block.text), lines_of(printed), "shown", "printed", lineterm="")
            raise Mistake(f"{block.place}: what is shown is not what is printed\n" + "\n".join(difference))

    def write(self, block, following):
        name = block.told["file"]
        users = [each.told.get("check", "") for each in following]
        users += [block.told["file"]] if "simulate" in block.told else []
        users += [each.text for each in following[1:] if each.language == "sh" and "not run" not in each.told]
        if not any(name in each for each in users):
            raise Mistake(f"{block.place}: no command uses {name}")
        (self.scratch.folder / name).write_text(block.text)

    def simulate(self, block):
        """All simulators print the same."""
        file = block.told["file"]
        printed = {}
        for name in block.told["simulate"].split(", "):
            if name not in SIMULATORS:
                raise Mistake(f"{block.place}: nobody knows the simulator {name}; there are {', '.join(SIMULATORS)}")
            commands = SIMULATORS[name].format(file=file, top=file.split(".")[0])
            printed[name] = OWN_LINES.sub("", self.command(block, commands))
        self.printed = next(iter(printed.values()))
        if any(each != self.printed for each in printed.values()):
            raise Mistake(f"{block.place}: simulators differ: {printed}")

    def python(self, block):
        if ">>>" not in block.text:
            (self.scratch.temporary / "block.py").write_text(block.text)
            self.printed = self.command(block, "/usr/bin/python3 /tmp/block.py")
            return
        name, line = block.place.split(":")
        test = doctest.DocTestParser().get_doctest(block.text, self.names, name, name, int(line))
        told = []
        runner = doctest.DocTestRunner(verbose=False)
        left = os.getcwd()
        os.chdir(self.scratch.folder)
        try:
            runner.run(test, out=told.append, clear_globs=False)
        finally:
            os.chdir(left)
        self.names = test.globs
        if runner.failures:
            raise Mistake(f"{block.place}:\n" + "".join(told))

    def read_json(self, block):
        try:
            json.loads(block.text)
        except ValueError as wrong:
            raise Mistake(f"{block.place}: {wrong}") from wrong


def main():
    if len(sys.argv) < 3:
        sys.exit(__doc__)
    sys.path.insert(0, f"{sys.argv[1]}/python")
    for name in sys.argv[2:]:
        try:
            blocks = blocks_of((TREE / name).read_text(), name)
            with tempfile.TemporaryDirectory() as folder:
                scratch = copy_of_tree(folder, sys.argv[1]) if blocks else None
                done, left_out = Document(blocks, scratch).run()
        except Mistake as mistake:
            sys.exit(str(mistake))
        print(f"{name}: {done} blocks run, {left_out} not")


if __name__ == "__main__":
    main()
