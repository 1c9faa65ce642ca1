"""That the package declares what the header does, and says so when the library is not there."""

import ctypes
import os
import pathlib
import re
import subprocess
import sys
import tomllib
import unittest

import secpolicy
from secpolicy import _library

HEADER = pathlib.Path(os.environ["SECPOLICY_HEADER"])
TESTS = pathlib.Path(__file__).resolve().parent.parent

# What stands for each type of the header.
TYPES = {
    "void": None,
    "secpolicy_status": ctypes.c_int,
    "secpolicy_decision": ctypes.c_int,
    "uint32_t": ctypes.c_uint32,
    "size_t": ctypes.c_size_t,
    "const char*": ctypes.c_char_p,
    "const char* const*": _library._WORDS,
    "secpolicy_error*": _library.ErrorHandle,
    "secpolicy_error**": _library._ERROR,
    "secpolicy_text*": _library.TextHandle,
    "secpolicy_text**": _library._TEXT,
    "secpolicy_host*": _library.HostHandle,
    "secpolicy_host**": ctypes.POINTER(_library.HostHandle),
    "secpolicy_policy*": _library.PolicyHandle,
    "secpolicy_policy**": ctypes.POINTER(_library.PolicyHandle),
    "secpolicy_search_terms*": ctypes.POINTER(_library.SearchTerms),
}
# A text may hold any bytes as far as ctypes knows: its address and size are taken.
BY_ADDRESS = {"secpolicy_text_data": ctypes.c_void_p}


def header():
    return re.sub(r"/\*.*?\*/", " ", HEADER.read_text(), flags=re.DOTALL)


def type_of(declaration):
    """The type that stands for a declaration such as "const secpolicy_host *host"."""
    words = re.sub(r"\s+", " ", declaration).strip()
    spelled = re.sub(r"\s*\*\s*", "* ", words).replace("* *", "**").strip()
    for name in (spelled, re.sub(r"\s*\b\w+$", "", spelled)):
        for candidate in (name.strip(), re.sub(r"^const ", "", name.strip())):
            if candidate in TYPES:
                return TYPES[candidate]
    raise AssertionError(f"no type is known for {declaration!r}")


def declared():
    """The functions of the header: name to result and arguments."""
    functions = {}
    for result, name, arguments in re.findall(
            r"^((?:const )?\w+[ *]+)(secpolicy_\w+)\(([^)]*)\);", header(), re.MULTILINE):
        types = [] if arguments.strip() == "void" else [
            type_of(each) for each in arguments.split(",")]
        functions[name] = (BY_ADDRESS.get(name, type_of(result)), types)
    return functions


class DeclarationsTest(unittest.TestCase):
    maxDiff = None

    def test_every_function_is_declared_as_in_the_header(self):
        self.assertGreater(len(declared()), 20)
        self.assertEqual(_library.FUNCTIONS, declared())

    @unittest.skipIf("SECPOLICY_IS_INSTRUMENTED" in os.environ,
                     "instrumented code exports names of the instrumentation")
    def test_what_the_library_exports_is_what_the_header_declares(self):
        listed = subprocess.run(["nm", "-D", "--defined-only", os.environ["SECPOLICY_LIBRARY"]],
                                check=True, capture_output=True, text=True).stdout
        exported = {line.split()[2].split("@")[0] for line in listed.splitlines()
                    if line.split()[1] == "T"}
        self.assertEqual(exported, set(declared()))

    def test_terms_are_as_in_the_header(self):
        body = re.search(r"typedef struct secpolicy_search_terms \{(.*?)\}", header(),
                         re.DOTALL).group(1)
        members = [(re.search(r"(\w+)$", each.strip()).group(1), type_of(each))
                   for each in body.split(";") if each.strip()]
        self.assertEqual(_library.SearchTerms._fields_, members)

    def test_numbers_are_as_in_the_header(self):
        text = header()
        for name, number in (("ANY_DECISION", _library.ANY_DECISION),
                             ("GRANTED", _library.GRANTED), ("REVOKED", _library.REVOKED)):
            self.assertRegex(text, rf"SECPOLICY_{name} = {number}\b")
        self.assertRegex(text, r"SECPOLICY_ALL_DOMAINS UINT32_MAX")
        self.assertEqual(_library.ALL_DOMAINS, 2**32 - 1)
        for part, number in zip(("MAJOR", "MINOR"), _library.NEEDED):
            self.assertRegex(text, rf"SECPOLICY_C_VERSION_{part} {number}\b")

    def test_every_status_has_an_exception(self):
        from secpolicy._errors import _BY_STATUS
        numbers = {int(number): name for name, number in
                   re.findall(r"SECPOLICY_(\w+) = (\d+)",
                              re.search(r"enum secpolicy_status \{(.*?)\}", header(),
                                        re.DOTALL).group(1))}
        self.assertEqual(numbers.pop(0), "OK")
        self.assertEqual(set(_BY_STATUS), set(numbers))


    def test_the_tests_in_c_call_every_function(self):
        sources = "".join(path.read_text() for path in (TESTS / "c").glob("*.c"))
        self.assertEqual({name for name in declared() if f"{name}(" not in sources}, set())

    def test_the_package_has_the_projects_version(self):
        root = TESTS.parent.parent
        project = re.search(r"^project\(\w+ VERSION ([\d.]+)", (root / "CMakeLists.txt").read_text(),
                            re.MULTILINE).group(1)
        self.assertEqual(secpolicy.__version__, project)
        package = tomllib.loads((root / "bindings/python/pyproject.toml").read_text())
        self.assertEqual(package["tool"]["setuptools"]["dynamic"]["version"],
                         {"attr": "secpolicy.__version__"})


class MissingLibraryTest(unittest.TestCase):
    def run_with(self, library):
        code = ("import secpolicy\n"
                "try:\n    secpolicy.Host('/none')\n"
                "except secpolicy.LibraryError as problem:\n    print(problem)\n")
        return subprocess.run([sys.executable, "-c", code], check=True, text=True,
                              env=dict(os.environ, SECPOLICY_LIBRARY=library),
                              capture_output=True).stdout

    def test_a_library_that_is_not_there(self):
        printed = self.run_with("/none/libsecpolicy_c.so.1")
        self.assertIn("/none/libsecpolicy_c.so.1 cannot be used", printed)
        self.assertIn("SECPOLICY_LIBRARY", printed)

    def test_a_library_that_is_another(self):
        self.assertIn("secpolicy_c_version", self.run_with("libc.so.6"))
