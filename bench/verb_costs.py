"""What verbs of the command take on big policy directories."""

from __future__ import annotations

import pathlib
import shutil
import tempfile

from process_cost import Cost, Words, cost_of, least
from scale_script import SCALE

ALL = ("load", "may", "who", "search", "paths", "digest", "diff")
OF_MUCH_MEMORY = ("diff", "digest")
# Times in those of a load; megabytes are 10^6 bytes.
AIMS = {name: "at most 1.3; 90 MB" for name in ("may", "who", "search", "paths", "digest")} | {
    "diff": "at most 2.6"}
AIMS_OF_MUCH_MEMORY = {"diff": "900 MB", "digest": "600 MB"}


def write_policy(host, count: int) -> None:  # type: ignore[no-untyped-def]
    """Rules of every type, as many in each domain."""
    host.write("objects/base", [f"object{i:02}" for i in range(SCALE.OBJECTS)])
    for number, domain in enumerate(SCALE.domain_names()):
        own = count // SCALE.DOMAINS + (number < count % SCALE.DOMAINS)
        host.write(f"domains/{domain}", SCALE.rules_of_domain(own))
    host.assemble()


def write_changed(policy: pathlib.Path, changed: pathlib.Path) -> None:
    """The same policy but for one more rule in each tenth domain."""
    shutil.copytree(policy, changed)
    for domain in SCALE.domain_names()[::10]:
        with (changed / "domains" / domain).open("a") as file:
            file.write("-p sys_boot changed grant\n")


def measure(command: pathlib.Path, count: int, rounds: int,
            names: tuple[str, ...]) -> dict[str, Cost]:
    """The least of several runs in turn, each figure by itself."""
    with tempfile.TemporaryDirectory(prefix="secpolicy-bench-") as directory:
        host = SCALE.Host(command, pathlib.Path(directory))
        write_policy(host, count)
        changed = pathlib.Path(directory) / "changed"
        write_changed(host.policy, changed)
        here: Words = ["--host", host.path]
        asked: Words = [*here, "--policy", host.policy]
        # The answers are yes; those of diff are differences, which it reports by its exit status.
        words: dict[str, Words] = {
            "load": ["load", *here, host.policy],
            "may": ["may", *asked, "appDom", "read", "object00"],
            "who": ["who", *asked, "read", "object00"],
            "search": ["search", *here, host.policy, "--word", "object00"],
            "paths": ["paths", *asked, "globalVMDom", "appDom"],
            "digest": ["digest", *here, host.policy],
            "diff": ["diff", *here, host.policy, changed],
        }
        costs: dict[str, list[Cost]] = {name: [] for name in names}
        for _ in range(rounds):
            for name in names:
                if name == "load":
                    host.assemble()  # the kernel starts afresh, or the rules would be there already
                cost = cost_of([command, *words[name]], status=1 if name == "diff" else 0)
                assert cost is not None  # there is no limit
                costs[name].append(cost)
    return {name: least(each) for name, each in costs.items()}
