#!/usr/bin/env python3
"""Builds the library for a platform of the test's own, and loads a policy through it.

  platform_test.py BUILD SOURCE [NAME...]    a build, for its compiler; the root of the repository
"""

from __future__ import annotations

import os
import pathlib
import re
import subprocess
import sys
import tempfile
import unittest

BUILD = pathlib.Path(sys.argv[1]).resolve()
SOURCE = pathlib.Path(sys.argv[2]).resolve()
HERE = SOURCE / "tests" / "platform"


def cached(name: str) -> str:
    found = re.search(rf"^{name}:\w+=(.*)$", (BUILD / "CMakeCache.txt").read_text(), re.MULTILINE)
    assert found, f"{name} is not in the build's cache"
    return found.group(1)


CMAKE = cached("CMAKE_COMMAND")
COMPILER = cached("CMAKE_CXX_COMPILER")
# What only the stand-in host, the command and the tests need.
NOT_NEEDED = ("LibArchive", "PkgConfig", "nlohmann_json", "CLI11", "OpenSSL", "GTest")
FLAGS = ("-std=c++20", "-Wall", "-Wextra", "-Werror")


def run(*command: object, **environment: object) -> subprocess.CompletedProcess[str]:
    return subprocess.run(
        [str(word) for word in command],
        env={**os.environ, "CCACHE_NOHASHDIR": "1",
             **{name: str(value) for name, value in environment.items()}},
        text=True, capture_output=True, check=False)


def done(*command: object, **environment: object) -> subprocess.CompletedProcess[str]:
    """Runs a command that has to succeed, and says what it printed when it does not."""
    result = run(*command, **environment)
    if result.returncode != 0:
        words = " ".join(map(str, command))
        raise AssertionError(f"{words}: {result.returncode}\n{result.stdout}{result.stderr}")
    return result


def configure(build: pathlib.Path, *options: str) -> subprocess.CompletedProcess[str]:
    return run(CMAKE, "-G", "Ninja", "-S", SOURCE, "-B", build, "-DCMAKE_BUILD_TYPE=Debug",
               f"-DCMAKE_CXX_COMPILER={COMPILER}", "-DCMAKE_UNITY_BUILD=ON",
               f"-DCMAKE_INSTALL_PREFIX={build / 'prefix'}", "-DCMAKE_INSTALL_LIBDIR=lib",
               *(f"-DCMAKE_DISABLE_FIND_PACKAGE_{name}=ON" for name in NOT_NEEDED), *options)


class PlatformTest(unittest.TestCase):
    maxDiff = None

    @classmethod
    def setUpClass(cls) -> None:
        directory = tempfile.TemporaryDirectory(prefix="secpolicy-platform-")
        cls.addClassCleanup(directory.cleanup)
        cls.work = pathlib.Path(directory.name)
        cls.library = cls.work / "libplatform.so"
        cls.compile_library(HERE / "recorder.cc", cls.library)

    @staticmethod
    def compile_library(source: pathlib.Path, library: pathlib.Path) -> None:
        done(COMPILER, *FLAGS, "-shared", "-fPIC", f"-Wl,-soname,{library.name}.3",
             f"-I{SOURCE / 'src'}", source, "-o", library)
        link = library.with_name(f"{library.name}.3")
        link.unlink(missing_ok=True)
        link.symlink_to(library.name)


class Configuration(PlatformTest):
    """What is wrong with the platform's library is said before anything is built."""

    def refused(self, *options: str) -> str:
        result = configure(self.work / "build", *options)
        self.assertNotEqual(result.returncode, 0, result.stdout)
        # CMake breaks the lines of a message where they are long.
        return " ".join(result.stderr.split())

    def refused_library(self, value: object) -> str:
        return self.refused("-DSECPOLICY_PLATFORM=external", f"-DSECPOLICY_PLATFORM_LIBRARY={value}")

    def test_wrong_values(self) -> None:
        empty = self.work / "empty.cc"
        empty.write_text("void nothing() {}\n")
        other = self.work / "libother.so"
        self.compile_library(empty, other)
        text = self.work / "text.so"
        text.write_text("no library\n")
        for value, message in (
                ("", "SECPOLICY_PLATFORM=external needs SECPOLICY_PLATFORM_LIBRARY"),
                ("/nowhere/libplatform.so", "there is no file /nowhere/libplatform.so"),
                (self.work, f"{self.work} is a directory"),
                ("lib/platform.so", '"lib/platform.so" is neither the absolute path of a file nor'),
                ("-lplatform", '"-lplatform" is neither the absolute path'),
                ("no_such_platform", 'no program can be linked with "no_such_platform"'),
                (other, f'no program can be linked with "{other}"'),
                (text, f'no program can be linked with "{text}"'),
                (f"{self.library};/nowhere/more.a", "there is no file /nowhere/more.a")):
            with self.subTest(value=str(value)):
                self.assertIn(message, self.refused_library(value))

    def test_the_stand_in_host_takes_no_library(self) -> None:
        self.assertIn("SECPOLICY_PLATFORM_LIBRARY is for SECPOLICY_PLATFORM=external",
                      self.refused("-DSECPOLICY_PLATFORM=stand-in",
                                   f"-DSECPOLICY_PLATFORM_LIBRARY={self.library}"))

    def test_unknown_platform(self) -> None:
        self.assertIn('SECPOLICY_PLATFORM is "other": it can be stand-in or external',
                      self.refused("-DSECPOLICY_PLATFORM=other"))

    def test_what_needs_the_stand_in_host_is_not_left_out_silently(self) -> None:
        parts = ("SECPOLICY_BUILD_COMMAND", "SECPOLICY_BUILD_TESTS", "SECPOLICY_BUILD_BENCHMARKS",
                 "SECPOLICY_FUZZ")
        for part in parts:
            switches = [f"-D{other}={'ON' if other == part else 'OFF'}" for other in parts]
            with self.subTest(part=part):
                self.assertIn(f"{part} needs the stand-in host",
                              self.refused("-DSECPOLICY_PLATFORM=external",
                                           f"-DSECPOLICY_PLATFORM_LIBRARY={self.library}",
                                           *switches))


POLICY = {
    "objects/base": "logFile\ndefault\n",
    "domains/appDom": (
        "-s openat grant\n-c net_admin revoke\n-p net_bind 80 grant\n-a logFile read grant\n"
        "-d logFile globalVMDom exec grant\n-f default logFile file grant\n"
        "-u logFile stream grant\n-r /dev/null r\n-r /etc rx\n"),
    "domains/globalVMDom": "-s openat grant\n-s unheard grant\n-s close grant\n",
    "domains/ioFilterDom": "",
    "fileLabels/base": "/dev/null logFile\n",
}


TARDISKS = {
    "tardisks/plain.tar": "",
    "tardisks/vendor.tar": "",
    "etc/olvane/secpolicy/tardisks/vendor": "# for the vendor's programs\n-E vendorFile globalVMDom\n",
    "policy/objects/base": "",
    "policy/domains/appDom": "",
    "policy/fileLabels/base": "",
}


class Load(PlatformTest):
    """The library, installed, between a program and a platform that records what it is asked."""

    @classmethod
    def setUpClass(cls) -> None:
        super().setUpClass()
        cls.build = cls.work / "build"
        result = configure(cls.build, "-DSECPOLICY_PLATFORM=external",
                           f"-DSECPOLICY_PLATFORM_LIBRARY={cls.library}", "-DSECPOLICY_WERROR=ON")
        assert result.returncode == 0, result.stderr
        done(CMAKE, "--build", cls.build, "--parallel", 2)
        done(CMAKE, "--install", cls.build)
        cls.prefix = cls.build / "prefix"

    def write(self, name: str, files: dict[str, str]) -> pathlib.Path:
        for path, text in files.items():
            file = self.work / name / path
            file.parent.mkdir(parents=True, exist_ok=True)
            file.write_text(text)
        return self.work / name

    def loader(self, *options: str) -> pathlib.Path:
        search = {"PKG_CONFIG_PATH": self.prefix / "lib" / "pkgconfig"}
        flags = done("pkg-config", "--cflags", "--libs", "secpolicy", **search).stdout.split()
        program = self.work / "loader"
        done(COMPILER, *FLAGS, HERE / "loader.cc", "-o", program, *flags, *options)
        return program

    def check(self, program: pathlib.Path, policy: pathlib.Path, expected: str) -> None:
        shown = done(program, policy, LD_LIBRARY_PATH=f"{self.prefix / 'lib'}:{self.work}")
        self.assertEqual(shown.stderr.replace(str(policy), "@POLICY@"),
                         (HERE / expected).read_text())

    def test_operations_come_in_their_order(self) -> None:
        self.check(self.loader(), self.write("policy", POLICY), "load.txt")

    def test_archives_do_the_same(self) -> None:
        for shared in (self.prefix / "lib").glob("libsecpolicy.so*"):
            shared.rename(self.work / shared.name)
        try:
            program = self.loader()
        finally:
            for shared in self.work.glob("libsecpolicy.so*"):
                shared.rename(self.prefix / "lib" / shared.name)
        self.assertNotIn("libsecpolicy", done("readelf", "-dW", program).stdout)
        self.check(program, self.write("policy", POLICY), "load.txt")

    def test_a_domain_that_is_not_there_is_asked_of_the_kernel_itself(self) -> None:
        more = {**POLICY, "domains/moreDom": "-s openat grant\n"}
        self.check(self.loader(), self.write("more", more), "unknown_domain.txt")

    def test_tardisks_are_asked_for_where_a_host_has_them(self) -> None:
        """In a root directory of its own, for which the program has to be whole in itself."""
        root = self.write("root", TARDISKS)
        done(COMPILER, *FLAGS, "-static", f"-I{SOURCE / 'src'}", f"-I{self.prefix / 'include'}",
             HERE / "loader.cc", HERE / "recorder.cc", self.prefix / "lib" / "libsecpolicy.a",
             "-o", root / "loader")
        enter = ["chroot"] if os.geteuid() == 0 else ["unshare", "--map-root-user", "--root"]
        shown = done(*enter, root, "/loader", "/policy")
        # A display goes by the order of the directory.
        load, _, _ = shown.stderr.partition("show\n")
        self.assertEqual(load, (HERE / "tardisks.txt").read_text())

    def test_the_library_alone_is_installed(self) -> None:
        names = {path.relative_to(self.prefix).as_posix() for path in self.prefix.rglob("*")
                 if not path.is_dir()}
        self.assertIn("include/secpolicy/secpolicy.h", names)
        self.assertIn("include/secpolicy/platform/zek_access.h", names)
        self.assertEqual([name for name in names if "host" in name or name.startswith("bin/")], [])

    def test_libraries_are_found_from_where_they_lie(self) -> None:
        dynamic = done("readelf", "-dW", self.prefix / "lib" / "libsecpolicy.so").stdout
        self.assertIn("Shared library: [libplatform.so.3]", dynamic)
        self.assertRegex(dynamic, r"\((?:RUNPATH|RPATH)\).*\[\$ORIGIN\]")

    def test_by_cmake(self) -> None:
        project = self.work / "project"
        project.mkdir()
        (project / "CMakeLists.txt").write_text(
            "cmake_minimum_required(VERSION 3.25)\nproject(Loader LANGUAGES CXX)\n"
            "find_package(SecPolicy REQUIRED COMPONENTS static)\n"
            f"add_executable(loader {HERE / 'loader.cc'})\n"
            "target_link_libraries(loader PRIVATE SecPolicy::secpolicy)\n"
            f"add_executable(loader_static {HERE / 'loader.cc'})\n"
            "target_link_libraries(loader_static PRIVATE SecPolicy::secpolicy_static)\n")
        build = self.work / "project-build"
        done(CMAKE, "-G", "Ninja", "-S", project, "-B", build, f"-DCMAKE_CXX_COMPILER={COMPILER}",
             f"-DCMAKE_PREFIX_PATH={self.prefix}")
        done(CMAKE, "--build", build, "--parallel", 2)
        for program in ("loader", "loader_static"):
            self.check(build / program, self.write("policy", POLICY), "load.txt")

    def test_no_path_of_a_platform_without_soname_is_kept(self) -> None:
        """Neither the linker nor those who link later get to see where it lay."""
        place = self.work / "bare"
        place.mkdir()
        bare = place / "libplatform.so"
        done(COMPILER, *FLAGS, "-shared", "-fPIC", f"-I{SOURCE / 'src'}", HERE / "recorder.cc",
             "-o", bare)
        result = configure(self.build, f"-DSECPOLICY_PLATFORM_LIBRARY={bare}")
        self.assertEqual(result.returncode, 0, result.stderr)
        done(CMAKE, "--build", self.build, "--parallel", 2)
        prefix = self.work / "bare-prefix"
        done(CMAKE, "--install", self.build, "--prefix", prefix)
        for file in prefix.rglob("*"):
            if file.is_file():
                self.assertNotIn(str(place).encode(), file.read_bytes(), file)
        dynamic = done("readelf", "-dW", prefix / "lib" / "libsecpolicy.so").stdout
        self.assertIn("Shared library: [libplatform.so]", dynamic)
        # Beside the library it is found, by the linker and by the loader.
        bare.rename(prefix / "lib" / bare.name)
        flags = done("pkg-config", "--cflags", "--libs", "secpolicy",
                     PKG_CONFIG_PATH=prefix / "lib" / "pkgconfig").stdout.split()
        program = self.work / "bare-loader"
        done(COMPILER, *FLAGS, HERE / "loader.cc", "-o", program, *flags,
             f"-Wl,-rpath,{prefix / 'lib'}")
        self.assertIn("platform: open", done(program, self.write("policy", POLICY)).stderr)


if __name__ == "__main__":
    unittest.main(argv=[sys.argv[0], *sys.argv[3:]])
