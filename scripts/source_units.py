"""Divides sources into units that can be compiled as one, since they define no name twice."""

import re

# A type, an alias, a constant or a function that begins at the start of a line. Names of capital letters are macros.
DEFINITION = re.compile(r"^(?:(?:struct|class|enum class|enum) (\w+)|using (?!namespace)(?:\w+::)*(\w+)"
                        r"|const(?:expr)? .*?(\w+)(?: =|[{[(])|\w[^;=\n]*?(?<!::)\b(?![A-Z_]+\(|its[A-Z])(\w+)\([^;\n]*$)", re.MULTILINE)

# Where programs start.
STARTS = {"main", "sc_main"}

# A name of another namespace, or for another type, which several sources may give alike.
BROUGHT = re.compile(r"^using (?:(\w+) = )?([^;=]*?(\w+)>?);", re.MULTILINE)

NAMESPACE = re.compile("^using namespace .*", re.MULTILINE)

# What only one source sees. There it hides what headers declare in the namespace around it. (Comments are left out already.)
OWN = re.compile(r"^namespace \{$(.*?)^\}  $", re.MULTILINE | re.DOTALL)

COMMENT_OR_TEXT = re.compile(r'//.*|"(?:[^"\\\n]|\\.)*"')

# A call, or a type.
USE = re.compile(r"(?<![.>:\w])(?:(\w+)\(|([A-Z]\w*))")


def names_of(pattern, text):
    return {name for found in pattern.findall(text) for name in found if name}


class Names:
    """The names that a source defines, those of them that no other source sees, what those mean that only stand for another
    name, those that it uses, and the namespaces whose names it uses unqualified."""

    def __init__(self, text):
        self.namespaces = set(NAMESPACE.findall(text))
        self.defined = names_of(DEFINITION, text)
        self.own = names_of(DEFINITION, "".join(OWN.findall(text)))
        self.brought = {name or last: meaning for name, meaning, last in BROUGHT.findall(text)}
        self.used = names_of(USE, text)


class Unit:
    """Sources alike in `kind`, such as a folder and flags."""

    def __init__(self, kind):
        self.kind = kind
        self.sources = []
        self.namespaces = set()
        self.defined = set()
        self.own = set()
        self.brought = {}

    def takes(self, kind, names):
        # What both define for all to see are functions of different arguments.
        clash = self.own & (names.defined | names.used) | self.defined & names.own
        clash = {name for name in clash if name not in self.brought or self.brought[name] != names.brought.get(name)}
        clash |= self.defined & names.defined & STARTS
        alike = not self.namespaces or not names.namespaces or self.namespaces == names.namespaces
        return self.kind == kind and alike and not clash

    def add(self, source, names):
        self.sources.append(source)
        self.namespaces |= names.namespaces
        self.defined |= names.defined
        self.own |= names.own
        self.brought.update(names.brought)


def units_of(sources, kind_of, largest):
    """Units of up to `largest` of the paths `sources`; those of a unit have one kind in common, which the function `kind_of`
    tells, and use no two sets of namespaces."""
    units = []
    for source in sources:
        text = COMMENT_OR_TEXT.sub("", source.read_text())
        kind = kind_of(source)
        names = Names(text)
        unit = next((unit for unit in units if len(unit.sources) < largest and unit.takes(kind, names)), None)
        if not unit:
            unit = Unit(kind)
            units.append(unit)
        unit.add(source, names)
    return units
