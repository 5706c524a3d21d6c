#!/usr/bin/env python3
"""Completes the folder of an archive: a README, the licences of what is linked in, a software bill of materials (SPDX 2.3)
and a list of the files with their SHA-256.

  describe.py FOLDER SYSTEM VERSION BUILD

What is linked in follows from the headers that the build in BUILD has read, as the compiler has noted them. Everything
has the date in SOURCE_DATE_EPOCH.
"""

import datetime
import hashlib
import json
import os
import pathlib
import re
import shutil
import subprocess
import sys

HERE = pathlib.Path(__file__).resolve().parent
GCC = "GPL-3.0-or-later WITH GCC-exception-3.1"

# The packages of Debian that headers belong to: what of them is linked in, and its licence.
LINKED_IN = [
    (r"lib(32)?stdc\+\+-\d+-dev(-\w+-cross)?|g\+\+-mingw-w64-x86-64-posix", "libstdc++", GCC),
    (r"lib(32)?gcc-\d+-dev(-\w+-cross)?|gcc-mingw-w64-x86-64-posix(-runtime)?", "libgcc", GCC),
    (r"libc6-dev(-\w+(-cross)?)?", "glibc", "LGPL-2.1-or-later"),
    (r"mingw-w64-(x86-64-dev|common)", "mingw-w64", "ZPL-2.1"),
    (r"libz-mingw-w64-dev|zlib1g-dev", "zlib", "Zlib"),
    (r"libcli11-dev", "CLI11", "BSD-3-Clause"),
    (r"nlohmann-json3-dev", "nlohmann-json", "MIT"),
    (r"libboost[\d.]*-dev", "Boost", "BSL-1.0"),
    (r"librandom123-dev", "Random123", "BSD-3-Clause"),
]
# They have numbers of Linux's interface alone.
NOT_LINKED_IN = r"linux-libc-dev(-\w+-cross)?"


def output_of(*command):
    return subprocess.run(command, check=True, text=True, stdout=subprocess.PIPE).stdout


def headers_of(build):
    """The headers of the system that the compilations have read, but for those of tests, which are not in an archive."""
    paths = set()
    is_shipped = False
    for line in output_of("ninja", "-C", str(build), "-t", "deps").splitlines():
        if line.startswith("    "):
            if is_shipped:
                paths.add(os.path.realpath(os.path.join(build, line.strip())))
        elif line:
            is_shipped = not re.match(r"(tests|bench|validation)/|.*/tests/", line)
    return sorted(path for path in paths if path.startswith("/usr/"))


def components_of(build):
    """What is linked in: name, version, licence and package of each."""
    packages = set(re.findall(r"^([^:\s]+):", output_of("dpkg-query", "-S", *headers_of(build)), re.MULTILINE))
    components = {}
    for package in sorted(packages):
        known = [entry for entry in LINKED_IN if re.fullmatch(entry[0], package)]
        if known:
            version = output_of("dpkg-query", "-W", "-f", "${Version}", package)
            components[known[0][1]] = (known[0][1], version, known[0][2], package)
        elif not re.fullmatch(NOT_LINKED_IN, package):
            sys.exit(f"describe.py: the build uses {package}, of which no licence is known here")
    return [components[name] for name in sorted(components)]


def write_readme(folder, system, version):
    kind = system.split("-")[0]
    text = (HERE / f"README-{kind}.txt.in").read_text()
    for word, value in {"VERSION": version, "SYSTEM": system, "CFLAGS": "-m32 " if system.endswith("i386") else ""}.items():
        text = text.replace(f"@{word}@", value)
    (folder / "README.txt").write_text(text)


def write_licences(folder, components):
    """Debian's copyright file of each component, and the licences that these name without their text."""
    licences = folder / "share/doc/morvik/licences"
    licences.mkdir()
    for name, _, _, package in components:
        shutil.copyfile(f"/usr/share/doc/{package}/copyright", licences / f"{name}.txt")
    for licence in ("GPL-3", "LGPL-2.1"):
        shutil.copyfile(f"/usr/share/common-licenses/{licence}", licences / f"{licence}.txt")


def digest(path, kind):
    return hashlib.new(kind, path.read_bytes()).hexdigest()


def files_of(folder):
    return sorted(path for path in folder.rglob("*") if path.is_file() and not path.is_symlink())


def spdx_file(number, folder, path):
    licences = path.parent.name == "licences"
    return {
        "SPDXID": f"SPDXRef-File-{number}",
        "fileName": f"./{path.relative_to(folder)}",
        "checksums": [{"algorithm": kind.upper(), "checksumValue": digest(path, kind)} for kind in ("sha1", "sha256")],
        "licenseConcluded": "NOASSERTION" if licences else "MIT",
        "licenseInfoInFiles": ["NOASSERTION"],
        "copyrightText": "NOASSERTION" if licences else "2026 the morvik authors",
    }


def spdx_package(identifier, name, version, licence, origin, **more):
    return {
        "SPDXID": identifier,
        "name": name,
        "versionInfo": version,
        "downloadLocation": "NOASSERTION",
        "licenseConcluded": licence,
        "licenseDeclared": licence,
        "copyrightText": origin,
        **more,
    }


def write_materials(folder, system, version, components):
    name = f"morvik-{version}-{system}"
    listed = files_of(folder)
    files = [spdx_file(number, folder, path) for number, path in enumerate(listed, 1)]
    own = "./share/doc/morvik/morvik.spdx.json"
    verification = hashlib.sha1("".join(sorted(digest(path, "sha1") for path in listed)).encode()).hexdigest()
    packages = [spdx_package(
        "SPDXRef-morvik", "morvik", version, "MIT", "2026 the morvik authors", packageFileName=name, filesAnalyzed=True,
        packageVerificationCode={"packageVerificationCodeValue": verification,
                                 "packageVerificationCodeExcludedFiles": [own, "./MANIFEST.sha256"]})]
    relations = [("SPDXRef-DOCUMENT", "DESCRIBES", "SPDXRef-morvik")]
    relations += [("SPDXRef-morvik", "CONTAINS", file["SPDXID"]) for file in files]
    for component, of_version, licence, package in components:
        identifier = "SPDXRef-" + re.sub(r"[^A-Za-z0-9.-]", "p", component)
        packages.append(spdx_package(
            identifier, component, of_version, licence, f"See share/doc/morvik/licences/{component}.txt", filesAnalyzed=False,
            supplier="Organization: Debian", externalRefs=[{
                "referenceCategory": "PACKAGE-MANAGER", "referenceType": "purl",
                "referenceLocator": f"pkg:deb/debian/{package.replace('+', '%2B')}@{of_version.replace('+', '%2B')}"}]))
        relations.append(("SPDXRef-morvik", "STATIC_LINK", identifier))
    date = datetime.datetime.fromtimestamp(int(os.environ["SOURCE_DATE_EPOCH"]), datetime.timezone.utc)
    document = {
        "spdxVersion": "SPDX-2.3",
        "dataLicense": "CC0-1.0",
        "SPDXID": "SPDXRef-DOCUMENT",
        "name": name,
        "documentNamespace": f"https://morvik.invalid/spdx/{name}-{verification}",
        "creationInfo": {"created": date.strftime("%Y-%m-%dT%H:%M:%SZ"), "creators": [f"Tool: morvik-archives-{version}"]},
        "packages": packages,
        "files": files,
        "relationships": [{"spdxElementId": one, "relationshipType": kind, "relatedSpdxElement": other}
                          for one, kind, other in relations],
    }
    (folder / own).write_text(json.dumps(document, indent=1) + "\n")


def write_manifest(folder):
    lines = [f"{digest(path, 'sha256')}  {path.relative_to(folder)}\n" for path in files_of(folder)]
    (folder / "MANIFEST.sha256").write_text("".join(lines))


def main():
    folder, system, version, build = pathlib.Path(sys.argv[1]), sys.argv[2], sys.argv[3], pathlib.Path(sys.argv[4])
    components = components_of(build)
    write_readme(folder, system, version)
    write_licences(folder, components)
    write_materials(folder, system, version, components)
    write_manifest(folder)


if __name__ == "__main__":
    main()
