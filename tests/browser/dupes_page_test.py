"""dupes_page_test.py QUENBY PHOTO: the page of `quenby dupes --html` in a real browser. Where
QUENBY_SCREENSHOTS names a folder, a picture of the page is left there."""

import json
import os
import pathlib
import shutil
import subprocess
import sys
import tempfile

import browser

HOSTILE = "<img src=x onerror=document.title='broken'>&\"'.jpg"


def dupes(quenby, *arguments):
    run = subprocess.run([quenby, "dupes", *map(str, arguments)], capture_output=True)
    return run.returncode, run.stdout.decode(errors="replace"), run.stderr.decode(errors="replace")


def photos_in(folder):
    return sorted(os.listdir(os.fsencode(folder)))


def main(quenby, photo):
    browser.skip_unless_installed()
    with tempfile.TemporaryDirectory() as place:
        place = pathlib.Path(place).resolve()
        photos, downloads = place / "photos", place / "downloads"
        photos.mkdir()
        downloads.mkdir()
        names = [os.fsencode("a.jpg"), os.fsencode(HOSTILE), b"\xe9.jpg"]
        for i, name in enumerate(names):
            path = os.path.join(os.fsencode(photos), name)
            shutil.copy(photo, path)
            os.utime(path, ns=(0, 1_700_000_000_000_000_001 + i))
        page = place / "page.html"
        code, _, errors = dupes(
            quenby, "-r", photos, "--assume-mtime", "--keep", "best", "--html", page
        )
        assert code == 0, errors

        with browser.Browser(downloads) as window:
            window.open(page)
            assert window.run("return document.title") == "Near-duplicates"
            boxes = "[...document.querySelectorAll('input')]"
            state = lambda: window.run(f"return {boxes}.map(box => box.checked)")
            said = lambda: window.run("return document.getElementById('chosen').textContent")
            assert state().count(True) == 1 and len(state()) == 3
            assert said().startswith("2 of 3 photos would go, "), said()
            assert window.run("return [...document.images].every(i => i.naturalWidth > 0)")
            # Every control has a name that a screen reader tells.
            assert window.run(
                f"return {boxes}.every(box => box.labels[0].textContent.includes('.jpg'))"
            )
            if "QUENBY_SCREENSHOTS" in os.environ:
                window.screenshot(pathlib.Path(os.environ["QUENBY_SCREENSHOTS"]) / "dupes.png")

            # By keys alone: through the boxes, the last one kept stays.
            window.press(browser.TAB, browser.SPACE)
            assert state()[0]
            window.run(f"for (const box of {boxes}) if (box.checked) box.click()")
            assert state().count(True) == 1
            assert "One photo of each group stays." in said(), said()
            window.click("#all")
            assert state() == [True] * 3 and said() == "Every photo stays."
            assert window.run("return document.getElementById('save').disabled")
            window.run(f"{boxes}[1].closest('label').querySelector('img').click()")
            window.run(f"{boxes}[2].focus()")
            window.press(browser.SPACE, browser.TAB, browser.ENTER)
            kept = state().index(True)
            browser.wait_for(downloads / "duplicates.json")
            # No script of a name ran, nothing was asked of the network.
            assert window.run("return document.title") == "Near-duplicates"
            assert window.complaints() == [], window.complaints()

        plan = json.loads((downloads / "duplicates.json").read_text())
        assert [len(plan["groups"][0][what]) for what in ("keep", "remove")] == [1, 2], plan
        before = photos_in(photos)
        command = ["--plan", downloads / "duplicates.json", "--move-to", place / "away"]
        code, said, errors = dupes(quenby, *command)
        assert code == 0 and "2 photos would be moved" in errors, errors
        assert photos_in(photos) == before
        code, _, errors = dupes(quenby, *command, "--apply")
        assert code == 0, errors
        assert photos_in(photos) == [before[kept]], photos_in(photos)


if __name__ == "__main__":
    main(*sys.argv[1:])
