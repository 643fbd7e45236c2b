// measure.mjs PACKAGE LIBRARY DIST QUENBY PAPER: processor time of the module's two builds in node beside the
// native library's on one thread, then of the page in Chromium, into the section "web" of a paper, such as
// docs/performance.md. LIBRARY is libquenby.so, QUENBY the command.
import { execFileSync } from "node:child_process";
import { mkdtempSync, readFileSync, rmSync, writeFileSync } from "node:fs";
import { tmpdir } from "node:os";
import { dirname, join, resolve } from "node:path";
import { fileURLToPath, pathToFileURL } from "node:url";

const [packageFolder, library, dist, command, paper] = process.argv.slice(2).map((path) => resolve(path));
const here = dirname(fileURLToPath(import.meta.url));
const { load } = await import(pathToFileURL(join(packageFolder, "quenby.js")));
const scratch = mkdtempSync(join(tmpdir(), "quenby-measure-"));

// Shading, edges and grain.
function picture(width, height) {
  const data = new Uint8Array(4 * width * height);
  let random = 1;
  for (let y = 0, i = 0; y < height; ++y) {
    for (let x = 0; x < width; ++x, i += 4) {
      random = (Math.imul(random, 1664525) + 1013904223) >>> 0;
      const light = 128 + 90 * Math.sin(x / 211 + y / 307) + (random >>> 28) + ((x >> 7) & (y >> 7) & 1 ? -60 : 0);
      data[i] = Math.min(255, Math.max(0, light + 20));
      data[i + 1] = Math.min(255, Math.max(0, light));
      data[i + 2] = Math.min(255, Math.max(0, light - 20));
      data[i + 3] = 255;
    }
  }
  return { data, width, height };
}

const work = [
  ["slider, 1 megapixel", 1155, 866, "AE0", "slider=0.5;", 15],
  ["slider, 12 megapixels", 4000, 3000, "AE0", "slider=0.5;", 5],
  ["ZebraBW, 2 megapixels", 1632, 1224, "ZebraBW", "", 15],
  ["LowDimRGBCurve, 2 megapixels", 1632, 1224, "LowDimRGBCurve", "s1=0.9;s2=0.2;s3=0.4;s4=0.7;", 25],
  ["WinterRGB, 2 megapixels", 1632, 1224, "WinterRGB", "", 15],
];

const median = (times) => times.sort((a, b) => a - b)[times.length >> 1];
const spent = (body) => {
  const start = process.cpuUsage();
  body();
  return process.cpuUsage(start).user / 1000;
};

const lines = [];
const tell = (line) => (console.log(line), lines.push(line));

const builds = [await load({ build: "simd" }), await load({ build: "scalar" })];
tell("| processor time, ms | native, one thread | with vectors | without | times native |\n|---|---|---|---|---|");
for (const [name, width, height, filter, parameters, runs] of work) {
  const pixels = picture(width, height);
  const raw = join(scratch, "pixels");
  writeFileSync(raw, pixels.data);
  const native = Number(execFileSync("python3", [join(here, "native.py"), library, raw, width, height, filter,
    parameters, runs], { encoding: "utf8" }));
  const times = builds.map((quenby) => {
    const session = quenby.session(pixels);
    // V8 compiles what is often called once more, beside the first of these.
    for (let i = 0; i < 10; ++i) session.apply(filter, parameters);
    const result = median(Array.from({ length: runs }, () => spent(() => session.apply(filter, parameters))));
    session.close();
    return result;
  });
  tell(`| ${name} | ${[native, ...times].map((t) => t.toFixed(1)).join(" | ")} | ${(times[0] / native).toFixed(1)} |`);
}

const [quenby] = builds;
const large = join(scratch, "large.jpg");
writeFileSync(large, quenby.write(picture(4000, 3000), "JPEG").bytes);
const hundred = join(scratch, "hundred.jpg");
{
  const other = await load({ build: "simd" });
  writeFileSync(hundred, other.write(picture(11600, 8640), "JPEG", { quality: 80 }).bytes);
}
// The command from its start to the written file, as the page from a click.
const started = performance.now();
execFileSync(command, ["enhance", large, "-o", join(scratch, "native.jpg"), "--slider", "0.4", "-j", "1", "--quiet"]);
const native = performance.now() - started;
tell("");
tell(execFileSync("python3", ["-B", join(here, "page.py"), dist, large, hundred, native.toFixed(0)],
  { encoding: "utf8" }).trim());
rmSync(scratch, { recursive: true });

const begin = "<!-- web -->\n";
const end = "<!-- end of web -->";
const text = readFileSync(paper, "utf8");
writeFileSync(paper, text.slice(0, text.indexOf(begin) + begin.length) + lines.join("\n") + "\n" +
  text.slice(text.indexOf(end)));
