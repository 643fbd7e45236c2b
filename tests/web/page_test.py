"""page_test.py DIST: the page in a real browser, as a person uses it. PHOTOS names the photos of
tests/web/photos.cpp, QUENBY the command whose files must come out, AXE the script of axe-core. Where
QUENBY_SCREENSHOTS names a folder, pictures of the page are left there."""

import base64
import hashlib
import json
import os
import pathlib
import re
import subprocess
import sys
import tempfile
import time
import zipfile

root = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(root / "tests/browser"))
import browser  # noqa: E402

QUENBY = os.environ["QUENBY"]
PHOTOS = pathlib.Path(os.environ["PHOTOS"])
SHOWN = "return document.querySelector('#seen').textContent !== '' && !document.body.classList.contains('busy')"
LOOKS = "return document.body.classList.contains('looks-shown')"


class Page:
    """The window, and what is asked of the page again and again."""

    def __init__(self, window, downloads):
        self.window, self.downloads = window, downloads

    def __getattr__(self, name):
        return getattr(self.window, name)

    def open_photos(self, *paths):
        self.choose("#files", *paths)
        self.wait_until("return document.title.startsWith(arguments[0])", paths[0].name)
        self.wait_until(SHOWN)
        self.wait_until(LOOKS)

    def shown(self):
        self.wait_until(SHOWN)

    def text(self, selector):
        return self.run("return document.querySelector(arguments[0]).textContent", selector)

    def saved(self, name):
        """The bytes of a download, which goes."""
        path = self.downloads / name
        browser.wait_for(path)
        data = path.read_bytes()
        path.unlink()
        return data

    def picture_hash(self, selector):
        """Of a canvas that the worker draws on, as it is seen."""
        return hashlib.sha256(base64.b64decode(self.window._send(
            "GET", f"/element/{self.find(selector)}/screenshot"))).hexdigest()

    def until(self, condition, otherwise, seconds=20):
        end = time.monotonic() + seconds
        while not condition():
            assert time.monotonic() < end, otherwise

    def problems(self):
        return self.run("return [...document.querySelectorAll('#problems span')].map(p => p.textContent)")

    def forget_problems(self):
        self.run("document.querySelectorAll('#problems button').forEach(b => b.click())")


def command(*arguments, place):
    out = place / "command_out"
    subprocess.run([QUENBY, *map(str, arguments), "-o", out, "--overwrite", "--quiet"], check=True)
    return out.read_bytes()


def slide(page, value):
    """Moves the first slider as keys do: input, then change."""
    page.run(
        "const s = document.querySelector('#settings input[type=range]'); s.value = arguments[0];"
        "s.dispatchEvent(new Event('input')); s.dispatchEvent(new Event('change'))", value)


def test_saves_the_commands_bytes(page, place):
    photo = PHOTOS / "large.jpg"
    page.open_photos(photo)
    before = page.picture_hash("#stage")
    slide(page, 0.85)
    page.until(lambda: page.picture_hash("#stage") != before, "the slider changes nothing")
    page.chord(browser.CONTROL, "s")
    assert page.saved("large_AE0.jpg") == command("enhance", photo, "--slider", "0.85", place=place)
    page.click("#undo")
    page.click("#save")
    first = command("enhance", photo, "--slider", page.run("return document.querySelector('#setting-slider').value"), place=place)
    assert page.saved("large_AE0.jpg") == first
    page.click("#redo")
    page.click("#save")
    assert page.saved("large_AE0.jpg") != first
    page.run("document.querySelector('#looks input[value=ZebraBW]').click()")
    page.click("#save")
    assert page.saved("large_ZebraBW.jpg") == command("look", "ZebraBW", photo, place=place)
    page.run("document.querySelector('#file-panel').open = true; document.querySelector('#format').value = 'PNG'")
    page.click("#save")
    page.saved("large_ZebraBW.png")
    page.wait_until("return document.querySelector('#status').textContent.startsWith('Saved large_ZebraBW.png')")
    page.run("document.querySelector('#format').value = ''")


def test_fits_narrow_pages(page):
    page.emulate(360, 740)
    assert page.run("return document.documentElement.scrollWidth") <= 360
    # The chosen look is in the row's sight, whatever the width was before.
    page.run("[...document.querySelectorAll('#looks input')].at(-1).click()")
    for size in ((1280, 900), (360, 740)):
        page.emulate(*size)
        page.run_async("const done = arguments[0]; requestAnimationFrame(() => requestAnimationFrame(done))")
        page.wait_until("const row = document.querySelector('#looks').getBoundingClientRect();"
                        "const look = document.querySelector('.look:has(input:checked)').getBoundingClientRect();"
                        "return row.left <= look.left && look.right <= row.right + 1")
    page.run("document.querySelector('#looks input[value=AE0]').click()")
    # What is said in passing covers nothing that a finger moves.
    page.click("#save")
    page.wait_until("return document.querySelector('#status').textContent !== ''")
    page.saved("large_AE0.jpg")
    assert page.run("const box = (e) => e.getBoundingClientRect(), told = box(document.querySelector('#status'));"
                    "return [...document.querySelectorAll('header button, aside button, aside input')].map(box)"
                    ".every(b => b.bottom <= told.top || b.top >= told.bottom || b.width === 0)")
    page.emulate(1280, 900)


def test_shows_one_to_one(page, place):
    """What is seen at 1:1 are the pixels that the command would save, here without coding them."""
    out = place / "large.png"
    page.run("document.querySelector('#looks input[value=AE0]').click()")
    slider = page.run("return document.querySelector('#setting-slider').value")
    subprocess.run([QUENBY, "enhance", PHOTOS / "large.jpg", "--slider", slider, "-o", out, "--quiet"], check=True)
    for width in (1280, 1281):  # also where the photo's middle is between two pixels
        page.emulate(width, 900)
        page.press("1")
        page.wait_until("return document.querySelector('#seen').textContent === 'Full size, 100 %'")
        assert page.run("return !document.querySelector('#detail-after').hidden")
        page.click("#compare")
        page.run("document.querySelector('#status').textContent = ''")  # which lies over it
        seen, others = page.run_async(
            """const [saved, shown, done] = arguments;
            const pixels = async (data) => {
              const bytes = Uint8Array.from(atob(data), c => c.charCodeAt(0));
              const picture = await createImageBitmap(new Blob([bytes]), { colorSpaceConversion: 'none' });
              const context = new OffscreenCanvas(picture.width, picture.height).getContext('2d');
              context.drawImage(picture, 0, 0);
              return context.getImageData(0, 0, picture.width, picture.height);
            };
            const box = (id) => document.querySelector(id).getBoundingClientRect();
            Promise.all([pixels(saved), pixels(shown)]).then(([file, screen]) => {
              const stage = box('#stage'), photo = box('#after'), told = box('#seen');
              let seen = 0, others = 0;
              for (let y = Math.ceil(stage.top); y < Math.floor(told.top); ++y) {
                for (let x = Math.ceil(stage.left); x < Math.floor(stage.right); ++x) {
                  const from = 4 * ((y - Math.round(photo.top)) * file.width + x - Math.round(photo.left));
                  const at = 4 * (y * screen.width + x);
                  ++seen;
                  for (let i = 0; i < 3; ++i) if (file.data[from + i] !== screen.data[at + i]) { ++others; break; }
                }
              }
              done([seen, others]);
            });""", base64.b64encode(out.read_bytes()).decode(), page.window._send("GET", "/screenshot"))
        assert seen > 500_000 and others == 0, f"{others} of {seen} pixels are others at a width of {width}"
        page.click("#compare")
        page.press("0")
        assert page.text("#seen").startswith("Preview, "), page.text("#seen")
    page.emulate(1280, 900)


def test_compares(page):
    page.run("document.querySelector('#divider').focus()")
    page.press(browser.RIGHT, browser.RIGHT)
    assert page.run("return document.querySelector('#divider').getAttribute('aria-valuenow')") == "54"
    page.drag("#divider", (0.5, 0.5), (-1.5, 0.5))
    assert int(page.run("return document.querySelector('#divider').getAttribute('aria-valuenow')")) < 54
    page.click("#compare")
    assert page.run("return getComputedStyle(document.querySelector('#divider')).display") == "none"
    page.click("#compare")


def test_faces(page, place):
    photo = PHOTOS / "twenty/faces.jpg"
    page.open_photos(photo)
    page.run("document.querySelector('#face-panel').open = true")
    page.wait_until("return document.querySelectorAll('.face').length === 1")
    assert page.text(".face span") == "Ada"
    page.click("#save")
    slider = page.run("return document.querySelector('#setting-slider').value")
    assert page.saved("faces_AE0.jpg") == command("enhance", photo, "--slider", slider, place=place)
    page.run("document.querySelector('.face').focus()")
    page.press(browser.RIGHT)
    page.click("#save")
    moved = page.saved("faces_AE0.jpg")
    sides = page.run("const s = document.querySelector('.face').style;"
                     "return [s.left, s.top, s.width, s.height].map(parseFloat)")
    assert abs(sides[0] - 31) < 1e-6, sides
    face = "0.31000000000000005,0.2,0.51,0.5"
    assert moved == command("enhance", photo, "--slider", slider, "--faces", "none", "--face", face, place=place)

    def dragged(selector, *places):
        """The sides of the box after its part was dragged, and the file that is saved then."""
        page.drag(selector, *places)
        page.click("#save")
        saved = page.saved("faces_AE0.jpg")
        return saved, page.run("const s = document.querySelector('.face').style;"
                               "return [s.left, s.top, s.width, s.height].map(parseFloat)")

    by_hand, place_by_hand = dragged(".face", (0.5, 0.5), (0.7, 0.6), (0.9, 0.8))
    assert place_by_hand[0] > sides[0] + 5 and place_by_hand[1] > sides[1] + 5, (sides, place_by_hand)
    assert abs(place_by_hand[2] - sides[2]) < 0.01 and abs(place_by_hand[3] - sides[3]) < 0.01, (sides, place_by_hand)
    sized, place_sized = dragged(".face i", (0.5, 0.5), (-1.5, -1.5))
    assert place_sized[:2] == place_by_hand[:2], (place_by_hand, place_sized)
    assert place_sized[2] < place_by_hand[2] and place_sized[3] < place_by_hand[3], (place_by_hand, place_sized)
    assert len({moved, by_hand, sized}) == 3

    page.click("#add-face")
    assert page.text("#face-count") == "2"
    page.press("\ue017")
    assert page.text("#face-count") == "1"


def test_measures(page):
    page.run("document.querySelector('#file-panel').open = true")
    page.click("#score")
    told = page.wait_until("const told = document.querySelector('#scores').value; return told.includes('after') && told")
    score = json.loads(subprocess.run([QUENBY, "score", "--json", PHOTOS / "twenty/faces.jpg"], capture_output=True,
                                      check=True).stdout)["score"]
    assert abs(float(re.search(r"[0-9.]+", told)[0]) - score) < 0.006, (told, score)
    blank = "const c = document.querySelector(arguments[0]); return c.getContext('2d').getImageData(0, 0, c.width, c.height).data.some(x => x !== 0)"
    page.wait_until(blank, "#histogram")
    page.wait_until(blank, "#curve")
    assert page.run("return [...document.querySelectorAll('.look canvas')].every(c => c.width > 50)")


def test_many(page, place):
    page.open_photos(*(PHOTOS / "similar" / f"{name}.jpg" for name in "abc"))
    group = ", near-duplicate, group 1"
    page.wait_until("return [...document.querySelectorAll('.shot')].map(s => s.title).join() === arguments[0]",
                    f"large.jpg,faces.jpg,a.jpg{group},b.jpg{group},c.jpg")
    # Each has its own edit, and its own undo.
    page.click(".shot:nth-of-type(5)")
    page.wait_until("return document.title.startsWith('c.jpg')")
    page.shown()
    assert page.run("return document.querySelector('#undo').disabled")
    slide(page, 0.9)
    page.press("[")
    page.wait_until("return document.title.startsWith('b.jpg')")
    page.shown()
    assert page.run("return document.querySelector('#undo').disabled")
    assert page.run("return document.querySelector('#setting-slider').value") == "0.4"
    page.press("]")
    page.wait_until("return document.title.startsWith('c.jpg')")
    page.shown()
    page.click("#undo")
    page.click("#save-all")
    archive = place / "photos.zip"
    archive.write_bytes(page.saved("photos.zip"))
    with zipfile.ZipFile(archive) as files:
        assert files.testzip() is None
        for name in "abc":
            expected = command("enhance", PHOTOS / "similar" / f"{name}.jpg", "--slider", "0.4", place=place)
            assert files.read(f"{name}_AE0.jpg") == expected, name


def test_drops_and_pastes(page):
    data = base64.b64encode((PHOTOS / "twenty/plain.jpg").read_bytes()).decode()
    give = """const bytes = Uint8Array.from(atob(arguments[0]), c => c.charCodeAt(0));
      const data = new DataTransfer(); data.items.add(new File([bytes], arguments[1], { type: 'image/jpeg' }));
      document.body.dispatchEvent(arguments[2] === 'drop'
        ? new DragEvent('drop', { dataTransfer: data, bubbles: true, cancelable: true })
        : new ClipboardEvent('paste', { clipboardData: data, bubbles: true }))"""
    for how in ("drop", "paste"):
        page.run(give, data, f"{how}.jpg", how)
        page.wait_until("return document.title.startsWith(arguments[0])", how)
        page.shown()


def test_hostile_files(page):
    for name, words in (("empty.jpg", "empty"), ("cut.jpg", "truncated"), ("bomb.jpg", "pixels"),
                        ("text.jpg", "not a JPEG or PNG"), ("page.png", "not a JPEG or PNG")):
        page.choose("#files", PHOTOS / "hostile" / name)
        said = page.wait_until("return [...document.querySelectorAll('#problems span')].map(p => p.textContent).join()")
        assert said.startswith(name) and words in said, said
        page.forget_problems()
    page.open_photos(PHOTOS / "twenty/cmyk.jpg")


def test_keyboard_alone(page, url, place):
    """From the empty page to a saved photo by keys alone; only the file dialog is not the page's."""
    focused = "const e = document.activeElement; return e.id || e.name || e.className || e.tagName"

    def tab_to(wanted):
        for _ in range(60):
            if page.run(focused) == wanted:
                return
            page.press(browser.TAB)
        raise AssertionError(f"no way to {wanted} by Tab")

    page.visit(url)
    page.wait_until("return document.body.classList.contains('ready')")
    page.press(browser.TAB)
    assert page.run(focused) == "open"
    photo = PHOTOS / "twenty/orientation6.jpg"
    page.open_photos(photo)
    for place_of_focus in ("stage", "divider", "compare", "look"):
        tab_to(place_of_focus)
    page.press(browser.RIGHT)  # the next look
    page.wait_until("return document.querySelector('#looks input:checked').value !== 'AE0'")
    page.press(browser.LEFT)
    tab_to("setting-slider")
    before = page.run("return document.activeElement.value")
    page.press(browser.RIGHT, browser.RIGHT)
    after = page.run("return document.activeElement.value")
    assert float(after) > float(before)
    page.press("c")
    assert page.run("return document.querySelector('#compare').getAttribute('aria-pressed')") == "false"
    page.press("c")
    page.chord(browser.CONTROL, "z")
    page.chord(browser.CONTROL, "z")
    assert page.run("return document.querySelector('#setting-slider').value") == before
    page.chord(browser.CONTROL, browser.SHIFT, "z")
    page.chord(browser.CONTROL, browser.SHIFT, "z")
    tab_to("save")
    page.press(browser.ENTER)
    assert page.saved("orientation6_AE0.jpg") == command("enhance", photo, "--slider", after, place=place)


def test_names_what_is_lost(page):
    """Another format has no place for everything."""
    page.open_photos(PHOTOS / "twenty/phone.jpg")
    page.run("document.querySelector('#format').value = 'PNG'")
    page.click("#save")
    page.wait_until("return document.querySelector('#status').textContent.includes('Not in it:')")
    assert page.run("return document.querySelectorAll('#status li').length") > 0
    assert page.saved("phone_AE0.png").startswith(b"\x89PNG")


def test_touch(page):
    """A finger moves the divider and the photo, two of them zoom."""
    page.emulate(820, 1180)
    page.command("Emulation.setTouchEmulationEnabled", {"enabled": True, "maxTouchPoints": 2})

    def touch(kind, *points):
        page.command("Input.dispatchTouchEvent", {"type": kind, "touchPoints": [
            {"x": x, "y": y, "id": i} for i, (x, y) in enumerate(points)]})

    def box(selector):
        """Where it is, once it stays there: what a finger or another size of the window moves comes a little later."""
        before = None
        while True:
            now = page.run("const b = document.querySelector(arguments[0]).getBoundingClientRect();"
                           "return [b.left, b.top, b.width, b.height]", selector)
            if now == before:
                return now
            before = now
            time.sleep(0.1)

    left, top, width, height = box("#divider")
    divider = (left + width / 2, top + height / 2)
    share = page.run("return Number(document.querySelector('#divider').getAttribute('aria-valuenow'))")
    touch("touchStart", divider)
    touch("touchMove", (divider[0] - 80, divider[1]))
    touch("touchEnd")
    page.wait_until("return Number(document.querySelector('#divider').getAttribute('aria-valuenow')) < arguments[0]",
                    share)

    left, top, width, height = box("#stage")
    x, y = left + width / 2, top + height / 2
    before = box("#after")
    touch("touchStart", (x - 20, y), (x + 20, y))
    for far in (40, 70, 100):
        touch("touchMove", (x - far, y), (x + far, y))
    touch("touchEnd")
    zoomed = box("#after")
    assert zoomed[2] > 2 * before[2], (before, zoomed)
    touch("touchStart", (x, y))
    touch("touchMove", (x - 60, y - 30))
    touch("touchEnd")
    moved = box("#after")
    assert moved[0] < zoomed[0] - 40 and abs(moved[2] - zoomed[2]) < 1, (zoomed, moved)
    page.press("0")
    page.command("Emulation.setTouchEmulationEnabled", {"enabled": False})
    page.emulate(1280, 900)


def test_survives_a_broken_worker(page):
    """What no call should bring about: the engine itself fails. The page says so, starts another one and goes on."""
    page.run("quenbyWorker().worker.postMessage({ id: 0, call: 'what there is not', given: [] })")
    slide(page, 0.3)
    page.wait_until("return document.querySelector('#problems').textContent.includes('the engine stopped')")
    page.wait_until("return quenbyWorker().error === undefined")
    page.shown()
    assert len(page.problems()) == 1, page.problems()
    page.forget_problems()
    slide(page, 0.6)
    page.click("#save")
    browser.wait_for(page.downloads / "cmyk_AE0.jpg")
    assert page.saved("cmyk_AE0.jpg") == command(
        "enhance", PHOTOS / "twenty/cmyk.jpg", "--slider", "0.6", place=page.downloads.parent)
    assert page.problems() == [], page.problems()


def test_a_hundred_megapixels(page):
    page.choose("#files", PHOTOS / "hundred.jpg")
    page.wait_until("return document.title.startsWith('hundred')", seconds=60)
    page.wait_until(SHOWN, seconds=60)
    page.run("delete document.body.dataset.saved")
    page.click("#save")
    page.wait_until("return document.body.dataset.saved", seconds=120)
    memory = int(page.run("return document.body.dataset.memory"))
    assert memory < 1 << 30, memory
    assert len(page.saved("hundred_AE0.jpg")) > 1_000_000


def test_without_vectors(url, place):
    """A processor that has none for WebAssembly gets the other module, and the same file."""
    downloads = place / "scalar"
    downloads.mkdir()
    with browser.Browser(downloads, 1280, 900, ["--js-flags=--no-enable-ssse3 --no-enable-sse4-1"]) as window:
        page = Page(window, downloads)
        page.visit(url)
        page.wait_until("return document.body.classList.contains('ready')")
        assert "no vectors" in page.text("#build"), page.text("#build")
        photo = PHOTOS / "twenty/orientation6.jpg"
        page.open_photos(photo)
        page.click("#save")
        slider = page.run("return document.querySelector('#setting-slider').value")
        assert page.saved("orientation6_AE0.jpg") == command("enhance", photo, "--slider", slider, place=place)


def test_selftest(page):
    page.press("?")
    page.wait_until("return document.querySelectorAll('#licences details').length > 7")
    page.click("#selftest")
    page.wait_until("return !document.querySelector('#table').hidden")
    native = subprocess.run([QUENBY, "selftest", "--quiet"], capture_output=True, text=True, check=True).stdout
    assert page.text("#table") == native
    assert page.text("#digest").endswith(hashlib.sha256(native.encode()).hexdigest())
    page.run("document.querySelector('#about-box').close()")


def test_accessible(page):
    if "AXE" not in os.environ:
        print("skipped: the accessibility checker, which npm's registry has")
        return
    script = pathlib.Path(os.environ["AXE"]).read_text()
    page.run(script + "\nwindow.axe = axe;")
    for about, dark in ((False, False), (False, True), (True, False)):
        page.emulate(1280, 900, dark)
        if about:
            page.press("?")
        found = page.run_async("const done = arguments[0]; axe.run().then(r => done(r.violations.map("
                               "v => [v.impact, v.id, v.nodes.map(n => n.html.slice(0, 120))])), e => done(String(e)))")
        serious = [one for one in found if one[0] in ("serious", "critical")]
        assert not serious, json.dumps(serious, indent=1)
    page.run("document.querySelector('#about-box').close()")


def test_installable(page):
    told = page.command("Page.getInstallabilityErrors", {})["installabilityErrors"]
    assert told == [], told
    manifest = json.loads(page.command("Page.getAppManifest", {})["data"])
    assert manifest["display"] == "standalone", manifest


def test_offline(page, server, url):
    page.wait_until("return navigator.serviceWorker.controller !== null")
    server.terminate()
    server.wait()
    page.visit(url)
    page.wait_until("return document.body.classList.contains('ready')")
    page.open_photos(PHOTOS / "twenty/plain.jpg")
    page.click("#save")
    page.saved("plain_AE0.jpg")


def screenshots(page):
    folder = os.environ.get("QUENBY_SCREENSHOTS")
    if folder is None:
        return
    folder = pathlib.Path(folder)
    for width, height, dark in ((1440, 900, True), (820, 1180, False), (360, 740, True)):
        page.emulate(width, height, dark)
        time.sleep(0.5)
        page.screenshot(folder / f"page_{width}.png")
    page.emulate(1280, 900)


def requests_of(origin, log):
    """Every address that the page, its workers and its service worker asked any host for. What Chromium
    asks on its own account has no initiator."""
    urls = set()
    for line in log.read_text().splitlines():  # an event each, within a frame
        try:
            told = json.loads(line.rstrip(",")).get("params", {})
        except json.JSONDecodeError:
            continue
        if told.get("initiator") == origin:
            urls.add(told["url"])
    assert f"{origin}/app.js" in urls, "the log does not tell what the page asks for"
    return urls


def main(dist):
    server = subprocess.Popen(["node", str(root / "web/serve.mjs"), dist, "0"], stdout=subprocess.PIPE, text=True)
    try:
        url = server.stdout.readline().strip()
        with tempfile.TemporaryDirectory() as place:
            place = pathlib.Path(place).resolve()
            downloads, log = place / "downloads", place / "network.json"
            downloads.mkdir()
            arguments = [f"--log-net-log={log}"]
            with browser.Browser(downloads, 1280, 900, arguments) as window:
                page = Page(window, downloads)
                page.visit(url)
                page.wait_until("return document.body.classList.contains('ready')")
                if "QUENBY_SCREENSHOTS" in os.environ:
                    page.screenshot(pathlib.Path(os.environ["QUENBY_SCREENSHOTS"]) / "page_empty.png")
                test_saves_the_commands_bytes(page, place)
                screenshots(page)
                test_fits_narrow_pages(page)
                test_shows_one_to_one(page, place)
                test_compares(page)
                test_faces(page, place)
                test_measures(page)
                test_many(page, place)
                test_drops_and_pastes(page)
                test_hostile_files(page)
                test_survives_a_broken_worker(page)
                test_touch(page)
                test_accessible(page)
                test_selftest(page)
                test_a_hundred_megapixels(page)
                test_keyboard_alone(page, url, place)
                test_names_what_is_lost(page)
                assert page.complaints() == [], page.complaints()
                test_without_vectors(url, place)
                test_installable(page)
                test_offline(page, server, url)
            strangers = {found for found in requests_of(url.rstrip("/"), log) if not found.startswith(url)}
            assert not strangers, strangers
    finally:
        server.terminate()
        server.wait()
    print("the page: all well")


if __name__ == "__main__":
    main(*sys.argv[1:])
