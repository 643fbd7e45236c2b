"""Whole photos: files in, files out, with their metadata."""

from __future__ import annotations

import ctypes
import math
import os
import secrets
from collections.abc import Iterable
from ctypes import byref, c_size_t, c_void_p
from dataclasses import dataclass
from typing import Any, Optional, Union

import numpy as np

from ._filters import look_named, parameter_string
from ._library import Cancel, CFacts, CKnownFace, CLoss, COpenOptions, CPixels, CSaveOptions
from ._library import Handle, Threads, call, plain, pointer_of, utf8
from ._pixels import AnyPhoto, Bytes, Face, Path, array_of, faces_of, file_bytes, pixels_of, rgba_of

_as_stored, _ignore_known_faces = 1, 2
_drop = {"all": 1, "gps": 2, "thumbnail": 4, "gain map": 8}
_kinds = {"copyright": 1, "time": 2, "exif": 4, "xmp": 8, "iptc": 16, "gain map": 32}
_formats = {".jpg": "JPEG", ".jpeg": "JPEG", ".jpe": "JPEG", ".png": "PNG"}


@dataclass(frozen=True)
class Facts:
    """What a file says before its picture data; the size is the stored one, before any turning."""

    format: str  #: "JPEG" or "PNG"
    width: int
    height: int
    channels: int  #: 1 grey, 2 grey and alpha, 3 colour, 4 CMYK or colour and alpha.
    progressive: bool
    has_alpha: bool
    orientation: int  #: EXIF, 1 ... 8.
    capture_time: Optional[str]  #: "2024-05-01T12:30:45+02:00"
    wall_clock: Optional[float]  #: Capture time in seconds since 1970 by the clock of its place.
    utc: Optional[float]  #: The same in UTC, where the offset is known.
    last_edit: Optional[str]  #: By Quenby, as the file tells: "AE0, slider 0.4".


@dataclass(frozen=True)
class KnownFace:
    """A face that a file knows of, in fractions of the upright picture."""

    left: float
    top: float
    right: float
    bottom: float
    name: str  #: Of the person; empty where none is stated.


@dataclass(frozen=True)
class Loss:
    """Something that the photo had and the file made of it has not."""

    what: str
    why: str


def _facts(given: CFacts) -> Facts:
    def known(seconds: float) -> Optional[float]:
        return None if math.isnan(seconds) else seconds

    return Facts(
        format=given.format.decode(),
        width=given.width,
        height=given.height,
        channels=given.channels,
        progressive=bool(given.progressive),
        has_alpha=bool(given.has_alpha),
        orientation=given.orientation,
        capture_time=given.capture_time.decode(errors="replace") or None,
        wall_clock=known(given.wall_clock),
        utc=known(given.utc),
        last_edit=given.last_edit.decode(errors="replace") or None,
    )


def facts(
    photo: Union[Path, bytes],
    *,
    max_bytes: Optional[int] = None,
    max_pixels: Optional[int] = None,
    max_scans: Optional[int] = None,
    max_segments: Optional[int] = None,
) -> Facts:
    """What a file says, without decoding it; limits are those of read()."""
    options = open_options(
        max_bytes=max_bytes, max_pixels=max_pixels, max_scans=max_scans, max_segments=max_segments
    )
    data = _required_bytes(photo, max_bytes)
    given = CFacts()
    call("read_facts_within", data, len(data), byref(options), byref(given))
    return _facts(given)


def _required_bytes(photo: Union[Path, bytes], max_bytes: Optional[int]) -> bytes:
    data = file_bytes(photo, max_bytes)
    if data is None:
        raise TypeError(f"a file is a path or bytes, not {type(photo).__name__}")
    return data


def open_options(
    scale: int = 1,
    rotate: int = 0,
    upright: bool = True,
    known_faces: bool = True,
    max_bytes: Optional[int] = None,
    max_pixels: Optional[int] = None,
    max_scans: Optional[int] = None,
    max_segments: Optional[int] = None,
) -> COpenOptions:
    for name, value in (
        ("max_bytes", max_bytes),
        ("max_pixels", max_pixels),
        ("max_scans", max_scans),
        ("max_segments", max_segments),
    ):
        if value is not None and value < 1:
            raise ValueError(f"{name}: is below 1")
    if scale not in (1, 2, 4, 8):
        raise ValueError("scale: is not 1, 2, 4 or 8")
    if rotate % 90 != 0:
        raise ValueError("rotate: is no multiple of 90")
    flags = (0 if upright else _as_stored) | (0 if known_faces else _ignore_known_faces)
    return COpenOptions(
        scale=scale,
        rotate=rotate % 360,
        max_pixels=min(max_pixels or 0, 2**64 - 1),
        max_scans=min(max_scans or 0, 2**31 - 1),
        flags=flags,
        max_segments=min(max_segments or 0, 2**31 - 1),
        max_bytes=min(max_bytes or 0, 2**64 - 1),
    )


def _bits(name: str, chosen: Iterable[str], known: dict[str, int]) -> int:
    bits = 0
    for what in [chosen] if isinstance(chosen, str) else chosen:
        if what not in known:
            raise ValueError(f"{name}: '{what}' is none of {', '.join(known)}")
        bits |= known[what]
    return bits


_no_mark, _source_quality = 16, 32
_subsampling = {444: 64, 422: 128, 420: 256}


def _save_options(
    quality: Union[int, str],
    strip: Iterable[str],
    keep: Iterable[str],
    subsampling: Optional[int],
    mark: bool = True,
) -> CSaveOptions:
    flags = _bits("strip", strip, _drop) | (0 if mark else _no_mark)
    if quality == "auto":
        flags |= _source_quality
        quality = 90
    if not isinstance(quality, int) or not 1 <= quality <= 100:
        raise ValueError('quality: is not from 1 to 100, or "auto"')
    if subsampling is not None:
        if subsampling not in _subsampling:
            raise ValueError("subsampling: is none of 444, 422, 420")
        flags |= _subsampling[subsampling]
    return CSaveOptions(quality=quality, flags=flags, keep=_bits("keep", keep, _kinds))


class Photo:
    """A decoded photo, upright, with what its file says. Made by read()."""

    def __init__(self, data: bytes, options: dict[str, Any], cancel: Optional[Cancel]) -> None:
        pointer = c_void_p()
        given = open_options(**options)
        call("photo_open", data, len(data), byref(given), pointer_of(cancel), byref(pointer))
        self._made_of = (data, options)
        self._handle = Handle("photo_free", pointer)
        pixels = CPixels()
        call("photo_pixels", pointer, byref(pixels))
        memory = (ctypes.c_uint8 * (pixels.height * pixels.stride)).from_address(pixels.rgba)
        memory._photo = self._handle  # which the array then keeps
        array = np.frombuffer(memory, np.uint8).reshape(pixels.height, pixels.width, 4)
        array.flags.writeable = False
        self.rgba: Bytes = array  #: (height, width, 4), upright, read-only, not a copy.
        given_facts = CFacts()
        call("photo_facts", pointer, byref(given_facts))
        self.facts = _facts(given_facts)
        count = c_size_t()
        call("photo_faces", pointer, None, 0, byref(count))
        faces = (CKnownFace * count.value)()
        call("photo_faces", pointer, faces, count.value, byref(count))
        #: Those that the file knows of.
        self.faces = tuple(
            KnownFace(f.left, f.top, f.right, f.bottom, f.name.decode(errors="replace"))
            for f in faces
        )
        notices: list[str] = []
        while (text := plain("photo_notice", pointer, len(notices))) is not None:
            notices.append(text.decode(errors="replace"))
        #: What a user should know: "16 bits a channel, read as 8".
        self.notices = tuple(notices)

    @property
    def rgb(self) -> Bytes:
        """(height, width, 3); a view without the alpha."""
        return self.rgba[..., :3]

    @property
    def width(self) -> int:
        return int(self.rgba.shape[1])

    @property
    def height(self) -> int:
        return int(self.rgba.shape[0])

    def __array__(self, dtype: Any = None, copy: Optional[bool] = None) -> Any:
        array = self.rgba if self.facts.has_alpha else self.rgb
        return array.copy() if copy else array

    def __reduce__(self) -> Any:
        return Photo, (*self._made_of, None)

    def __repr__(self) -> str:
        return f"<quenby.Photo {self.facts.format} {self.width}x{self.height}>"


def read(
    photo: Union[Path, bytes],
    *,
    scale: int = 1,
    rotate: int = 0,
    upright: bool = True,
    known_faces: bool = True,
    max_bytes: Optional[int] = None,
    max_pixels: Optional[int] = None,
    max_scans: Optional[int] = None,
    max_segments: Optional[int] = None,
    cancel: Optional[Cancel] = None,
) -> Photo:
    """Decodes a JPEG or PNG file, all of it or PhotoError.

    scale:       1, 2, 4 or 8: what the sides are divided by, rounded up.
    rotate:      degrees clockwise beyond upright, a multiple of 90.
    upright:     else the picture is as it is stored.
    max_pixels:  the largest picture to decode, 268435456 unless given; likewise max_bytes, 2**30, of the
                 file, max_scans, 100, and max_segments, 4096, of a JPEG file.
    cancel:      Cancel(after=5) limits the time.
    """
    options = dict(
        scale=scale,
        rotate=rotate,
        upright=upright,
        known_faces=known_faces,
        max_bytes=max_bytes,
        max_pixels=max_pixels,
        max_scans=max_scans,
        max_segments=max_segments,
    )
    return Photo(_required_bytes(photo, max_bytes), options, cancel)


def opened(photo: AnyPhoto) -> Union[Photo, Bytes]:
    """A file or Photo as a Photo, all else as the array of its pixels."""
    if isinstance(photo, Photo):
        return photo
    data = file_bytes(photo)
    return array_of(photo) if data is None else Photo(data, {}, None)


def _taken(pointer: c_void_p) -> tuple[bytes, list[Loss]]:
    file = Handle("file_free", pointer)
    data = ctypes.string_at(plain("file_data", pointer), plain("file_size", pointer))
    losses = []
    for index in range(plain("file_loss_count", pointer)):
        loss = CLoss()
        call("file_loss", pointer, index, byref(loss))
        losses.append(Loss(loss.what.decode(errors="replace"), loss.why.decode(errors="replace")))
    file.close()
    return data, losses


def _encoded(
    pixels: AnyPhoto,
    format: str,
    like: Optional[Photo],
    quality: Union[int, str],
    strip: Iterable[str],
    keep: Iterable[str],
    subsampling: Optional[int],
    cancel: Optional[Cancel],
) -> tuple[bytes, list[Loss]]:
    save = _save_options(quality, strip, keep, subsampling)
    if like is not None and not isinstance(like, Photo):
        raise TypeError(f"like: is no Photo but {type(like).__name__}")
    rgba = pixels.rgba if isinstance(pixels, Photo) else rgba_of(array_of(pixels))
    given, pointer = pixels_of(rgba), c_void_p()
    rest = (byref(given), utf8(format), byref(save), pointer_of(cancel), byref(pointer))
    if like is None:
        call("write", *rest)
    else:
        call("photo_save", like._handle.pointer, *rest)
    return _taken(pointer)


def encode(
    pixels: AnyPhoto,
    format: str = "JPEG",
    *,
    like: Optional[Photo] = None,
    quality: Union[int, str] = 90,
    strip: Iterable[str] = (),
    keep: Iterable[str] = (),
    subsampling: Optional[int] = None,
    cancel: Optional[Cancel] = None,
) -> bytes:
    """The bytes of a file with these pixels.

    like:         a photo of the same size whose metadata goes with them, made to say what the
                  picture is; JPEG files are coded like its own.
    quality:      1 to 100, or "auto": what the file of `like` seems to have.
    strip:        of the metadata: "all" but the colour profile, "gps", "thumbnail", "gain map".
    keep:         these kinds of it and the colour profile alone: "copyright", "time", "exif", "xmp",
                  "iptc", "gain map"; all kinds unless given.
    subsampling:  of a JPEG file: 444, 422 or 420.
    """
    return _encoded(pixels, format, like, quality, strip, keep, subsampling, cancel)[0]


def _format_for(path: Path) -> str:
    extension = os.path.splitext(os.fspath(path))[1].lower()
    if extension not in _formats:
        raise ValueError(f"'{extension}' is no format that can be written: {', '.join(_formats)}")
    return _formats[extension]


def _usual_permissions(folder: str, unused_name: str) -> int:
    """What others may do with a new file in a folder, as the process's mask or its own rules have it."""
    try:
        probe = os.open(folder or ".", os.O_TMPFILE | os.O_RDWR | os.O_CLOEXEC, 0o666)
    except (OSError, AttributeError):  # file systems and systems without nameless files
        probe = os.open(unused_name, os.O_RDWR | os.O_CREAT | os.O_EXCL | os.O_CLOEXEC, 0o666)
        os.unlink(unused_name)
    try:
        return os.fstat(probe).st_mode & 0o777
    finally:
        os.close(probe)


def _put(path: Path, data: bytes, overwrite: bool) -> None:
    """Whole or not at all."""
    target = os.path.realpath(os.fspath(path))
    if os.path.exists(target) and not os.path.isfile(target):
        with open(target, "wb") as special:  # a pipe or device; a folder is an error
            special.write(data)
        return
    if not overwrite and os.path.lexists(target):
        raise FileExistsError(17, "exists already; overwrite=True replaces it", os.fspath(path))
    folder = os.path.dirname(target)
    temporary = os.path.join(folder, f".quenby-{secrets.token_hex(8)}")
    exists = os.path.exists(target)
    mode = os.stat(target).st_mode & 0o7777 if exists else _usual_permissions(folder, temporary)
    # Nobody else has it before it is whole.
    descriptor = os.open(temporary, os.O_WRONLY | os.O_CREAT | os.O_EXCL | os.O_CLOEXEC, 0o600)
    try:
        with os.fdopen(descriptor, "wb") as file:
            file.write(data)
        os.chmod(temporary, mode)
        if overwrite:
            os.replace(temporary, target)
        else:
            os.link(temporary, target)  # which replaces nothing that came meanwhile
    finally:
        if os.path.exists(temporary):
            os.unlink(temporary)


def write(
    path: Path,
    pixels: AnyPhoto,
    *,
    like: Optional[Photo] = None,
    quality: Union[int, str] = 90,
    strip: Iterable[str] = (),
    keep: Iterable[str] = (),
    subsampling: Optional[int] = None,
    overwrite: bool = False,
    cancel: Optional[Cancel] = None,
) -> list[Loss]:
    """Writes pixels to a file, in the format that its name says; see encode(). Returns what of the
    metadata is not in it. The file appears whole or not at all."""
    data, losses = _encoded(
        pixels, _format_for(path), like, quality, strip, keep, subsampling, cancel
    )
    _put(path, data, overwrite)
    return losses


def filter_file(
    source: Union[Path, bytes],
    target: Optional[Path],
    filter: str,
    faces: Iterable[Face] = (),
    *,
    params: Optional[str] = None,
    format: Optional[str] = None,
    quality: Union[int, str] = 90,
    subsampling: Optional[int] = None,
    mark: bool = True,
    rotate: int = 0,
    scale: int = 1,
    known_faces: bool = True,
    strip: Iterable[str] = (),
    keep: Iterable[str] = (),
    max_bytes: Optional[int] = None,
    max_pixels: Optional[int] = None,
    max_scans: Optional[int] = None,
    max_segments: Optional[int] = None,
    overwrite: bool = False,
    cancel: Optional[Cancel] = None,
    threads: int = 1,
    **parameters: Any,
) -> Any:
    """The file that `quenby enhance` makes of a file with these options: upright, filtered, with its
    metadata kept.

    target:      a path whose extension says the format; None gives the bytes back, in `format` or
                 that of the source.
    params:      a parameter string, "slider=0.4;", in place of keywords.
    threads:     how many share the work, 0 for as many as there are cores; the file is the same.
    mark:        whether the file tells of the edit. A photo that tells of one is edited all the
                 same; see Facts.last_edit.
    max_bytes, max_pixels, max_scans, max_segments:  limits, as those of read().

    Returns the losses of metadata, a list; without a target the bytes and that list.
    """
    if params is None:
        params = parameter_string(filter, parameters)
    elif parameters:
        raise TypeError("params or keywords, not both: " + ", ".join(parameters))
    if target is not None:
        format = _format_for(target)
    data = _required_bytes(source, max_bytes)
    open = open_options(
        scale, rotate, True, known_faces, max_bytes, max_pixels, max_scans, max_segments
    )
    save, pointer = _save_options(quality, strip, keep, subsampling, mark), c_void_p()
    arguments = (data, len(data), utf8(filter), utf8(params), *faces_of(faces), byref(open))
    rest = (None if format is None else utf8(format), byref(save), pointer_of(cancel))
    sharing = Threads(threads)
    try:
        if sharing.workers.count > 1:
            open.workers = ctypes.pointer(sharing.workers)
        call("filter_file", *arguments, *rest, byref(pointer))
    finally:
        sharing.close()
    made, losses = _taken(pointer)
    if target is None:
        return made, losses
    _put(target, made, overwrite)
    return losses


def enhance_file(
    source: Union[Path, bytes],
    target: Optional[Path],
    slider: float = 0.4,
    faces: Iterable[Face] = (),
    **options: Any,
) -> Any:
    """filter_file() with the automatic enhancement; slider from 0 to 1."""
    return filter_file(source, target, "AE0", faces, slider=slider, **options)


def look_file(
    source: Union[Path, bytes], target: Optional[Path], name: str, **options: Any
) -> Any:
    """filter_file() with a look, by its name or display name: "winter"."""
    return filter_file(source, target, look_named(name).name, **options)
