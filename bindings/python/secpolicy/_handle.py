"""Handles of the library that threads may share."""

from __future__ import annotations

import contextlib
import threading
from collections.abc import Callable, Iterator
from typing import Generic, TypeVar

Raw = TypeVar("Raw")


class Handle(Generic[Raw]):
    """Frees a handle once: when it was closed, and no call uses it any more."""

    def __init__(self, raw: Raw, free: Callable[[Raw], object], what: str) -> None:
        self._raw = raw
        self._free = free
        self._what = what
        self._lock = threading.Lock()
        self._uses = 0
        self._is_closed = False

    @property
    def is_open(self) -> bool:
        """Whether it has not been closed."""
        return not self._is_closed

    @contextlib.contextmanager
    def use(self) -> Iterator[Raw]:
        """The handle, for a call. Raises ValueError when it was closed."""
        with self._lock:
            if self._is_closed:
                raise ValueError(f"the {self._what} is closed")
            self._uses += 1
        try:
            yield self._raw
        finally:
            with self._lock:
                self._uses -= 1
                is_last = self._is_closed and self._uses == 0
            if is_last:
                self._free(self._raw)

    def close(self) -> None:
        """No call begins from here on. Does nothing a second time."""
        with self._lock:
            is_last = not self._is_closed and self._uses == 0
            self._is_closed = True
        if is_last:
            self._free(self._raw)

    def __del__(self) -> None:
        self.close()
