"""Hosts, and policies that were read by way of them."""

from __future__ import annotations

import ctypes
import json
import os
from types import TracebackType
from typing import Any, Self

from . import _library
from ._errors import InvalidArgumentError, LoadError
from ._handle import Handle
from ._library import HostHandle, PolicyHandle
from ._results import Answer, CheckReport, Decision, HeldPolicy, LoadResult, Match

Path = str | os.PathLike[str]

#: The source that is what a host's kernel holds. A directory of that name is "./kernel".
KERNEL = "kernel"


def _encoded(text: str, name: str) -> bytes:
    if not isinstance(text, str):
        raise TypeError(f"{name} is no text: {text!r}")
    if "\0" in text:
        raise InvalidArgumentError(f"{name} has a NUL character in it")
    try:
        return text.encode()
    except UnicodeEncodeError as problem:
        raise InvalidArgumentError(f"{name} is not UTF-8") from problem


def _optional(text: str | None, name: str) -> bytes | None:
    return None if text is None else _encoded(text, name)


def _path(path: Path, name: str) -> bytes:
    return _encoded(os.fspath(path), name)


def _optional_path(path: Path | None, name: str) -> bytes | None:
    return None if path is None else _path(path, name)


def _words(words: tuple[str, ...]) -> ctypes.Array[ctypes.c_char_p]:
    encoded = [_encoded(word, f"word {number}") for number, word in enumerate(words, 1)]
    return (ctypes.c_char_p * len(encoded))(*encoded)


class Host:
    """A host directory.

    Holds its path, and nothing open: what has become of the directory is seen by each call anew. To
    be closed, or used in a "with" statement. May be used by several threads at once. A call on a
    closed host raises ValueError.
    """

    def __init__(self, directory: Path) -> None:
        """Opens `directory`. Raises HostError when it is no host directory."""
        raw = HostHandle()
        _library.call("secpolicy_host_open", _path(directory, "directory"), ctypes.byref(raw))
        self._handle = Handle(raw, _library.library().secpolicy_host_free, "host")

    @staticmethod
    def create(directory: Path) -> Host:
        """Makes `directory` a host directory with the default description, and opens it.

        Its tardisks are to be put into its sub-directory "tardisks"; then `assemble` makes it
        usable. Raises HostError when it is a host directory already, or cannot be made.
        """
        _library.call("secpolicy_host_create", _path(directory, "directory"))
        return Host(directory)

    def __repr__(self) -> str:
        return f"secpolicy.Host({self.path!r})" if self._handle.is_open else "<closed secpolicy.Host>"

    @property
    def path(self) -> str:
        """The absolute path."""
        with self._handle.use() as raw:
            path: bytes = _library.library().secpolicy_host_path(raw)
            return path.decode()

    def assemble(self) -> None:
        """Unpacks the tardisks into the root file system and starts the kernel anew.

        The kernel forgets all policy. Raises HostError, with root and kernel as before.
        """
        with self._handle.use() as raw:
            _library.call("secpolicy_host_assemble", raw)

    def load(self, directory: Path | None = None) -> LoadResult:
        """Loads a policy directory, by default the host's own one, into the host's kernel.

        Raises LoadError when the load reports errors: what could be installed is, and the
        exception's `result` says what. Raises LoadTerminatedError, likewise, when it was terminated
        before its end. Raises HostError with nothing changed, unless the message says that the work
        was killed: then the kernel holds what it held before or what was installed.
        """
        text = _library.TextHandle()
        name = _optional_path(directory, "directory")
        with self._handle.use() as raw:
            try:
                _library.call_for(text, "secpolicy_load", raw, name)
            except LoadError as failure:
                failure._result = LoadResult._of(json.loads(_library.take_text(text)))
                raise
        return LoadResult._of(json.loads(_library.take_text(text)))

    def show(self, domain: int | None = None) -> HeldPolicy:
        """What the kernel holds; of the domains, the one with the id `domain`, or all.

        Raises BadRequestError when no domain has that id.
        """
        if domain is None:
            number = _library.ALL_DOMAINS
        elif 0 <= domain < _library.ALL_DOMAINS:
            number = domain
        else:
            raise InvalidArgumentError(f"{domain} is no id of a domain")
        with self._handle.use() as raw:
            return HeldPolicy._of(json.loads(_library.text_from("secpolicy_show", raw, number)))

    def check(self, directory: Path | None = None) -> CheckReport:
        """All findings in a policy directory, by default the host's own one. Changes nothing.

        Raises HostError when there is no such directory. Findings raise nothing.
        """
        name = _optional_path(directory, "directory")
        with self._handle.use() as raw:
            return CheckReport._of(json.loads(_library.text_from("secpolicy_check", raw, name)))

    def read_policy(self, source: Path | None = KERNEL) -> Policy:
        """Reads a policy to be asked: of a directory, or what the kernel holds.

        None is the host's own directory. Raises HostError when there is no such directory; errors
        of a load of it raise nothing, see Policy.errors.
        """
        raw = PolicyHandle()
        name = _optional_path(source, "source")
        with self._handle.use() as host:
            _library.call("secpolicy_policy_read", host, name, ctypes.byref(raw))
        return Policy(raw, None if source is None else os.fspath(source))

    def close(self) -> None:
        """Frees the host. Policies that were read by way of it stay usable."""
        self._handle.close()

    def __enter__(self) -> Self:
        return self

    def __exit__(self, kind: type[BaseException] | None, problem: BaseException | None,
                 trace: TracebackType | None) -> None:
        self.close()


class Policy:
    """A policy as it was when it was read: made by Host.read_policy.

    To be closed, or used in a "with" statement. May be used by several threads at once.
    """

    def __init__(self, raw: PolicyHandle, source: str | None) -> None:
        lib = _library.library()
        self._source = source
        self._handle = Handle(raw, lib.secpolicy_policy_free, "policy")
        #: What a load of it reports, in order.
        self.errors: tuple[str, ...] = tuple(
            lib.secpolicy_policy_error(raw, index).decode()
            for index in range(lib.secpolicy_policy_error_count(raw)))

    def __repr__(self) -> str:
        state = f"{len(self.errors)} errors" if self._handle.is_open else "closed"
        return f"<secpolicy.Policy of {self._source!r}, {state}>"

    def search(self, *, domain: str | None = None, type: str | None = None, word: str | None = None,
               pattern: str | None = None, path: str | None = None,
               decision: Decision | str | None = None) -> tuple[Match, ...]:
        """The rules for which everything holds that is given.

        Rules of this domain; of this type, "-s" or "syscall" for instance; with this word; with a
        word that this regular expression (RE2 syntax) is found in; path rules that decide on this
        absolute path or are for something below it; that decide so, Decision.GRANT or "grant" for
        instance. A path rule grants when it permits anything. Raises BadRequestError for an unknown
        domain or type, a bad pattern or a relative path, and InvalidArgumentError for a word
        together with a pattern and for an unknown decision.
        """
        terms = _library.SearchTerms(
            ctypes.sizeof(_library.SearchTerms), _optional(domain, "domain"),
            _optional(type, "type"), _optional(word, "word"), _optional(pattern, "pattern"),
            _optional(path, "path"), _decision(decision))
        with self._handle.use() as raw:
            text = _library.text_from("secpolicy_search", raw, ctypes.byref(terms))
        return Match._all_of(json.loads(text)["matches"])

    def may(self, domain: str, *words: str) -> Answer:
        """Whether `domain` is allowed what the words say, "read" and "/etc/hosts" for instance.

        Raises BadRequestError for what is unknown or no question.
        """
        name = _encoded(domain, "domain")
        return Answer._of(self._ask("secpolicy_may", words, name))

    def who(self, *words: str) -> tuple[Match, ...]:
        """The domains that are allowed it, by name, each with the rule that decides.

        Raises BadRequestError for what is unknown or no question.
        """
        return Match._all_of(self._ask("secpolicy_who", words)["domains"])

    def _ask(self, function: str, words: tuple[str, ...], *before: bytes) -> Any:
        asked = _words(words)
        with self._handle.use() as raw:
            return json.loads(_library.text_from(function, raw, *before, asked, len(words)))

    def close(self) -> None:
        """Frees the policy."""
        self._handle.close()

    def __enter__(self) -> Self:
        return self

    def __exit__(self, kind: type[BaseException] | None, problem: BaseException | None,
                 trace: TracebackType | None) -> None:
        self.close()


_DECISIONS = {Decision.GRANT: _library.GRANTED, Decision.REVOKE: _library.REVOKED}


def _decision(decision: Decision | str | None) -> int:
    if decision is None:
        return _library.ANY_DECISION
    try:
        return _DECISIONS[Decision(decision)]
    except ValueError:
        known = ", ".join(repr(each.value) for each in Decision)
        raise InvalidArgumentError(f"{decision!r} is no decision: {known}") from None
