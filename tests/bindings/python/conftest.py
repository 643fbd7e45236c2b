"""Pictures and files to work on, and the command beside which results are held: QUENBY_COMMAND."""

import io
import os
import subprocess

import numpy as np
import pytest
from PIL import Image

XMP = (
    "<x:xmpmeta xmlns:x='adobe:ns:meta/'><rdf:RDF "
    "xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#'><rdf:Description rdf:about='' "
    "xmlns:mwg-rs='http://www.metadataworkinggroup.com/schemas/regions/' "
    "xmlns:stArea='http://ns.adobe.com/xmp/sType/Area#' "
    "xmlns:stDim='http://ns.adobe.com/xap/1.0/sType/Dimensions#'>"
    "<mwg-rs:Regions rdf:parseType='Resource'>"
    "<mwg-rs:AppliedToDimensions stDim:w='240' stDim:h='160' stDim:unit='pixel'/>"
    "<mwg-rs:RegionList><rdf:Bag><rdf:li><rdf:Description mwg-rs:Type='Face' mwg-rs:Name='Ada'>"
    "<mwg-rs:Area stArea:x='0.4' stArea:y='0.5' stArea:w='0.5' stArea:h='0.6' "
    "stArea:unit='normalized'/></rdf:Description></rdf:li></rdf:Bag></mwg-rs:RegionList>"
    "</mwg-rs:Regions></rdf:Description></rdf:RDF></x:xmpmeta>"
)


def picture(width: int, height: int, seed: int = 1) -> np.ndarray:
    """Something like a photo: light that changes slowly, squares with corners, noise."""
    noise = np.random.default_rng(seed).normal(0, 6, (height, width, 3))
    y, x = np.mgrid[0:height, 0:width]
    light = 40 + 120 * x / width + 50 * ((x // 12 % 2) & (y // 12 % 2))
    colours = np.stack([light, light / 2 + 90 * y / height, 200 - light / 2], axis=-1)
    return np.clip(colours + noise, 0, 255).astype(np.uint8)


@pytest.fixture(scope="session")
def pixels() -> np.ndarray:
    return picture(240, 160)


@pytest.fixture(scope="session")
def photo(tmp_path_factory, pixels):
    """A JPEG file that is to be turned clockwise, with a time and a face that it knows of."""
    exif = Image.Exif()
    exif[0x0112] = 6
    exif[0x0132] = "2024:05:01 12:30:45"
    path = tmp_path_factory.mktemp("photos") / "photo.jpg"
    Image.fromarray(pixels).save(path, quality=92, exif=exif)
    file = path.read_bytes()
    packet = b"http://ns.adobe.com/xap/1.0/\0" + XMP.encode()  # which older versions of Pillow leave out
    end = 2 + 2 + int.from_bytes(file[4:6], "big")
    segment = b"\xff\xe1" + (len(packet) + 2).to_bytes(2, "big") + packet
    path.write_bytes(file[:end] + segment + file[end:])
    return path


@pytest.fixture(scope="session")
def png(tmp_path_factory, pixels):
    path = tmp_path_factory.mktemp("photos") / "photo.png"
    Image.fromarray(pixels).save(path)
    return path


@pytest.fixture(scope="session")
def quenby_command():
    """Runs the command with arguments and gives its output."""
    command = os.environ.get("QUENBY_COMMAND")
    if command is None:
        pytest.skip("QUENBY_COMMAND does not name the command to compare with")

    def run(*arguments) -> bytes:
        done = subprocess.run([command, *map(str, arguments)], capture_output=True, timeout=60)
        assert done.returncode == 0, done.stderr.decode()
        return done.stdout

    return run


def jpeg(array: np.ndarray) -> bytes:
    file = io.BytesIO()
    Image.fromarray(array).save(file, "JPEG")
    return file.getvalue()
