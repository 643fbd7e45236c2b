"""What is wrong is said, by the right exception."""

import pickle
import time

import numpy as np
import pytest
from conftest import jpeg, picture

import quenby

SMALL = picture(30, 20)


@pytest.mark.parametrize(
    "photo, error",
    [
        (None, TypeError),
        (3, TypeError),
        ([[1, 2], [3, 4]], TypeError),
        (SMALL.astype(np.float32), TypeError),
        (SMALL.astype(np.int8), TypeError),
        (SMALL[..., 0], ValueError),
        (SMALL[..., :2], ValueError),
        (SMALL[:0], ValueError),
        (SMALL[:, :0], ValueError),
        ("no such file.jpg", FileNotFoundError),
        (".", IsADirectoryError),
        (b"", quenby.PhotoError),
        (b"text", quenby.PhotoError),
    ],
)
def test_photos_that_are_none(photo, error):
    functions = [quenby.enhance, quenby.niqe, quenby.green_cdf, quenby.Session]
    grey = isinstance(photo, np.ndarray) and photo.ndim == 2
    for function in functions if grey else [*functions, quenby.fast, quenby.brief]:
        with pytest.raises(error):
            function(photo)


def test_kinds_of_bad_files():
    whole = jpeg(SMALL)
    huge = bytearray(whole)
    at = whole.index(b"\xff\xc0")
    huge[at + 5 : at + 9] = b"\xf0" * 4
    for data, kind in (
        (b"", "empty"),
        (b"some text", "not a photo"),
        (b"GIF89a" + bytes(20), "unsupported"),
        (whole[: len(whole) // 2], "truncated"),
        (bytes(huge), "too large"),
    ):
        with pytest.raises(quenby.PhotoError) as caught:
            quenby.read(data)
        assert caught.value.kind == kind and str(caught.value)
        assert isinstance(caught.value, ValueError)
        again = pickle.loads(pickle.dumps(caught.value))
        assert (again.kind, str(again)) == (kind, str(caught.value))
    with pytest.raises(quenby.PhotoError, match="pixels"):
        quenby.read(whole, max_pixels=599)
    quenby.read(whole, max_pixels=600)
    with pytest.raises(quenby.PhotoError, match="segments"):
        quenby.read(whole, max_segments=1)


def test_limits(tmp_path):
    whole = jpeg(SMALL)
    path = tmp_path / "a.jpg"
    path.write_bytes(whole)
    enough = dict(max_bytes=len(whole), max_pixels=600, max_scans=1, max_segments=9)
    for call in (
        quenby.read,
        quenby.facts,
        quenby.green_cdf,
        lambda file, **limits: quenby.enhance_file(file, None, **limits),
    ):
        for file in (whole, path):
            call(file, **enough)
            for limit, words in (
                (dict(max_bytes=len(whole) - 1), "larger than"),
                (dict(max_pixels=599), "pixels"),
                (dict(max_segments=1), "segments"),
            ):
                with pytest.raises(quenby.PhotoError, match=words) as caught:
                    call(file, **limit)
                assert caught.value.kind == "too large"
    found = quenby.find_duplicates([path], max_bytes=len(whole) - 1)
    assert found.failed[str(path)].kind == "too large"
    assert not quenby.find_duplicates([path], **enough).failed
    for limit in enough:
        for call in (quenby.read, quenby.facts, quenby.green_cdf):
            with pytest.raises(ValueError, match=limit):
                call(whole, **{limit: 0})
            call(whole, **{limit: 2**200})
    late = quenby.Cancel(after=0)
    deadline = time.monotonic() + 60
    while time.monotonic() < deadline:  # until its thread has had its turn
        try:
            quenby.read(path, cancel=late)
        except quenby.Cancelled:
            break
    else:
        pytest.fail("is not cancelled by the time")


@pytest.mark.parametrize(
    "call, names",
    [
        (lambda: quenby.apply(SMALL, "AE9"), "AE9"),
        (lambda: quenby.apply(SMALL, "AE0"), "slider"),
        (lambda: quenby.apply(SMALL, "AE0", slide=1, slider=1), "slide"),
        (lambda: quenby.apply(SMALL, "AE0", slider="much"), "slider"),
        (lambda: quenby.apply(SMALL, "AE0", params="slider=1;\0"), "zero"),
        (lambda: quenby.look(SMALL, "none"), "none"),
        (lambda: quenby.enhance(SMALL, faces=[(1, 2, 3)]), "face"),
        (lambda: quenby.enhance(SMALL, faces=[(0, 0, float("nan"), 1)]), "finite"),
        (lambda: quenby.enhance(SMALL, faces=[(0.9, 0, 0.1, 1)]), "wrong way"),
        (lambda: quenby.enhance(SMALL, faces=[(90, 90, 99, 99)]), "outside"),
        (lambda: quenby.read(jpeg(SMALL), scale=3), "scale"),
        (lambda: quenby.read(jpeg(SMALL), rotate=45), "rotate"),
        (lambda: quenby.read(jpeg(SMALL), max_pixels=0), "max_pixels"),
        (lambda: quenby.read(jpeg(SMALL), max_segments=0), "max_segments"),
        (lambda: quenby.Cancel(after=-1), "after"),
        (lambda: quenby.Cancel(after=float("nan")), "after"),
        (lambda: quenby.encode(SMALL, "GIF"), "GIF"),
        (lambda: quenby.encode(SMALL, quality=0), "quality"),
        (lambda: quenby.encode(SMALL, strip=["mood"]), "mood"),
        (lambda: quenby.encode(SMALL, keep="mood"), "mood"),
        (lambda: quenby.encode(SMALL, like=quenby.read(jpeg(picture(9, 9)))), "size"),
        (lambda: quenby.write("a.gif", SMALL), "gif"),
        (lambda: quenby.fast(SMALL, arc=8), "arc"),
        (lambda: quenby.brief(SMALL, np.zeros((2, 1), int)), "corners"),
        (lambda: quenby.distance(np.zeros(255), SMALL), "256"),
        (lambda: quenby.dupe_window(float("nan")), "threshold"),
        (lambda: quenby.check_parameters("AE9"), "AE9"),
        (lambda: quenby.Session(SMALL).enhance(out=np.zeros((20, 31, 4), np.uint8)), "out"),
        (
            lambda: quenby.Session(SMALL).enhance(out=np.zeros((20, 60, 4), np.uint8)[:, ::2]),
            "out",
        ),
    ],
)
def test_arguments_that_cannot_be_meant(call, names):
    with pytest.raises(ValueError, match=names):
        call()


@pytest.mark.parametrize(
    "call",
    [
        lambda: quenby.apply(SMALL, "AE0", params="slider=1;", slider=1),
        lambda: quenby.apply(SMALL, None),
        lambda: quenby.Session(SMALL).enhance(out=[1, 2]),
        lambda: quenby.brief(SMALL, np.zeros((2, 2))),
        lambda: quenby.read(SMALL),
        lambda: quenby.find_duplicates([3]),
    ],
)
def test_arguments_of_a_wrong_kind(call):
    with pytest.raises(TypeError):
        call()


def test_cancelled_before_it_begins(photo):
    cancel = quenby.Cancel()
    cancel.request()
    opened = quenby.read(photo)
    for call in (
        lambda: quenby.enhance(SMALL, cancel=cancel),
        lambda: quenby.read(photo, cancel=cancel),
        lambda: quenby.encode(SMALL, cancel=cancel),
        lambda: quenby.encode(opened, like=opened, cancel=cancel),
        lambda: quenby.enhance_file(photo, None, cancel=cancel),
        lambda: quenby.find_duplicates([photo], cancel=cancel),
    ):
        with pytest.raises(quenby.Cancelled):
            call()


def test_parameters_are_described():
    by_name = {filter.name: filter for filter in quenby.filters()}
    auto = by_name["AE0"]
    assert auto.reads_faces and auto.required == "slider=0.4;"
    slider = auto.parameters[0]
    assert (slider.name, slider.kind, slider.required) == ("slider", "number", True)
    assert (slider.lowest, slider.highest) == (0, 1)
    for name, filter in by_name.items():
        assert quenby.check_parameters(name, filter.required) == []
    faults = quenby.check_parameters("AE0", "slide=1;")
    assert [(fault.kind, fault.key) for fault in faults] == [("unknown", "slide"), ("missing", "slider")]
