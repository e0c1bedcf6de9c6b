# SPDX-License-Identifier: Apache-2.0
"""The unit's toolchain file, with a stand-in for the SDK: what it makes CMake do, and when it stops. All
paths contain blanks, as a user's may."""

from __future__ import annotations

import os
import re
import shlex
import shutil
import subprocess
import tarfile
import tempfile
import unittest
from collections.abc import Iterable
from io import BytesIO
from pathlib import Path

from elftools.elf.elffile import ELFFile

PROJECT = Path(__file__).resolve().parents[2]
STAND_IN = Path(__file__).with_name("stand_in.sh")
TOOLCHAIN = "cmake/toolchains/qnx-armv7.cmake"
DEFAULT_VARIANT = "gcc_ntoarmv7le_gpp"
DEFINITIONS = {"-D_QNX_SOURCE", "-D_LARGEFILE64_SOURCE", "-D_FILE_OFFSET_BITS=64"}
# What links the C++ library statically: GCC's options, and positions, which only q++ has.
STATIC_OPTIONS = ["-static-libstdc++", "-static-libgcc"]
POSITIONS = ["-Wl,--as-needed", "-Bstatic", "-lstdc++", "-lgcc_eh", "-lgcc", "-Bdynamic"]
POSITIONS_WITHOUT_SHARED_LIBGCC = ["-Wl,--as-needed", "-Bstatic", "-lstdc++", "-Bdynamic"]
USAGE = (b"Usage: orvane <options>\r\n\r\nOptions:\r\n  -i -- Update iAP config files\r\n"
         b"  -a -- Update airplay config file\r\n\r\n")
# The options that a build for the unit may use, as patterns: GCC 4.7, the oldest compiler of a unit, or its
# driver has each. The stand-in fails at any other.
OPTIONS = (
    "-c", "-o", "-E", "-v", "-V?*", "-lang-c++", "-std=c++11", "-D*", "-U*", "-I*", "-Wp,-M[DTF],*",
    "-g", "-Os", "-O3", "-Wall", "-Wextra", "-fdata-sections", "-ffunction-sections",
    "-fdebug-prefix-map=*", "-fstack-protector",
    "-Wl,--gc-sections", "-Wl,-z,relro", "-Wl,-z,now", "-Wl,-z,noexecstack",
    "-static", *STATIC_OPTIONS, *POSITIONS)


class Sdk:
    """The folders that the SDK's environment script would name."""

    def __init__(self, folder: Path, version: str = "4.7.3", unknown: Iterable[str] = (),
                 ignored: Iterable[str] = (), added: Iterable[str] = (),
                 tools: str = "ntoarmv7-") -> None:
        self.host, self.target = folder / "the SDK/host", folder / "the SDK/target"
        self.variables = {"QNX_HOST": str(self.host), "QNX_TARGET": str(self.target)}
        programs, state = self.host / "usr/bin", self.host / "stand-in"
        for place in (programs, state, self.host / "calls", self.target):
            place.mkdir(parents=True)
        (state / "version").write_text(f"{version}\n")
        assert set(OPTIONS) >= {*unknown, *ignored}
        known = [option for option in OPTIONS if option not in unknown]
        for name, lines in (("known", known), ("ignored", ignored), ("added", added)):
            (state / name).write_text("".join(f"{line}\n" for line in lines))
        (programs / "q++").symlink_to(STAND_IN)
        for tool in ("ar", "ranlib", "strip", "objcopy"):
            found = shutil.which(f"arm-linux-gnueabihf-{tool}")
            assert found is not None, tool
            (programs / f"{tools}{tool}").symlink_to(found)

    def calls(self) -> list[list[str]]:
        """The words of each call of the driver, in no order."""
        return [path.read_text().splitlines() for path in (self.host / "calls").iterdir()]


class TargetBuildTest(unittest.TestCase):
    """Each test has a folder; all share a copy of the project, and one build."""

    shared: Path
    sources: Path
    build: Path
    sdk: Sdk

    @classmethod
    def setUpClass(cls) -> None:
        holder = tempfile.TemporaryDirectory(prefix="orvane-target build-")
        cls.addClassCleanup(holder.cleanup)
        cls.shared = Path(holder.name)
        cls.sources, cls.build = cls.shared / "the project", cls.shared / "the build"
        shutil.copytree(PROJECT, cls.sources,
                        ignore=shutil.ignore_patterns("build", ".git", "__pycache__"))
        cls.sdk = Sdk(cls.shared)
        environment = {**os.environ, **cls.sdk.variables}
        for words in (cls.configuration(cls.build), ["cmake", "--build", cls.build],
                      ["cpack", "-G", "TGZ", "--config", cls.build / "CPackConfig.cmake"]):
            done = subprocess.run(words, env=environment, cwd=cls.build.parent, text=True,
                                  stdout=subprocess.PIPE, stderr=subprocess.STDOUT, check=False)
            if done.returncode != 0:
                raise AssertionError(f"{words}\n{done.stdout}")

    def setUp(self) -> None:
        self.folder = Path(tempfile.mkdtemp(dir=self.shared))

    @classmethod
    def configuration(cls, build: Path, *options: str) -> list[str | Path]:
        return ["cmake", "-G", "Ninja", "-S", cls.sources, "-B", build,
                f"-DCMAKE_TOOLCHAIN_FILE={cls.sources / TOOLCHAIN}", *options]

    def configure(self, variables: dict[str, str], *options: str) -> subprocess.CompletedProcess[str]:
        environment = {name: text for name, text in os.environ.items() if not name.startswith("QNX_")}
        done = subprocess.run(self.configuration(self.folder / "build", *options), text=True,
                              env={**environment, **variables}, stdout=subprocess.PIPE,
                              stderr=subprocess.STDOUT, check=False)
        done.stdout = " ".join(done.stdout.split())  # CMake breaks the lines of a message
        return done

    def commands(self, *options: str, sdk: Sdk) -> list[list[str]]:
        """The commands that would build the program, the link last, in a build that is only configured."""
        done = self.configure(sdk.variables, *options)
        self.assertEqual(done.returncode, 0, done.stdout)
        lines = subprocess.run(["ninja", "-C", self.folder / "build", "-t", "commands", "orvane"],
                               text=True, stdout=subprocess.PIPE, check=True).stdout
        return [shlex.split(line) for line in lines.splitlines()]

    def libraries(self, *options: str, sdk: Sdk) -> list[str]:
        """What the program is linked with, after its objects."""
        words = self.commands(*options, sdk=sdk)[-1]
        behind = words.index("src/liborvane_core.a") + 1
        return words[behind:words.index("&&", behind)]

    def compiled(self) -> dict[str, list[str]]:
        """The words with which each source of the project was compiled."""
        sources = {}
        for words in self.sdk.calls():
            if "-c" in words and words[-1].startswith(f"{self.sources}/"):
                name = str(Path(words[-1]).relative_to(self.sources))
                self.assertNotIn(name, sources)
                sources[name] = words
        return sources

    def packed(self) -> tarfile.TarFile:
        [path] = (self.build / "packages").glob("*.tar.gz")
        archive = tarfile.open(path)
        self.addCleanup(archive.close)
        return archive

    def packed_program(self) -> ELFFile:
        member = next(entry for entry in self.packed() if entry.name.endswith("bin/orvane"))
        content = self.packed().extractfile(member.name)
        assert content is not None
        return ELFFile(BytesIO(content.read()))

    def test_cmake_recognises_the_driver(self) -> None:
        [found] = (self.build / "CMakeFiles").glob("*/CMakeCXXCompiler.cmake")
        self.assertIn('set(CMAKE_CXX_COMPILER_ID "QCC")', found.read_text())

    def test_the_rules_are_those_for_the_driver(self) -> None:
        link = next(words for words in self.sdk.calls() if "src/liborvane_core.a" in words)
        for name, words in [*self.compiled().items(), ("orvane", link)]:
            with self.subTest(name=name):
                self.assertIn("-lang-c++", words)
                self.assertEqual([word for word in words if word.startswith("-flto")], [])
                self.assertEqual(name.endswith(".cpp"),
                                 any(word.startswith("-Wp,-MD,") for word in words))

    def test_an_option_that_is_not_listed_ends_a_build(self) -> None:
        done = self.configure(self.sdk.variables, "-DCMAKE_CXX_FLAGS=-Wduplicated-cond")
        self.assertNotEqual(done.returncode, 0)
        self.assertIn("unrecognized command line option '-Wduplicated-cond'", done.stdout)

    def test_every_call_names_the_variant(self) -> None:
        question = ["-V"]  # CMake asks whether it is that driver
        self.assertIn(question, self.sdk.calls())
        calls = [words for words in self.sdk.calls() if words != question]
        self.assertGreater(len(calls), 20)
        for words in calls:
            self.assertEqual([word for word in words if word.startswith("-V")],
                             [f"-V{DEFAULT_VARIANT}"])

    def test_the_product_for_the_unit_is_built_and_nothing_else(self) -> None:
        product = {str(path.relative_to(PROJECT)) for path in (PROJECT / "src").rglob("*.cpp")}
        self.assertEqual(set(self.compiled()),
                         {name for name in product if not name.startswith("src/platform/linux/")})

    def test_the_platform_is_compiled_with_the_definitions_that_it_needs(self) -> None:
        for name in ("option_parser", "shared_memory"):
            with self.subTest(name=name):
                words = self.compiled()[f"src/platform/qnx/{name}.cpp"]
                self.assertEqual(DEFINITIONS - set(words), set())

    def test_the_usage_record_is_in_the_packed_program(self) -> None:
        section = self.packed_program().get_section_by_name("QNX_usage")
        self.assertEqual(section.data(), USAGE)
        self.assertEqual(section["sh_flags"], 0)

    def test_the_packed_program_is_stripped(self) -> None:
        with (self.build / "orvane").open("rb") as built:
            self.assertIsNotNone(ELFFile(built).get_section_by_name(".symtab"))
        self.assertIsNone(self.packed_program().get_section_by_name(".symtab"))

    def test_the_package_is_for_the_unit(self) -> None:
        version = re.search(r"project\(orvane VERSION (\S+)", (PROJECT / "CMakeLists.txt").read_text())
        assert version is not None
        self.assertEqual(Path(str(self.packed().name)).name,
                         f"orvane-{version[1]}-qnx-armv7.tar.gz")
        names = {Path(name) for name in self.packed().getnames()}
        documents = Path("share/doc/orvane")
        self.assertLessEqual({Path("bin/orvane"), Path("bin/orvane-field"), documents / "copyright"}, names)
        self.assertNotIn(Path("bin/orvane-unit"), names)
        # Nobody here knows what an SDK's libraries are.
        self.assertNotIn(documents / "orvane.spdx.json", names)

    def test_the_program_brings_the_c_plus_plus_library_and_needs_the_c_library(self) -> None:
        dynamic = self.packed_program().get_section_by_name(".dynamic")
        needed = {tag.needed for tag in dynamic.iter_tags("DT_NEEDED")}
        self.assertIn("libc.so.6", needed)
        self.assertEqual({name for name in needed if re.match(r"libstdc\+\+|libgcc", name)}, set())

    def test_the_c_plus_plus_library_is_static_by_position_where_the_driver_has_no_option(self) -> None:
        sdk = Sdk(self.folder, ignored=["-static-libstdc++"])
        self.assertEqual(self.libraries(sdk=sdk), POSITIONS)

    def test_libgcc_is_not_named_where_it_is_static_alone(self) -> None:
        sdk = Sdk(self.folder, unknown=["-static-libstdc++", "-lgcc_eh"], added=["-static-libgcc"])
        self.assertEqual(self.libraries(sdk=sdk), POSITIONS_WITHOUT_SHARED_LIBGCC)

    def test_the_c_plus_plus_library_is_dynamic_where_the_driver_has_no_other(self) -> None:
        sdk = Sdk(self.folder, unknown=["-static-libstdc++"], ignored=["-Bstatic"])
        self.assertEqual(self.libraries(sdk=sdk), [])

    def test_a_c_plus_plus_library_of_any_name_is_noticed(self) -> None:
        library = self.folder / "libcpp.so.4"
        subprocess.run(["arm-linux-gnueabihf-g++", "-shared", f"-Wl,-soname,{library.name}",
                        "-x", "c++", "/dev/null", "-o", library], check=True)
        sdk = Sdk(self.folder, added=["-Wl,--no-as-needed", str(library)])
        self.assertEqual(self.libraries(sdk=sdk), [])

    def test_a_static_build_stays_one(self) -> None:
        sdk = Sdk(self.folder)
        self.assertEqual(self.libraries("-DORVANE_STATIC=ON", sdk=sdk), [])
        self.assertIn("-static", self.commands(sdk=sdk)[-1])

    def test_what_the_linker_or_the_c_library_lacks_is_left_out(self) -> None:
        options = ["-Wl,--gc-sections", "-Wl,-z,relro", "-Wl,-z,now", "-Wl,-z,noexecstack"]
        absent_symbol = "-Wl,--wrap=__stack_chk_fail"  # renames it to a symbol that nothing defines
        sdk = Sdk(self.folder, unknown=options[:2], ignored=options[2:], added=[absent_symbol])
        *compiles, link = self.commands(sdk=sdk)
        self.assertEqual(set(options) & set(link), set(options[2:]))
        for words in compiles:
            self.assertNotIn("-fstack-protector", words)

    def test_an_sdk_of_several_compilers_with_the_long_names_of_tools(self) -> None:
        sdk = Sdk(self.folder, tools="arm-unknown-nto-qnx7.0.0eabi-")
        words = self.commands("-DORVANE_QNX_VARIANT=5.4.0,gcc_ntoarmv7le_gpp",
                              "-DCMAKE_CXX_FLAGS=-g", sdk=sdk)[-1]
        self.assertIn("-V5.4.0,gcc_ntoarmv7le_gpp", words)
        self.assertIn("-g", words)
        cache = (self.folder / "build/CMakeCache.txt").read_text()
        for tool in ("AR", "RANLIB", "STRIP", "OBJCOPY"):
            self.assertIn(f"CMAKE_{tool}:FILEPATH={sdk.host}/usr/bin/arm-unknown-nto-qnx7.0.0eabi-"
                          f"{tool.lower()}\n", cache)

    def test_a_missing_tool_is_named(self) -> None:
        done = self.configure(Sdk(self.folder, tools="another-").variables)
        self.assertNotEqual(done.returncode, 0)
        self.assertIn("Could not find CMAKE_AR using the following names: ntoarmv7-ar", done.stdout)

    def test_a_missing_environment_variable_is_named(self) -> None:
        variables = Sdk(self.folder).variables
        for name in variables:
            for broken in ({key: text for key, text in variables.items() if key != name},
                           {**variables, name: ""}):
                with self.subTest(name=name, broken=broken):
                    done = self.configure(broken)
                    self.assertNotEqual(done.returncode, 0)
                    self.assertIn(f"{name} is not set: run the QNX SDK's environment script first",
                                  done.stdout)

    def test_an_old_compiler_is_refused(self) -> None:
        done = self.configure(Sdk(self.folder, version="4.6.3").variables)
        self.assertNotEqual(done.returncode, 0)
        self.assertIn("orvane needs GCC 4.7 or newer.", done.stdout)
        self.assertIn(f"q++ -V{DEFAULT_VARIANT} is GCC 4.6.3.", done.stdout)

    def test_the_oldest_compiler_is_not_refused(self) -> None:
        done = self.configure(Sdk(self.folder, version="4.7.0").variables)
        self.assertEqual(done.returncode, 0, done.stdout)
        self.assertIn("The CXX compiler identification is QCC 4.7.0", done.stdout)
        self.assertNotIn("needs GCC", done.stdout)

    def test_another_variant_for_a_configured_folder_is_refused(self) -> None:
        sdk, option = Sdk(self.folder), "-DORVANE_QNX_VARIANT=5.4.0,gcc_ntoarmv7le_gpp"
        self.commands(sdk=sdk)
        done = self.configure(sdk.variables, option)
        self.assertNotEqual(done.returncode, 0)
        self.assertIn(f"This folder was configured with -V{DEFAULT_VARIANT}. For "
                      "-V5.4.0,gcc_ntoarmv7le_gpp configure again, with cmake --fresh.", done.stdout)
        words = self.commands("--fresh", option, sdk=sdk)[-1]
        self.assertIn("-V5.4.0,gcc_ntoarmv7le_gpp", words)


if __name__ == "__main__":
    unittest.main()
