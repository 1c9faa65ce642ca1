"""What the library answers with, as values."""

from __future__ import annotations

import dataclasses
import enum
from collections.abc import Mapping, Sequence
from typing import Any

# A parsed object of a result. Its form is described by the schemas in docs/schemas.
Json = Mapping[str, Any]


class Severity(enum.Enum):
    """How bad a finding is."""

    ERROR = "error"      #: a load reports it, or is terminated by it
    WARNING = "warning"  #: a load says nothing, but something else was probably meant


class Decision(enum.Enum):
    """What a rule decides."""

    GRANT = "grant"
    REVOKE = "revoke"


@dataclasses.dataclass(frozen=True, slots=True)
class Place:
    """Where something stands. What is not known is None."""

    file: str | None
    line: int | None    #: from 1
    column: int | None  #: from 1, in bytes

    @classmethod
    def _of(cls, entry: Json) -> Place:
        return cls(entry.get("file"), entry.get("line"), entry.get("column"))


@dataclasses.dataclass(frozen=True, slots=True)
class Rule:
    """A rule of a domain."""

    type: str                  #: its keyword, "-s" for instance
    words: tuple[str, ...]     #: those between the keyword and the decision or permission
    decision: Decision | None  #: None for a path rule
    permission: str | None     #: of a path rule, "rw" or "" for instance; None for others
    world: int | None          #: of a path rule that is for one world only
    line: str                  #: the rule as a line of a policy file
    place: Place | None

    @classmethod
    def _of(cls, entry: Json) -> Rule:
        decision = entry.get("decision")
        place = entry.get("place")
        return cls(
            type=entry["type"],
            words=tuple(entry["words"]),
            decision=None if decision is None else Decision(decision),
            permission=entry.get("permission"),
            world=entry.get("world"),
            line=entry["line"],
            place=None if place is None else Place._of(place))


@dataclasses.dataclass(frozen=True, slots=True)
class Domain:
    """A domain that a kernel holds."""

    id: int
    name: str
    enforcement_level: str
    state: int
    ref_count: int
    world_ref_count: int
    rules: tuple[Rule, ...]  #: by type, and within one in the order in which they were first set

    @classmethod
    def _of(cls, entry: Json) -> Domain:
        return cls(
            id=entry["id"],
            name=entry["name"],
            enforcement_level=entry["enforcementLevel"],
            state=entry["state"],
            ref_count=entry["refCount"],
            world_ref_count=entry["worldRefCount"],
            rules=tuple(map(Rule._of, entry["rules"])))


@dataclasses.dataclass(frozen=True, slots=True)
class Object:
    """An object that a kernel holds."""

    name: str
    id: int


@dataclasses.dataclass(frozen=True, slots=True)
class Tardisk:
    """A tardisk of a host, and its label."""

    path: str
    label: str  #: empty when the kernel has no name for it any more


@dataclasses.dataclass(frozen=True, slots=True)
class HeldPolicy:
    """What a host's kernel holds."""

    domains: tuple[Domain, ...]    #: by id
    objects: tuple[Object, ...]    #: by name
    tardisks: tuple[Tardisk, ...]  #: by path

    def domain(self, name: str) -> Domain:
        """The domain of that name. Raises KeyError."""
        for domain in self.domains:
            if domain.name == name:
                return domain
        raise KeyError(name)

    @classmethod
    def _of(cls, entry: Json) -> HeldPolicy:
        return cls(
            domains=tuple(map(Domain._of, entry["domains"])),
            objects=tuple(Object(each["name"], each["id"]) for each in entry["objects"]),
            tardisks=tuple(Tardisk(each["path"], each["label"]) for each in entry["tardisks"]))


@dataclasses.dataclass(frozen=True, slots=True)
class Finding:
    """What a check found. What is not known is None."""

    id: str  #: the kind of finding; docs/findings.md explains each
    severity: Severity
    message: str
    file: str | None          #: named as the policy directory was given
    line: int | None          #: from 1
    column: int | None        #: from 1, in bytes
    length: int | None        #: in bytes, of what is wrong; 0 for the whole line
    source: str | None        #: the line
    load_message: str | None  #: the words in which a load reports it
    help: str | None          #: what would be right

    @classmethod
    def _of(cls, entry: Json) -> Finding:
        return cls(
            id=entry["id"],
            severity=Severity(entry["severity"]),
            message=entry["message"],
            file=entry.get("file"),
            line=entry.get("line"),
            column=entry.get("column"),
            length=entry.get("length"),
            source=entry.get("source"),
            load_message=entry.get("loadMessage"),
            help=entry.get("help"))


@dataclasses.dataclass(frozen=True, slots=True)
class CheckReport:
    """All findings in a policy directory."""

    source: str  #: the directory as given; empty for the host's own one
    files: int   #: how many policy files were looked at
    findings: tuple[Finding, ...]

    @property
    def errors(self) -> tuple[Finding, ...]:
        """Those that a load reports."""
        return tuple(each for each in self.findings if each.severity is Severity.ERROR)

    @property
    def warnings(self) -> tuple[Finding, ...]:
        """Those that a load says nothing of."""
        return tuple(each for each in self.findings if each.severity is Severity.WARNING)

    @classmethod
    def _of(cls, entry: Json) -> CheckReport:
        return cls(entry["source"], entry["files"], tuple(map(Finding._of, entry["findings"])))


@dataclasses.dataclass(frozen=True, slots=True)
class LoadMessage:
    """An error that a load logged."""

    message: str
    file: str | None  #: what it is about, where the message says so
    line: int | None  #: from 1

    @classmethod
    def _of(cls, entry: Json) -> LoadMessage:
        return cls(entry["message"], entry.get("file"), entry.get("line"))


@dataclasses.dataclass(frozen=True, slots=True)
class LoadResult:
    """What came of a load."""

    source: str                      #: the directory as given; empty for the host's own one
    errors: tuple[LoadMessage, ...]  #: in the order in which they were logged
    installed: HeldPolicy            #: what the kernel holds after it

    @classmethod
    def _of(cls, entry: Json) -> LoadResult:
        return cls(entry["source"], tuple(map(LoadMessage._of, entry["errors"])),
                   HeldPolicy._of(entry["installed"]))


@dataclasses.dataclass(frozen=True, slots=True)
class Match:
    """A rule that a search found, and its domain."""

    domain: str
    rule: Rule

    @classmethod
    def _all_of(cls, entries: Sequence[Json]) -> tuple[Match, ...]:
        return tuple(cls(each["domain"], Rule._of(each["rule"])) for each in entries)


@dataclasses.dataclass(frozen=True, slots=True)
class Answer:
    """Whether a domain is allowed something."""

    domain: str
    allowed: bool
    rule: Rule | None  #: what decided; None when no rule speaks
    path: str | None   #: of a question about a file: what its path was resolved to
    label: str | None  #: of a question about a file: its label, if it has one
    #: of the execution of a file that is allowed: what moves the program to another domain
    transition: Rule | None

    def __bool__(self) -> bool:
        return self.allowed

    @classmethod
    def _of(cls, entry: Json) -> Answer:
        rule = entry["rule"]
        transition = entry.get("transition")
        return cls(entry["domain"], entry["allowed"], None if rule is None else Rule._of(rule),
                   entry.get("path"), entry.get("label"),
                   None if transition is None else Rule._of(transition))
