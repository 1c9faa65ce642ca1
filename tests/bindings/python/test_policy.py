"""Asking policies from Python."""

import secpolicy
from hosts import HostTest


class PolicyTest(HostTest):
    def setUp(self):
        super().setUp()
        self.read = self.host.read_policy(self.policy)
        self.addCleanup(self.read.close)

    def lines(self, **terms):
        return [each.rule.line for each in self.read.search(**terms)]

    def test_every_term_narrows_a_search(self):
        self.assertEqual(self.lines(domain="appDom"),
                         ["-a conf read grant", "-r /etc rw", "-s open grant"])
        self.assertEqual(self.lines(domain="appDom", type="syscall"), ["-s open grant"])
        self.assertEqual(self.lines(word="read"), ["-a conf read grant", "-s read grant"])
        self.assertEqual(self.lines(pattern="^(open|write)$"), ["-s open grant", "-s write revoke"])
        self.assertEqual(self.lines(path="/etc/hosts"), ["-r /etc rw"])
        self.assertEqual(self.lines(type="-s", decision=secpolicy.Decision.REVOKE),
                         ["-s write revoke"])
        self.assertEqual(self.lines(type="-s", decision="revoke"), ["-s write revoke"])
        self.assertEqual(self.lines(path="/usr"), [])

    def test_a_match_has_its_place(self):
        match, = self.read.search(word="write")
        self.assertEqual(match.domain, "globalVMDom")
        self.assertEqual(match.rule.place.file, str(self.policy / "domains/globalVMDom"))
        self.assertEqual(match.rule.place.line, 2)

    def test_bad_searches_are_told(self):
        for terms, message in (({"domain": "apDom"}, r'unknown domain "apDom" \(nearest: appDom\)'),
                               ({"type": "sysall"}, 'no type of rules is called "sysall"'),
                               ({"pattern": "("}, r'"\(" is no regular expression'),
                               ({"path": "etc"}, 'not an absolute path: "etc"')):
            with self.assertRaisesRegex(secpolicy.BadRequestError, message):
                self.read.search(**terms)
        with self.assertRaises(secpolicy.InvalidArgumentError):
            self.read.search(word="a", pattern="b")
        with self.assertRaises(secpolicy.InvalidArgumentError):
            self.read.search(word="a\0b")
        with self.assertRaisesRegex(secpolicy.InvalidArgumentError,
                                    "^'allow' is no decision: 'grant', 'revoke'$"):
            self.read.search(decision="allow")

    def test_its_representation_says_what_was_read(self):
        self.assertEqual(repr(self.read), f"<secpolicy.Policy of {str(self.policy)!r}, 0 errors>")
        with self.host.read_policy() as kernel:
            self.assertEqual(repr(kernel), "<secpolicy.Policy of 'kernel', 0 errors>")
        self.assertEqual(repr(kernel), "<secpolicy.Policy of 'kernel', closed>")

    def test_may(self):
        answer = self.read.may("appDom", "read", "/etc/hosts")
        self.assertTrue(answer)
        self.assertEqual((answer.domain, answer.path, answer.rule.line),
                         ("appDom", "/etc/hosts", "-r /etc rw"))
        self.assertEqual((answer.label, answer.transition), (None, None))
        self.assertEqual(self.read.may("appDom", "getattr", "/").label, "default")
        refused = self.read.may("ioFilterDom", "syscall", "open")
        self.assertFalse(refused)
        self.assertIsNone(refused.rule)
        self.assertIsNone(refused.label)

    def test_who(self):
        match, = self.read.who("syscall", "read")
        self.assertEqual((match.domain, match.rule.line), ("globalVMDom", "-s read grant"))
        self.assertEqual(self.read.who("capability", "net_admin"), ())

    def test_bad_questions_are_told(self):
        for words in ((), ("syscall",), ("syscall", "opne"), ("syscall", "open", "read", "write")):
            with self.assertRaises(secpolicy.BadRequestError, msg=words):
                self.read.who(*words)
        with self.assertRaisesRegex(secpolicy.BadRequestError, 'unknown domain "none"'):
            self.read.may("none", "syscall", "open")
        with self.assertRaises(secpolicy.InvalidArgumentError):
            self.read.who("syscall", "\udcff")

    def test_a_policy_outlives_its_host_and_its_files(self):
        self.write("domains/appDom", "-s open revoke\n")
        self.host.close()
        self.assertTrue(self.read.may("appDom", "syscall", "open"))

    def test_errors_of_a_load_are_kept(self):
        self.assertEqual(self.read.errors, ())
        self.write("domains/appDom", "-s opne grant\n")
        with self.host.read_policy(self.policy) as read:
            self.assertIn("unknown system call \"opne\"", read.errors[0])

    def test_the_kernel_is_the_default(self):
        with self.host.read_policy() as read:
            self.assertEqual(read.search(), ())
        self.host.load(self.policy)
        with self.host.read_policy() as read:
            self.assertTrue(read.may("appDom", "syscall", "open"))

    def test_a_closed_policy_is_not_used(self):
        self.read.close()
        with self.assertRaisesRegex(ValueError, "^the policy is closed$"):
            self.read.search()
