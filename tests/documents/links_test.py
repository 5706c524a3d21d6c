#!/usr/bin/python3
"""Every link of the documents leads to a file of the tree, and to a heading of it where it names one.

    links_test.py DOCUMENT...     as paths from the root
"""

import re
import sys

sys.dont_write_bytecode = True
from scratch import TREE


def without_code(text):
    return re.sub(r"^```.*?^```$", "", text, flags=re.MULTILINE | re.DOTALL)


def anchors(document):
    """Those of the headings, as viewers make them."""
    headings = re.findall(r"^#+ +(.+)$", without_code(document.read_text()), flags=re.MULTILINE)
    return {re.sub(r"[^\w\- ]", "", heading.lower()).replace(" ", "-") for heading in headings}


def links(document):
    text = re.sub(r"`[^`\n]*`", "", without_code(document.read_text()))
    return [link for link in re.findall(r"\]\(([^)\s]+)\)", text) if "://" not in link]


def wrong_links(document):
    for link in links(document):
        name, _, anchor = link.partition("#")
        target = (document.parent / name).resolve() if name else document
        if not target.is_file():
            yield f"{document}: {link} leads to no file"
        elif anchor and anchor not in anchors(target):
            yield f"{document}: {link} leads to no heading"


def main():
    documents = [TREE / name for name in sys.argv[1:]]
    wrong = [line for document in documents for line in wrong_links(document)]
    count = sum(len(links(document)) for document in documents)
    if wrong or count == 0:
        sys.exit("\n".join(wrong) or __doc__)
    print(f"{count} links")


if __name__ == "__main__":
    main()
