"""report_page_test.py QUENBY PHOTO: the page of `quenby enhance --report` in a real browser. Where
QUENBY_SCREENSHOTS names a folder, pictures of the page are left there."""

import os
import pathlib
import shutil
import struct
import subprocess
import sys
import tempfile

import browser

HOSTILE = "<img src=x onerror=document.title='broken'>&\"'.jpg"
ADA = "<script>document.title='broken'</script>Ada&\""

FACE = """<x:xmpmeta xmlns:x="adobe:ns:meta/">
<rdf:RDF xmlns:rdf="http://www.w3.org/1999/02/22-rdf-syntax-ns#">
<rdf:Description rdf:about="" xmlns:mwg-rs="http://www.metadataworkinggroup.com/schemas/regions/"
 xmlns:stArea="http://ns.adobe.com/xmp/sType/Area#">
<mwg-rs:Regions rdf:parseType="Resource"><mwg-rs:RegionList><rdf:Bag>
<rdf:li rdf:parseType="Resource"><mwg-rs:Name>&lt;script>document.title='broken'&lt;/script>Ada&amp;"\
</mwg-rs:Name><mwg-rs:Type>Face</mwg-rs:Type>
<mwg-rs:Area stArea:x="0.5" stArea:y="0.4" stArea:w="0.4" stArea:h="0.3" stArea:unit="normalized"/>
</rdf:li></rdf:Bag></mwg-rs:RegionList></mwg-rs:Regions>
</rdf:Description></rdf:RDF></x:xmpmeta>"""

JUMBF = b"JP\0\1\0\0\0\1\0\0\0\x10jumb\0\0\0\x08jumd"


def with_segments(photo, *segments):
    """A JPEG file with more segments behind its first marker."""
    whole = b"".join(b"\xff" + bytes([marker]) + struct.pack(">H", len(data) + 2) + data
                     for marker, data in segments)
    return photo[:2] + whole + photo[2:]


def enhance(quenby, *arguments):
    run = subprocess.run([quenby, "enhance", *arguments], capture_output=True)
    return run.returncode, run.stderr.decode(errors="replace")


def look_at(page, window):
    window.open(page)
    at = lambda: float(
        window.run("return document.querySelector('.pair').style.getPropertyValue('--at')")[:-1]
    )
    assert window.run("return [...document.images].every(i => i.naturalWidth > 0)")
    assert window.run("return document.querySelectorAll('section').length") == 4
    # Before is shown up to the divider, which a mouse, a finger and keys move.
    clip = "getComputedStyle(document.querySelector('.pair > img + img')).clipPath"
    assert at() == 50
    window.drag(".pair", (0.5, 0.5), (0.7, 0.4), (0.25, 0.6))
    assert 24 < at() < 26, at()
    right = float(window.run(f"return {clip}").split()[1].rstrip("px%"))
    width = window.run("return document.querySelector('.pair').getBoundingClientRect().width")
    assert 74 < right < 76 or 0.74 < right / width < 0.76, (right, width)
    window.press(browser.LEFT)  # where the mouse was the keys are
    assert 22 < at() < 25, at()
    window.press(browser.HOME)
    assert at() == 0
    told = "document.querySelector('.pair input').getAttribute('aria-valuetext')"
    assert window.run(f"return {told}") == "0 % before"
    window.drag(".pair", (0.5, 0.5), (0.6, 0.5), (0.8, 0.5), pointer="touch")
    assert 79 < at() < 81, at()
    # The face that the file tells of has its name; without the box, it is not drawn.
    faces = "[...document.querySelectorAll('.faces')].filter(s => getComputedStyle(s).display !== 'none')"
    assert window.run(f"return {faces}.length") == 3
    names = window.run(f"return {faces}.map(s => s.textContent.trim())")
    assert names == [ADA, "", ""], names
    box = window.run(
        "const r = document.querySelector('.faces g:last-child rect').getBoundingClientRect();"
        "const p = document.querySelector('.pair').getBoundingClientRect();"
        "return [(r.left - p.left) / p.width, (r.top - p.top) / p.height, r.width / p.width]"
    )
    assert all(abs(a - b) < 0.01 for a, b in zip(box, (0.3, 0.25, 0.4))), box
    window.click("#faces")
    assert window.run(f"return {faces}.length") == 0
    window.click("#faces")
    texts = lambda selector: window.run(
        "return [...document.querySelectorAll(arguments[0])].map(e => e.textContent.trim())", selector
    )
    steps = texts("section .chosen")
    assert steps == ["slider 0.3"] * 3, steps
    assert window.run("return document.querySelector('.chart .mapped').getTotalLength() > 100")
    lost = texts(".lost")
    assert len(lost) == 1 and lost[0].startswith("JUMBF boxes lost: "), lost
    text = " ".join(texts("section"))
    assert HOSTILE in text and "\\xe9.jpg" in text and "is empty" in text, text
    # No script of a name ran, nothing was asked of the network.
    assert window.run("return document.title") == "Before and after"
    asked = "performance.getEntriesByType('resource').filter(e => !e.name.startsWith('data:'))"
    assert window.run(f"return {asked}.map(e => e.name)") == []
    assert window.complaints() == [], window.complaints()


def main(quenby, photo):
    browser.skip_unless_installed()
    with tempfile.TemporaryDirectory() as place:
        place = pathlib.Path(place).resolve()
        photos, downloads = os.fsencode(place / "photos"), place / "downloads"
        os.mkdir(photos)
        downloads.mkdir()
        plain = pathlib.Path(photo).read_bytes()
        xmp = b"http://ns.adobe.com/xap/1.0/\0" + FACE.encode()
        contents = {
            b"0.jpg": with_segments(plain, (0xE1, xmp), (0xEB, JUMBF)),
            os.fsencode(HOSTILE): plain,
            b"empty.jpg": b"",
            b"\xe9.jpg": plain,
        }
        for name, content in contents.items():
            with open(os.path.join(photos, name), "wb") as file:
                file.write(content)
        page = place / "page.html"
        command = ["-r", photos, "-o", os.fsencode(place / "out") + b"/", "--slider", "0.3",
                   "--face", "0.1,0.1,0.2,0.2", "--report", os.fsencode(page)]
        code, errors = enhance(quenby, *command)
        assert code == 1 and "is empty" in errors, errors
        with browser.Browser(downloads) as window:
            look_at(page, window)
            if "QUENBY_SCREENSHOTS" in os.environ:
                window.screenshot(pathlib.Path(os.environ["QUENBY_SCREENSHOTS"]) / "report.png")
        # Again: nothing is left to do but the page, which shows what stands there.
        page.unlink()
        (place / "photos/empty.jpg").unlink()
        code, errors = enhance(quenby, *command)
        assert code == 0 and "3 there already" in errors, errors
        assert page.read_text().count("was there already") == 3
        assert page.read_text().count('class="pair"') == 3


if __name__ == "__main__":
    main(*sys.argv[1:])
