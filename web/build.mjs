// build.mjs PACKAGE LICENCES OUT: the page as files for any static host.
import { execFileSync } from "node:child_process";
import { createHash } from "node:crypto";
import { cp, mkdir, readdir, readFile, rm, writeFile } from "node:fs/promises";
import { basename, dirname, join, relative } from "node:path";
import { fileURLToPath, pathToFileURL } from "node:url";

const [packageFolder, licences, out] = process.argv.slice(2);
const here = dirname(fileURLToPath(import.meta.url));

await rm(out, { recursive: true, force: true });
await cp(join(here, "src"), out, { recursive: true });
await mkdir(join(out, "quenby"));
for (const name of await readdir(packageFolder)) {
  if (/\.(js|wasm)$/.test(name)) await cp(join(packageFolder, name), join(out, "quenby", name));
}

// The page in one file and its worker in another, and all without comments and long names; what the service
// worker is filled with stays to be found.
const minify = (...options) =>
  execFileSync("esbuild", ["--minify", "--target=es2022", "--log-level=warning", "--allow-overwrite",
    `--outbase=${out}`, `--outdir=${out}`, ...options], { stdio: "inherit" });
const whole = ["app.js", "quenby/worker.js"].map((name) => join(out, name));
minify("--bundle", "--format=esm", "--external:node:fs/promises", ...whole);
for (const path of await filesBelow(out)) {
  if (path.endsWith(".js") && !whole.includes(path) && basename(path) !== "sw.js") await rm(path);
}
minify(join(out, "style.css"));

const texts = [];
for (const name of (await readdir(licences)).sort()) {
  texts.push({ name: name.replace(/\.txt$/, ""), text: await readFile(join(licences, name), "utf8") });
}
await writeFile(join(out, "licences.json"), JSON.stringify(texts));

async function filesBelow(folder) {
  const found = [];
  for (const entry of await readdir(folder, { withFileTypes: true })) {
    const path = join(folder, entry.name);
    found.push(...(entry.isDirectory() ? await filesBelow(path) : [path]));
  }
  return found.sort();
}
const sum = createHash("sha256");
const names = [];
for (const path of await filesBelow(out)) {
  const name = relative(out, path);
  sum.update(name).update(await readFile(path));
  if (name !== "sw.js") names.push(name);
}
const ofBuild = (build) => names.filter((name) => name.startsWith(`quenby/quenby-${build}.`));
const builds = [...ofBuild("simd"), ...ofBuild("scalar")];
const { probe } = await import(pathToFileURL(join(packageFolder, "vectors.js")));
const worker = await readFile(join(out, "sw.js"), "utf8");
const list = (values) => JSON.stringify(values).slice(1, -1);
await writeFile(join(out, "sw.js"), worker
  .replace("@VERSION@", `quenby-${sum.digest("hex").slice(0, 16)}`)
  .replace('"@FILES@"', () => list(["./", ...names.filter((name) => !builds.includes(name))]))
  .replace('"@SIMD@"', () => list(ofBuild("simd")))
  .replace('"@SCALAR@"', () => list(ofBuild("scalar")))
  .replace('"@PROBE@"', () => list([...probe])));
