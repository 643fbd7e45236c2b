"""What Quenby makes of one photo, as pictures: python one_photo.py PHOTO FOLDER"""

# %% The photo
import pathlib
import sys

import numpy as np
from PIL import Image

import quenby

photo = quenby.read(sys.argv[1])
folder = pathlib.Path(sys.argv[2])
folder.mkdir(exist_ok=True)
print(photo, photo.facts.capture_time, *(face.name or "a face" for face in photo.faces))


# %% Pictures side by side
def sheet(pictures, height=240):
    small = [Image.fromarray(np.ascontiguousarray(p)) for p in pictures]
    small = [p.resize((max(1, p.width * height // p.height), height)) for p in small]
    side_by_side = Image.new("RGB", (sum(p.width for p in small), height))
    at = 0
    for picture in small:
        side_by_side.paste(picture, (at, 0))
        at += picture.width
    return side_by_side


# %% The slider, from the photo as it was to its strongest
with quenby.Session(photo) as session:
    enhanced = [session.enhance(slider) for slider in (0.2, 0.4, 0.7, 1)]
sheet([photo.rgb, *enhanced]).save(folder / "slider.png")

# %% Every look
looks = [filter for filter in quenby.filters() if not filter.reads_faces and not filter.required]
sheet([quenby.look(photo, filter.name) for filter in looks]).save(folder / "looks.png")
print(*(filter.display_name for filter in looks), sep=", ")

# %% Where it looks natural: dark blocks do, light ones do not
niqe = quenby.niqe(photo)
print(f"NIQE {float(niqe):.2f}, enhanced {float(quenby.niqe(enhanced[1])):.2f}")
if niqe.blocks.size:
    light = np.clip(niqe.blocks / niqe.blocks.max() * 255, 0, 255).astype(np.uint8)
    Image.fromarray(light).resize((photo.width, photo.height), Image.NEAREST).save(
        folder / "niqe.png"
    )

# %% Its corners, in red
corners = quenby.fast(photo, threshold=40)
drawn = photo.rgb.copy()
for x, y, _ in corners:
    drawn[max(0, y - 1) : y + 2, max(0, x - 1) : x + 2] = (255, 0, 0)
Image.fromarray(drawn).save(folder / "corners.png")
print(len(corners), "corners")

# %% The file, with its metadata kept
losses = quenby.enhance_file(sys.argv[1], folder / "enhanced.jpg", 0.4, overwrite=True)
print("nothing lost" if not losses else losses)
