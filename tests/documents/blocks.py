"""The fenced blocks of a Markdown file, with what the comments directly before each tell of its test.

    <!-- file: NAME -->         the block is the file NAME, which commands below use
    <!-- simulate: NAME, ... -->  the file is a module that these simulators run; the block behind is what each prints
    <!-- check: COMMAND -->     runs COMMAND when the block has been run or written
    <!-- output -->             the block is what the commands before it print
    <!-- output of: COMMAND --> the block is what COMMAND prints
    <!-- status: N -->          the last command ends with exit status N, not 0
    <!-- cut: SCRIPT -->        sed's SCRIPT changes the commands before they are run, so that they soon end
    <!-- not run: REASON -->    the block cannot be run here
"""

import re
from dataclasses import dataclass, field

KINDS = ("file", "simulate", "check", "output", "output of", "status", "cut", "not run")
WITHOUT_VALUE = ("output",)


class Mistake(Exception):
    """What is wrong with a document, with its place."""


@dataclass
class Block:
    place: str  # FILE:LINE of its first line
    language: str
    text: str
    told: dict = field(default_factory=dict)  # what the comments tell, by kind


def _told(comment, place):
    match = re.fullmatch(r"<!-- ([a-z ]+?)(?:: (.+))? -->", comment)
    kind, value = match.groups() if match else (None, None)
    if kind not in KINDS or (value is None) != (kind in WITHOUT_VALUE):
        raise Mistake(f"{place}: {comment} is nothing that a block can be told: {', '.join(KINDS)}")
    return kind, value or ""


def blocks_of(text, name):
    """All blocks of the text, in order."""
    found = []
    told = []
    opened = None
    for number, line in enumerate(text.split("\n"), 1):
        place = f"{name}:{number}"
        fence = re.match(r" *```(.*)", line)
        if opened is not None:
            if fence:
                opened.text = "".join(each + "\n" for each in lines)
                found.append(opened)
                opened = None
            else:
                lines.append(line)
        elif fence:
            opened = Block(place, fence[1].strip(), "", dict(_told(*each) for each in told))
            lines, told = [], []
        elif line.startswith("<!-- "):
            told = [*told, (line, place)]
        else:
            told = []
    if opened is not None:
        raise Mistake(f"{opened.place}: the block has no end")
    return found
