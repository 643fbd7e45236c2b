#!/usr/bin/env python3
"""corpus.py unpack FOLDER | pack FOLDER [MOST]

fuzz/corpus/TARGET.txt has the inputs that are worth keeping, a line of hexadecimal digits each.
`unpack` makes a file of each in FOLDER/TARGET, as libFuzzer reads them; `pack` writes the lines
anew, MOST (60) of a target, smallest first."""
import hashlib
import pathlib
import sys

kept = pathlib.Path(__file__).parent / "corpus"
action, folder = sys.argv[1], pathlib.Path(sys.argv[2])
if action == "unpack":
    for corpus in sorted(kept.glob("*.txt")):
        (folder / corpus.stem).mkdir(parents=True, exist_ok=True)
        for line in corpus.read_text().splitlines():
            content = bytes.fromhex(line)
            (folder / corpus.stem / hashlib.sha1(content).hexdigest()).write_bytes(content)
elif action == "pack":
    most = int(sys.argv[3]) if len(sys.argv) > 3 else 60
    kept.mkdir(exist_ok=True)
    for target in sorted(path for path in folder.iterdir() if path.is_dir()):
        inputs = sorted((file.read_bytes() for file in target.iterdir()), key=lambda b: (len(b), b))
        lines = [content.hex() for content in inputs if content]
        (kept / f"{target.name}.txt").write_text("".join(line + "\n" for line in lines[:most]))
else:
    sys.exit(__doc__)
