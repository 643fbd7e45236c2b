// The module in node, both builds: the command's bytes, and what it says of what cannot be done.
//   QUENBY=... PHOTOS=... PACKAGE=... TABLE=... node --test module.test.mjs
import assert from "node:assert/strict";
import { execFileSync, spawnSync } from "node:child_process";
import { mkdtempSync, readdirSync, readFileSync, rmSync, writeFileSync } from "node:fs";
import { tmpdir } from "node:os";
import { join } from "node:path";
import { after, test } from "node:test";
import { pathToFileURL } from "node:url";

const { QUENBY, PHOTOS, PACKAGE, TABLE } = process.env;
const { bestBuild, load, QuenbyError } = await import(pathToFileURL(join(PACKAGE, "quenby.js")));
const builds = { simd: await load({ build: "simd" }), scalar: await load({ build: "scalar" }) };
const scratch = mkdtempSync(join(tmpdir(), "quenby-web-"));
after(() => rmSync(scratch, { recursive: true }));

const twenty = readdirSync(join(PHOTOS, "twenty")).sort();
const photo = (name) => new Uint8Array(readFileSync(join(PHOTOS, name)));

function command(...args) {
  const out = join(scratch, "out.jpg");
  execFileSync(QUENBY, [...args, "-o", out, "--overwrite", "--quiet"], { stdio: "pipe" });
  return new Uint8Array(readFileSync(out));
}

test("there are twenty photos and more, and this machine has vectors", () => {
  assert.ok(twenty.length >= 20);
  assert.equal(bestBuild(), "simd");
});

test("the table is the command's and the recorded one", () => {
  const native = execFileSync(QUENBY, ["selftest", "--quiet"], { encoding: "utf8" });
  assert.equal(native, `quenby ${builds.simd.version}\n${readFileSync(TABLE, "utf8")}`);
  for (const quenby of Object.values(builds)) assert.equal(quenby.selftest(), native);
});

test("every photo becomes the command's file", () => {
  for (const name of twenty) {
    const path = join(PHOTOS, "twenty", name);
    const expected = command("enhance", path, "--slider", "0.4");
    const winter = command("look", "winter", path);
    for (const [build, quenby] of Object.entries(builds)) {
      const file = photo(join("twenty", name));
      const same = (made, wanted, what) =>
        assert.ok(Buffer.compare(made.bytes, wanted) === 0, `${name}, ${build}: ${what}`);
      same(quenby.filterFile(file, "AE0", { slider: 0.4 }), expected, "enhanced");
      same(quenby.filterFile(file, "WinterRGB"), winter, "look");
    }
  }
});

test("faces, quality and what is left out become the command's file", () => {
  const path = join(PHOTOS, "twenty", "faces.jpg");
  const { simd } = builds;
  const file = photo("twenty/faces.jpg");
  assert.deepEqual(simd.open(file).faces.map((face) => face.name), ["Ada"]);
  const made = simd.filterFile(file, "AE08bit", "slider=0.7;", {
    faces: [{ left: 0.1, top: 0.2, right: 0.3, bottom: 0.5 }], open: { ignoreKnownFaces: true },
    save: { quality: 77, sampling: "4:4:4", dropLocation: true },
  });
  assert.deepEqual(made.bytes, command("enhance", path, "--filter", "AE08bit", "--slider", "0.7",
    "--faces", "none", "--face", "0.1,0.2,0.3,0.5", "--quality", "77", "--subsampling", "444",
    "--strip", "gps"));
});

// Of a size that pays for tables which smaller ones go without.
test("vectors give the bytes of plain code, whatever the colours", () => {
  const [width, height] = [701, 401];
  const data = new Uint8Array(4 * width * height);
  for (let i = 0, random = 1; i < data.length; ++i) {
    random = (Math.imul(random, 1664525) + 1013904223) >>> 0;
    data[i] = (random >>> 24) >> (i >> 14 & 3); // dark ones, too
  }
  const sessions = Object.values(builds).map((quenby) => quenby.session({ data, width, height }));
  for (const [filter, parameters] of [["AE0", "slider=0.9;"], ["AE08bit", "slider=0.2;"],
    ["AE0", "slider=0.6;gtmOnly=true;"], ["LowDimRGBCurve", "s1=0.9;"], ["SummerRGB", ""],
    ["ZebraBW", ""], ["ZebraBW", "maskRadius=0.7;maskAlpha=0.6;"], ["ZebraBW", "applyMask=0;"]]) {
    const [vectors, plain] = sessions.map((session) => session.apply(filter, parameters));
    assert.ok(Buffer.compare(Buffer.from(vectors), Buffer.from(plain)) === 0, `${filter} ${parameters}`);
  }
  for (const session of sessions) session.close();
});

test("a session gives what the file holds", () => {
  const { simd, scalar } = builds;
  const [first, second] = [simd, scalar].map((quenby) => {
    const opened = quenby.open(photo("twenty/orientation6.jpg"));
    assert.deepEqual([opened.width, opened.height], [247, 331]);
    const session = opened.session();
    const slow = session.setSlider(0.7).slice();
    const pixels = session.setSlider(0.3).slice();
    assert.notDeepEqual(slow, pixels);
    const look = session.look("ZebraBW").slice();
    opened.close();
    const again = session.setSlider(0.3);
    assert.deepEqual(again, pixels);
    session.close();
    assert.throws(() => session.setSlider(0.3), QuenbyError);
    return [pixels, look];
  });
  assert.deepEqual(first, second);
});

test("scores, shots and groups are those of the library", () => {
  const { simd } = builds;
  const path = join(PHOTOS, "large.jpg");
  const told = JSON.parse(execFileSync(QUENBY, ["score", "--json", path], { encoding: "utf8" }));
  const opened = simd.open(photo("large.jpg"));
  assert.ok(Math.abs(opened.score() - told.score) < 1e-3, JSON.stringify(told));
  opened.close();
  const shots = ["a", "b", "c"].map((name) => simd.shot(photo(`similar/${name}.jpg`)));
  assert.deepEqual(simd.duplicates(shots), [0, 0, 2]);
  assert.equal(simd.score({ data: new Uint8Array(4 * 8 * 8), width: 8, height: 8 }), null);
});

test("filters tell what they take", () => {
  const filters = builds.simd.filters();
  const told = JSON.parse(execFileSync(QUENBY, ["looks", "--json"], { encoding: "utf8" }));
  assert.deepEqual(filters.map(({ name }) => name), told.map(({ name }) => name));
  const slider = filters[0].parameters.find(({ name }) => name === "slider");
  assert.deepEqual([slider.kind, slider.required, slider.lowest, slider.highest], ["number", true, 0, 1]);
});

test("limits are those that are named", () => {
  const { simd } = builds;
  const file = photo("twenty/plain.jpg");
  const { width, height } = simd.facts(file);
  const enough = { maxBytes: file.length, maxPixels: width * height, maxScans: 1, maxSegments: 99 };
  for (const call of [
    (limits) => simd.facts(file, limits), (limits) => simd.shot(file, limits),
    (limits) => simd.open(file, limits).close(),
    (limits) => simd.filterFile(file, "WinterRGB", {}, { open: limits }),
  ]) {
    call(enough);
    const less = { maxBytes: file.length - 1, maxPixels: width * height - 1, maxSegments: 1 };
    for (const [limit, value] of Object.entries(less)) {
      assert.throws(() => call({ [limit]: value }), { kind: "too-large" }, limit);
    }
  }
});

test("what cannot be done is an error with a sentence, and the module lives on", () => {
  const expected = {
    "hostile/empty.jpg": "empty-file", "hostile/cut.jpg": "truncated", "hostile/bomb.jpg": "too-large",
    "hostile/text.jpg": "not-a-photo", "hostile/page.png": "not-a-photo",
  };
  for (const quenby of Object.values(builds)) {
    for (const [name, kind] of Object.entries(expected)) {
      const refused = (error) => error instanceof QuenbyError && error.kind === kind && error.message.length > 10;
      assert.throws(() => quenby.open(photo(name)), refused, name);
      assert.throws(() => quenby.filterFile(photo(name), "AE0", { slider: 0.4 }), refused, name);
    }
    const plain = photo("twenty/plain.jpg");
    const invalid = (error) => error.kind === "invalid-argument";
    assert.throws(() => quenby.filterFile(plain, "AE1"), invalid);
    assert.throws(() => quenby.filterFile(plain, "AE0"), invalid);
    assert.throws(() => quenby.filterFile(plain, "AE0", { slider: 0.4 }, { save: { quality: 300 } }), invalid);
    assert.throws(() => quenby.session({ data: new Uint8Array(3), width: 1, height: 1 }), invalid);
    assert.equal(quenby.open(plain).width, 203);
  }
});

test("of damaged files comes the command's result or its sentence", () => {
  const { simd } = builds;
  const path = join(scratch, "damaged.jpg");
  const sentences = new Set();
  for (const name of ["progressive", "profile2", "restarts", "faces"]) {
    const whole = photo(`twenty/${name}.jpg`);
    for (let step = 1; step < 12; ++step) {
      const damaged = whole.slice();
      damaged.fill(step * 23, Math.floor((step / 14) ** 2 * whole.length), Math.floor((step / 14) ** 2 * whole.length) + 3);
      writeFileSync(path, damaged);
      const out = join(scratch, "out.jpg");
      const native = spawnSync(QUENBY, ["enhance", path, "--slider", "0.4", "-o", out, "--overwrite"], { encoding: "utf8" });
      try {
        const { bytes } = simd.filterFile(damaged, "AE0", { slider: 0.4 });
        assert.equal(native.status, 0, native.stderr);
        assert.ok(Buffer.compare(bytes, readFileSync(out)) === 0, `${name}, ${step}`);
      } catch (error) {
        if (!(error instanceof QuenbyError)) throw error;
        sentences.add(error.message);
        assert.ok(native.stderr.includes(error.message), `${error.message}: ${native.stderr}`);
      }
    }
  }
  assert.ok(sentences.size > 2, [...sentences].join());
});

test("too little memory is an error, and the next photo works", () => {
  const { simd } = builds;
  // Nearly all that 32 bits address, which costs nothing until it is written.
  const taken = [];
  for (let size = 1 << 30; size >= 1 << 20; ) {
    const address = simd.malloc(size);
    if (address === 0) size >>= 1;
    else taken.push(address);
  }
  assert.ok(taken.some((address) => address > 2 ** 31));
  const picture = { data: new Uint8Array(4 * 3000 * 2000), width: 3000, height: 2000 };
  const message = "not enough memory";
  assert.throws(() => simd.session(picture), { kind: "out-of-memory", message });
  assert.throws(() => simd.filterFile(photo("large.jpg"), "AE0", { slider: 1 }), { kind: "out-of-memory", message });
  for (const address of taken) simd.module.free(address);
  simd.session(picture).close();
  assert.equal(simd.open(photo("twenty/plain.jpg")).width, 203);
});

test("what takes too long is given up, and the module lives on", () => {
  const { simd } = builds;
  const file = photo("large.jpg");
  const slow = { kind: "cancelled", message: "was given up after 0 ms" };
  const opened = simd.open(file, { timeout: 60_000 });
  const session = opened.session();
  const pixels = session.setSlider(0.3).slice();
  for (const call of [
    () => simd.open(file, { timeout: 0 }), () => simd.shot(file, { timeout: 0 }),
    () => simd.filterFile(file, "AE0", { slider: 1 }, { timeout: 0 }),
    () => simd.write(opened, "PNG", { timeout: 0 }), () => opened.save({ timeout: 0 }),
    () => session.setSlider(0.9, { timeout: 0 }), () => session.look("ZebraBW", "", { timeout: 0 }),
    () => simd.duplicates([simd.shot(file), simd.shot(file)], 0, { timeout: 0 }),
  ]) assert.throws(call, slow, String(call));
  // Some dozen milliseconds' work, so on the way.
  assert.throws(() => simd.filterFile(file, "AE0", { slider: 1 }, { timeout: 1 }), { kind: "cancelled" });
  assert.deepEqual(simd.filterFile(file, "AE0", { slider: 1 }, { timeout: 60_000 }),
    simd.filterFile(file, "AE0", { slider: 1 }));
  assert.deepEqual(session.setSlider(0.3, { timeout: 60_000 }), pixels);
  for (const wrong of [-1, NaN, 2 ** 32]) {
    assert.throws(() => simd.open(file, { timeout: wrong }), { kind: "invalid-argument" });
  }
  session.close();
  opened.close();
});

test("a package is what npm packs", () => {
  const packed = spawnSync("npm", ["pack", "--dry-run", "--json"], { cwd: PACKAGE, encoding: "utf8" });
  const files = JSON.parse(packed.stdout)[0].files.map(({ path }) => path);
  for (const name of ["quenby.js", "quenby.d.ts", "quenby-simd.wasm", "quenby-scalar.wasm", "README.md",
    "licences/libjpeg-turbo.txt"]) {
    assert.ok(files.includes(name), name);
  }
});
