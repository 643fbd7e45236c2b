"""The C library, its structs, and what its errors are in Python."""

from __future__ import annotations

import ctypes
import os
import pathlib
import weakref
from ctypes import POINTER, byref, c_char, c_char_p, c_double, c_float, c_int32, c_size_t
from ctypes import c_uint32, c_uint64, c_void_p
from typing import Any, Optional

ABI = 1


class PhotoError(ValueError):
    """Bytes that are no photo, or one that cannot be read.

    kind: "empty", "not a photo", "unsupported", "damaged", "truncated" or "too large".
    """

    def __init__(self, message: str, kind: str) -> None:
        super().__init__(message, kind)
        self.kind = kind

    def __str__(self) -> str:
        return str(self.args[0])


class Cancelled(Exception):
    """A Cancel object asked the work to end."""


class CError(ctypes.Structure):
    _fields_ = [("kind", c_int32), ("message", c_char * 508)]


class CPixels(ctypes.Structure):
    _fields_ = [("rgba", c_void_p), ("width", c_uint32), ("height", c_uint32), ("stride", c_size_t)]


class CFace(ctypes.Structure):
    _fields_ = [
        ("left", c_float),
        ("top", c_float),
        ("right", c_float),
        ("bottom", c_float),
        ("in_pixels", c_uint32),
    ]


class Growing(ctypes.Structure):
    """A struct that says its size."""

    def __init__(self, **fields: Any) -> None:
        super().__init__(struct_size=ctypes.sizeof(self), **fields)


class CFilter(Growing):
    _fields_ = [
        ("struct_size", c_size_t),
        ("name", c_char_p),
        ("display_name", c_char_p),
        ("description", c_char_p),
        ("required", c_char_p),
        ("parameter_count", c_uint32),
        ("reads_faces", c_uint32),
    ]


class CParameter(Growing):
    _fields_ = [
        ("struct_size", c_size_t),
        ("name", c_char_p),
        ("description", c_char_p),
        ("wanted", c_char_p),
        ("only_with", c_char_p),
        ("kind", c_int32),
        ("required", c_uint32),
        ("lowest", c_float),
        ("highest", c_float),
        ("above_lowest", c_uint32),
        ("fewest", c_uint32),
        ("standard", c_float),
    ]


class CFault(ctypes.Structure):
    _fields_ = [("kind", c_int32), ("key", c_char * 60), ("message", c_char * 448)]


class CWorkers(Growing):
    _fields_ = [
        ("struct_size", c_size_t),
        ("count", c_size_t),
        ("context", c_void_p),
        ("run", c_void_p),
    ]


class COpenOptions(Growing):
    _fields_ = [
        ("struct_size", c_size_t),
        ("scale", c_int32),
        ("rotate", c_int32),
        ("max_pixels", c_uint64),
        ("max_scans", c_int32),
        ("flags", c_uint32),
        ("workers", POINTER(CWorkers)),
        ("max_scanned_pixels", c_uint64),
        ("max_compressed_pixels", c_uint64),
        ("max_segments", c_int32),
        ("max_bytes", c_uint64),
    ]


class CSaveOptions(Growing):
    _fields_ = [
        ("struct_size", c_size_t),
        ("quality", c_int32),
        ("flags", c_uint32),
        ("keep", c_uint32),
    ]


class CFacts(Growing):
    _fields_ = [
        ("struct_size", c_size_t),
        ("width", c_uint32),
        ("height", c_uint32),
        ("channels", c_int32),
        ("orientation", c_int32),
        ("progressive", c_uint32),
        ("has_alpha", c_uint32),
        ("wall_clock", c_double),
        ("utc", c_double),
        ("format", c_char * 16),
        ("capture_time", c_char * 64),
        ("last_edit", c_char * 96),
    ]


class CKnownFace(ctypes.Structure):
    _fields_ = [
        ("left", c_double),
        ("top", c_double),
        ("right", c_double),
        ("bottom", c_double),
        ("name", c_char * 96),
    ]


class CLoss(Growing):
    _fields_ = [("struct_size", c_size_t), ("what", c_char_p), ("why", c_char_p)]


class CShot(ctypes.Structure):
    _fields_ = [
        ("green_cdf", c_float * 256),
        ("orientation", c_int32),
        ("pixel_count", c_uint32),
        ("wall_clock", c_double),
        ("utc", c_double),
    ]


class CPair(ctypes.Structure):
    _fields_ = [
        ("first", c_uint64),
        ("second", c_uint64),
        ("seconds", c_double),
        ("score", c_float),
        ("distance", c_float),
        ("times_known", c_uint32),
        ("same_orientation", c_uint32),
    ]


class CPairs(ctypes.Structure):
    _fields_ = [("data", POINTER(CPair)), ("count", c_size_t)]


class CNiqe(Growing):
    _fields_ = [
        ("struct_size", c_size_t),
        ("score", c_float),
        ("block_columns", c_uint32),
        ("block_rows", c_uint32),
        ("features", c_float * 36),
    ]


class CCorner(ctypes.Structure):
    _fields_ = [("x", c_int32), ("y", c_int32), ("score", c_int32)]


class CCorners(ctypes.Structure):
    _fields_ = [("data", POINTER(CCorner)), ("count", c_size_t)]


class CDescriptor(ctypes.Structure):
    _fields_ = [("x", c_int32), ("y", c_int32), ("words", c_uint32 * 8)]


class CDescriptors(ctypes.Structure):
    _fields_ = [("data", POINTER(CDescriptor)), ("count", c_size_t)]


_file = (c_char_p, c_size_t)
_pixels = POINTER(CPixels)
_faces = (POINTER(CFace), c_size_t)
_floats = c_void_p
_object = POINTER(c_void_p)
_open = POINTER(COpenOptions)
_save = POINTER(CSaveOptions)

# What each function takes before the error.
_fallible: dict[str, tuple[Any, ...]] = {
    "cancel_new": (_object,),
    "cancel_new_after": (c_uint32, _object),
    "filter_count": (POINTER(c_size_t),),
    "filter_at": (c_size_t, POINTER(CFilter)),
    "filter_named": (c_char_p, POINTER(CFilter)),
    "parameter_at": (c_char_p, c_size_t, POINTER(CParameter)),
    "check_parameters": (c_char_p, c_char_p, POINTER(CFault), c_size_t, POINTER(c_size_t)),
    "read_facts_within": (*_file, _open, POINTER(CFacts)),
    "photo_open": (*_file, _open, c_void_p, _object),
    "photo_pixels": (c_void_p, _pixels),
    "photo_facts": (c_void_p, POINTER(CFacts)),
    "photo_faces": (c_void_p, POINTER(CKnownFace), c_size_t, POINTER(c_size_t)),
    "photo_save": (c_void_p, _pixels, c_char_p, _save, c_void_p, _object),
    "write": (_pixels, c_char_p, _save, c_void_p, _object),
    "filter_file": (*_file, c_char_p, c_char_p, *_faces, _open, c_char_p, _save, c_void_p, _object),
    "file_loss": (c_void_p, c_size_t, POINTER(CLoss)),
    "session_open": (_pixels, *_faces, c_uint32, _object),
    "session_open_photo": (c_void_p, *_faces, _object),
    "session_share": (c_void_p, POINTER(CWorkers)),
    "threads_new": (c_size_t, _object),
    "threads_lend": (c_void_p, POINTER(CWorkers)),
    "session_apply": (c_void_p, c_char_p, c_char_p, c_void_p, c_size_t, c_void_p),
    "green_cdf": (_pixels, _floats),
    "read_shot": (*_file, _open, c_void_p, POINTER(CShot)),
    "distance": (_floats, _floats, POINTER(c_float)),
    "dupe_score": (c_float, c_double, c_int32, POINTER(c_float)),
    "dupe_window": (c_float, c_int32, POINTER(c_double)),
    "find_pairs": (POINTER(CShot), c_size_t, c_float, c_void_p, POINTER(CPairs)),
    "group_pairs": (POINTER(CPair), c_size_t, c_size_t, POINTER(c_uint64)),
    "niqe": (_pixels, POINTER(CNiqe), _floats, c_size_t),
    "grey_of": (_pixels, c_void_p, c_size_t),
    "fast": (_pixels, c_int32, c_int32, c_int32, POINTER(CCorners)),
    "brief": (_pixels, POINTER(CCorner), c_size_t, POINTER(CDescriptors)),
}

_plain: dict[str, tuple[Any, ...]] = {
    "abi": (c_uint32,),
    "version": (c_char_p,),
    "niqe_model": (c_char_p,),
    "cancel_request": (None, c_void_p),
    "cancel_free": (None, c_void_p),
    "photo_free": (None, c_void_p),
    "photo_notice": (c_char_p, c_void_p, c_size_t),
    "file_data": (c_void_p, c_void_p),
    "file_size": (c_size_t, c_void_p),
    "file_loss_count": (c_size_t, c_void_p),
    "file_free": (None, c_void_p),
    "session_free": (None, c_void_p),
    "threads_free": (None, c_void_p),
    "pairs_free": (None, POINTER(CPairs)),
    "corners_free": (None, POINTER(CCorners)),
    "descriptors_free": (None, POINTER(CDescriptors)),
}


def _loaded() -> ctypes.CDLL:
    # A build of one's own, such as one with a sanitizer, in place of the library in the package.
    path = os.environ.get("QUENBY_LIBRARY") or pathlib.Path(__file__).with_name("libquenby.so")
    library = ctypes.CDLL(str(path))
    for name, types in _plain.items():
        function = getattr(library, "quenby_" + name)
        function.restype = types[0]
        function.argtypes = types[1:]
    if library.quenby_abi() != ABI:
        raise ImportError(f"{path} has the interface {library.quenby_abi()}, not {ABI}")
    for name, arguments in _fallible.items():
        function = getattr(library, "quenby_" + name)
        function.restype = c_int32
        function.argtypes = [*arguments, POINTER(CError)]
    return library


_library = _loaded()

_photo_kinds = {
    4: "empty",
    5: "not a photo",
    6: "unsupported",
    7: "damaged",
    8: "truncated",
    9: "too large",
}


def plain(name: str, *arguments: Any) -> Any:
    """Calls a function that cannot fail."""
    return getattr(_library, "quenby_" + name)(*arguments)


def call(name: str, *arguments: Any) -> None:
    """Calls a function, and raises what it ends with."""
    error = CError()
    try:
        kind = getattr(_library, "quenby_" + name)(*arguments, byref(error))
    except ctypes.ArgumentError as wrong:  # which is no TypeError of its own
        raise TypeError(f"{name}: {wrong}") from None
    if kind == 0:
        return
    message = error.message.decode(errors="replace")
    if kind in _photo_kinds:
        raise PhotoError(message, _photo_kinds[kind])
    if kind == 1:
        raise ValueError(message)
    if kind == 2:
        raise MemoryError(message)
    if kind == 3:
        raise Cancelled(message)
    raise RuntimeError(message)


class Handle:
    """An object of the library, freed when nobody has it any more."""

    def __init__(self, free: str, pointer: c_void_p) -> None:
        self.pointer = pointer
        self._free = weakref.finalize(self, plain, free, pointer)

    def close(self) -> None:
        self._free()


class Cancel:
    """A wish that work ends: pass it to calls, and call request() from any thread.

    Calls with it then raise Cancelled, between two of their steps; also those that only begin.

    after:  seconds from now on after which it asks by itself; None never does.
    """

    def __init__(self, after: Optional[float] = None) -> None:
        pointer = c_void_p()
        if after is None:
            call("cancel_new", byref(pointer))
        else:
            if not 0 <= after <= 4_000_000:
                raise ValueError("after: is not from 0 to 4000000 seconds")
            call("cancel_new_after", round(after * 1000), byref(pointer))
        self._handle = Handle("cancel_free", pointer)

    def request(self) -> None:
        """Asks every call with this object to end; nothing takes it back."""
        plain("cancel_request", self._handle.pointer)


class Threads:
    """Threads that share the work on one photo, until they are closed.

    count: with the one that calls; 0 for as many as there are cores.
    """

    def __init__(self, count: int) -> None:
        if not 0 <= count <= 1024:
            raise ValueError("threads: is not 0 to 1024")
        pointer = c_void_p()
        call("threads_new", count, byref(pointer))
        self._handle = Handle("threads_free", pointer)
        self.workers = CWorkers()
        call("threads_lend", pointer, byref(self.workers))

    def close(self) -> None:
        self._handle.close()


def pointer_of(cancel: Optional[Cancel]) -> Optional[c_void_p]:
    if cancel is None:
        return None
    if not isinstance(cancel, Cancel):
        raise TypeError(f"cancel: is no Cancel but {type(cancel).__name__}")
    return cancel._handle.pointer


def utf8(text: str) -> bytes:
    """A text for the library, which a zero byte would end."""
    if not isinstance(text, str):
        raise TypeError(f"wants a str, not {type(text).__name__}")
    if "\0" in text:
        raise ValueError("a zero character in a text")
    return text.encode()


__version__: str = plain("version").decode()
niqe_model: str = plain("niqe_model").decode()
