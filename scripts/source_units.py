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

# The namespace around what a source defines.
SPACE = re.compile(r"^namespace (\w+(?:::\w+)*) \{$", re.MULTILINE)

# What only one source sees. There it hides what headers declare in the namespace around it. (Comments are left out already.)
OWN = re.compile(r"^namespace \{$(.*?)^\}  $", re.MULTILINE | re.DOTALL)

COMMENT_OR_TEXT = re.compile(r'//.*|"(?:[^"\\\n]|\\.)*"')

# A call, or a type.
USE = re.compile(r"(?<![.>:\w])(?:(\w+)\(|([A-Z]\w*))")


def names_of(pattern, text):
    return {name for found in pattern.findall(text) for name in found if name}


class Names:
    """The names that a source defines, those of them that no other source sees, what those mean that only stand for another
    name, those that it uses, the namespaces whose names it uses unqualified, and the namespace that it is in."""

    def __init__(self, text):
        self.space = min(SPACE.findall(text), default="", key=len)
        self.namespaces = set(NAMESPACE.findall(text))
        self.defined = names_of(DEFINITION, text)
        self.own = names_of(DEFINITION, "".join(OWN.findall(text)))
        self.brought = {name or last: meaning for name, meaning, last in BROUGHT.findall(text)}
        self.used = names_of(USE, text)


def sees(space, other):
    """Whether what is in one of two namespaces sees the names of the other without saying which."""
    return not space or not other or f"{space}::".startswith(f"{other}::") or f"{other}::".startswith(f"{space}::")


def agree(one, other):
    """Whether two sources can be compiled as one, `other` after `one`."""
    if one.namespaces and other.namespaces and one.namespaces != other.namespaces:
        return False
    # What both define for all to see are functions of different arguments.
    clash = set()
    if sees(one.space, other.space):
        clash = one.own & (other.defined | other.used) | other.own & one.defined
        clash = {name for name in clash if name not in one.brought or one.brought[name] != other.brought.get(name)}
    return not (clash or one.defined & other.defined & STARTS)


class Unit:
    """Sources alike in `kind`, such as a folder and flags."""

    def __init__(self, kind):
        self.kind = kind
        self.sources = []
        self.names = []

    def takes(self, kind, names):
        return self.kind == kind and all(agree(one, names) for one in self.names)

    def add(self, source, names):
        self.sources.append(source)
        self.names.append(names)


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
