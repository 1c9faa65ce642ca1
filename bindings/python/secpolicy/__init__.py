"""Policies of stand-in hosts: loaded, shown, checked and asked.

    import secpolicy

    with secpolicy.Host("build/demo/host") as host:
        for finding in host.check("policy").findings:
            print(finding.file, finding.line, finding.message)
        host.load("policy")
        with host.read_policy() as policy:
            print(policy.may("netDom", "read", "/etc/hosts").allowed)

Everything is done by the library libsecpolicy_c in the calling process, which stays as it was. Calls
release the interpreter's lock, and may be made from several threads at once.
"""

from ._errors import (BadRequestError, HostError, InvalidArgumentError, LibraryError, LoadError,
                      LoadTerminatedError, OutOfMemoryError, SecPolicyError, SystemFailure)
from ._host import Host, Policy
from ._library import version
from ._results import (Answer, CheckReport, Decision, Domain, Finding, HeldPolicy, LoadMessage,
                       LoadResult, Match, Object, Place, Rule, Severity, Tardisk)

#: The package's own version; version() is the library's.
__version__ = "0.1.0"

__all__ = [
    "Answer", "BadRequestError", "CheckReport", "Decision", "Domain", "Finding", "HeldPolicy",
    "Host", "HostError", "InvalidArgumentError", "LibraryError", "LoadError", "LoadMessage",
    "LoadResult", "LoadTerminatedError", "Match", "Object", "OutOfMemoryError", "Place", "Policy",
    "Rule", "SecPolicyError", "Severity", "SystemFailure", "Tardisk", "version",
]
