"""Every function of the package with every kind of argument: it returns, or raises what the package says.

Functions and their parameters are those that the package has; one with a parameter of a new name fails
here until a right value of it is told.
"""

import dataclasses
import inspect

import numpy as np
import pytest
from conftest import jpeg, picture

import quenby

SMALL = picture(30, 20)
FILE = jpeg(SMALL)

RIGHT = {
    "a": SMALL,
    "after": None,
    "arc": 9,
    "b": SMALL,
    "cancel": None,
    "corners": None,
    "distance": 0.5,
    "faces": (),
    "filter": "WinterRGB",
    "format": "PNG",
    "keep": (),
    "known_faces": True,
    "like": None,
    "mark": True,
    "max_bytes": None,
    "max_pixels": None,
    "max_scans": None,
    "max_segments": None,
    "name": "winter",
    "out": None,
    "overwrite": True,
    "params": "",
    "path": "out.png",
    "paths": (),
    "photo": SMALL,
    "pixels": SMALL,
    "quality": 90,
    "rotate": 0,
    "same_orientation": True,
    "scale": 1,
    "seconds": 1.0,
    "slider": 0.4,
    "source": FILE,
    "strip": (),
    "subsampling": None,
    "suppress": True,
    "target": None,
    "threads": 1,
    "threshold": 20,
    "upright": True,
    "workers": 1,
}
RIGHT_OF_ONE = {("facts", "photo"): FILE, ("read", "photo"): FILE}

WRONG = [
    None,
    True,
    0,
    1,
    -1,
    2**31,
    2**63,
    -(2**64),
    2**200,
    0.5,
    float("nan"),
    float("inf"),
    1j,
    "",
    "text",
    "a\0b",
    "\ud800",
    "%s%n",
    b"",
    b"bytes",
    bytearray(9),
    [],
    [None],
    [3],
    [(1, 2, 3, 4, 5)],
    ["text"],
    {"slider": 3},
    object(),
    print,
    np.zeros((0, 0)),
    np.array(np.nan),
    np.zeros((20, 30), np.uint8),
    np.full((20, 30, 3), 7, np.uint8)[::-1, ::-1],
    np.zeros((256,), np.float32),
    np.array(["text", None], object),
]


def calls():
    """(name, function) of functions, of classes that are more than data, of their methods."""
    for name in quenby.__all__:
        thing = getattr(quenby, name)
        if inspect.isfunction(thing):
            yield name, thing
        elif inspect.isclass(thing) and not dataclasses.is_dataclass(thing):
            if not issubclass(thing, BaseException) and thing is not quenby.Photo:  # read() makes those
                yield name, thing
            if thing is quenby.Session:
                session = quenby.Session(SMALL)
                for method, function in inspect.getmembers(session, inspect.ismethod):
                    if not method.startswith("_") and method != "close":
                        yield f"{name}.{method}", function


def test_arguments_are_served_or_refused_as_the_package_says(tmp_path, monkeypatch):
    monkeypatch.chdir(tmp_path)
    refused = (ValueError, TypeError, OSError, MemoryError, quenby.Cancelled)
    before = quenby.enhance(SMALL)
    functions = tried = 0
    complaints = []
    for name, function in calls():
        functions += 1
        parameters = [
            parameter
            for parameter in inspect.signature(function).parameters.values()
            if parameter.kind is not parameter.VAR_KEYWORD
        ]
        right = {}
        for parameter in parameters:
            right[parameter.name] = RIGHT_OF_ONE.get((name, parameter.name), RIGHT[parameter.name])
        function(**right)
        for parameter in parameters:
            for value in WRONG:
                tried += 1
                try:
                    function(**{**right, parameter.name: value})
                except refused as error:
                    if not str(error):
                        complaints.append(f"{name}({parameter.name}={value!r}): no message")
                except BaseException as error:
                    complaints.append(f"{name}({parameter.name}={value!r}): {error!r}")
    print(f"{functions} functions, {tried} calls")
    assert not complaints, "\n".join(complaints)
    assert functions >= 25 and tried >= 3000
    assert not list(tmp_path.glob(".quenby*"))
    assert np.array_equal(quenby.enhance(SMALL), before)


@pytest.mark.parametrize(
    "call",
    [
        lambda: quenby.enhance(SMALL, nothing=1),
        lambda: quenby.filter_file(FILE, None, "AE0", slider=0.4, nothing=1),
        lambda: quenby.Session(SMALL).apply("AE0", slider=0.4, nothing=1),
    ],
)
def test_unknown_keywords_are_refused(call):
    with pytest.raises((TypeError, ValueError), match="nothing"):
        call()
