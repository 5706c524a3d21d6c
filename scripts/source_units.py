"""Divides sources into units that can be compiled as one, since they define no name twice."""

import re

LARGEST = 12

# A type, an alias, a constant or a function that begins at the start of a line. Names of capital letters are macros.
DEFINITION = re.compile(r"^(?:(?:struct|class|enum class|enum) (\w+)|using (?!namespace)(?:\w+::)*(\w+)"
                        r"|const(?:expr)? .*?(\w+)(?: =|[{[(])|\w[^;=]*?(?<!::)\b(?![A-Z_]+\()(\w+)\([^;]*$)", re.MULTILINE)

NAMESPACE = re.compile("^using namespace .*", re.MULTILINE)


class Unit:
    """Sources alike in `kind`, such as a folder and flags."""

    def __init__(self, kind):
        self.kind = kind
        self.sources = []
        self.names = set()

    def takes(self, kind, names):
        return self.kind == kind and len(self.sources) < LARGEST and not self.names & names

    def add(self, source, names):
        self.sources.append(source)
        self.names |= names


def units_of(sources, kind_of):
    """Units of the paths `sources`; those of a unit have one kind in common, which the function `kind_of` tells,
    and what they use of namespaces."""
    units = []
    for source in sources:
        text = source.read_text()
        kind = kind_of(source), sorted(NAMESPACE.findall(text))
        names = {name for found in DEFINITION.findall(text) for name in found if name}
        unit = next((unit for unit in units if unit.takes(kind, names)), None)
        if not unit:
            unit = Unit(kind)
            units.append(unit)
        unit.add(source, names)
    return units
