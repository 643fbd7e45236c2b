// Everything that the page consists of, kept for when there is no network. web/build.mjs fills in the
// names and a sum over what is in them, so that a new version is another cache.
const version = "@VERSION@";
const files = ["@FILES@"];
const builds = { simd: ["@SIMD@"], scalar: ["@SCALAR@"] };
const probe = new Uint8Array(["@PROBE@"]);

const address = (name) => new URL(name, self.registration.scope).href;
const all = new Set([...files, ...builds.simd, ...builds.scalar].map(address));

self.addEventListener("install", (event) => {
  const own = WebAssembly.validate(probe) ? builds.simd : builds.scalar;
  event.waitUntil(caches.open(version)
    .then((cache) => cache.addAll([...files, ...own].map((name) => new Request(address(name), { cache: "reload" }))))
    .then(() => self.skipWaiting()));
});

self.addEventListener("activate", (event) => {
  event.waitUntil(caches.keys()
    .then((names) => Promise.all(names.filter((name) => name !== version).map((name) => caches.delete(name))))
    .then(() => self.clients.claim()));
});

self.addEventListener("fetch", (event) => {
  const url = event.request.url.replace(/[?#].*/, "");
  if (event.request.method !== "GET" || !all.has(url)) return;
  event.respondWith(caches.open(version).then(async (cache) => {
    const kept = await cache.match(url);
    return kept ?? fetch(event.request);
  }));
});
