"""Makes photos better: enhancement and looks, near-duplicates, quality, corners.

A photo, wherever one is wanted, is an array of (height, width, 3) or (height, width, 4) bytes, red
first, alpha not multiplied in; a PIL image; a path; or the bytes of a JPEG or PNG file. Files are shown
upright and bring the faces that they know of. Arrays are only read, and those of four channels whose
rows lie in one piece each are not copied.

Faces are (left, top, right, bottom): fractions of the upright picture, or pixels when one of the four
numbers is above 2. They may reach beyond the picture.

Errors are ValueError for an argument that cannot be meant, TypeError for one of a wrong kind, OSError for
files that cannot be read or written, MemoryError, PhotoError (a ValueError) for bytes that are no photo or
a damaged one, and Cancelled. Nothing here keeps state; any number of threads may call at once, and all
work is done with the interpreter's lock released.
"""

from ._duplicates import (
    Duplicates,
    Group,
    Pair,
    distance,
    dupe_score,
    dupe_window,
    find_duplicates,
    green_cdf,
)
from ._features import Keypoints, brief, fast
from ._filters import Fault, Filter, Parameter, check_parameters, filters
from ._library import Cancel, Cancelled, PhotoError, __version__
from ._photos import (
    Facts,
    KnownFace,
    Loss,
    Photo,
    encode,
    enhance_file,
    facts,
    filter_file,
    look_file,
    read,
    write,
)
from ._quality import Niqe, niqe
from ._session import Session, apply, enhance, look

__all__ = [
    "Cancel",
    "Cancelled",
    "Duplicates",
    "Facts",
    "Fault",
    "Filter",
    "Group",
    "Keypoints",
    "KnownFace",
    "Loss",
    "Niqe",
    "Pair",
    "Parameter",
    "Photo",
    "PhotoError",
    "Session",
    "__version__",
    "apply",
    "brief",
    "check_parameters",
    "distance",
    "dupe_score",
    "dupe_window",
    "encode",
    "enhance",
    "enhance_file",
    "facts",
    "fast",
    "filter_file",
    "filters",
    "find_duplicates",
    "green_cdf",
    "look",
    "look_file",
    "niqe",
    "read",
    "write",
]
