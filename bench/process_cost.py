"""What one process takes from its start to its end, in time and memory."""

from __future__ import annotations

import dataclasses
import os
import pathlib
import resource
import signal
import subprocess
import tempfile
import time

Words = list[str | pathlib.Path]


class Failed(Exception):
    """The process ended with another status than it should have."""


@dataclasses.dataclass(frozen=True)
class Cost:
    seconds: float  # elapsed
    processor: float  # seconds, with those of the processes that it waited for
    peak: int  # bytes


def processor_time() -> float:
    used = resource.getrusage(resource.RUSAGE_CHILDREN)
    return used.ru_utime + used.ru_stime


def start_cost(words: Words) -> float:
    """The processor time of a short process, by itself."""
    used = processor_time()
    done = subprocess.run(words, stdout=subprocess.DEVNULL, stderr=subprocess.PIPE, text=True,
                          check=False)
    if done.returncode != 0:
        raise Failed(f"{' '.join(map(str, words))}: {done.stderr}")
    return processor_time() - used


def tail(file: pathlib.Path) -> str:
    return file.read_bytes()[-2000:].decode(errors="replace").strip()


def cost_of(words: Words, *, directory: pathlib.Path | None = None,
            standard_input: str = os.devnull, limit: float | None = None,
            status: int = 0) -> Cost | None:
    """Runs a process in `directory`; nothing if it was stopped after `limit` seconds."""
    with tempfile.TemporaryDirectory() as scratch:
        # Not by wait4 here: what this process starts has this one's memory for its first peak.
        peak, output, errors = (pathlib.Path(scratch) / name for name in ("peak", "out", "err"))
        timed = ["time", "--quiet", "--format=%M", f"--output={peak}", *words]
        used, start = processor_time(), time.monotonic()
        with open((directory or pathlib.Path()) / standard_input, "rb") as given, \
                output.open("wb") as out, errors.open("wb") as err:
            process = subprocess.Popen(timed, cwd=directory, stdin=given, stdout=out, stderr=err,
                                       start_new_session=True)
            try:
                ended = process.wait(limit)
            except subprocess.TimeoutExpired:
                return None
            finally:
                if process.returncode is None:
                    os.killpg(process.pid, signal.SIGKILL)
                    process.wait()
        seconds = time.monotonic() - start
        if ended != status:
            raise Failed(f"{' '.join(map(str, words))}: exit status {ended}: "
                         f"{tail(errors) or tail(output)}")
        return Cost(seconds, processor_time() - used, int(peak.read_text()) * 1024)


def least(costs: list[Cost]) -> Cost:
    """The least of each figure: what others do on the machine only ever adds to one."""
    return Cost(*(min(getattr(cost, field.name) for cost in costs)
                  for field in dataclasses.fields(Cost)))
