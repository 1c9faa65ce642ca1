"""That results have the form that the schemas describe."""

import ctypes
import json
import os
import pathlib

import jsonschema

import secpolicy
from hosts import HostTest
from secpolicy import _library

SCHEMAS = pathlib.Path(os.environ["SECPOLICY_SCHEMAS"])


class SchemasTest(HostTest):
    def setUp(self):
        super().setUp()
        self.lib = _library.library()
        self.raw = self.host._handle._raw

    def expect(self, schema, text):
        content = json.loads(text)
        jsonschema.Draft202012Validator(
            json.loads((SCHEMAS / f"{schema}.schema.json").read_text())).validate(content)
        return content

    def load(self):
        """The text of a load, whatever its outcome."""
        text = _library.TextHandle()
        try:
            _library.call_for(text, "secpolicy_load", self.raw, bytes(self.policy))
        except secpolicy.LoadError:
            pass
        return self.expect("load", _library.take_text(text))

    def test_load(self):
        self.assertEqual(self.load()["outcome"], "done")
        self.write("domains/globalVMDom", "-s opne grant\n-s r\xe4d grant\n")
        self.write("objects/base", b"conf\n\xff\n")
        self.assertEqual(self.load()["outcome"], "failed")
        os.unlink(self.policy / "domains/ioFilterDom")
        self.host.assemble()
        self.assertEqual(self.load()["outcome"], "terminated")

    def test_others(self):
        self.load()
        show = _library.text_from("secpolicy_show", self.raw, _library.ALL_DOMAINS)
        self.assertEqual(len(self.expect("show", show)["domains"]), 4)
        self.write("domains/appDom", "-s opne grant\n")
        check = _library.text_from("secpolicy_check", self.raw, bytes(self.policy))
        self.assertEqual(self.expect("check", check)["errors"], 1)
        with self.host.read_policy() as policy:
            raw = policy._handle._raw
            terms = _library.SearchTerms(ctypes.sizeof(_library.SearchTerms))
            found = _library.text_from("secpolicy_search", raw, ctypes.byref(terms))
            self.assertGreater(len(self.expect("search", found)["matches"]), 4)
            words = (ctypes.c_char_p * 2)(b"read", b"/etc/hosts")
            may = _library.text_from("secpolicy_may", raw, b"appDom", words, 2)
            self.assertTrue(self.expect("may", may)["allowed"])
            who = _library.text_from("secpolicy_who", raw, words, 2)
            self.assertEqual(len(self.expect("who", who)["domains"]), 1)
