#!/usr/bin/env python3
"""Installs what was built, and uses it as others would.

  install_test.py BUILD SOURCE [NAME...]    the build, the root of the repository, tests (all)

Needs nothing of the build but what it installs. The consumers are compiled with the build's own
compiler.
"""

from __future__ import annotations

import os
import pathlib
import re
import shutil
import subprocess
import sys
import tempfile
import unittest

BUILD = pathlib.Path(sys.argv[1]).resolve()
SOURCE = pathlib.Path(sys.argv[2]).resolve()
HERE = SOURCE / "tests" / "install"


def cached(name: str) -> str:
    found = re.search(rf"^{name}:\w+=(.*)$", (BUILD / "CMakeCache.txt").read_text(), re.MULTILINE)
    assert found, f"{name} is not in the build's cache"
    return found.group(1)


CMAKE = cached("CMAKE_COMMAND")
COMPILER = cached("CMAKE_CXX_COMPILER")
LIBDIR = cached("CMAKE_INSTALL_LIBDIR")
PREFIX = cached("CMAKE_INSTALL_PREFIX")
VERSION = cached("CMAKE_PROJECT_VERSION")


def run(*command: object, **environment: object) -> subprocess.CompletedProcess[str]:
    """Runs a command that has to succeed, and says what it printed when it does not."""
    done = subprocess.run(
        [str(word) for word in command],
        env={**os.environ, **{name: str(value) for name, value in environment.items()}},
        text=True, capture_output=True, check=False)
    if done.returncode != 0:
        words = " ".join(map(str, command))
        raise AssertionError(f"{words}: {done.returncode}\n{done.stdout}{done.stderr}")
    return done


def files_below(directory: pathlib.Path) -> list[pathlib.Path]:
    return sorted(path for path in directory.rglob("*") if path.is_symlink() or path.is_file())


def names_below(directory: pathlib.Path, base: pathlib.Path) -> list[str]:
    """Every file of the directory, as seen from another that holds all of them."""
    return sorted(str(path.relative_to(base)) for path in files_below(directory))


def listed_files() -> list[str]:
    """What installed_files.txt names, for this build."""
    lines = (HERE / "installed_files.txt").read_text().splitlines()
    names = [line for line in lines if line and not line.startswith("#")]
    return sorted(name.replace("@LIB@", LIBDIR).replace("@VERSION@", VERSION)
                  .replace("@BUILD_TYPE@", cached("CMAKE_BUILD_TYPE").lower()) for name in names)


class Installed(unittest.TestCase):
    """What was built, in a prefix of its own."""

    directory: tempfile.TemporaryDirectory[str]
    work: pathlib.Path
    prefix: pathlib.Path

    @classmethod
    def setUpClass(cls) -> None:
        cls.directory = tempfile.TemporaryDirectory(prefix="secpolicy-install-")
        cls.addClassCleanup(cls.directory.cleanup)
        cls.work = pathlib.Path(cls.directory.name)
        cls.prefix = cls.work / "prefix"
        run(CMAKE, "--install", BUILD, "--prefix", cls.prefix)

    def command(self, *arguments: object) -> subprocess.CompletedProcess[str]:
        return run(self.prefix / "bin" / "secpolicy", *arguments)


class Files(Installed):
    def test_exactly_what_is_listed_is_installed(self) -> None:
        self.assertEqual(names_below(self.prefix, self.prefix), listed_files())

    def test_components_are_the_whole(self) -> None:
        parts = self.work / "parts"
        for component in ("Runtime", "Development", "Command"):
            run(CMAKE, "--install", BUILD, "--prefix", parts, "--component", component)
        self.assertEqual(names_below(parts, parts), listed_files())

    def test_runtime_is_the_shared_libraries(self) -> None:
        runtime = self.work / "runtime"
        run(CMAKE, "--install", BUILD, "--prefix", runtime, "--component", "Runtime")
        names = [path.name for path in files_below(runtime)]
        self.assertTrue(names)
        for name in names:
            self.assertRegex(name, r"^lib\w+\.so\.[0-9.]+$")

    def test_a_staging_directory_stands_before_the_prefix(self) -> None:
        stage = self.work / "stage"
        run(CMAKE, "--install", BUILD, DESTDIR=stage)
        root = stage / PREFIX.lstrip("/")
        self.assertEqual(names_below(stage, root), listed_files())

    def test_nothing_names_the_build_or_the_source(self) -> None:
        bare = self.work / "bare"
        shutil.copytree(self.prefix, bare, symlinks=True)
        for path in files_below(bare):
            if path.is_symlink():
                continue
            if path.suffix == ".a" or path.read_bytes()[:4] == b"\x7fELF":
                # What a debugger reads is where the sources were; a package is stripped of it.
                run("strip", "--strip-debug", path)
            text = path.read_bytes()
            places = [BUILD, SOURCE, self.prefix]
            if path.suffix == ".service":
                places.remove(self.prefix)  # systemd wants the command's absolute path
            for place in places:
                self.assertNotIn(str(place).encode(), text, path.relative_to(bare))

    def test_each_header_compiles_alone(self) -> None:
        include = self.prefix / "include"
        headers = [path.relative_to(include) for path in files_below(include)]
        self.assertIn(pathlib.Path("secpolicy/secpolicy.h"), headers)
        source = self.work / "header.cc"
        for header in headers:
            source.write_text(f"#include <{header}>\n#include <{header}>\n")
            run(COMPILER, "-std=c++20", "-Wall", "-Wextra", "-Wpedantic", "-Werror", "-fsyntax-only",
                f"-I{include}", source)

    def test_libraries_are_known_by_the_names_that_programs_are_linked_with(self) -> None:
        for name, soname in (("libsecpolicy.so", "libsecpolicy.so.1"),
                             ("libsecpolicy_c.so", "libsecpolicy_c.so.1"),
                             ("libsecpolicy_host.so", "libsecpolicy_host.so.0")):
            dynamic = self.dynamic(self.prefix / LIBDIR / name)
            self.assertIn(f"Library soname: [{soname}]", dynamic)

    def test_libraries_are_found_relative_to_what_needs_them(self) -> None:
        for path, expected in ((self.prefix / LIBDIR / "libsecpolicy.so", "$ORIGIN"),
                               (self.prefix / LIBDIR / "libsecpolicy_c.so", "$ORIGIN"),
                               (self.prefix / "bin" / "secpolicy", f"$ORIGIN/../{LIBDIR}")):
            search = re.findall(r"\((?:RUNPATH|RPATH)\).*\[(.*)\]", self.dynamic(path))
            self.assertEqual(search, [expected], path)

    def test_the_unit_starts_the_command_of_its_prefix(self) -> None:
        unit = (self.prefix / "lib/systemd/system/secpolicy-load.service").read_text()
        self.assertIn(f"ExecStart={self.prefix}/bin/secpolicy load", unit)
        self.assertNotIn("/usr/bin/secpolicy", unit)

    @staticmethod
    def dynamic(path: pathlib.Path) -> str:
        return run("readelf", "-dW", path).stdout


class Command(Installed):
    def test_runs_from_its_prefix(self) -> None:
        self.assertEqual(self.command("--version").stdout, f"secpolicy {VERSION}\n")

    def test_manual_pages_are_found(self) -> None:
        page = run("mandoc", "-T", "utf8", self.prefix / "share/man/man8/secpolicy-load.8").stdout
        self.assertIn("secpolicy-load", page)

    def test_completions_complete(self) -> None:
        script = self.prefix / "share/bash-completion/completions/secpolicy"
        done = run("bash", "-c", 'source "$1"; complete -p secpolicy', "bash", script)
        self.assertIn("secpolicy", done.stdout)
        script = self.prefix / "share/zsh/site-functions/_secpolicy"
        self.assertTrue(script.read_text().startswith("#compdef secpolicy"), script)
        run("zsh", "-n", script)


DAMAGED = {
    "objects/base": "logFile\none two\n",
    "domains/appDom": "# ordinary programs\n-s openat grant\n-c net_admin maybe\n",
    "domains/globalVMDom": "",
    "domains/ioFilterDom": "",
    "fileLabels/base": "",
}
POLICY = {
    "objects/base": "logFile\n",
    "domains/appDom": "-s openat grant\n-c net_admin revoke\n-a logFile read grant\n-r /etc rx\n",
    "domains/globalVMDom": "-d logFile appDom exec grant\n",
    "domains/ioFilterDom": "",
    "fileLabels/base": "",
}


class Consumer(Installed):
    """Programs that others write: what they are compiled with differs, what they print does not."""

    def setUp(self) -> None:
        self.place = pathlib.Path(tempfile.mkdtemp(dir=self.work))

    def policy(self, name: str, files: dict[str, str]) -> pathlib.Path:
        for path, text in files.items():
            file = self.place / name / path
            file.parent.mkdir(parents=True, exist_ok=True)
            file.write_text(text)
        return self.place / name

    def check(self, consumer: pathlib.Path, **environment: object) -> None:
        """What the program makes of a host of its own."""
        host = self.place / "host"
        self.command("host", "init", host)
        self.command("host", "assemble", host)
        damaged = self.policy("damaged", DAMAGED)
        done = run(consumer, host, damaged, self.policy("policy", POLICY), **environment)
        self.assertEqual(done.stderr.replace(str(damaged), "@DAMAGED@"),
                         (HERE / "consumer" / "errors.txt").read_text())
        self.assertEqual(done.stdout, (HERE / "consumer" / "output.txt").read_text())
        # What it loaded is there for everyone.
        held = self.command("show", "--host", host).stdout
        self.assertIn(held, done.stdout)

    def build(self, prefix: pathlib.Path, *options: str) -> pathlib.Path:
        build = self.place / "build"
        run(CMAKE, "-G", "Ninja", "-S", HERE / "consumer", "-B", build,
            f"-DCMAKE_CXX_COMPILER={COMPILER}", f"-DCMAKE_PREFIX_PATH={prefix}", *options,
            CCACHE_NOHASHDIR=1)
        run(CMAKE, "--build", build, "--parallel", 2, "--target", "consumer", CCACHE_NOHASHDIR=1)
        return build / "consumer"

    def moved(self) -> pathlib.Path:
        """The prefix at another place, of which nobody was told."""
        moved = self.place / "moved"
        shutil.copytree(self.prefix, moved, symlinks=True)
        return moved

    def compile(self, prefix: pathlib.Path, *options: str) -> pathlib.Path:
        search = {"PKG_CONFIG_PATH": prefix / LIBDIR / "pkgconfig"}
        self.assertEqual(run("pkg-config", "--modversion", "secpolicy", **search).stdout,
                         f"{VERSION}\n")
        flags = run("pkg-config", "--cflags", "--libs", *options, "secpolicy", **search).stdout
        program = self.place / "consumer"
        run(COMPILER, "-std=c++20", HERE / "consumer" / "consumer.cc", "-o", program,
            *flags.split(), f"-Wl,-rpath,{prefix / LIBDIR}")
        return program

    def test_by_cmake(self) -> None:
        self.check(self.build(self.moved()))

    def test_by_cmake_with_the_archives(self) -> None:
        consumer = self.build(self.moved(), "-DCONSUMER_STATIC=ON")
        self.assertNotIn("libsecpolicy", run("readelf", "-dW", consumer).stdout)
        self.check(consumer)

    def test_by_pkg_config(self) -> None:
        moved = self.moved()
        self.check(self.compile(moved))

    def test_the_c_interface_by_pkg_config(self) -> None:
        library = self.moved() / LIBDIR
        search = {"PKG_CONFIG_PATH": library / "pkgconfig"}
        flags = run("pkg-config", "--cflags", "--libs", "secpolicy-c", **search).stdout
        source = self.place / "version.c"
        source.write_text("#include <secpolicy/secpolicy_c.h>\n#include <stdio.h>\n"
                          "int main(void) { return printf(\"%u\\n\", (unsigned)secpolicy_c_version()) < 0; }\n")
        program = self.place / "version"
        run(cached("CMAKE_C_COMPILER"), source, "-o", program, *flags.split(),
            f"-Wl,-rpath,{library}")
        self.assertRegex(run(program).stdout, r"^[1-9][0-9]*\n$")

    def test_by_pkg_config_with_the_archives(self) -> None:
        moved = self.moved()
        for shared in (moved / LIBDIR).glob("libsecpolicy*.so*"):
            shared.unlink()
        consumer = self.compile(moved, "--static")
        self.assertNotIn("libsecpolicy", run("readelf", "-dW", consumer).stdout)
        self.check(consumer)

    def test_as_a_part_of_another_project(self) -> None:
        # Built as the library itself was, so that a compiler's cache knows most of it.
        consumer = self.build(pathlib.Path("/nowhere"), f"-DSECPOLICY_SOURCE={SOURCE}",
                              "-DCMAKE_UNITY_BUILD=ON")
        self.check(consumer)

    def test_as_documented(self) -> None:
        document = (SOURCE / "docs" / "installing.md").read_text()
        blocks = re.findall(r"^```(\w+)\n(.*?)^```$", document, re.MULTILINE | re.DOTALL)
        program, = (text for language, text in blocks if language == "cpp")
        installed, _ = (text for language, text in blocks if language == "cmake")
        command = next(text for language, text in blocks if "pkg-config" in text)
        (self.place / "program.cc").write_text(program)
        (self.place / "CMakeLists.txt").write_text(
            "cmake_minimum_required(VERSION 3.25)\nproject(Documented LANGUAGES CXX)\n" + installed)
        build = self.place / "build"
        run(CMAKE, "-G", "Ninja", "-S", self.place, "-B", build, f"-DCMAKE_CXX_COMPILER={COMPILER}",
            f"-DCMAKE_PREFIX_PATH={self.prefix}")
        run(CMAKE, "--build", build)
        run("sh", "-ec", f'cd "$1"\n{command.replace("c++", COMPILER, 1)}', "sh", self.place,
            PKG_CONFIG_PATH=self.prefix / LIBDIR / "pkgconfig")
        host = self.place / "host"
        self.command("host", "init", host)
        self.command("host", "assemble", host)
        shown = self.command("show", "--host", host).stdout
        for made in (build / "program", self.place / "program"):
            self.assertEqual(run(made, host).stdout, shown)

    def test_an_older_program_does_not_take_a_version_that_broke_something(self) -> None:
        project = self.place / "project"
        project.mkdir()
        (project / "CMakeLists.txt").write_text(
            "cmake_minimum_required(VERSION 3.25)\nproject(Older LANGUAGES NONE)\n"
            "find_package(SecPolicy 0.0 REQUIRED)\n")
        with self.assertRaisesRegex(AssertionError, "requested version\\s+\"0.0\""):
            run(CMAKE, "-G", "Ninja", "-S", project, "-B", self.place / "build",
                f"-DCMAKE_PREFIX_PATH={self.prefix}")


if __name__ == "__main__":
    unittest.main(argv=[sys.argv[0], *sys.argv[3:]])
