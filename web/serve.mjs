// serve.mjs FOLDER [PORT]: serves a folder on 127.0.0.1, under the policy that the page states itself.
import { createReadStream } from "node:fs";
import { readFile, stat } from "node:fs/promises";
import { createServer } from "node:http";
import { extname, join, resolve, sep } from "node:path";

const root = resolve(process.argv[2]);
const types = {
  ".html": "text/html; charset=utf-8", ".css": "text/css; charset=utf-8", ".js": "text/javascript; charset=utf-8",
  ".svg": "image/svg+xml", ".json": "application/json", ".wasm": "application/wasm", ".png": "image/png",
  ".webmanifest": "application/manifest+json",
};
const page = await readFile(join(root, "index.html"), "utf8");
const policy = /http-equiv="Content-Security-Policy" content="([^"]+)"/.exec(page)[1];

const server = createServer(async (request, response) => {
  const wanted = decodeURIComponent(new URL(request.url, "http://localhost").pathname);
  const path = join(root, wanted.endsWith("/") ? `${wanted}index.html` : wanted);
  const found = path.startsWith(root + sep) && (await stat(path).catch(() => null));
  if (!found?.isFile() || !["GET", "HEAD"].includes(request.method)) {
    response.writeHead(404).end();
    return;
  }
  response.writeHead(200, {
    "Content-Type": types[extname(path)] ?? "application/octet-stream", "Content-Length": found.size,
    "Content-Security-Policy": `${policy}; frame-ancestors 'none'`, "Referrer-Policy": "no-referrer",
    "X-Content-Type-Options": "nosniff", "Cache-Control": "no-cache",
  });
  if (request.method === "HEAD") response.end();
  else createReadStream(path).pipe(response);
});
server.listen(Number(process.argv[3] ?? 8080), "127.0.0.1", () =>
  console.log(`http://127.0.0.1:${server.address().port}/`));
