"""Types command lines into an interactive bash and zsh, and looks at what they complete.

completions.py REFERENCE MORVIK [MORVIK-MPI]    REFERENCE is the folder that the build has written
"""

import os
import pty
import re
import select
import subprocess
import sys
import tempfile
from pathlib import Path

REFERENCE = Path(sys.argv[1]).resolve()
PROGRAMS = [Path(program).resolve() for program in sys.argv[2:]]
INSTRUCTION_SETS = re.findall(r"^MORVIK_\w*INSTRUCTION_SET\((\w+),",
                              (Path(__file__).parents[3] / "lanes/InstructionSets.def").read_text(), re.MULTILINE)
SECONDS = 60  # an answer takes a small part of one

BASH = r"""
source /usr/share/bash-completion/bash_completion
bind 'set bell-style none'
bind '"\C-g": insert-completions'
"""
ZSH = r"""
setopt no_beep no_prompt_cr no_prompt_sp
unsetopt zle_bracketed_paste
fpath=({folders} $fpath)
autoload -U compinit && compinit -D -u
zle -C all-matches complete-word _generic
zstyle ':completion:all-matches::::' completer _all_matches _complete
zstyle ':completion:all-matches:*' insert true
bindkey '^G' all-matches
"""


class Shell:
    """An interactive shell, in which Ctrl-G inserts everything that the word could become."""

    def __init__(self, command, setup, folder):
        shares = [REFERENCE / program.name / "share" for program in PROGRAMS]
        setup = setup.replace("{folders}", " ".join(f"'{share}/zsh/site-functions'" for share in shares))
        # What is typed runs these in the place of the programs.
        for program in PROGRAMS:
            setup += f"{program.name}() {{ printf '[%s]' \"$@\"; echo; echo END; }}\n"
        file = folder / "setup"
        file.write_text(setup)
        environment = {
            "PATH": os.environ["PATH"],
            "HOME": str(folder),
            "TERM": "dumb",
            "XDG_DATA_DIRS": ":".join(map(str, [*shares, "/usr/share"])),  # where bash-completion looks
        }
        self.process, self.terminal = pty.fork()
        if self.process == 0:
            os.chdir(folder / "work")
            os.execvpe(command[0], command, environment)
        self.type(f"stty -echo columns 10000; PS1= PS2=; . '{file}'; echo 'EN''D'\n")
        self.answer()

    def type(self, text):
        os.write(self.terminal, text.encode())

    def answer(self):
        """All that comes until the end of an answer."""
        text = ""
        while "END\r\n" not in text:
            if not select.select([self.terminal], [], [], SECONDS)[0]:
                raise TimeoutError(f"no answer after {text!r}")
            text += os.read(self.terminal, 65536).decode(errors="replace")
        return text

    def completed(self, line):
        """The arguments of the line, when Ctrl-G has been typed at its end."""
        self.type(line + "\a\n")
        return re.findall(r"\[([^\]\r\n]*)\]", self.answer().split("END")[-2].strip().splitlines()[-1])

    def close(self):
        self.type("exit\n")
        os.close(self.terminal)
        os.waitpid(self.process, 0)


def options_of(program, subcommand):
    """What --help tells, before the explanation: the first column of its list."""
    text = subprocess.run([program, subcommand, "--help"], check=True, capture_output=True, text=True).stdout
    names = re.findall(r"^  (?:-h,)?(--[a-z0-9-]+(?:,--[a-z0-9-]+)*)", text, re.MULTILINE)
    return {name for list in names for name in list.split(",")}


def subcommands_of(program):
    text = subprocess.run([program, "--help"], check=True, capture_output=True, text=True).stdout
    return re.findall(r"^  (\w+) ", text.split("Subcommands:")[1].split("Example")[0], re.MULTILINE)


def check(shell, line, expected, failures):
    """`expected` stands at the end of the completed line, in any order."""
    before = line.split()[1:]
    if not line.endswith(" "):
        before.pop()
    arguments = shell.completed(line)
    found = {argument.rstrip("=/") for argument in arguments[len(before) :] if argument}
    if arguments[: len(before)] != before or found != set(expected):
        failures.append(f"{line!r} becomes {arguments}, expected {before} and {sorted(expected)}")


CASES = [
    ("morvik de", ["decode"]),
    ("morvik --v", ["--version"]),
    ("morvik decode --num-pu ", ["2", "4", "8"]),
    ("morvik decode --num-pu 8 --alg", ["--algorithm"]),
    ("morvik decode --algorithm=ta", ["--algorithm=table"]),
    ("morvik decode --iterations ", []),
    ("morvik decode ", ["a.csv", "b.txt", "folder"]),
    ("morvik decode --reference b", ["b.txt"]),
    ("morvik decode a.csv --output fol", ["folder"]),
    ("morvik ber --block-size 614", ["6144"]),
    ("morvik ber --block-size 512,614", ["512,6144"]),
    ("morvik ber --algorithm max-log,s", ["max-log,scaled"]),
    ("morvik ber --instruction-set ", [*INSTRUCTION_SETS, "component"]),
    ("morvik ber --reference ", ["a.csv", "b.txt", "folder"]),
    ("morvik ber --report ", ["folder"]),
    ("morvik merge ", ["a.csv", "b.txt", "folder"]),
    ("morvik merge a.csv b", ["b.txt"]),
    ("morvik vectors --check ", ["folder"]),
    ("morvik vectors --streams s", ["separate"]),
    ("morvik trace --signals alpha,bet", [f"alpha,beta{i}" for i in ["", *range(8)]]),
    ("morvik compare --format ", ["c", "csv", "memh", "npy", "vcd"]),
    ("morvik info 20", ["200", "208", "2016", "2048"]),
]


def check_shell(command, setup):
    failures = []
    with tempfile.TemporaryDirectory() as name:
        work = Path(name) / "work"
        (work / "folder").mkdir(parents=True)
        (work / "a.csv").touch()
        (work / "b.txt").touch()
        shell = Shell(command, setup, Path(name))
        for line, expected in CASES:
            check(shell, line, expected, failures)
        for program in PROGRAMS:
            subcommands = subcommands_of(program)
            check(shell, f"{program.name} ", subcommands, failures)
            for subcommand in subcommands:
                check(shell, f"{program.name} {subcommand} --", options_of(program, subcommand), failures)
        shell.close()
    for failure in failures:
        print(f"{command[0]}: {failure}")
    return not failures


passed = [
    check_shell(["bash", "--norc", "--noprofile", "-i"], BASH),
    check_shell(["zsh", "-f", "-i"], ZSH),
]
sys.exit(0 if all(passed) else 1)
