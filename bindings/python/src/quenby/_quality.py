"""How natural a picture looks."""

from __future__ import annotations

from ctypes import byref
from dataclasses import dataclass

import numpy as np
import numpy.typing as npt

from ._library import CNiqe, call, niqe_model
from ._photos import Photo, opened
from ._pixels import AnyPhoto, floats, pixels_of, rgba_of

_block = 96


@dataclass(frozen=True, eq=False)
class Niqe:
    """A NIQE score and what it is made of."""

    score: float  #: Lower is better; NaN when a side is below 96 pixels.
    features: npt.NDArray[np.float32]  #: The 36 mean features; NaN when the picture is too small.
    blocks: npt.NDArray[np.float32]  #: (rows, columns): what each block of 96 x 96 alone would score.
    model: str = niqe_model  #: Scores compare only under one model.

    def __float__(self) -> float:
        return self.score


def niqe(photo: AnyPhoto) -> Niqe:
    """The NIQE score of a photo at its full size; files are shown upright first. Alpha is ignored."""
    pixels = opened(photo)
    rgba = pixels.rgba if isinstance(pixels, Photo) else rgba_of(pixels)
    given, result = pixels_of(rgba), CNiqe()
    blocks = np.empty((rgba.shape[0] // _block, rgba.shape[1] // _block), np.float32)
    call("niqe", byref(given), byref(result), floats(blocks), blocks.size)
    return Niqe(result.score, np.array(result.features, np.float32), blocks)


