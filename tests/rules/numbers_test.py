#!/usr/bin/env python3
"""Every numbered rule of docs/arithmetic.md is found in rules/ where the document says, and rules/ names no other. The other
names that the document gives with a rule are those of the code. The headers of rules/ need nothing of other folders, and
nothing that allocates.

  numbers_test.py SOURCES
"""

import pathlib
import re
import sys

RULES = 22
STANDARD = {"algorithm", "array", "cmath", "cstddef", "cstdint", "optional", "string_view", "type_traits", "utility"}


def numbers_in(comment):
    """The rules that a comment names: "rule 7", "rules 5, 13 and 14"."""
    found = set()
    for match in re.finditer(r"\brules? (\d+(?:(?:, | and )\d+)*)", " ".join(comment.split())):
        found.update(map(int, re.findall(r"\d+", match.group(1))))
    return found


def described(document):
    """For each rule, the headers that the document names, and what of them."""
    parts = re.split(r"\*\*Rule (\d+):", document)
    rules = {}
    for number, body in zip(parts[1::2], parts[2::2]):
        body = " ".join(body.split("\n## ")[0].split())
        rules[int(number)] = {file: re.findall(r"\w+", names)
                              for file, names in re.findall(r"`(rules/\w+\.h)`: (`\w+`(?:, `\w+`)*)", body)}
    return rules


def named_places(document):
    """The functions, members and files that the document names in brackets with the rules."""
    for inside in re.findall(r"\((`rules/[^()]*)\)", document):
        yield from re.findall(r"`([\w:./]+)`", inside)


def is_in(place, sources):
    """Whether a file, or the text of one, has the place."""
    if "." in place:
        return any(f"/{path}".endswith(f"/{place}") for path in sources)
    return any(re.search(rf"\b{place.split('::')[-1]}\b", text) for text in sources.values())


def comments(header):
    """The comment above each name that a header declares, and the header's own under the name ""."""
    head = re.match(r"(?://.*\n)+", header).group()
    found = {"": head.replace("//", "")}
    for block, declaration in re.findall(r"((?:^ *///.*\n)+)(?=((?:.*\n){1,4}))", header, re.M):
        for name in re.findall(r"\w+", declaration):
            found[name] = found.get(name, "") + block.replace("///", "")
    return found


def main():
    sources = pathlib.Path(sys.argv[1])
    document = (sources / "docs/arithmetic.md").read_text()
    rules = described(document)
    headers = {f"rules/{path.name}": path.read_text() for path in sorted((sources / "rules").glob("*.h"))}
    code = {path: path.read_text() for folder in ("rules", "lanes", "src") for path in (sources / folder).glob("*.*")}
    faults = [f"docs/arithmetic.md names {place}, which the code lacks"
              for place in named_places(document) if not is_in(place, code)]
    if sorted(rules) != list(range(1, RULES + 1)):
        faults.append(f"docs/arithmetic.md has the rules {sorted(rules)}")
    for number, places in rules.items():
        if not places:
            faults.append(f"docs/arithmetic.md: rule {number} names no place in rules/")
        for file, names in places.items():
            above = comments(headers[file]) if file in headers else {}
            for name in names:
                if number not in numbers_in(above.get(name, "")) | (numbers_in(above[""]) if name in above else set()):
                    faults.append(f"{file}: no {name} whose comment names rule {number}")
    for file, header in headers.items():
        text = "\n".join(re.findall(r"//+(.*)", header))
        for number in sorted(numbers_in(text)):
            if file not in rules.get(number, {}):
                faults.append(f"{file} names rule {number}, whose text in docs/arithmetic.md does not name the file")
        for name in re.findall(r'#include ["<](.*)[">]', header):
            if name not in STANDARD and name not in headers:
                faults.append(f"{file} includes {name}")
    print("\n".join(faults) or f"{len(rules)} rules in {len(headers)} headers")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
