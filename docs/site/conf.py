"""The site of the documents, by Sphinx: scripts/docs builds it. Sources are the Markdown files where they lie, so
that links between them and to files hold in a clone as well as in the site."""

import pathlib
import posixpath
import re
import urllib.parse

from docutils import nodes

ROOT = pathlib.Path(__file__).resolve().parents[2]

project = "morvik"
release = re.search(r"project\(morvik VERSION (\S+)", (ROOT / "CMakeLists.txt").read_text())[1]
copyright = "the authors of morvik"
extensions = ["myst_parser", "breathe"]

root_doc = "docs/index"
include_patterns = ["*.md", "docs/*.md", "docs/*.rst", "examples/*.md", "validation/*/*.md", "tests/*/*.md", "tests/data/*/*.md"]
exclude_patterns = ["build", ".*"]
nitpicky = True
nitpick_ignore_regex = [("c:identifier", "u?int(8|16|32)_t|size_t"), ("cpp:identifier", "u?int32_t")]

myst_heading_anchors = 4
suppress_warnings = ["myst.header"]  # pages of the site begin with what the reader sees first

breathe_projects = {"morvik": str(ROOT / "build/docs/doxygen/xml")}
breathe_default_project = "morvik"
breathe_domain_by_extension = {"h": "c"}

html_theme = "furo"
html_title = f"morvik {release}"
html_static_path = ["static"]
html_css_files = ["morvik.css"]
html_additional_pages = {"index": "to_index.html"}
templates_path = ["templates"]
html_copy_source = False
html_show_sourcelink = False
highlight_language = "none"


PAGE = ROOT / "build/browser/morvik.html"  # where scripts/browser has built it
html_extra_path = [str(PAGE)] if PAGE.exists() else []


def link_page(app, doctree, docname):
    """Where a clone names the file of the page in the browser, the site leads to the page, if it has it."""
    if docname != "docs/browser" or not PAGE.exists():
        return
    for name in list(doctree.findall(nodes.literal)):
        if name.astext() == str(PAGE.relative_to(ROOT)):
            link = nodes.reference("", "", refuri=f"../{PAGE.name}", internal=False)
            name.replace_self(link)
            link += nodes.Text("the page in the browser")


def name_pages(app, doctree, docname):
    """Where a clone shows the name of a linked file, as compare.md, the site shows the page's title."""
    here = posixpath.dirname(app.builder.get_target_uri(docname))
    for link in doctree.findall(nodes.reference):
        if link.get("internal") and re.fullmatch(r"[\w./]+\.(md|rst)", link.astext()):
            page = urllib.parse.urlsplit(link.get("refuri", "")).path
            target = posixpath.splitext(posixpath.normpath(posixpath.join(here, page)))[0]
            link[:] = [nodes.Text(f"“{app.env.titles[target].astext()}”")]


def setup(app):
    app.connect("doctree-resolved", name_pages)
    app.connect("doctree-resolved", link_page)
