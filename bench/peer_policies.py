"""Rules of equal meaning, in the languages of several readers of policies.

A rule lets a domain have one access to one object. The rules of one count lie evenly in 100
domains; no two of them name the same domain and object, so that none can be merged with another.
"""

from __future__ import annotations

import dataclasses
import pathlib
import zlib
from collections.abc import Callable, Iterator

from scale_script import SCALE

ACCESSES = ("read", "write", "exec", "append")
DOMAINS = (*SCALE.WELL_KNOWN, *(f"dom{i:02}" for i in range(100 - len(SCALE.WELL_KNOWN))))


@dataclasses.dataclass(frozen=True)
class Rules:
    """A number of rules; if spoilt, the last one of them has an access that does not exist."""

    count: int
    spoilt: bool = False

    def objects(self) -> Iterator[str]:
        return (f"object{i:06}" for i in range(-(-self.count // len(DOMAINS))))

    def of_domain(self, number: int) -> Iterator[tuple[str, str]]:
        """Each object of the domain with its access."""
        own = self.count // len(DOMAINS) + (number < self.count % len(DOMAINS))
        last_domain = min(self.count, len(DOMAINS)) - 1
        for i, name in zip(range(own), self.objects()):
            if self.spoilt and number == last_domain and i == own - 1:
                yield name, "spoilt"
            else:
                access = zlib.crc32(f"{DOMAINS[number]} {name}".encode()) % len(ACCESSES)
                yield name, ACCESSES[access]

    def triples(self) -> Iterator[tuple[str, str, str]]:
        for number, domain in enumerate(DOMAINS):
            for name, access in self.of_domain(number):
                yield domain, name, access


Language = Callable[[Rules], Iterator[str]]


def cil(rules: Rules) -> Iterator[str]:
    """What the language asks of every policy, the types, and one allow statement for each rule."""
    yield f"(class file ({' '.join(ACCESSES)}))"
    yield "(classorder (file))"
    yield "(sid kernel)"
    yield "(sidorder (kernel))"
    yield "(mls false)"
    yield "(sensitivity s0)"
    yield "(sensitivityorder (s0))"
    yield "(user u)"
    yield "(role r)"
    yield "(userrole u r)"
    yield "(userlevel u (s0))"
    yield "(userrange u ((s0) (s0)))"
    yield f"(roletype r {DOMAINS[0]})"
    yield f"(sidcontext kernel (u r {DOMAINS[0]} ((s0) (s0))))"
    for name in (*DOMAINS, *rules.objects()):
        yield f"(type {name})"
    for domain, name, access in rules.triples():
        yield f"(allow {domain} {name} (file ({access})))"
    if rules.count == 0:  # a policy without any is refused
        yield f"(allow {DOMAINS[0]} {DOMAINS[0]} (file ({ACCESSES[0]})))"


def kernel_policy(rules: Rules) -> Iterator[str]:
    """The same in the language of checkpolicy, which sets the order of its parts."""
    yield "class file"
    yield "sid kernel"
    yield f"class file {{ {' '.join(ACCESSES)} }}"
    for name in (*DOMAINS, *rules.objects()):
        yield f"type {name};"
    yield "role r;"
    yield f"role r types {DOMAINS[0]};"
    for domain, name, access in rules.triples():
        yield f"allow {domain} {name}:file {access};"
    yield "user u roles { r };"
    yield f"sid kernel u:r:{DOMAINS[0]}"


PERMISSIONS = {"read": "r", "write": "w", "exec": "ix", "append": "a"}


def many_profiles(rules: Rules) -> Iterator[str]:
    """A profile for each domain, a path for each object."""
    for number, domain in enumerate(DOMAINS):
        yield f"profile {domain} {{"
        for name, access in rules.of_domain(number):
            yield f"  /srv/{name} {PERMISSIONS.get(access, access)},"
        yield "}"


def one_profile(rules: Rules) -> Iterator[str]:
    """One profile with all rules: what would be a domain is a directory of the path."""
    yield "profile all {"
    for domain, name, access in rules.triples():
        yield f"  /srv/{domain}/{name} {PERMISSIONS.get(access, access)},"
    yield "}"


def path_domains(rules: Rules) -> Iterator[str]:
    """A domain that a program of its name enters, a path for each object."""
    for number, domain in enumerate(DOMAINS):
        yield f"<kernel> /usr/bin/{domain}"
        yield "use_profile 0"
        yield "use_group 0"
        yield ""
        for name, access in rules.of_domain(number):
            yield f"file {'execute' if access == 'exec' else access} /srv/{name}"
        yield ""


def write_host(rules: Rules, command: pathlib.Path, directory: pathlib.Path) -> None:
    """This project's own: directory/host, and the policy in directory/policy."""
    host = SCALE.Host(command, directory)
    host.write("objects/base", rules.objects())
    for number, domain in enumerate(DOMAINS):
        host.write(f"domains/{domain}",
                   (f"-a {name} {access} grant" for name, access in rules.of_domain(number)))
