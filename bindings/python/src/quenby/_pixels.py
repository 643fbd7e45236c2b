"""Photos as pixels: arrays, PIL images, paths and bytes of files, and faces."""

from __future__ import annotations

import ctypes
import os
from collections.abc import Iterable, Sequence
from typing import Any, Optional, Union

import numpy as np
import numpy.typing as npt

from ._library import CFace, CPixels

Bytes = npt.NDArray[np.uint8]
Path = Union[str, "os.PathLike[str]"]
#: An array, a PIL image, a path or the bytes of a file, or a Photo.
AnyPhoto = Any
Face = Sequence[float]

# No face is twice as far to the right as the picture is wide.
_largest_fraction = 2.0


# As C has it.
_usual_max_bytes = 2**30


def _first_bytes(path: Path, most: int) -> bytes:
    with open(path, "rb") as file:
        # One byte more than there is, so that the end shows; a pipe has no size.
        parts = [file.read(min(os.fstat(file.fileno()).st_size + 1, most))]
        left = most - len(parts[0])
        while left > 0 and (part := file.read(min(2**20, left))):
            parts.append(part)
            left -= len(part)
    return b"".join(parts)


def file_bytes(photo: AnyPhoto, max_bytes: Optional[int] = None) -> Optional[bytes]:
    """What stands in a file: of a path, or bytes as they are; None for what is no file. Of a larger file
    as much as shows that it is one."""
    if isinstance(photo, (str, os.PathLike)):
        return _first_bytes(photo, max(1, max_bytes or _usual_max_bytes) + 1)
    if isinstance(photo, (bytes, bytearray, memoryview)):
        return bytes(photo)
    return None


def _is_pil(photo: Any) -> bool:
    return hasattr(photo, "mode") and hasattr(photo, "convert") and hasattr(photo, "getbands")


def array_of(photo: Any) -> Bytes:
    """The array of pixels that a photo is; its channels stay as they are."""
    if _is_pil(photo):
        has_alpha = "A" in photo.getbands() or "transparency" in getattr(photo, "info", {})
        photo = np.asarray(photo.convert("RGBA" if has_alpha else "RGB"))
    elif not isinstance(photo, np.ndarray) and not hasattr(photo, "__array_interface__"):
        raise TypeError(
            "a photo is an array, a PIL image, a path or bytes, not " + type(photo).__name__
        )
    array = np.asarray(photo)
    if array.dtype != np.uint8:
        raise TypeError(f"pixels are bytes (uint8), not {array.dtype}")
    if array.ndim != 3 or array.shape[2] not in (3, 4):
        raise ValueError(f"pixels are (height, width, 3 or 4), not {array.shape}")
    if array.shape[0] == 0 or array.shape[1] == 0:
        raise ValueError("the picture has no pixels")
    return array


def rgba_of(array: Bytes) -> Bytes:
    """Pixels of four channels, each row in one piece: the array itself where it is so."""
    height, width, channels = array.shape
    if channels == 3:
        rgba = np.empty((height, width, 4), np.uint8)
        rgba[..., :3] = array
        rgba[..., 3] = 255
        return rgba
    return array if rows_are_whole(array) else np.ascontiguousarray(array)


def rows_are_whole(array: Bytes) -> bool:
    """Whether an array of four channels is one that the library reads and writes in place."""
    height, width, channels = array.shape
    pixels_follow = width == 1 or array.strides[1] == 4
    rows_follow = height == 1 or array.strides[0] >= 4 * width
    return channels == 4 and array.strides[2] == 1 and pixels_follow and rows_follow


def stride_of(array: Bytes) -> int:
    """Bytes from row to row; a single row has none of its own."""
    row = array.shape[1] * (array.shape[2] if array.ndim == 3 else 1)
    return row if array.shape[0] == 1 else array.strides[0]


def pixels_of(array: Bytes) -> CPixels:
    """The struct for an array whose rows are whole; the array must stay while it is used."""
    return CPixels(array.ctypes.data, array.shape[1], array.shape[0], stride_of(array))


def as_channels(rgba: Bytes, channels: int) -> Bytes:
    return rgba if channels == 4 else np.ascontiguousarray(rgba[..., :3])


def faces_of(faces: Iterable[Face]) -> tuple[Any, int]:
    """An array of faces for the library, and how many they are."""
    boxes = []
    for face in faces:
        sides = [float(side) for side in face]
        if len(sides) != 4:
            raise ValueError("a face is (left, top, right, bottom)")
        if sides[0] > sides[2] or sides[1] > sides[3]:
            raise ValueError(f"the face {tuple(sides)} has its sides the wrong way round")
        boxes.append(CFace(*sides, in_pixels=max(sides) > _largest_fraction))
    return (CFace * len(boxes))(*boxes) if boxes else None, len(boxes)


def floats(values: npt.NDArray[np.float32]) -> ctypes.c_void_p:
    return ctypes.c_void_p(values.ctypes.data)
