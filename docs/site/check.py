#!/usr/bin/python3
"""Checks a built site: every link leads to a page or file of it and to a place that is there, and pages load nothing
from a network.

    check.py FOLDER
"""

import html.parser
import pathlib
import sys
import urllib.parse


class Page(html.parser.HTMLParser):
    """The names of a page's places, where it leads, and what it loads."""

    def __init__(self, text):
        super().__init__()
        self.places = set()
        self.links = []
        self.loaded = []
        self.feed(text)

    def handle_starttag(self, tag, attributes):
        attributes = dict(attributes)
        self.places.update(attributes[name] for name in ("id", "name") if attributes.get(name))
        if tag == "a" and attributes.get("href"):
            self.links.append(attributes["href"])
        elif tag in ("img", "script", "link", "object"):
            self.loaded += [attributes[name] for name in ("src", "href", "data") if attributes.get(name)]


def mistakes(folder):
    pages = {path.resolve(): Page(path.read_text()) for path in folder.rglob("*.html")}
    for path, page in pages.items():
        for link in page.links + page.loaded:
            parts = urllib.parse.urlsplit(link)
            if parts.scheme:
                if link in page.loaded:
                    yield f"{path}: loads {link}"
                continue
            target = (path.parent / urllib.parse.unquote(parts.path)).resolve() if parts.path else path
            if not target.is_file():
                yield f"{path}: {link} leads nowhere"
            elif parts.fragment and parts.fragment not in pages[target].places:
                yield f"{path}: {link} leads to no place of that page"


def main():
    if len(sys.argv) != 2:
        sys.exit(__doc__)
    found = sorted(set(mistakes(pathlib.Path(sys.argv[1]))))
    if found:
        sys.exit("\n".join(found))


if __name__ == "__main__":
    main()
