"""Near-duplicates, quality, corners: what the command says of the same files."""

import json
import pickle

import numpy as np
import pytest
from conftest import picture
from niqe_definition import niqe_features
from PIL import Image

import quenby


def test_find_duplicates_finds_what_the_command_finds(quenby_command, photo, png, tmp_path):
    bright = tmp_path / "bright.jpg"
    quenby.enhance_file(photo, bright, 0.9)
    other = tmp_path / "other.png"
    Image.fromarray(255 - picture(200, 150, 9)[::-1] // 3).save(other)
    text = tmp_path / "text.jpg"
    text.write_text("no photo")
    copy = tmp_path / "copy.png"
    copy.write_bytes(png.read_bytes())
    paths = [str(path) for path in (photo, bright, png, other, copy)]
    wanted = json.loads(quenby_command("dupes", *paths, "--json", "--threshold", "-1", "--unknown-times", "--pairs"))
    found = quenby.find_duplicates([*paths, text, photo], threshold=-1, workers=2)
    assert len(found.groups) > 0
    for groups, said in ((found.groups, wanted["groups"]), (found.look_alikes, wanted["lookAlikes"])):
        assert [list(group.paths) for group in groups] == [
            [photo["file"] for photo in group["photos"]] for group in said
        ]
        for group, also in zip(groups, said):
            assert [(p.first, p.second) for p in group.pairs] == [
                (p["a"], p["b"]) for p in also["pairs"]
            ]
            for pair, other_pair in zip(group.pairs, also["pairs"]):
                assert pair.score == pytest.approx(other_pair["score"], abs=1e-8)
                assert (pair.seconds is not None) == other_pair["timesKnown"]
    assert list(found.failed) == [str(text)]
    assert found.failed[str(text)].kind == "not a photo"
    again = pickle.loads(pickle.dumps(found))
    assert again.groups == found.groups and again.failed[str(text)].kind == "not a photo"
    assert quenby.find_duplicates([]).groups == ()


def test_distances_of_photos_and_of_their_distributions(pixels, photo):
    cdf = quenby.green_cdf(pixels)
    assert cdf.shape == (256,) and cdf.dtype == np.float32
    greens = np.bincount(pixels[..., 1].ravel(), minlength=256)
    assert np.allclose(cdf, np.cumsum(greens) / pixels[..., 1].size, atol=1e-5)
    assert quenby.distance(cdf, pixels) == quenby.distance(pixels, cdf) < 0.01
    assert quenby.distance(pixels, photo) < 0.1
    assert quenby.dupe_score(0.0, 0) > 3.6 > 0 > quenby.dupe_score(1.0, -1e5, False)
    window = quenby.dupe_window(0)
    assert quenby.dupe_score(0.0, window) == pytest.approx(0, abs=1e-3)
    assert quenby.dupe_window(9) < 0


def test_niqe_is_what_the_command_scores(quenby_command, photo, tmp_path):
    said = json.loads(quenby_command("score", "--json", "--features", photo))
    niqe = quenby.niqe(photo)
    assert float(niqe) == pytest.approx(said["score"], abs=1e-6)
    assert np.allclose(niqe.features, said["features"], atol=1e-6)
    assert niqe.blocks.shape == (said["blockRows"], said["blockColumns"]) == (2, 1)
    assert niqe.model == said["model"]
    again = pickle.loads(pickle.dumps(niqe))
    assert again.score == niqe.score and np.array_equal(again.blocks, niqe.blocks)
    small = quenby.niqe(picture(95, 300))
    assert np.isnan(small.score) and np.isnan(small.features).all() and small.blocks.size == 0


def test_niqe_has_the_features_of_its_definition():
    for seed, size in ((1, (300, 200)), (2, (193, 389))):
        photo = picture(*size, seed)
        assert np.allclose(quenby.niqe(photo).features, niqe_features(photo), rtol=0.02, atol=0.01)


def test_corners_are_those_of_the_command(quenby_command, png, pixels):
    said = json.loads(quenby_command("keypoints", png, "--json", "--brief", "--threshold", "15"))
    corners = quenby.fast(png, 15)
    assert corners.tolist() == [[c["x"], c["y"], c["score"]] for c in said["corners"]]
    described = [c for c in said["corners"] if "descriptor" in c]
    keypoints = quenby.brief(pixels, corners)
    assert len(described) > 0
    assert keypoints.positions.tolist() == [[c["x"], c["y"]] for c in described]
    as_hex = [bits[::-1].tobytes().hex() for bits in keypoints.descriptors]
    assert as_hex == [c["descriptor"] for c in described]
    again = quenby.brief(pixels, threshold=15)
    assert np.array_equal(again.descriptors, keypoints.descriptors)


def test_grey_pictures_are_taken_as_they_are(pixels):
    grey = np.ascontiguousarray(pixels[..., 1])
    wanted = quenby.fast(pixels, arc=10, suppress=False)
    assert len(wanted) > len(quenby.fast(pixels, arc=10))
    for layout in (grey, pixels[..., 1], np.asfortranarray(grey), grey[::-1].copy()[::-1]):
        assert np.array_equal(quenby.fast(layout, arc=10, suppress=False), wanted)
    assert quenby.fast(grey[:5, :5]).shape == (0, 3)
    assert quenby.brief(grey, np.array([[2**40, -(2**40)]])).descriptors.shape == (0, 32)
