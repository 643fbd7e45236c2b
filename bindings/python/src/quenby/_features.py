"""Corners and their descriptors."""

from __future__ import annotations

from ctypes import POINTER, byref, c_void_p, cast
from dataclasses import dataclass
from typing import Any, Optional

import numpy as np
import numpy.typing as npt

from ._library import CCorner, CCorners, CDescriptors, CPixels, call, plain
from ._photos import Photo, opened
from ._pixels import AnyPhoto, Bytes, pixels_of, rgba_of, stride_of


@dataclass(frozen=True, eq=False)
class Keypoints:
    """Corners with their BRIEF descriptors; the number of bits in which two descriptors differ tells how
    unlike the corners are."""

    positions: npt.NDArray[np.int32]  #: (n, 2): column, row.
    descriptors: Bytes  #: (n, 32): bit i is bit i mod 8 of byte i // 8.


def _grey_of(photo: AnyPhoto) -> Bytes:
    """The green channel; a grey picture, (height, width) bytes, as it is."""
    if isinstance(photo, np.ndarray) and photo.ndim == 2:
        if photo.dtype != np.uint8:
            raise TypeError(f"pixels are bytes (uint8), not {photo.dtype}")
        if photo.size == 0:
            raise ValueError("the picture has no pixels")
        whole = (photo.shape[1] == 1 or photo.strides[1] == 1) and (
            photo.shape[0] == 1 or photo.strides[0] >= photo.shape[1]
        )
        return photo if whole else np.ascontiguousarray(photo)
    pixels = opened(photo)
    rgba = pixels.rgba if isinstance(pixels, Photo) else rgba_of(pixels)
    height, width = rgba.shape[:2]
    grey = np.empty((height, width), np.uint8)
    given = pixels_of(rgba)
    call("grey_of", byref(given), grey.ctypes.data, width)
    return grey


def _struct_of(grey: Bytes) -> CPixels:
    return CPixels(grey.ctypes.data, grey.shape[1], grey.shape[0], stride_of(grey))


def _taken(array: Any, dtype: Any, columns: int) -> Any:
    """A copy of what the library gave."""
    if array.count == 0:
        return np.empty((0, columns), dtype)
    pointer = cast(array.data, POINTER(np.ctypeslib.as_ctypes_type(dtype)))
    return np.ctypeslib.as_array(pointer, (array.count, columns)).copy()


def fast(
    photo: AnyPhoto, threshold: int = 20, *, arc: int = 9, suppress: bool = True
) -> npt.NDArray[np.int32]:
    """FAST corners in raster order: (n, 3) of column, row and score.

    photo:      the green channel counts; a grey picture, (height, width) bytes, is taken as it is.
    threshold:  by more than how much the circle around a corner differs.
    arc:        how many neighbouring pixels of the circle do, 9 to 12.
    suppress:   only corners that score higher than all their neighbours.
    """
    grey, corners = _grey_of(photo), CCorners()
    given = _struct_of(grey)
    threshold = max(-(2**31), min(threshold, 2**31 - 1))
    call("fast", byref(given), arc, threshold, bool(suppress), byref(corners))
    try:
        found: npt.NDArray[np.int32] = _taken(corners, np.int32, 3)
    finally:
        plain("corners_free", byref(corners))
    return found


def brief(
    photo: AnyPhoto, corners: Optional[npt.ArrayLike] = None, *, threshold: int = 20
) -> Keypoints:
    """BRIEF descriptors of corners; those within 15 pixels of a border are left out.

    corners:  (n, 2 or more) of column and row, such as fast() gives; without them, fast(photo, threshold).
    """
    grey = _grey_of(photo)
    given, described = _struct_of(grey), CDescriptors()
    at = np.asarray(fast(grey, threshold) if corners is None else corners)
    if at.size == 0:
        at = np.empty((0, 2), np.int32)
    if at.ndim != 2 or at.shape[1] < 2:
        raise ValueError(f"corners are (n, 2 or more), not {at.shape}")
    if not np.issubdtype(at.dtype, np.integer):
        raise TypeError(f"corners are whole numbers, not {at.dtype}")
    columns = np.zeros((len(at), 3), np.int32)
    columns[:, :2] = np.clip(at[:, :2], -(2**31), 2**31 - 1)
    call(
        "brief",
        byref(given),
        cast(c_void_p(columns.ctypes.data), POINTER(CCorner)),
        len(columns),
        byref(described),
    )
    try:
        words = _taken(described, np.int32, 10)
    finally:
        plain("descriptors_free", byref(described))
    bits = np.ascontiguousarray(words[:, 2:]).astype("<i4").view(np.uint8).reshape(len(words), 32)
    return Keypoints(np.ascontiguousarray(words[:, :2]), bits)
