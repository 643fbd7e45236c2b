"""Filters on pixels: arrays of every layout, images, sessions, threads."""

import threading

import numpy as np
import pytest
from PIL import Image

import quenby


def rgba_of(rgb):
    return np.dstack([rgb, np.full(rgb.shape[:2], 255, np.uint8)])


def test_every_kind_of_photo_gives_the_same(pixels, png):
    wanted = quenby.enhance(pixels, slider=0.7)
    assert wanted.shape == pixels.shape and wanted.flags.c_contiguous
    assert not np.array_equal(wanted, pixels)
    for photo in (
        Image.fromarray(pixels),
        Image.open(png),
        png,
        str(png),
        png.read_bytes(),
        quenby.read(png),
    ):
        assert np.array_equal(quenby.enhance(photo, slider=0.7), wanted)
    made = quenby.enhance(rgba_of(pixels), slider=0.7)
    assert made.shape[2] == 4 and np.array_equal(made[..., :3], wanted)


def test_it_is_what_the_command_makes(quenby_command, pixels, png, tmp_path):
    quenby_command("enhance", png, "-o", tmp_path / "a.png", "--face", "0.3,0.2,0.6,0.7")
    wanted = np.asarray(Image.open(tmp_path / "a.png"))
    assert np.array_equal(quenby.enhance(pixels, faces=[(0.3, 0.2, 0.6, 0.7)]), wanted)


def test_layouts_do_not_matter(pixels):
    rgba = rgba_of(pixels)
    wide = np.zeros((160, 300, 4), np.uint8)
    wide[:, 20:260] = rgba
    read_only = rgba.copy()
    read_only.flags.writeable = False
    wanted = quenby.look(rgba, "winter")
    for photo in (
        wide[:, 20:260],
        read_only,
        np.asfortranarray(rgba),
        rgba[::-1].copy()[::-1],
        np.repeat(rgba, 2, axis=1)[:, ::2],
        np.ascontiguousarray(rgba[..., ::-1])[..., ::-1],
    ):
        assert np.array_equal(photo, rgba)
        assert np.array_equal(quenby.look(photo, "winter"), wanted)
    for part in (rgba[:1], rgba[:, :1], rgba[5:6, 7:8], pixels[::2, ::3]):
        whole = np.ascontiguousarray(part)
        assert np.array_equal(quenby.look(part, "winter"), quenby.look(whole, "winter"))


def test_images_of_other_modes_are_converted(pixels):
    grey = Image.fromarray(pixels).convert("L")
    assert np.array_equal(quenby.look(grey, "fall"), quenby.look(grey.convert("RGB"), "fall"))
    palette = Image.fromarray(pixels).convert("P")
    assert quenby.look(palette, "fall").shape == pixels.shape


def test_a_session_applies_to_the_photo_as_it_was_given(pixels):
    given = rgba_of(pixels)
    wanted = [quenby.enhance(given, slider) for slider in (0.2, 0.9)]
    out = np.zeros((160, 260, 4), np.uint8)
    with quenby.Session(given) as session:
        given[:] = 0
        for slider, result in zip((0.2, 0.9), wanted):
            assert np.array_equal(session.enhance(slider), result)
            assert session.enhance(slider, out=out[:, 10:250]) is not None
            assert np.array_equal(out[:, 10:250], result)
            assert not out[:, :10].any() and not out[:, 250:].any()
        assert np.array_equal(session.apply("PassThrough"), rgba_of(pixels))
        assert np.array_equal(session.apply("AE0", params="slider=0.2;"), wanted[0])
    with pytest.raises(ValueError):
        session.enhance()


def test_shared_work_gives_the_same(pixels, photo):
    wanted = quenby.enhance(pixels)
    for threads in (0, 1, 3):
        assert np.array_equal(quenby.enhance(pixels, threads=threads), wanted)
        with quenby.Session(pixels, threads=threads) as session:
            assert np.array_equal(session.enhance(), wanted)
            assert np.array_equal(session.look("winter"), quenby.look(pixels, "winter"))
        assert quenby.enhance_file(photo, None, threads=threads) == quenby.enhance_file(photo, None)
    for threads in (-1, 1025):
        with pytest.raises(ValueError, match="threads"):
            quenby.enhance(pixels, threads=threads)


def test_faces_change_the_result(pixels, photo):
    fractions, inside = (0.25, 0.25, 0.75, 0.75), (60, 40, 180, 120)
    assert np.array_equal(
        quenby.enhance(pixels, faces=[fractions]), quenby.enhance(pixels, faces=[inside])
    )
    opened = quenby.read(photo)
    assert not np.array_equal(
        quenby.enhance(opened), quenby.enhance(quenby.read(photo, known_faces=False))
    )


def test_eight_threads_get_the_same_bytes(pixels):
    sliders = (0.1, 0.5, 1.0)
    wanted = [quenby.enhance(pixels, slider) for slider in sliders]
    shared = quenby.Session(pixels)
    wrong = []

    def work(session):
        for slider, result in zip(sliders, wanted):
            if not np.array_equal(session.enhance(slider), result):
                wrong.append(slider)

    threads = [
        threading.Thread(target=work, args=(shared if i % 2 else quenby.Session(pixels),))
        for i in range(8)
    ]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    assert wrong == []


def test_other_threads_run_meanwhile(pixels):
    """The interpreter's lock is released: another thread ends the work that waits for its word."""
    cancel = quenby.Cancel()
    begun = threading.Event()

    def enhance_on():
        while True:
            quenby.enhance(pixels, cancel=cancel)
            begun.set()

    def work():
        with pytest.raises(quenby.Cancelled):
            enhance_on()

    thread = threading.Thread(target=work)
    thread.start()
    assert begun.wait(60)
    cancel.request()
    thread.join(60)
    assert not thread.is_alive()
