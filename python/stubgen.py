"""Writes the type stubs of the compiled module, _kvdata.pyi, and the py.typed
marker into the package folder, from the module itself: its classes,
enumerations, functions and properties with the signatures pybind11 puts
first in each docstring. Run after every build of the module:

    python3 python/stubgen.py build/dev/python/kvdata

The stubs are checked before they are written: they parse, and every name
they use is defined. A signature that names a type Python cannot spell
becomes typing.Any.
"""

import ast
import importlib
import inspect
import pathlib
import re
import sys
import typing

HEADER = '''"""Type stubs of kvdata._kvdata, generated from the module by python/stubgen.py."""
# ruff: noqa
import os
import typing
from typing import Any, Callable, Dict, Iterator, List, Optional, Tuple, Union
import numpy
'''
OVERLOAD = re.compile(r"^\d+\. (.*)$", re.M)
# The library's value types, as the documentation of fields and properties names them.
VALUE_TYPES = {"String": "str", "Single": "float", "Double": "float", "Long": "int",
               "Integer": "int", "Boolean": "bool", "Variant": "Any"}


def spell(text):
    """A pybind11 type name as a stub spells it."""
    text = text.replace("kvdata._kvdata.", "")
    text = re.sub(r"numpy\.ndarray\[[^\]]*\]", "numpy.ndarray", text)
    text = re.sub(r"\bhandle\b", "object", text)
    text = re.sub(r"\bbuffer\b", "object", text)
    return "typing.Any" if "::" in text or "<" in text else text


def value_type(words):
    """The stub type of a value documented as `words` ("Single", "tUser or None")."""
    name, _, rest = words.strip().partition(" ")
    name = VALUE_TYPES.get(name, name)
    return f"Optional[{name}]" if rest == "or None" else name


def split_top(text):
    """The comma-separated parts of text outside brackets."""
    parts, depth, start = [], 0, 0
    for i, c in enumerate(text):
        depth += c in "[(" and 1 or c in "])" and -1 or 0
        if c == "," and depth == 0:
            parts.append(text[start:i])
            start = i + 1
    return [p.strip() for p in parts + [text[start:]] if p.strip()]


def signature(line, name, method):
    """`def name(...) -> T: ...` from the first line of a pybind11 docstring."""
    match = re.match(rf"^{re.escape(name)}\((.*)\)(?: -> (.*))?$", line.strip())
    if not match and name.startswith("__"):
        return None
    if not match:
        params, result = (["self"] if method else []) + ["*args: Any", "**kwargs: Any"], "Any"
    else:
        params = []
        for p in split_top(match.group(1)):
            head, _, default = p.partition(" = ")
            pname, _, ptype = head.partition(": ")
            params.append(pname + (f": {spell(ptype)}" if ptype and pname != "self" else "")
                          + (" = ..." if default else ""))
        result = spell(match.group(2) or "None")
    return f"def {name}({', '.join(params)}) -> {result}: ..."


def routine(name, func, indent, method=False, static=False):
    """The stub of a function, one per overload."""
    doc = (func.__doc__ or "").strip()
    overloads = OVERLOAD.findall(doc) if "Overloaded function." in doc else []
    lines = []
    for line in overloads or [doc.splitlines()[0] if doc else ""]:
        stub = signature(line, name, method)
        if stub is None:
            continue
        lines += [indent + "@typing.overload"] if overloads else []
        lines += [indent + "@staticmethod"] if static else []
        lines.append(indent + stub)
    return lines


DUNDERS = {"__init__", "__call__", "__getitem__", "__setitem__", "__len__", "__iter__", "__eq__",
           "__bytes__", "__float__", "__lt__", "__copy__", "__deepcopy__"}


def class_lines(name, cls):
    bases = [b.__name__ for b in cls.__bases__ if b.__module__ == cls.__module__]
    lines = [f"class {name}({', '.join(bases)}):" if bases else f"class {name}:"]
    members = getattr(cls, "__members__", {})
    # A record's fields are listed in its documentation as "name: type".
    fields = dict(re.findall(r"^  (\w+): (.+)$", cls.__doc__ or "", re.M))
    for key, value in vars(cls).items():
        if key in members:
            lines.append(f"    {key}: typing.ClassVar[{name}]")
        elif isinstance(value, property):
            first = ((value.fget.__doc__ or "") if value.fget else "").strip().split("\n")[0]
            result = spell(first.rpartition(" -> ")[2]) if " -> " in first else "Any"
            if result == "object" and key in fields:
                result = value_type(fields[key])
            elif result == "object" and value.__doc__ and "." in value.__doc__:
                result = value_type(value.__doc__.split(".")[0])
            lines.append(f"    {key}: {result}")
        elif key.startswith("__") and key not in DUNDERS:
            continue
        elif isinstance(value, staticmethod):
            lines += routine(key, value.__func__, "    ", static=True)
        elif callable(value) and not inspect.isclass(value):
            lines += routine(key, value, "    ", method=True)
    return lines + (["    ..."] if len(lines) == 1 else [])


def check(text):
    """Raises unless the stubs parse and every name they use is defined."""
    ast.parse(text)
    names = {}
    exec(compile("from __future__ import annotations\n" + text, "_kvdata.pyi", "exec"), names)
    for obj in list(names.values()):
        for target in [obj] + (list(vars(obj).values()) if inspect.isclass(obj) else []):
            target = getattr(target, "__func__", target)     # a staticmethod's function
            if inspect.isclass(target) or inspect.isfunction(target):
                typing.get_type_hints(target, globalns=names)


def main(package_dir):
    folder = pathlib.Path(package_dir).resolve()
    sys.path.insert(0, str(folder.parent))         # this package, not the sources beside this file
    module = importlib.import_module("kvdata._kvdata")
    out = [HEADER]
    for name, obj in vars(module).items():
        if name.startswith("__"):
            continue
        if inspect.isclass(obj):
            out += class_lines(name, obj) + [""]
        elif callable(obj):
            out += routine(name, obj, "") + [""]
    text = "\n".join(out)
    check(text)
    (folder / "_kvdata.pyi").write_text(text)
    (folder / "py.typed").write_text("")


if __name__ == "__main__":
    main(sys.argv[1])
