"""Files in, files out: the bytes of the command, metadata kept, nothing lost."""

import os
import pathlib
import pickle
import shlex
import stat
import subprocess
import sys

import numpy as np
import pytest
from conftest import picture

import quenby


@pytest.mark.parametrize(
    "arguments, options",
    [
        ([], {}),
        (["--slider", "0.9", "--quality", "70"], {"slider": 0.9, "quality": 70}),
        (["--scale", "2", "--rotate", "-90"], {"scale": 2, "rotate": -90}),
        (["--faces", "none", "--strip", "all"], {"known_faces": False, "strip": "all"}),
        (["--keep", "time,xmp"], {"keep": ("time", "xmp")}),
        (
            ["--face", "0.2,0.1,0.6,0.7", "--face", "50,60,90,110"],
            {"faces": [(0.2, 0.1, 0.6, 0.7), (50, 60, 90, 110)]},
        ),
        (["--global-only"], {"gtmOnly": True}),
    ],
)
def test_enhance_file_writes_the_file_of_the_command(
    quenby_command, photo, tmp_path, arguments, options
):
    quenby_command("enhance", photo, "-o", tmp_path / "wanted.jpg", *arguments)
    assert quenby.enhance_file(photo, tmp_path / "made.jpg", **options) == []
    assert (tmp_path / "made.jpg").read_bytes() == (tmp_path / "wanted.jpg").read_bytes()
    made, losses = quenby.enhance_file(photo.read_bytes(), None, **options)
    assert (made, losses) == ((tmp_path / "wanted.jpg").read_bytes(), [])


def test_looks_and_png_are_those_of_the_command(quenby_command, photo, png, tmp_path):
    quenby_command("look", "winter", photo, "-o", tmp_path / "a.png")
    quenby.look_file(photo, tmp_path / "b.png", "winter")
    assert (tmp_path / "a.png").read_bytes() == (tmp_path / "b.png").read_bytes()
    quenby_command("look", "starfish", png, "-o", tmp_path / "c.png", "--s1", "0.7", "--no-mask")
    quenby.look_file(png, tmp_path / "d.png", "starfish", s1=0.7, applyMask=False)
    assert (tmp_path / "c.png").read_bytes() == (tmp_path / "d.png").read_bytes()


def test_the_steps_give_the_same_file(photo):
    opened = quenby.read(photo)
    made = quenby.enhance_file(photo, None, mark=False)[0]
    assert quenby.encode(quenby.enhance(opened), like=opened) == made


def test_files_are_coded_and_marked_as_they_are_told(quenby_command, photo, tmp_path):
    coded = ["--quality", "auto", "--subsampling", "422"]
    quenby_command("enhance", photo, "-o", tmp_path / "wanted.jpg", *coded)
    made = quenby.enhance_file(photo, None, quality="auto", subsampling=422)[0]
    assert made == (tmp_path / "wanted.jpg").read_bytes()
    assert quenby.facts(made).last_edit == "AE0, slider 0.4"
    assert quenby.facts(photo).last_edit is None


def test_read_tells_what_a_file_says(photo):
    opened = quenby.read(photo)
    assert opened.rgba.shape == (240, 160, 4) and not opened.rgba.flags.writeable
    assert (opened.facts.width, opened.facts.height, opened.facts.orientation) == (240, 160, 6)
    assert opened.facts.capture_time == "2024-05-01T12:30:45"
    assert opened.facts.wall_clock == 1714566645 and opened.facts.utc is None
    assert [face.name for face in opened.faces] == ["Ada"]
    assert opened.facts == quenby.facts(photo) == quenby.facts(photo.read_bytes())
    assert np.asarray(opened).shape == (240, 160, 3)
    stored = quenby.read(photo, upright=False, scale=2)
    assert (stored.width, stored.height) == (120, 80)
    pixels = quenby.read(photo).rgba  # of which only the array is left
    assert np.array_equal(pixels, opened.rgba)


def test_png_pixels_come_back(tmp_path):
    rgba = np.random.default_rng(2).integers(0, 256, (20, 30, 4), np.uint8)
    quenby.write(tmp_path / "a.png", rgba)
    assert np.array_equal(quenby.read(tmp_path / "a.png").rgba, rgba)
    assert [loss.what for loss in quenby.write(tmp_path / "a.jpg", rgba)] == ["transparency"]


def test_files_are_their_users_alone_until_they_are_whole(photo, tmp_path, monkeypatch):
    seen, opened = [], os.fdopen

    def look(descriptor, mode):
        seen.append(stat.S_IMODE(os.fstat(descriptor).st_mode))
        return opened(descriptor, mode)

    monkeypatch.setattr(os, "fdopen", look)
    plain = tmp_path / "plain"
    plain.touch()
    target = tmp_path / "out.jpg"
    quenby.enhance_file(photo, target)
    assert seen == [0o600]
    assert target.stat().st_mode == plain.stat().st_mode
    monkeypatch.delattr(os, "O_TMPFILE", raising=False)
    quenby.write(tmp_path / "other.png", picture(10, 10))
    assert (tmp_path / "other.png").stat().st_mode == plain.stat().st_mode
    assert sorted(os.listdir(tmp_path)) == sorted(
        {photo.name if photo.parent == tmp_path else "plain", "plain", "out.jpg", "other.png"}
    )


def test_nothing_is_overwritten_unasked(photo, tmp_path):
    target = tmp_path / "there.jpg"
    target.write_bytes(b"old")
    os.chmod(target, 0o640)
    for write in (
        lambda **o: quenby.enhance_file(photo, target, **o),
        lambda **o: quenby.write(target, picture(10, 10), **o),
    ):
        with pytest.raises(FileExistsError):
            write()
        assert target.read_bytes() == b"old"
        write(overwrite=True)
        assert target.read_bytes() != b"old"
        assert stat.S_IMODE(target.stat().st_mode) == 0o640
        target.write_bytes(b"old")
    link = tmp_path / "link.jpg"
    link.symlink_to(target)
    quenby.enhance_file(photo, link, overwrite=True)
    assert link.is_symlink() and target.read_bytes() == quenby.enhance_file(photo, None)[0]
    assert sorted(os.listdir(tmp_path)) == ["link.jpg", "there.jpg"]


def test_a_file_may_replace_itself(photo, tmp_path):
    copy = tmp_path / "copy.jpg"
    copy.write_bytes(photo.read_bytes())
    quenby.enhance_file(copy, copy, overwrite=True)
    assert copy.read_bytes() == quenby.enhance_file(photo, None)[0]


def test_pipes_are_written_and_stay(photo, tmp_path):
    pipe = tmp_path / "pipe.jpg"
    os.mkfifo(pipe)
    descriptor = os.open(pipe, os.O_RDWR)
    try:
        quenby.write(pipe, picture(10, 10), overwrite=True)
        assert os.read(descriptor, 100_000) == quenby.encode(picture(10, 10))
    finally:
        os.close(descriptor)
    assert stat.S_ISFIFO(pipe.stat().st_mode)


def test_photos_and_facts_are_pickled(photo):
    opened = quenby.read(photo, rotate=90)
    again = pickle.loads(pickle.dumps(opened))
    assert np.array_equal(again.rgba, opened.rgba) and again.facts == opened.facts
    for result in (opened.facts, opened.faces, quenby.Loss("a", "b"), quenby.filters()):
        assert pickle.loads(pickle.dumps(result)) == result


def test_what_is_found_out_is_pickled(photo):
    def again(result):
        return pickle.loads(pickle.dumps(result))

    niqe, keypoints = quenby.niqe(photo), quenby.brief(photo)
    assert float(again(niqe)) == float(niqe)
    assert np.array_equal(again(niqe).features, niqe.features)
    assert np.array_equal(again(niqe).blocks, niqe.blocks)
    assert np.array_equal(again(keypoints).positions, keypoints.positions)
    assert np.array_equal(again(keypoints).descriptors, keypoints.descriptors)
    pair = quenby.Pair("a", "b", 3.5, 0.001, None, True)
    group = quenby.Group(("a", "b"), (pair,))
    found = quenby.Duplicates((group,), (), {"c": quenby.PhotoError("no photo", "not a photo")})
    assert again(found).groups == found.groups
    error = again(found).failed["c"]
    assert (type(error), str(error), error.kind) == (quenby.PhotoError, "no photo", "not a photo")


def test_the_example_makes_its_pictures(photo, tmp_path):
    example = pathlib.Path(__file__).parents[3] / "bindings/python/examples/one_photo.py"
    python = shlex.split(os.environ.get("QUENBY_PYTHON", sys.executable))  # an emulator and its Python
    done = subprocess.run([*python, example, photo, tmp_path / "out"], capture_output=True, text=True)
    assert done.returncode == 0, done.stderr
    assert "nothing lost" in done.stdout
    made = {"slider.png", "looks.png", "niqe.png", "corners.png", "enhanced.jpg"}
    assert set(os.listdir(tmp_path / "out")) == made
