"""page.py DIST PHOTO LARGEST NATIVE: wall time of what the page does with a photo, and how much memory the
module takes for a photo of 100 megapixels, as rows of a table. NATIVE is what the command takes to enhance the
photo, in ms."""

import pathlib
import statistics
import subprocess
import sys
import tempfile
import time

root = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(root / "tests/browser"))
import browser  # noqa: E402

SHOWN = "return document.body.classList.contains('looks-shown') && !document.body.classList.contains('busy')"


def main(dist, photo, largest, native):
    server = subprocess.Popen(["node", str(root / "web/serve.mjs"), dist, "0"], stdout=subprocess.PIPE, text=True)
    try:
        with tempfile.TemporaryDirectory() as place, browser.Browser(place, 1400, 1000) as page:
            page.visit(server.stdout.readline().strip())
            page.wait_until("return document.body.classList.contains('ready')")
            page.run("quenbyFrames.length = 0; window.started = 0;"
                     "document.querySelector('#files').addEventListener('change',"
                     " () => (window.started = performance.now()), true)")
            page.choose("#files", photo)
            first = page.wait_until("return quenbyFrames.length && quenbyFrames[0].at - started")
            page.wait_until(SHOWN)
            page.run("""quenbyFrames.length = 0;
              const slider = document.querySelector('#setting-slider'); let step = 0;
              const move = () => { slider.value = 0.2 + 0.005 * step; slider.dispatchEvent(new Event('input'));
                if (++step < 120) requestAnimationFrame(move); };
              move()""")
            time.sleep(6)
            frames = page.run("return quenbyFrames.slice(5)")
            gaps = [b["at"] - a["at"] for a, b in zip(frames, frames[1:])]
            page.run("delete document.body.dataset.saved")
            page.click("#save")
            saved = page.wait_until("return Number(document.body.dataset.saved)", seconds=60)
            middle = lambda values: f"{statistics.median(values):.1f}"
            print("| in the page, ms | | aim |\n|---|---|---|")
            print(f"| frame to frame while the slider moves, 1 megapixel | {middle(gaps)} | 16.7 |")
            print(f"| of it the filter | {middle([f['filter'] for f in frames])} | |")
            print(f"| of it the canvas | {middle([f['draw'] for f in frames])} | |")
            print(f"| 12 megapixels opened to the first enhanced preview | {first:.0f} | 700 |")
            print(f"| 12 megapixels saved; the command takes {native} in all | {saved} | 1200 |")
            page.choose("#files", largest)
            page.wait_until("return document.title.startsWith('hundred')", seconds=100)
            page.wait_until(SHOWN, seconds=100)
            page.run("delete document.body.dataset.saved")
            page.click("#save")
            took = page.wait_until("return Number(document.body.dataset.saved)", seconds=200)
            memory = page.run("return document.body.dataset.memory")
            print(f"| 100 megapixels saved, with {int(memory) >> 20} MiB of the module's memory | {took} | |")
    finally:
        server.terminate()
        server.wait()


if __name__ == "__main__":
    main(*sys.argv[1:])
