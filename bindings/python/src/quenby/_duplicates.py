"""Near-duplicates: the same scene, a moment apart."""

from __future__ import annotations

import os
from collections.abc import Iterable
from concurrent.futures import ThreadPoolExecutor
from ctypes import byref, c_double, c_float, c_uint64
from dataclasses import dataclass
from typing import Any, Optional

import numpy as np
import numpy.typing as npt

from ._library import Cancel, Cancelled, COpenOptions, CPair, CPairs, CShot
from ._library import call, plain, pointer_of
from ._photos import Photo, open_options, opened
from ._pixels import AnyPhoto, Path, file_bytes, floats, pixels_of, rgba_of

Cdf = npt.NDArray[np.float32]

# As the command has it: without times, pictures that merely have as many dark and bright parts reach 0.
_least_untimed_score = 3.5


def _shot_of(file: bytes, options: COpenOptions, cancel: Optional[Cancel] = None) -> CShot:
    shot = CShot()
    call("read_shot", file, len(file), byref(options), pointer_of(cancel), byref(shot))
    return shot


def green_cdf(
    photo: AnyPhoto,
    *,
    max_bytes: Optional[int] = None,
    max_pixels: Optional[int] = None,
    max_scans: Optional[int] = None,
    max_segments: Optional[int] = None,
) -> Cdf:
    """The share of pixels whose green byte is at most i: 256 floats up to 1. Files are decoded at the size
    that find_duplicates reads, within limits that are those of read()."""
    options = open_options(
        max_bytes=max_bytes, max_pixels=max_pixels, max_scans=max_scans, max_segments=max_segments
    )
    file = file_bytes(photo, max_bytes)
    if file is not None:
        return np.array(_shot_of(file, options).green_cdf, np.float32)
    pixels = opened(photo)
    rgba = pixels.rgba if isinstance(pixels, Photo) else rgba_of(pixels)
    given, cdf = pixels_of(rgba), np.empty(256, np.float32)
    call("green_cdf", byref(given), floats(cdf))
    return cdf


def _cdf_of(photo_or_cdf: Any) -> Cdf:
    if isinstance(photo_or_cdf, np.ndarray) and photo_or_cdf.ndim == 1:
        if photo_or_cdf.shape != (256,):
            raise ValueError("a green CDF has 256 values")
        return np.ascontiguousarray(photo_or_cdf, np.float32)
    return green_cdf(photo_or_cdf)


def distance(a: Any, b: Any) -> float:
    """How far apart the light of two photos is, once a difference in exposure is taken out: 0 to 1; of a
    photo to itself about 0.001.

    a, b:  photos, or what green_cdf() gave of them.
    """
    result = c_float()
    one, other = _cdf_of(a), _cdf_of(b)
    call("distance", floats(one), floats(other), byref(result))
    return result.value


def dupe_score(distance: float, seconds: float, same_orientation: bool = True) -> float:
    """The duplicate score of two photos so far apart: larger is more likely, 0 the even chance, the same
    photo twice about 3.65. seconds lie between the two, of either sign."""
    result = c_float()
    call("dupe_score", distance, seconds, bool(same_orientation), byref(result))
    return result.value


def dupe_window(threshold: float = 0.0, same_orientation: bool = True) -> float:
    """The longest time between two photos, in seconds, that may reach a score: negative when none does,
    infinite when any does."""
    result = c_double()
    call("dupe_window", threshold, bool(same_orientation), byref(result))
    return result.value


@dataclass(frozen=True)
class Pair:
    """Two photos that reach the threshold."""

    first: str
    second: str
    score: float
    distance: float
    seconds: Optional[float]  #: Between them; None where not both times are known.
    same_orientation: bool


@dataclass(frozen=True)
class Group:
    """Photos of which every two are a pair."""

    paths: tuple[str, ...]
    pairs: tuple[Pair, ...]


@dataclass(frozen=True)
class Duplicates:
    """What find_duplicates found."""

    groups: tuple[Group, ...]
    #: What looks alike, with scores from 3 on, where a time is not known: no reason to remove any.
    look_alikes: tuple[Group, ...]
    failed: dict[str, Exception]  #: Photos that could not be read, and why.


def _groups(names: list[str], given: list[CPair]) -> tuple[Group, ...]:
    pairs, first_of = (CPair * len(given))(*given), (c_uint64 * len(names))()
    call("group_pairs", pairs, len(given), len(names), first_of)
    inside: dict[int, list[Pair]] = {}
    for pair in given:
        first = first_of[pair.first]
        if first != first_of[pair.second]:
            continue
        inside.setdefault(first, []).append(
            Pair(
                names[pair.first],
                names[pair.second],
                pair.score,
                pair.distance,
                pair.seconds if pair.times_known else None,
                bool(pair.same_orientation),
            )
        )
    return tuple(
        Group(
            tuple(name for name, of in zip(names, first_of) if of == first), tuple(inside[first])
        )
        for first in sorted(inside)
    )


def find_duplicates(
    paths: Iterable[Path],
    threshold: float = 1.5,
    *,
    workers: Optional[int] = None,
    max_bytes: Optional[int] = None,
    max_pixels: Optional[int] = None,
    max_scans: Optional[int] = None,
    max_segments: Optional[int] = None,
    cancel: Optional[Cancel] = None,
) -> Duplicates:
    """The near-duplicates among files, as `quenby dupes` finds them: shots of one scene a moment apart.
    Photos without a capture time are in no group; those that look alike are told apart from them.

    threshold:  the smallest score of a pair.
    workers:    how many files are read at once; as many as there are processors unless given.
    max_bytes, max_pixels, max_scans, max_segments:  limits for each file, as those of read().
    """
    options = open_options(
        max_bytes=max_bytes, max_pixels=max_pixels, max_scans=max_scans, max_segments=max_segments
    )
    names = list(dict.fromkeys(os.fspath(path) for path in paths))
    failed: dict[str, Exception] = {}

    def shot(name: str) -> Optional[CShot]:
        try:
            return _shot_of(file_bytes(name, max_bytes) or b"", options, cancel)
        except Cancelled:
            raise
        except (ValueError, OSError, MemoryError) as error:
            failed[name] = error
            return None

    with ThreadPoolExecutor(workers or os.cpu_count() or 1) as pool:
        shots = dict(zip(names, pool.map(shot, names)))
    found = {name: shot for name, shot in shots.items() if shot is not None}
    names = list(found)
    given, pairs = (CShot * len(names))(*found.values()), CPairs()
    del shots, found  # a kilobyte each
    call("find_pairs", given, len(names), threshold, pointer_of(cancel), byref(pairs))
    every = [CPair.from_buffer_copy(pair) for pair in pairs.data[: pairs.count]]
    plain("pairs_free", byref(pairs))
    timed = [pair for pair in every if pair.times_known]
    alike = [p for p in every if not p.times_known and p.score >= _least_untimed_score]
    return Duplicates(_groups(names, timed), _groups(names, alike), failed)
