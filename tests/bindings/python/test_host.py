"""Loading, showing and checking from Python."""

import gc
import os
import pathlib
import shutil
import unittest

import secpolicy
from hosts import HostTest


class LoadTest(HostTest):
    def test_what_was_installed_is_shown_later(self):
        result = self.host.load(self.policy)
        self.assertEqual(result.source, str(self.policy))
        self.assertEqual(result.errors, ())
        held = self.host.show()
        self.assertEqual(held, result.installed)
        self.assertEqual([each.name for each in held.domains],
                         ["rootDom", "appDom", "globalVMDom", "ioFilterDom"])
        self.assertEqual([each.name for each in held.objects], ["conf", "default", "tardisk"])
        self.assertEqual(held.tardisks, ())
        access, path, syscall = held.domain("appDom").rules
        self.assertEqual(access.words, ("conf", "read"))
        self.assertEqual(access.decision, secpolicy.Decision.GRANT)
        self.assertEqual((path.type, path.permission, path.decision), ("-r", "rw", None))
        self.assertEqual(syscall.line, "-s open grant")
        self.assertEqual(syscall.place, secpolicy.Place(None, 1, None))

    def test_its_representation_opens_it_again(self):
        again = eval(repr(self.host))  # what Python's own types promise of theirs
        self.addCleanup(again.close)
        self.assertEqual(again.path, self.host.path)
        again.close()
        self.assertEqual(repr(again), "<closed secpolicy.Host>")

    def test_one_domain_is_shown(self):
        self.host.load(self.policy)
        self.assertEqual([each.name for each in self.host.show(1).domains], ["appDom"])
        with self.assertRaisesRegex(secpolicy.BadRequestError, "^no domain has the id 77$"):
            self.host.show(77)
        for number in (-1, 2**32 - 1, 2**40):
            with self.assertRaises(secpolicy.InvalidArgumentError):
                self.host.show(number)

    def test_errors_of_a_load_are_an_exception_with_a_result(self):
        file = self.write("domains/globalVMDom", "-s read grant\n-s opne grant\n")
        with self.assertRaises(secpolicy.LoadError) as caught:
            self.host.load(self.policy)
        failure = caught.exception
        self.assertNotIsInstance(failure, secpolicy.LoadTerminatedError)
        self.assertEqual(str(failure), "Error in parsing policy for domain: globalVMDom: 2 : "
                                       "unknown system call \"opne\" (nearest: open)")
        self.assertEqual((failure.file, failure.line), (str(file), 2))
        first, *others = failure.result.errors
        self.assertEqual((first.file, first.line), (str(file), 2))
        self.assertEqual([each.message for each in others][-1],
                         "There were some problems encountered in setting the policy")
        self.assertEqual(failure.result.installed, self.host.show())

    def test_a_terminated_load_keeps_what_it_installed(self):
        os.unlink(self.policy / "domains/ioFilterDom")
        with self.assertRaises(secpolicy.LoadTerminatedError) as caught:
            self.host.load(self.policy)
        self.assertEqual(str(caught.exception), "Failed to fetch domainID for IOFilter domain")
        self.assertIsNone(caught.exception.file)
        self.assertIsNone(caught.exception.line)
        self.assertEqual(len(caught.exception.result.installed.domain("appDom").rules), 3)

    def test_a_directory_that_is_not_there(self):
        before = self.host.show()
        with self.assertRaisesRegex(secpolicy.HostError, "^there is no policy directory /none$"):
            self.host.load("/none")
        self.assertEqual(self.host.show(), before)

    def test_without_a_directory_the_hosts_own_is_loaded(self):
        with self.assertRaisesRegex(secpolicy.HostError,
                                    "^there is no policy directory /etc/olvane/secpolicy$"):
            self.host.load()
        own = pathlib.Path(self.host.path) / "root/etc/olvane/secpolicy"
        shutil.copytree(self.policy, own)
        result = self.host.load()
        self.assertEqual(result.source, "")
        self.assertEqual(len(result.installed.domain("appDom").rules), 3)


class CheckTest(HostTest):
    def test_a_sound_policy_has_no_errors(self):
        report = self.host.check(self.policy)
        self.assertEqual(report.errors, ())
        self.assertEqual(report.files, 5)

    def test_a_finding_has_its_place_and_help(self):
        file = self.write("domains/appDom", "-s opne grant\n-s open grant\n-s open grant\n")
        report = self.host.check(self.policy)
        finding, = report.errors
        self.assertEqual(finding.id, "unknown-word")
        self.assertEqual(finding.severity, secpolicy.Severity.ERROR)
        self.assertEqual((finding.file, finding.line, finding.column, finding.length),
                         (str(file), 1, 4, 4))
        self.assertEqual(finding.source, "-s opne grant")
        self.assertIn("open", finding.help)
        self.assertIn("repeated-rule", [each.id for each in report.warnings])

    def test_bytes_of_a_file_become_text(self):
        self.write("domains/appDom", b"-s op\xff grant\n")
        finding, = self.host.check(self.policy).errors
        self.assertEqual(finding.source, "-s op\N{REPLACEMENT CHARACTER} grant")

    def test_a_directory_that_is_not_there(self):
        with self.assertRaisesRegex(secpolicy.HostError, "^there is no policy directory /none$"):
            self.host.check("/none")


class HostDirectoryTest(HostTest):
    def test_path_is_absolute(self):
        before = os.getcwd()
        os.chdir(self.directory)
        try:
            with secpolicy.Host("host") as host:
                self.assertEqual(host.path, str(self.directory / "host"))
        finally:
            os.chdir(before)

    def test_a_host_is_made_once(self):
        with self.assertRaisesRegex(secpolicy.HostError, "is a host directory already"):
            secpolicy.Host.create(self.directory / "host")

    def test_only_a_host_is_opened(self):
        with self.assertRaisesRegex(secpolicy.HostError, "is not a host directory"):
            secpolicy.Host(self.directory)
        with self.assertRaises(secpolicy.SecPolicyError):
            secpolicy.Host(self.directory / "none")

    def test_bad_names_are_told(self):
        for name in ("", "with\0nul", os.fsdecode(b"bytes\xff")):
            with self.assertRaises(secpolicy.InvalidArgumentError, msg=repr(name)):
                secpolicy.Host(name)
        with self.assertRaises(TypeError):
            secpolicy.Host(7)
        with self.assertRaises(TypeError):
            secpolicy.Host(b"bytes")

    def test_a_closed_host_is_not_used(self):
        with self.host as host:
            host.show()
        for use in (host.show, host.check, host.load, host.assemble, host.read_policy,
                    lambda: host.path):
            with self.assertRaisesRegex(ValueError, "^the host is closed$"):
                use()
        host.close()

    def test_a_host_that_is_forgotten_is_freed(self):
        freed = []
        host = secpolicy.Host(self.directory / "host")
        free = host._handle._free
        host._handle._free = lambda raw: (free(raw), freed.append(True))
        del host
        gc.collect()
        self.assertEqual(freed, [True])


class LibraryTest(unittest.TestCase):
    def test_version(self):
        self.assertEqual(secpolicy.version()[0], 1)

    def test_everything_named_is_there(self):
        for name in secpolicy.__all__:
            self.assertTrue(getattr(secpolicy, name).__doc__, name)

    def test_the_package_is_typed(self):
        self.assertTrue((pathlib.Path(secpolicy.__file__).parent / "py.typed").exists())


if __name__ == "__main__":
    unittest.main()
