"""Filters on pixels."""

from __future__ import annotations

from collections.abc import Iterable
from ctypes import byref, c_void_p
from types import TracebackType
from typing import Any, Optional

import numpy as np

from ._filters import look_named, parameter_string
from ._library import Cancel, Handle, Threads, call, pointer_of, utf8
from ._photos import Photo, opened
from ._pixels import AnyPhoto, Bytes, Face, as_channels, faces_of, pixels_of, rgba_of
from ._pixels import rows_are_whole, stride_of

_borrow_pixels = 1


class Session:
    """One picture that filters are applied to, again and again: what a filter finds out about it is kept,
    so that moving a slider costs a fraction of the first application. Any number of threads may apply at
    once. The photo is copied, or shared with a Photo.

    threads: how many share the work of an application, 0 for as many as there are cores; the pixels are
             the same.

    with quenby.Session(photo) as session:
        for slider in (0.2, 0.4, 0.8):
            show(session.enhance(slider))
    """

    def __init__(self, photo: AnyPhoto, faces: Iterable[Face] = (), *, threads: int = 1) -> None:
        self._open(opened(photo), faces, threads, copies=True)

    def _open(self, photo: Any, faces: Iterable[Face], threads: int, copies: bool) -> "Session":
        self._threads = Threads(threads)
        boxes, pointer = faces_of(faces), c_void_p()
        if isinstance(photo, Photo):
            call("session_open_photo", photo._handle.pointer, *boxes, byref(pointer))
            self._shape = (photo.height, photo.width)
            self._channels = 4 if photo.facts.has_alpha else 3
        else:
            rgba = rgba_of(photo)
            self._borrowed = None if copies else rgba
            given = pixels_of(rgba)
            flags = 0 if copies else _borrow_pixels
            call("session_open", byref(given), *boxes, flags, byref(pointer))
            self._shape, self._channels = rgba.shape[:2], photo.shape[2]
        self._handle = Handle("session_free", pointer)
        if self._threads.workers.count > 1:
            call("session_share", pointer, byref(self._threads.workers))
        self._closed = False
        return self

    def apply(
        self,
        filter: str,
        *,
        params: Optional[str] = None,
        out: Optional[Bytes] = None,
        cancel: Optional[Cancel] = None,
        **parameters: Any,
    ) -> Bytes:
        """Applies a filter to the photo as it was given.

        params:   a parameter string, "slider=0.4;", in place of keywords.
        out:      where to write: (height, width, 4) bytes, writeable, each row in one piece. Without it
                  the result is a new array with as many channels as the photo has.
        """
        if self._closed:
            raise ValueError("the session is closed")
        if params is None:
            params = parameter_string(filter, parameters)
        elif parameters:
            raise TypeError("params or keywords, not both: " + ", ".join(parameters))
        made = np.empty((*self._shape, 4), np.uint8) if out is None else self._checked(out)
        call(
            "session_apply",
            self._handle.pointer,
            utf8(filter),
            utf8(params),
            made.ctypes.data,
            stride_of(made),
            pointer_of(cancel),
        )
        return made if out is not None else as_channels(made, self._channels)

    def _checked(self, out: Bytes) -> Bytes:
        if not isinstance(out, np.ndarray) or out.dtype != np.uint8:
            raise TypeError("out: is no array of bytes (uint8)")
        if out.shape != (*self._shape, 4):
            raise ValueError(f"out: is {out.shape}, not {(*self._shape, 4)}")
        if not out.flags.writeable or not rows_are_whole(out):
            raise ValueError("out: is read-only, or its rows are not in one piece each")
        return out

    def enhance(
        self, slider: float = 0.4, *, out: Optional[Bytes] = None, **options: Any
    ) -> Bytes:
        """apply() with the automatic enhancement; slider from 0 to 1."""
        return self.apply("AE0", out=out, slider=slider, **options)

    def look(self, name: str, *, out: Optional[Bytes] = None, **options: Any) -> Bytes:
        """apply() with a look, by its name or display name: "winter"."""
        return self.apply(look_named(name).name, out=out, **options)

    def close(self) -> None:
        """Frees what the session holds; not while another thread applies."""
        self._closed = True
        self._handle.close()
        self._threads.close()

    def __enter__(self) -> "Session":
        return self

    def __exit__(
        self,
        kind: Optional[type[BaseException]],
        error: Optional[BaseException],
        trace: Optional[TracebackType],
    ) -> None:
        self.close()


def apply(
    photo: AnyPhoto, filter: str, faces: Iterable[Face] = (), *, threads: int = 1, **options: Any
) -> Bytes:
    """A photo with a filter applied: (height, width, channels) bytes, upright, with as many channels as
    the photo has. threads as for Session; other options are those of Session.apply."""
    session = Session.__new__(Session)._open(opened(photo), faces, threads, copies=False)
    try:
        return session.apply(filter, **options)
    finally:
        session.close()


def enhance(
    photo: AnyPhoto, slider: float = 0.4, faces: Iterable[Face] = (), **options: Any
) -> Bytes:
    """A photo with the automatic enhancement; see apply(). slider goes from 0 to 1."""
    return apply(photo, "AE0", faces, slider=slider, **options)


def look(photo: AnyPhoto, name: str, **options: Any) -> Bytes:
    """A photo with a look, by its name or display name: quenby.look(photo, "winter")."""
    return apply(photo, look_named(name).name, **options)
