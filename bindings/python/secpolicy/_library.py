"""The shared library: finding it, the types of its functions, its errors as exceptions."""

from __future__ import annotations

import ctypes
import functools
import os
from ctypes import POINTER, c_char_p, c_int, c_size_t, c_uint32, c_void_p

from ._errors import LibraryError, SecPolicyError, type_of

#: The environment variable that names the library's file, where the loader is not to look for it.
VARIABLE = "SECPOLICY_LIBRARY"
SONAME = "libsecpolicy_c.so.1"

#: The version of the interface that this package needs, as (major, minor).
NEEDED = (1, 0)

ALL_DOMAINS = 0xFFFFFFFF
ANY_DECISION, GRANTED, REVOKED = range(3)


class SearchTerms(ctypes.Structure):
    """secpolicy_search_terms."""

    _fields_ = [("size", c_size_t), ("domain", c_char_p), ("type", c_char_p), ("word", c_char_p),
                ("pattern", c_char_p), ("path", c_char_p), ("decision", c_int)]


# Handles are addresses; each has a type of its own, so that one is not taken for another.
class HostHandle(c_void_p):
    """secpolicy_host *"""


class PolicyHandle(c_void_p):
    """secpolicy_policy *"""


class TextHandle(c_void_p):
    """secpolicy_text *"""


class ErrorHandle(c_void_p):
    """secpolicy_error *"""


_TEXT = POINTER(TextHandle)
_ERROR = POINTER(ErrorHandle)
_WORDS = POINTER(c_char_p)

#: Every function of secpolicy_c.h: what it returns, and what it takes.
FUNCTIONS: dict[str, tuple[type | None, list[type]]] = {
    "secpolicy_c_version": (c_uint32, []),
    "secpolicy_status_name": (c_char_p, [c_int]),
    "secpolicy_error_status": (c_int, [ErrorHandle]),
    "secpolicy_error_message": (c_char_p, [ErrorHandle]),
    "secpolicy_error_file": (c_char_p, [ErrorHandle]),
    "secpolicy_error_line": (c_uint32, [ErrorHandle]),
    "secpolicy_error_free": (None, [ErrorHandle]),
    "secpolicy_text_data": (c_void_p, [TextHandle]),
    "secpolicy_text_size": (c_size_t, [TextHandle]),
    "secpolicy_text_free": (None, [TextHandle]),
    "secpolicy_host_create": (c_int, [c_char_p, _ERROR]),
    "secpolicy_host_open": (c_int, [c_char_p, POINTER(HostHandle), _ERROR]),
    "secpolicy_host_assemble": (c_int, [HostHandle, _ERROR]),
    "secpolicy_host_path": (c_char_p, [HostHandle]),
    "secpolicy_host_free": (None, [HostHandle]),
    "secpolicy_load": (c_int, [HostHandle, c_char_p, _TEXT, _ERROR]),
    "secpolicy_show": (c_int, [HostHandle, c_uint32, _TEXT, _ERROR]),
    "secpolicy_check": (c_int, [HostHandle, c_char_p, _TEXT, _ERROR]),
    "secpolicy_policy_read": (c_int, [HostHandle, c_char_p, POINTER(PolicyHandle), _ERROR]),
    "secpolicy_policy_error_count": (c_size_t, [PolicyHandle]),
    "secpolicy_policy_error": (c_char_p, [PolicyHandle, c_size_t]),
    "secpolicy_policy_free": (None, [PolicyHandle]),
    "secpolicy_search": (c_int, [PolicyHandle, POINTER(SearchTerms), _TEXT, _ERROR]),
    "secpolicy_may": (c_int, [PolicyHandle, c_char_p, _WORDS, c_size_t, _TEXT, _ERROR]),
    "secpolicy_who": (c_int, [PolicyHandle, _WORDS, c_size_t, _TEXT, _ERROR]),
}


@functools.cache
def library() -> ctypes.CDLL:
    """The library, loaded once. Raises LibraryError."""
    name = os.environ.get(VARIABLE) or SONAME
    try:
        loaded = ctypes.CDLL(name)
        for function, (result, arguments) in FUNCTIONS.items():
            declared = getattr(loaded, function)
            declared.restype = result
            declared.argtypes = arguments
    except (OSError, AttributeError) as problem:
        raise LibraryError(f"{name} cannot be used: {problem}; the environment variable {VARIABLE} "
                           "may name another file") from problem
    number = int(loaded.secpolicy_c_version())
    found = (number >> 16, number & 0xFFFF)
    if found[0] != NEEDED[0] or found < NEEDED:
        raise LibraryError(f"{name} has version {found[0]}.{found[1]} of the interface; "
                           f"{NEEDED[0]}.{NEEDED[1]} is needed")
    return loaded


def version() -> tuple[int, int]:
    """The version of the library's interface, as (major, minor). Raises LibraryError."""
    number = int(library().secpolicy_c_version())
    return number >> 16, number & 0xFFFF


def take_text(text: TextHandle) -> str:
    """The content of a text, which is freed."""
    lib = library()
    try:
        size = lib.secpolicy_text_size(text)
        return ctypes.string_at(lib.secpolicy_text_data(text), size).decode()
    finally:
        lib.secpolicy_text_free(text)


def take_error(status: int, error: ErrorHandle) -> SecPolicyError:
    """The exception for an error, which is freed."""
    lib = library()
    try:
        message = lib.secpolicy_error_message(error).decode()
        file = lib.secpolicy_error_file(error)
        line = lib.secpolicy_error_line(error)
        return type_of(status)(message, None if file is None else file.decode(), line or None)
    finally:
        lib.secpolicy_error_free(error)


def call(function: str, *arguments: object) -> None:
    """Calls a function, whose last argument is the error that is raised if it fails."""
    error = ErrorHandle()
    status = getattr(library(), function)(*arguments, ctypes.byref(error))
    if status != 0:
        raise take_error(status, error)


def call_for(text: TextHandle, function: str, *arguments: object) -> None:
    """The same for a function whose last but one argument is a text, which the caller frees."""
    call(function, *arguments, ctypes.byref(text))


def text_from(function: str, *arguments: object) -> str:
    """The same, returning the content of the text."""
    text = TextHandle()
    call_for(text, function, *arguments)
    return take_text(text)
