"""Filters and looks, what they take, and the parameter strings they read."""

from __future__ import annotations

import math
from collections.abc import Iterable
from ctypes import byref, c_size_t
from dataclasses import dataclass
from typing import Any, Optional

from ._library import CFault, CFilter, CParameter, call, utf8

_kinds = ("number", "boolean", "numbers")
_fault_kinds = ("unknown", "missing", "unreadable", "misread", "ignored")


@dataclass(frozen=True)
class Parameter:
    """One key of a filter; nothing is clamped to its range."""

    name: str
    description: str
    wanted: str  #: "a number from 0 to 1"
    kind: str  #: "number", "boolean" or "numbers"
    required: bool
    lowest: float
    highest: float
    standard: Optional[float]  #: What counts without the key, or where to begin with a required one.
    only_with: str  #: The boolean without which this key does nothing; mostly "".


@dataclass(frozen=True)
class Filter:
    """A filter or look."""

    name: str  #: "AE0"
    display_name: str
    description: str
    reads_faces: bool
    required: str  #: The parameters it cannot do without: "slider=0.4;" or "".
    parameters: tuple[Parameter, ...]


@dataclass(frozen=True)
class Fault:
    """Something in a parameter string that does not mean what it seems to."""

    kind: str  #: "unknown", "missing", "unreadable", "misread" or "ignored"
    key: str
    message: str


def _parameter(filter: bytes, index: int) -> Parameter:
    row = CParameter()
    call("parameter_at", filter, index, byref(row))
    return Parameter(
        name=row.name.decode(),
        description=row.description.decode(),
        wanted=row.wanted.decode(),
        kind=_kinds[row.kind],
        required=bool(row.required),
        lowest=row.lowest,
        highest=row.highest,
        standard=None if math.isnan(row.standard) else row.standard,
        only_with=row.only_with.decode(),
    )


def filters() -> tuple[Filter, ...]:
    """Every filter and look, by name."""
    count = c_size_t()
    call("filter_count", byref(count))
    found = []
    for index in range(count.value):
        row = CFilter()
        call("filter_at", index, byref(row))
        found.append(
            Filter(
                name=row.name.decode(),
                display_name=row.display_name.decode(),
                description=row.description.decode(),
                reads_faces=bool(row.reads_faces),
                required=row.required.decode(),
                parameters=tuple(_parameter(row.name, i) for i in range(row.parameter_count)),
            )
        )
    return tuple(found)


def check_parameters(filter: str, params: str = "") -> list[Fault]:
    """What is wrong with a parameter string such as "slider=0.4;"; filters refuse the first three kinds
    and take the others in silence."""
    count = c_size_t()
    arguments = (utf8(filter), utf8(params))
    call("check_parameters", *arguments, None, 0, byref(count))
    faults = (CFault * count.value)()
    call("check_parameters", *arguments, faults, count.value, byref(count))
    return [
        Fault(
            _fault_kinds[fault.kind],
            fault.key.decode(errors="replace"),
            fault.message.decode(errors="replace"),
        )
        for fault in faults
    ]


def look_named(name: str) -> Filter:
    """The filter a user means: its name or display name in any letters; of several with one display
    name the first."""
    utf8(name)
    shown_so = None
    for filter in filters():
        if filter.name.lower() == name.lower():
            return filter
        if shown_so is None and filter.display_name.lower() == name.lower():
            shown_so = filter
    if shown_so is None:
        names = ", ".join(sorted({filter.display_name for filter in filters()}))
        raise ValueError(f"there is no look '{name}'; there are {names}")
    return shown_so


def _text(value: Any, parameter: Optional[Parameter], zero_and_one: bool) -> str:
    if isinstance(value, str):
        return value
    if isinstance(value, bool) or (parameter is not None and parameter.kind == "boolean"):
        return str(int(bool(value))) if zero_and_one else str(bool(value)).lower()
    if isinstance(value, Iterable):
        return "".join(repr(float(number)) + "," for number in value)
    return repr(float(value))


def parameter_string(filter: str, values: dict[str, Any]) -> str:
    """The parameter string of keyword arguments: numbers, booleans, lists of numbers, or texts."""
    rows: dict[str, Parameter] = {}
    for known in filters():
        if known.name == filter:
            rows = {row.name: row for row in known.parameters}
    parts = []
    for key, value in values.items():
        row = rows.get(key)
        zero_and_one = row is not None and "0 or 1" in row.wanted
        parts.append(f"{key}={_text(value, row, zero_and_one)};")
    return "".join(parts)
