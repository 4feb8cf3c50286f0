"""KVData for Python: the library's records, objects, byte streams,
colorimetry and spread test, by the names of the system's type library.

    import kvdata
    user = kvdata.KVUser.create()
    user.v1User = kvdata.tUser(USERID="jsmith", UserNumber=1042)
    data = user.to_bytes()
    again = kvdata.KVUser.from_bytes(data)

Run-time errors of the library are raised as kvdata.Error (number, source,
description), each number also as the built-in exception that fits it.
"""

from ._kvdata import *  # noqa: F401,F403
from ._kvdata import __doc__ as _native_doc  # noqa: F401
from . import _kvdata

__all__ = [name for name in dir(_kvdata) if not name.startswith("_")]


class Error(Exception):
    """A run-time error of the library: its automation number, source and
    description. Raised as the subclass for its number, which also derives
    from the built-in exception that fits (IndexError for 9, ...)."""

    def __init__(self, number, source, description):
        super().__init__(f"{source}: {description} (error {number})")
        self.number = number
        self.source = source
        self.description = description


def _kind(name, builtin, number, doc):
    cls = type(name, (Error, builtin), {"__doc__": doc, "number": number})
    cls.__module__ = __name__
    return cls


InvalidProcedureCallError = _kind("InvalidProcedureCallError", ValueError, 5,
                                  "Error 5: invalid procedure call or argument.")
OverflowError_ = _kind("NumericOverflowError", OverflowError, 6, "Error 6: overflow.")
OutOfMemoryError = _kind("OutOfMemoryError", MemoryError, 7, "Error 7: out of memory.")
SubscriptOutOfRangeError = _kind("SubscriptOutOfRangeError", IndexError, 9,
                                 "Error 9: subscript out of range.")
TypeMismatchError = _kind("TypeMismatchError", TypeError, 13, "Error 13: type mismatch.")
InternalError = _kind("InternalError", RuntimeError, 51, "Error 51: internal error.")
ObjectNotSetError = _kind("ObjectNotSetError", ValueError, 91,
                          "Error 91: object variable not set (None where an object is needed).")
InvalidUseOfNullError = _kind("InvalidUseOfNullError", ValueError, 94,
                              "Error 94: invalid use of Null.")
CannotCreateObjectError = _kind("CannotCreateObjectError", LookupError, 429,
                                "Error 429: cannot create object.")
DuplicateKeyError = _kind("DuplicateKeyError", KeyError, 457,
                          "Error 457: key already associated with an element of the collection.")
NumericOverflowError = OverflowError_
del OverflowError_

_ERRORS = {cls.number: cls for cls in (
    InvalidProcedureCallError, NumericOverflowError, OutOfMemoryError, SubscriptOutOfRangeError,
    TypeMismatchError, InternalError, ObjectNotSetError, InvalidUseOfNullError,
    CannotCreateObjectError, DuplicateKeyError)}


class _OtherError(Error, RuntimeError):
    """A run-time error whose number has no class of its own."""


def _error_for(number, source, description):
    return _ERRORS.get(number, _OtherError)(number, source, description)


class StreamError(ValueError):
    """A stream that could not be read or written (from_bytes, to_bytes).
    `entries` holds the event-log entries the failed read or write wrote,
    in order."""

    def __init__(self, message, entries):
        super().__init__(message if not entries else f"{message}: {entries[0]}")
        self.entries = list(entries)


def query(obj, interface):
    """The object as `interface` (e.g. kvdata.IKVStream) when it implements
    it, else None."""
    return obj if isinstance(obj, interface) else None


# Enumerations are also reachable without their leading "e": kvdata.SC.SCI.
for _name in ("eSC", "eTestResult", "eXYZ", "eStreamDirection"):
    globals()[_name[1:]] = getattr(_kvdata, _name)
del _name

__all__ += ["Error", "StreamError", "query", "SC", "TestResult", "XYZ", "StreamDirection"] + [
    cls.__name__ for cls in _ERRORS.values()]
