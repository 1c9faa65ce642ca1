"""A host and a policy of a test's own."""

import pathlib
import shutil
import tempfile
import unittest

import secpolicy


class HostTest(unittest.TestCase):
    """Has a host, assembled, and a policy without faults."""

    def setUp(self):
        self.directory = pathlib.Path(tempfile.mkdtemp(prefix="secpolicy-python-"))
        self.addCleanup(shutil.rmtree, self.directory)
        self.host = secpolicy.Host.create(self.directory / "host")
        self.addCleanup(self.host.close)
        self.host.assemble()
        self.policy = self.directory / "policy"
        self.write("objects/base", "conf\n")
        self.write("domains/appDom", "-s open grant\n-a conf read grant\n-r /etc rw\n")
        self.write("domains/globalVMDom", "-s read grant\n-s write revoke\n")
        self.write("domains/ioFilterDom", "# nothing\n")
        self.write("fileLabels/base", "# nothing\n")

    def write(self, name, content):
        """A file of the policy."""
        file = self.policy / name
        file.parent.mkdir(parents=True, exist_ok=True)
        file.write_bytes(content if isinstance(content, bytes) else content.encode())
        return file
