"""What the library refuses, as exceptions."""

from __future__ import annotations

from ._results import LoadResult


class SecPolicyError(Exception):
    """A call failed. `str()` is the message."""

    #: The status that the C interface gives it; 0 where the call did not get there.
    status = 0

    def __init__(self, message: str, file: str | None = None, line: int | None = None) -> None:
        super().__init__(message)
        #: The policy file that the message is about, if it is about one.
        self.file = file
        #: The line there, from 1, if it is about one.
        self.line = line


class LibraryError(SecPolicyError):
    """The library is not there, or is another one than this package is for."""


class InvalidArgumentError(SecPolicyError, ValueError):
    """An argument is no text that the library takes."""

    status = 1


class BadRequestError(SecPolicyError, ValueError):
    """A word, a domain or an id that there is not, a question of the wrong form, a bad pattern."""

    status = 2


class HostError(SecPolicyError):
    """The host directory, or the policy directory, does not allow what was asked."""

    status = 3


class LoadError(SecPolicyError):
    """A load reported errors. What could be installed is. The message is one of them."""

    status = 4

    def __init__(self, message: str, file: str | None = None, line: int | None = None,
                 result: LoadResult | None = None) -> None:
        super().__init__(message, file, line)
        self._result = result

    @property
    def result(self) -> LoadResult:
        """All errors, and what the kernel holds now."""
        if self._result is None:
            raise AttributeError("the load gave no result")
        return self._result


class LoadTerminatedError(LoadError):
    """A load was terminated, since a domain that every host needs is missing."""

    status = 5


class OutOfMemoryError(SecPolicyError, MemoryError):
    """There is no memory."""

    status = 6


class SystemFailure(SecPolicyError):
    """The system failed in a way that no other exception names."""

    status = 7


_TYPES: tuple[type[SecPolicyError], ...] = (
    InvalidArgumentError, BadRequestError, HostError, LoadError, LoadTerminatedError,
    OutOfMemoryError, SystemFailure)
_BY_STATUS = {each.status: each for each in _TYPES}


def type_of(status: int) -> type[SecPolicyError]:
    """The exception for a status of the C interface."""
    return _BY_STATUS.get(status, SecPolicyError)
