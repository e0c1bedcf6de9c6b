# SPDX-License-Identifier: Apache-2.0
"""Projects that use orvane get its library and nothing else: no other target, option, flag or file of ours.

One adds orvane's folder to its own build, one finds an installed orvane. All paths contain blanks.
"""

from __future__ import annotations

import json
import os
import re
import shutil
import subprocess
import tempfile
import unittest
from pathlib import Path
from typing import Any

HERE = Path(__file__).resolve().parent
PROJECT = HERE.parents[1]

# Everything that a build of the library alone reads.
TAKEN = ("CMakeLists.txt", "cmake", "src")

CHECK_VALUE = "cbf43926\n"

# What its sources require, and nothing that a builder may choose.
LIBRARY_FLAGS = {"-std=c++11", "-D_FILE_OFFSET_BITS=64", "-D_LARGEFILE64_SOURCE"}


def call(*words: str | Path) -> str:
    done = subprocess.run(words, text=True, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                          check=False)
    if done.returncode != 0:
        raise AssertionError(f"{words}: {done.returncode}\n{done.stdout}")
    return done.stdout


def options(fragments: list[dict[str, str]]) -> set[str]:
    return {word for each in fragments for word in each["fragment"].split()}


def files(folder: Path) -> set[str]:
    return {str(path.relative_to(folder)) for path in folder.rglob("*") if not path.is_dir()}


class Build:
    """A consumer, configured and built, and what CMake says it consists of."""

    def __init__(self, folder: Path, kind: str, *arguments: str) -> None:
        self.source, self.build = folder / "a consumer", folder / "a build"
        shutil.copytree(HERE / kind, self.source, dirs_exist_ok=True)
        shutil.copy(HERE / "print_check_value.cpp", self.source)
        query = self.build / ".cmake/api/v1/query"
        query.mkdir(parents=True)
        (query / "codemodel-v2").touch()
        self.said = call("cmake", "-S", self.source, "-B", self.build, "-G", "Ninja",
                         f"-DCMAKE_CXX_COMPILER={os.environ['ORVANE_COMPILER']}", *arguments)
        call("cmake", "--build", self.build)

    def targets(self) -> dict[str, Any]:
        replies = self.build / ".cmake/api/v1/reply"
        (model,) = replies.glob("codemodel-v2-*.json")
        (configuration,) = json.loads(model.read_text())["configurations"]
        return {target["name"]: json.loads((replies / target["jsonFile"]).read_text())
                for target in configuration["targets"]}

    def our_options(self) -> list[str]:
        cache = (self.build / "CMakeCache.txt").read_text()
        return re.findall(r"^(?:ORVANE|CPACK|BUILD_TESTING).*$", cache, re.MULTILINE)

    def installed(self, prefix: Path) -> set[str]:
        call("cmake", "--install", self.build, "--prefix", prefix)
        return files(prefix)


class ConsumerTest(unittest.TestCase):
    def setUp(self) -> None:
        holder = tempfile.TemporaryDirectory(prefix="orvane consumer-")
        self.addCleanup(holder.cleanup)
        self.folder = Path(holder.name)

    def check(self, build: Build) -> None:
        self.assertEqual(call(build.build / "consumer"), CHECK_VALUE)
        self.assertEqual(build.our_options(), [])
        consumer = build.targets()["consumer"]
        (group,) = consumer["compileGroups"]
        self.assertEqual(options(group.get("compileCommandFragments", [])), set())
        self.assertEqual(group.get("defines", []), [])
        flags = options([each for each in consumer["link"]["commandFragments"]
                         if each["role"] == "flags"])
        self.assertEqual(flags, set())
        libraries = [each["fragment"] for each in consumer["link"]["commandFragments"]
                     if each["role"] == "libraries"]
        self.assertEqual(len(libraries), 1, libraries)
        self.assertIn("liborvane_core.a", libraries[0])
        self.assertEqual(build.installed(self.folder / "of the consumer"), {"bin/consumer"})

    def add(self, *arguments: str) -> Build:
        orvane = self.folder / "a consumer/orvane"
        orvane.mkdir(parents=True)
        for name in TAKEN:
            copy = shutil.copytree if (PROJECT / name).is_dir() else shutil.copyfile
            copy(PROJECT / name, orvane / name)
        return Build(self.folder, "added", *arguments)

    def install(self) -> Path:
        prefix = self.folder / "a prefix"
        call("cmake", "--install", os.environ["ORVANE_BUILD"], "--component", "development",
             "--prefix", prefix)
        return prefix

    def test_added_to_another_build(self) -> None:
        build = self.add()
        self.check(build)
        targets = build.targets()
        self.assertEqual(set(targets), {"consumer", "orvane_core"})
        (group,) = targets["orvane_core"]["compileGroups"]
        flags = options(group["compileCommandFragments"])
        flags |= {f"-D{each['define']}" for each in group["defines"]}
        self.assertEqual(flags, LIBRARY_FLAGS)

    def test_found_after_an_install(self) -> None:
        prefix = self.install()
        build = Build(self.folder, "found", f"-DCMAKE_PREFIX_PATH={prefix}", "-DWANTED=1.0")
        self.check(build)
        self.assertEqual(set(build.targets()), {"consumer"})

    def test_all_headers_and_only_the_library_are_installed(self) -> None:
        prefix = self.install()
        headers = {f"include/orvane/{path.relative_to(PROJECT / 'src')}"
                   for path in (PROJECT / "src").rglob("*.h")}
        cmake = {f"lib/cmake/orvane/{name}.cmake"
                 for name in ("orvaneConfig", "orvaneConfig-release", "orvaneConfigVersion")}
        self.assertEqual(files(prefix), headers | cmake | {"lib/liborvane_core.a"})

    def test_another_major_version_is_not_found(self) -> None:
        prefix = self.install()
        with self.assertRaisesRegex(AssertionError, "considered but not accepted"):
            Build(self.folder, "found", f"-DCMAKE_PREFIX_PATH={prefix}", "-DWANTED=2.0")


if __name__ == "__main__":
    unittest.main()
