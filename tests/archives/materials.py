#!/usr/bin/env python3
"""The software bill of materials of an unpacked archive: what SPDX 2.3 requires is there, and true of the files.

  materials.py FOLDER NAME...     the names of what must be linked in, at least
"""

import hashlib
import json
import pathlib
import re
import sys

IDENTIFIER = re.compile(r"SPDXRef-[A-Za-z0-9.-]+")
LICENCES = {"MIT", "BSD-3-Clause", "BSL-1.0", "LGPL-2.1-or-later", "GPL-3.0-or-later WITH GCC-exception-3.1", "ZPL-2.1", "Zlib",
            "NOASSERTION"}
DOCUMENT = {"spdxVersion", "dataLicense", "SPDXID", "name", "documentNamespace", "creationInfo", "packages", "files", "relationships"}
PACKAGE = {"SPDXID", "name", "versionInfo", "downloadLocation", "filesAnalyzed", "licenseConcluded", "licenseDeclared", "copyrightText"}
FILE = {"SPDXID", "fileName", "checksums", "licenseConcluded", "licenseInfoInFiles", "copyrightText"}


def digest(path, kind):
    return hashlib.new(kind, path.read_bytes()).hexdigest()


def expect(right, what):
    if not right:
        sys.exit(f"materials.py: {what}")


def check_document(document):
    expect(DOCUMENT <= document.keys(), f"the document lacks {DOCUMENT - document.keys()}")
    expect((document["spdxVersion"], document["dataLicense"]) == ("SPDX-2.3", "CC0-1.0"), "version or licence of the document")
    expect(re.fullmatch(r"https://[^#\s]+", document["documentNamespace"]), "the namespace is no URI without a fragment")
    created = document["creationInfo"]
    expect(re.fullmatch(r"\d{4}-\d\d-\d\dT\d\d:\d\d:\d\dZ", created["created"]), "the date")
    expect(all(re.match(r"(Tool|Person|Organization): \S", name) for name in created["creators"]), "the creators")
    elements = [document, *document["packages"], *document["files"]]
    identifiers = {element["SPDXID"] for element in elements}
    expect(all(map(IDENTIFIER.fullmatch, identifiers)) and len(identifiers) == len(elements), "identifiers are wrong or not unique")
    for element in elements[1:]:
        required = FILE if "fileName" in element else PACKAGE
        expect(required <= element.keys(), f"{element['SPDXID']} lacks {required - element.keys()}")
        expect(element["licenseConcluded"] in LICENCES, f"{element['licenseConcluded']} is no licence that is known here")
    for relation in document["relationships"]:
        ends = {relation["spdxElementId"], relation["relatedSpdxElement"]}
        expect(ends <= identifiers, f"a relation between unknown elements: {ends}")


def check_files(document, folder):
    package = document["packages"][0]
    excluded = set(package["packageVerificationCode"]["packageVerificationCodeExcludedFiles"])
    there = {f"./{path.relative_to(folder)}" for path in folder.rglob("*") if path.is_file() and not path.is_symlink()}
    listed = {file["fileName"]: file for file in document["files"]}
    expect(there - excluded == listed.keys(), f"other files are listed than there are: {(there - excluded) ^ listed.keys()}")
    for name, file in listed.items():
        for checksum in file["checksums"]:
            right = digest(folder / name, checksum["algorithm"].lower()) == checksum["checksumValue"]
            expect(right, f"{name} has another {checksum['algorithm']}")
    sums = sorted(digest(folder / name, "sha1") for name in listed)
    code = hashlib.sha1("".join(sums).encode()).hexdigest()
    expect(package["packageVerificationCode"]["packageVerificationCodeValue"] == code, "the verification code of the package")
    contained = {relation["relatedSpdxElement"] for relation in document["relationships"]
                 if relation["relationshipType"] == "CONTAINS"}
    expect(contained == {file["SPDXID"] for file in document["files"]}, "the package does not contain its files")
    return len(listed)


def check_linked(document, folder, names):
    linked = {relation["relatedSpdxElement"] for relation in document["relationships"]
              if relation["relationshipType"] == "STATIC_LINK"}
    parts = {package["name"] for package in document["packages"] if package["SPDXID"] in linked}
    expect(set(names) <= parts, f"does not tell of {set(names) - parts}")
    for name in parts:
        licence = folder / f"share/doc/morvik/licences/{name}.txt"
        expect(licence.exists() and licence.stat().st_size > 0, f"no licence of {name}")
    return len(parts)


def main():
    folder = pathlib.Path(sys.argv[1])
    document = json.loads((folder / "share/doc/morvik/morvik.spdx.json").read_text())
    check_document(document)
    files = check_files(document, folder)
    print(f"{files} files and {check_linked(document, folder, sys.argv[2:])} components are as the bill of materials says")


if __name__ == "__main__":
    main()
