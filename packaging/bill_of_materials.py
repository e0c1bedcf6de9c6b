#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Writes a package's bill of materials (SPDX 2.3, JSON): its files with their checksums, and the Debian
packages whose code is linked into each program, with versions and licences. They are those that the build
itself reports: the linker's map names the members of archives that it took, and Ninja keeps the headers that
the compiler read. So a bill can't miss a library, and a library without a licence in LICENCES is an error.
"""

from __future__ import annotations

import argparse
import hashlib
import json
import os
import re
import subprocess
import sys
import time
from dataclasses import dataclass, field
from pathlib import Path
from typing import Any

# By the name of the Debian package, without the ending of those for another processor. Debian's names for
# licences differ from SPDX's: its Expat is MIT.
LICENCES = {
    r"libc6-dev": "LGPL-2.1-or-later",
    r"libcli11-dev": "BSD-3-Clause",
    r"libdtl-dev": "BSD-3-Clause",
    r"libgcc-\d+-dev": "GPL-3.0-or-later WITH GCC-exception-3.1",
    r"libstdc\+\+-\d+-dev": "GPL-3.0-or-later WITH GCC-exception-3.1",
    r"libtomlplusplus-dev": "MIT",
    r"libutfcpp-dev": "BSL-1.0",
    r"linux-libc-dev": "GPL-2.0-only WITH Linux-syscall-note",
    r"nlohmann-json3-dev": "MIT",
}
OWN_LICENCE = "Apache-2.0"
OWN_COPYRIGHT = "2026 the orvane developers"
OWN = "SPDXRef-Package-orvane"
OTHER_PROCESSOR = re.compile(r"-[a-z0-9]+-cross$")

# A line of a map that names a member of an archive, and one that names an object.
MEMBER = re.compile(r"^(?P<archive>[^ ].*\.a)\((?P<member>[^()]+)\)$")
OBJECT = re.compile(r"^LOAD (?P<object>.+\.o)$")
# What the optimisation at the link leaves of our own objects.
OWN_REMAINS = re.compile(r"\.ltrans\d+\.ltrans\.o$")


class Incomplete(Exception):
    """The bill would not name all that is in the programs."""


@dataclass
class Part:
    """What a program has of one Debian package."""
    archives: set[str] = field(default_factory=set)
    has_headers: bool = False

    def __str__(self) -> str:
        return "; ".join([*sorted(self.archives), *(["headers"] if self.has_headers else [])])


@dataclass(frozen=True)
class DebianPackage:
    name: str
    version: str
    architecture: str
    source: str
    built_using: str
    homepage: str

    @property
    def licence(self) -> str:
        name = OTHER_PROCESSOR.sub("", self.name)
        for pattern, licence in LICENCES.items():
            if re.fullmatch(pattern, name):
                return licence
        raise Incomplete(f"the licence of {self.name} is not known: add it to LICENCES in {__file__}")

    @property
    def notices(self) -> list[str]:
        """The text that has to travel with a program. An exception from a licence frees programs of it."""
        if " WITH " in self.licence:
            return []
        return [Path(f"/usr/share/doc/{self.name}/copyright").read_text(encoding="utf-8")]


@dataclass(frozen=True)
class Build:
    folder: Path
    sources: Path
    ninja: str

    def read_by_compiler(self, program: str) -> set[str]:
        """The headers in all objects of a program. Precompiled headers are objects here, too."""
        reported: dict[str, set[str]] = {}
        for line in self.ask_ninja("deps"):
            if line.startswith(" "):
                reported[output].add(line.strip())
            elif ": #deps " in line:
                output = line.split(": #deps ")[0]
                reported[output] = set()
        objects = [name for name in self.ask_ninja("inputs", program) if name.endswith((".o", ".gch"))]
        unreported = [name for name in objects if name not in reported]
        if unreported or not objects:
            raise Incomplete(f"{program}: {self.folder} does not say what the compiler read "
                             f"for {', '.join(unreported) or 'it'}")
        return {name for output in objects for name in reported[output]}

    def read_by_linker(self, program: str) -> set[str]:
        """The objects that a program contains, and the archives that have them."""
        plan = self.folder / f"{program}.map"
        if not plan.exists():
            raise Incomplete(f"{plan} is missing: {program} was not linked statically")
        read = set()
        for line in plan.read_text(errors="replace").splitlines():
            if found := MEMBER.match(line):
                read.add(found["archive"])
            elif (found := OBJECT.match(line)) and not OWN_REMAINS.search(found["object"]):
                read.add(found["object"])
        return read

    def parts(self, program: str) -> dict[str, Part]:
        """By the name of the Debian package."""
        linked = self.foreign(self.read_by_linker(program))
        headers = self.foreign(self.read_by_compiler(program))
        owners = owning_packages(linked | headers)
        parts: dict[str, Part] = {}
        for path in linked:
            parts.setdefault(owners[path], Part()).archives.add(Path(path).name)
        for path in headers:
            parts.setdefault(owners[path], Part()).has_headers = True
        return parts

    def foreign(self, names: set[str]) -> set[str]:
        """What is not the project's, by the file that each path leads to."""
        paths = {Path(os.path.realpath(self.folder / name)) for name in names}
        return {str(path) for path in paths
                if not path.is_relative_to(self.folder) and not path.is_relative_to(self.sources)}

    def ask_ninja(self, tool: str, *words: str) -> list[str]:
        return output_of(self.ninja, "-C", str(self.folder), "-t", tool, *words).splitlines()


def output_of(*words: str) -> str:
    return subprocess.run(words, check=True, text=True, stdout=subprocess.PIPE,
                          env={**os.environ, "LC_ALL": "C.UTF-8"}).stdout


def owning_packages(paths: set[str]) -> dict[str, str]:
    done = subprocess.run(["dpkg-query", "--search", *sorted(paths)], check=False, text=True,
                          capture_output=True, env={**os.environ, "LC_ALL": "C.UTF-8"})
    owners = {}
    for line in done.stdout.splitlines():
        packages, path = line.split(": ", 1)
        if path in paths:
            owners[path] = packages.split(", ")[0]
    if unknown := sorted(paths - owners.keys()):
        raise Incomplete(f"no Debian package has {', '.join(unknown)}, which the programs contain")
    return owners


def debian_package(name: str) -> DebianPackage:
    fields = ("${Package}", "${Version}", "${Architecture}", "${source:Package} ${source:Version}",
              "${Built-Using}", "${Homepage}")
    return DebianPackage(*output_of("dpkg-query", "--show", "--showformat=" + "\n".join(fields), name).split("\n"))


def identifier(kind: str, name: str) -> str:
    return f"SPDXRef-{kind}-" + re.sub(r"[^A-Za-z0-9.]+", "-", name).strip("-")


def describe_package(package: DebianPackage) -> dict[str, Any]:
    described: dict[str, Any] = {
        "SPDXID": identifier("Package", package.name),
        "name": package.name,
        "versionInfo": package.version,
        "supplier": "Organization: Debian",
        "downloadLocation": "NOASSERTION",
        "filesAnalyzed": False,
        "sourceInfo": f"built from the source package {package.source}"
                      + (f", using {package.built_using}" if package.built_using else ""),
        "licenseConcluded": package.licence,
        "licenseDeclared": package.licence,
        "licenseComments": "The licence of its libraries and headers as a whole; some parts have others.",
        "copyrightText": "NOASSERTION",
        "primaryPackagePurpose": "LIBRARY",
        "externalRefs": [{
            "referenceCategory": "PACKAGE-MANAGER", "referenceType": "purl",
            "referenceLocator": f"pkg:deb/debian/{package.name.replace('+', '%2B')}"
                                f"@{package.version.replace('+', '%2B')}?arch={package.architecture}"}],
    }
    if package.homepage:
        described["homepage"] = package.homepage
    if package.notices:
        described["attributionTexts"] = package.notices
    return described


def is_program(path: Path) -> bool:
    return path.read_bytes().startswith(b"\x7fELF")


def describe_file(path: Path, place: str, licences: set[str]) -> dict[str, Any]:
    content = path.read_bytes()
    return {
        "SPDXID": identifier("File", place),
        "fileName": f"./{place}",
        "fileTypes": ["BINARY" if is_program(path) else "OTHER"],
        "checksums": [{"algorithm": kind, "checksumValue": hashlib.new(kind, content).hexdigest()}
                      for kind in ("SHA1", "SHA256")],
        "licenseConcluded": all_of(licences),
        "licenseInfoInFiles": ["NOASSERTION"],
        "copyrightText": OWN_COPYRIGHT,
    }


def describe_own(version: str, files: list[dict[str, Any]], bill: str, licences: set[str]) -> dict[str, Any]:
    sums = sorted(file["checksums"][0]["checksumValue"] for file in files)
    code = hashlib.sha1("".join(sums).encode()).hexdigest()
    return {
        "SPDXID": OWN,
        "name": "orvane",
        "versionInfo": version,
        "supplier": "Organization: the orvane developers",
        "downloadLocation": "NOASSERTION",
        "filesAnalyzed": True,
        "packageVerificationCode": {"packageVerificationCodeValue": code,
                                    "packageVerificationCodeExcludedFiles": [f"./{bill}"]},
        "licenseConcluded": all_of(licences),
        "licenseDeclared": OWN_LICENCE,
        "licenseInfoFromFiles": ["NOASSERTION"],
        "copyrightText": OWN_COPYRIGHT,
        "primaryPackagePurpose": "APPLICATION",
    }


def all_of(licences: set[str]) -> str:
    return " AND ".join([OWN_LICENCE, *sorted(licences)])


def relation(one: str, kind: str, other: str, **more: str) -> dict[str, str]:
    return {"spdxElementId": one, "relationshipType": kind, "relatedSpdxElement": other, **more}


def document(build: Build, name: str, version: str, content: dict[str, Path], bill: str) -> dict[str, Any]:
    """Of a package with this content, by the places where it will be installed, and the bill."""
    programs = {place: build.parts(path.name) for place, path in sorted(content.items()) if is_program(path)}
    packages = {owner: debian_package(owner) for parts in programs.values() for owner in parts}
    files = [describe_file(path, place, {packages[owner].licence for owner in programs.get(place, {})})
             for place, path in sorted(content.items())]
    seconds = int(os.environ.get("SOURCE_DATE_EPOCH", time.time()))
    made = {
        "spdxVersion": "SPDX-2.3",
        "dataLicense": "CC0-1.0",
        "SPDXID": "SPDXRef-DOCUMENT",
        "name": name,
        "creationInfo": {"created": time.strftime("%Y-%m-%dT%H:%M:%SZ", time.gmtime(seconds)),
                         "creators": ["Organization: the orvane developers"]},
        "packages": [describe_own(version, files, bill, {package.licence for package in packages.values()}),
                     *(describe_package(package) for _, package in sorted(packages.items()))],
        "files": files,
        "relationships": [
            relation("SPDXRef-DOCUMENT", "DESCRIBES", OWN),
            *(relation(OWN, "CONTAINS", file["SPDXID"]) for file in files),
            *(relation(identifier("File", place), "STATIC_LINK", identifier("Package", packages[owner].name),
                       comment=str(part))
              for place, parts in programs.items() for owner, part in sorted(parts.items()))],
    }
    # The namespace must be another one for another bill, and the same one for the same.
    digest = hashlib.sha256(json.dumps(made, sort_keys=True).encode()).hexdigest()
    return {**made, "documentNamespace": f"https://orvane.example.org/spdx/{name}-{digest}"}


def main() -> int:
    parser = argparse.ArgumentParser(description=(__doc__ or "").splitlines()[0])
    parser.add_argument("--build", type=Path, required=True, help="the folder of the build, by Ninja")
    parser.add_argument("--sources", type=Path, required=True, help="the project's folder")
    parser.add_argument("--ninja", default="ninja", help="the program")
    parser.add_argument("--name", required=True, help="of the package, with its version and processor")
    parser.add_argument("--version", required=True)
    parser.add_argument("--prefix", type=Path, required=True, help="the absolute folder where it is installed")
    parser.add_argument("staged", type=Path, help="the folder that is packed, and gets the bill")
    given = parser.parse_args()
    place = str(given.prefix.relative_to("/") / "share/doc/orvane/orvane.spdx.json")
    output = given.staged / place
    output.unlink(missing_ok=True)
    content = {str(path.relative_to(given.staged)): path for path in given.staged.rglob("*") if path.is_file()}
    try:
        made = document(Build(given.build.resolve(), given.sources.resolve(), given.ninja), given.name,
                        given.version, content, place)
    except Incomplete as problem:
        print(f"no bill of materials: {problem}", file=sys.stderr)
        return 1
    output.write_text(json.dumps(made, indent=1, ensure_ascii=False) + "\n", encoding="utf-8")
    output.chmod(0o644)
    return 0


if __name__ == "__main__":
    sys.exit(main())
