"""The programs that bench/peers measures: how each is called, and what it does."""

from __future__ import annotations

import dataclasses
import os

import peer_policies


@dataclasses.dataclass(frozen=True)
class Question:
    """A call that says what a peer made of its rules: one such line of its output is one rule."""

    call: str
    start_of_line: str


@dataclasses.dataclass(frozen=True)
class Peer:
    """A program, called in a directory that holds its policy, as `policy` if it is one file."""

    name: str
    package: str
    call: str
    language: peer_policies.Language | None  # none: this project's own directories
    note: str
    question: Question | None = None
    standard_input: str = os.devnull


PARSED_PROFILES = Question("apparmor_parser -Q -K -d policy", "Mode:\t")
DECOMPILED = Question("checkpolicy -b -F -o - binary", "allow ")
PEERS = (
    Peer("load", "", "secpolicy load --host host policy", None,
         "checks each word against the kernel's lists, installs rule by rule into the simulated "
         "module, writes and syncs its state as text",
         Question("secpolicy show --host host", "-a ")),
    Peer("check", "", "secpolicy check --host host policy", None,
         "tries the load and forgets it; looks for every mistake and for what is probably not "
         "meant; writes nothing"),
    Peer("secilc", "secilc", "secilc -o binary -f contexts policy", peer_policies.cil,
         "builds a tree of all statements, resolves blocks and names in it, expands attributes, "
         "writes a binary policy", DECOMPILED),
    Peer("checkpolicy", "checkpolicy", "checkpolicy -o binary policy", peer_policies.kernel_policy,
         "resolves names while it parses, keeps rules in hashed tables of numbers, writes a binary "
         "policy", DECOMPILED),
    Peer("apparmor-many", "apparmor", "apparmor_parser -Q -S -K policy",
         peer_policies.many_profiles,
         "compiles the paths of each of 100 profiles to a minimal automaton, and packs that",
         PARSED_PROFILES),
    Peer("apparmor-one", "apparmor", "apparmor_parser -Q -S -K policy", peer_policies.one_profile,
         "the same with all rules in one profile, so in one automaton", PARSED_PROFILES),
    Peer("apparmor-names", "apparmor", "apparmor_parser -N policy", peer_policies.many_profiles,
         "parses the 100 profiles and prints their names; compiles nothing", PARSED_PROFILES),
    Peer("tomoyo", "tomoyo-tools", "tomoyo-checkpolicy d", peer_policies.path_domains,
         "checks the syntax line by line and keeps nothing; names are not looked up",
         standard_input="policy"),
)
