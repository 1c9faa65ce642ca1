#!/usr/bin/python3
"""Changes the headers in copies of the sources, and looks at what scripts/abi says about it.

  comparison_test.py COMPILER [unittest's arguments]

Two sources of the library are compiled: they export the record of file rules and the exceptions.
Exit status 77 when abidiff is not installed.
"""

import pathlib
import shutil
import subprocess
import sys
import tempfile
import unittest

REPOSITORY = pathlib.Path(__file__).resolve().parent.parent.parent
SOURCES = ["core/diagnostics.cc", "kernel/file_policy_calls.cc"]

FILE_RULE = "src/platform/zek_access.h"
EXCEPTION = "src/platform/tavon_exception.h"
HEADER = "include/secpolicy/secpolicy.h"
CALLS = "src/kernel/file_policy_calls.cc"
EXPORTS = "src/libsecpolicy.map"

# A function more, where it is declared, defined and exported.
ADDED = [
    (HEADER, "// Throws \"file path is empty\"", "void SomethingNew();\n// "),
    (CALLS, "unsigned int RetrieveNumberOfFilePolicies(", "void SomethingNew() {}\n"),
    (EXPORTS, "SecPolicy::StringToQueue", "SecPolicy::SomethingNew[^A-Za-z]*;\n"),
]


class Library:
    """A copy of the sources with changes, compiled."""

    count = 0

    def __init__(self, directory, *changes):
        Library.count += 1
        self.root = pathlib.Path(directory) / f"copy{Library.count}"
        for folder in ("include", "src"):
            shutil.copytree(REPOSITORY / folder, self.root / folder)
        for file, old, new in changes:
            self.replace(file, old, new)
        self.file = self.root / "lib.so"

    def replace(self, file, old, new):
        path = self.root / file
        text = path.read_text()
        assert text.count(old) >= 1, f"{file} does not hold: {old}"
        path.write_text(text.replace(old, new))

    def compiled(self, *options):
        subprocess.run(
            [COMPILER, "-std=c++20", "-g", "-O1", "-w", "-fPIC", "-shared", "-fvisibility=hidden",
             "-fvisibility-inlines-hidden", *options, f"-Wl,--version-script={self.root / EXPORTS}",
             "-I", self.root / "include", "-I", self.root / "src", "-o", self.file,
             *(self.root / "src" / source for source in SOURCES)], check=True)
        return self.file


def inserted(file, before, text):
    return file, before, text + before


class ComparisonTest(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.directory = tempfile.TemporaryDirectory()
        cls.kept = Library(cls.directory.name).compiled()

    @classmethod
    def tearDownClass(cls):
        cls.directory.cleanup()

    def compared(self, *changes, old=None):
        """The exit status for a copy with these changes, and the text."""
        new = Library(self.directory.name, *changes).compiled()
        made = subprocess.run([REPOSITORY / "scripts/abi", "--compare", old or self.kept, new],
                              capture_output=True, text=True)
        self.assertEqual(made.stderr, "")
        return made.returncode, made.stdout

    def expect_refused(self, *changes, naming, old=None):
        status, text = self.compared(*changes, old=old)
        self.assertEqual(status, 1, text)
        self.assertIn("NOT compatible", text)
        self.assertIn(naming, text)

    def test_sources_that_are_the_same_are_unchanged(self):
        self.assertEqual(self.compared(), (0, "lib.so: unchanged\n"))

    def test_a_field_more_in_a_record(self):
        self.expect_refused(
            inserted(FILE_RULE, "};\nstatic_assert(sizeof(ZekAccess_FileRule)",
                     "  std::uint32_t flags;\n"),
            (FILE_RULE, "== 1988", "== 1992"),
            naming="ZekAccess_FileRule")

    def test_a_field_more_in_an_exception(self):
        self.expect_refused(
            (EXCEPTION, "  KestMessage structuredMessage_;", "  KestMessage structuredMessage_;\n  int severity_ = 0;"),
            naming="TavonException")

    def test_a_virtual_function_more(self):
        self.expect_refused(
            inserted(EXCEPTION, " protected:\n", "  virtual int Severity() const { return 0; }\n"),
            naming="Severity")

    def test_virtual_functions_in_another_order(self):
        first, second = ("  virtual int First() const { return 0; }\n",
                         "  virtual int Second() const { return 0; }\n")
        old = Library(self.directory.name, inserted(EXCEPTION, " protected:\n", first + second))
        self.expect_refused(inserted(EXCEPTION, " protected:\n", second + first),
                            old=old.compiled(), naming="vtable offset")

    def test_a_function_less(self):
        self.expect_refused((CALLS, "void UpdateFilePolicy(", "static void UpdateFilePolicy_("),
                            naming="UpdateFilePolicy")

    def test_a_parameter_of_another_type(self):
        changed = "const std::string& path, unsigned long permission"
        self.expect_refused(
            (HEADER, "const std::string& path, unsigned int permission", changed),
            (CALLS, "const std::string& path, unsigned int permission", changed),
            naming="UpdateFilePolicy")

    def test_a_function_more_is_told_and_allowed(self):
        status, text = self.compared(*(inserted(*change) for change in ADDED))
        self.assertEqual(status, 0, text)
        self.assertIn("compatible, with additions", text)
        self.assertIn("SomethingNew", text)

    def test_a_library_without_debug_information_is_no_answer(self):
        bare = Library(self.directory.name).compiled("-g0")
        made = subprocess.run([REPOSITORY / "scripts/abi", "--compare", self.kept, bare],
                              capture_output=True, text=True)
        self.assertEqual(made.returncode, 1)
        self.assertIn("without debug information", made.stderr)


if __name__ == "__main__":
    if shutil.which("abidiff") is None:
        print("abidiff is not installed (Debian's package abigail-tools)")
        sys.exit(77)
    COMPILER = sys.argv.pop(1)
    unittest.main()
