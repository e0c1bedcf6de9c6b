# SPDX-License-Identifier: Apache-2.0
"""What SPDX 2.3 requires of a bill of materials, and what this project's bills have to name."""

from __future__ import annotations

import hashlib
import re
import subprocess
from collections.abc import Iterator
from typing import Any

LIBRARIES_OF_ALL = {"libc6-dev", "libgcc-N-dev", "libstdc++-N-dev", "linux-libc-dev"}
LIBRARIES = {
    "orvane": LIBRARIES_OF_ALL,
    "orvane-unit": LIBRARIES_OF_ALL | {"libcli11-dev", "libdtl-dev", "libtomlplusplus-dev", "libutfcpp-dev",
                                       "nlohmann-json3-dev"},
}
# Of archives and start files; headers alone would not name them.
LINKED = {"libc6-dev": "libc.a", "libgcc-N-dev": "libgcc.a", "libstdc++-N-dev": "libstdc++.a"}
# A notice has to travel with the program, so the bill has its words.
NOTICES = {"libcli11-dev": "Redistributions in binary form", "libdtl-dev": "Redistributions in binary form",
           "libtomlplusplus-dev": "The above copyright notice", "nlohmann-json3-dev": "The above copyright notice"}

LICENCES = {"Apache-2.0", "BSD-3-Clause", "BSL-1.0", "GPL-2.0-only WITH Linux-syscall-note",
            "GPL-3.0-or-later WITH GCC-exception-3.1", "LGPL-2.1-or-later", "MIT"}
IN_DOCUMENT = {"spdxVersion": r"SPDX-2\.3", "dataLicense": r"CC0-1\.0", "SPDXID": "SPDXRef-DOCUMENT", "name": ".+",
               "documentNamespace": r"https://[^#]+-[0-9a-f]{64}"}
IN_PACKAGE = {"name": ".+", "versionInfo": r"\d.*", "supplier": "Organization: .+", "downloadLocation": "NOASSERTION",
              "copyrightText": ".+"}


def broken_rules(bill: dict[str, Any], content: dict[str, bytes]) -> list[str]:
    """Of the bill of a package with this content, without the bill itself. Each group of rules relies on
    those before it."""
    for group in (of_document, of_packages, of_relationships, of_links):
        if broken := list(group(bill)):
            return broken
    return list(of_files(bill, content))


def mismatches(thing: dict[str, Any], patterns: dict[str, str]) -> Iterator[str]:
    for key, pattern in patterns.items():
        if not re.fullmatch(pattern, str(thing.get(key)), re.DOTALL):
            yield f"{thing.get('SPDXID')}: {key} is {thing.get(key)!r}"


def of_document(bill: dict[str, Any]) -> Iterator[str]:
    yield from mismatches(bill, IN_DOCUMENT)
    made = bill["creationInfo"]
    yield from mismatches(made, {"created": r"\d{4}-\d\d-\d\dT\d\d:\d\d:\d\dZ"})
    if not made["creators"] or not all(re.fullmatch("(Organization|Person|Tool): .+", name)
                                       for name in made["creators"]):
        yield f"its creators are {made['creators']}"
    names = [thing["SPDXID"] for thing in [bill, *bill["packages"], *bill["files"]]]
    if len(set(names)) != len(names):
        yield "an identifier is used twice"
    for name in names:
        if not re.fullmatch(r"SPDXRef-[A-Za-z0-9.-]+", name):
            yield f"{name} can't be an identifier"


def of_packages(bill: dict[str, Any]) -> Iterator[str]:
    if [package["name"] for package in bill["packages"]][:1] != ["orvane"]:
        yield "its first package is not orvane"
    for package in bill["packages"]:
        yield from mismatches(package, IN_PACKAGE)
        for key in ("licenseConcluded", "licenseDeclared"):
            if unknown := set(package[key].split(" AND ")) - LICENCES:
                yield f"{package['name']}: {key} has {unknown}"
        if package["filesAnalyzed"] != (package["name"] == "orvane") or \
                package["filesAnalyzed"] != ("packageVerificationCode" in package):
            yield f"{package['name']}: its files are listed, or are not"
        if NOTICES.get(package["name"], "") not in "".join(package.get("attributionTexts", [])):
            yield f"{package['name']}: no notice"


def of_files(bill: dict[str, Any], content: dict[str, bytes]) -> Iterator[str]:
    listed = {file["fileName"] for file in bill["files"]}
    if listed != {f"./{name}" for name in content}:
        yield f"it lists {sorted(listed)} instead of {sorted(content)}"
        return
    for file in bill["files"]:
        data = content[file["fileName"][2:]]
        if {one["algorithm"]: one["checksumValue"] for one in file["checksums"]} != \
                {"SHA1": hashlib.sha1(data).hexdigest(), "SHA256": hashlib.sha256(data).hexdigest()}:
            yield f"{file['fileName']} has another checksum"
    sums = "".join(sorted(hashlib.sha1(data).hexdigest() for data in content.values()))
    if bill["packages"][0]["packageVerificationCode"]["packageVerificationCodeValue"] != \
            hashlib.sha1(sums.encode()).hexdigest():
        yield "the verification code is another"


def of_relationships(bill: dict[str, Any]) -> Iterator[str]:
    known = {thing["SPDXID"] for thing in [bill, *bill["packages"], *bill["files"]]}
    found = {(each["spdxElementId"], each["relationshipType"], each["relatedSpdxElement"])
             for each in bill["relationships"]}
    for one, kind, other in found:
        if {one, other} - known:
            yield f"{one} {kind} {other}: an end is missing"
    own = "SPDXRef-Package-orvane"
    expected = {("SPDXRef-DOCUMENT", "DESCRIBES", own)} | {(own, "CONTAINS", file["SPDXID"]) for file in bill["files"]}
    if {each for each in found if each[1] != "STATIC_LINK"} != expected:
        yield "it does not describe the package with all of its files"
    if unused := known - {name for each in found for name in (each[0], each[2])}:
        yield f"nothing refers to {unused}"


def of_links(bill: dict[str, Any]) -> Iterator[str]:
    packages = {package["SPDXID"]: package for package in bill["packages"]}
    for file in bill["files"]:
        program = file["fileName"].rsplit("/", 1)[-1]
        linked = {common_name(packages[each["relatedSpdxElement"]]["name"]): each["comment"]
                  for each in bill["relationships"]
                  if each["relationshipType"] == "STATIC_LINK" and each["spdxElementId"] == file["SPDXID"]}
        expected = LIBRARIES.get(program, set()) if file["fileTypes"] == ["BINARY"] else set()
        if linked.keys() != expected:
            yield f"{program} contains {sorted(linked)} instead of {sorted(expected)}"
        for name, archive in LINKED.items():
            if name in linked and archive not in linked[name].split("; "):
                yield f"{program} contains {linked[name]} of {name}, without {archive}"
    for package in bill["packages"][1:]:
        installed = subprocess.run(["dpkg-query", "-W", "-f=${Version}\n", package["name"]], check=True, text=True,
                                   stdout=subprocess.PIPE).stdout.splitlines()
        if package["versionInfo"] not in installed:
            yield f"{package['name']} has the version {installed}, not {package['versionInfo']}"


def common_name(package: str) -> str:
    """Without the compiler's version and the processor."""
    return re.sub(r"-\d+-dev$", "-N-dev", re.sub(r"-[a-z0-9]+-cross$", "", package))
