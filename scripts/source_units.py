"""Divides sources into units that can be compiled as one, since they define no name twice."""

import re

# A type, an alias, a constant or a function that begins at the start of a line. Names of capital letters are macros.
DEFINITION = re.compile(r"^(?:(?:struct|class|enum class|enum) (\w+)|using (?!namespace)(?:\w+::)*(\w+)"
                        r"|const(?:expr)? .*?(\w+)(?: =|[{[(])|\w[^;=\n]*?(?<!::)\b(?![A-Z_]+\()(\w+)\([^;\n]*$)", re.MULTILINE)

NAMESPACE = re.compile("^using namespace .*", re.MULTILINE)

# What only one source sees. There it hides what headers declare in the namespace around it. (Comments are left out already.)
OWN = re.compile(r"^namespace \{$(.*?)^\}  $", re.MULTILINE | re.DOTALL)

COMMENT_OR_TEXT = re.compile(r'//.*|"(?:[^"\\\n]|\\.)*"')

# A call, or a type.
USE = re.compile(r"(?<![.>:\w])(?:(\w+)\(|([A-Z]\w*))")


def names_of(pattern, text):
    return {name for found in pattern.findall(text) for name in found if name}


class Names:
    """The names that a source defines, those of them that no other source sees, and those that it uses."""

    def __init__(self, text):
        self.defined = names_of(DEFINITION, text)
        self.own = names_of(DEFINITION, "".join(OWN.findall(text)))
        self.used = names_of(USE, text)


class Unit:
    """Sources alike in `kind`, such as a folder and flags."""

    def __init__(self, kind):
        self.kind = kind
        self.sources = []
        self.defined = set()
        self.own = set()

    def takes(self, kind, names):
        return self.kind == kind and not self.defined & names.defined and not self.own & names.used

    def add(self, source, names):
        self.sources.append(source)
        self.defined |= names.defined
        self.own |= names.own


def units_of(sources, kind_of, largest):
    """Units of up to `largest` of the paths `sources`; those of a unit have one kind in common, which the function `kind_of`
    tells, and what they use of namespaces."""
    units = []
    for source in sources:
        text = COMMENT_OR_TEXT.sub("", source.read_text())
        kind = kind_of(source), sorted(NAMESPACE.findall(text))
        names = Names(text)
        unit = next((unit for unit in units if len(unit.sources) < largest and unit.takes(kind, names)), None)
        if not unit:
            unit = Unit(kind)
            units.append(unit)
        unit.add(source, names)
    return units
