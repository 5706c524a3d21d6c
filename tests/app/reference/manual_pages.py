"""Checks the manual pages: that they are written well, and that they tell all that --help tells.

manual_pages.py REFERENCE MORVIK [MORVIK-MPI]    REFERENCE is the folder that the build has written
"""

import re
import subprocess
import sys
from pathlib import Path

REFERENCE = Path(sys.argv[1])
PROGRAMS = sys.argv[2:]
failures = []


def output_of(*command):
    return subprocess.run(command, check=True, capture_output=True, text=True).stdout


def words_of(text):
    """The text with neither line breaks nor what distinguishes a page from the help: capitals, typographic quotes."""
    return " ".join(text.split()).lower().replace("’", "'")


def check_form(page):
    """Two readers of manual pages have nothing to complain about."""
    lint = subprocess.run(["mandoc", "-T", "lint", "-W", "warning", page], capture_output=True, text=True)
    complaints = lint.stdout + lint.stderr
    # The pages carry the version, so that every build of it writes the same ones.
    complaints = re.sub(r'.*missing date, using "": TH\n', "", complaints)
    complaints += subprocess.run(["groff", "-ww", "-man", "-Tutf8", "-z", page], capture_output=True, text=True).stderr
    if complaints:
        failures.append(f"{page.name}:\n{complaints}")


def check_content(page, help_text):
    """Every option with its description, and every line of the explanation, stand in the page."""
    text = output_of("mandoc", "-T", "utf8", "-O", "width=1000", str(page))
    text = words_of(re.sub(".\b", "", text))  # bold letters are struck twice
    arguments = re.findall(r"^  (-\S[^\n]*?|[A-Z]+[^\n]*?)(?:  +|\n {30})(\S.*)$", help_text, re.MULTILINE)
    if not any("--help" in names for names, _ in arguments):
        failures.append(f"{page.name}: --help has another form than this test expects")
    for names, description in arguments:
        names = re.findall(r"(?<![\w-])--?[a-z][a-z0-9-]*", re.split(r"Needs:|Excludes:", names)[0]) or [names.split()[0]]
        names = re.sub("=.*", "", ", ".join(names))
        if not re.search(rf"{re.escape(names.lower())}( \S+)? {re.escape(words_of(description))}\.", text):
            failures.append(f"{page.name}: lacks {names}: {description}")
    for piece in re.split(r"\n|Exit status:|Example:|Subcommands:", help_text.split(arguments[-1][1])[1]):
        if words_of(piece) not in text:
            failures.append(f"{page.name}: lacks {piece}")


def check_pages(program):
    name = Path(program).name
    folder = REFERENCE / name / "share/man/man1"
    help_text = output_of(program, "--help")
    subcommands = re.findall(r"^  (\w+) ", help_text.split("Subcommands:")[1].split("Example")[0], re.MULTILINE)
    if len(subcommands) > 1:
        expected = {f"{name}.1": help_text}
        expected.update({f"{name}-{each}.1": output_of(program, each, "--help") for each in subcommands})
    else:  # on one page, with the example of the program in place of the subcommand's
        subcommand_help = output_of(program, *subcommands, "--help")
        expected = {f"{name}.1": re.split("Example:", subcommand_help)[0] + re.split("(?=Example:)", help_text)[1]}
    found = {page.name for page in folder.iterdir()}
    if found != set(expected):
        failures.append(f"{folder} has {sorted(found)}, expected {sorted(expected)}")
    for page, text in expected.items():
        check_form(folder / page)
        check_content(folder / page, text)


for each in PROGRAMS:
    check_pages(each)
print("\n".join(failures))
sys.exit(1 if failures else 0)
