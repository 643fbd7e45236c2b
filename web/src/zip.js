// A zip file of files as they are: photos are compressed already.

const table = Uint32Array.from({ length: 256 }, (_, n) => {
  for (let bit = 0; bit < 8; ++bit) n = n & 1 ? 0xedb88320 ^ (n >>> 1) : n >>> 1;
  return n;
});

export function crc32(bytes) {
  let sum = 0xffffffff;
  for (const byte of bytes) sum = table[(sum ^ byte) & 255] ^ (sum >>> 8);
  return (sum ^ 0xffffffff) >>> 0;
}

function record(fields) {
  const view = new DataView(new ArrayBuffer(fields.reduce((size, [width]) => size + width, 0)));
  let at = 0;
  for (const [width, value] of fields) {
    if (width === 2) view.setUint16(at, value, true);
    else view.setUint32(at, value, true);
    at += width;
  }
  return new Uint8Array(view.buffer);
}

/** @param files  { name, bytes }, fewer than 65536 and below 4 GiB together. */
export function zipOf(files) {
  const parts = [];
  const directory = [];
  let at = 0;
  const now = new Date();
  const time = (now.getHours() << 11) | (now.getMinutes() << 5) | (now.getSeconds() >> 1);
  const date = ((now.getFullYear() - 1980) << 9) | ((now.getMonth() + 1) << 5) | now.getDate();
  for (const { name, bytes } of files) {
    const named = new TextEncoder().encode(name);
    // Version 2.0, names in UTF-8, stored.
    const common = [
      [2, 20], [2, 0x0800], [2, 0], [2, time], [2, date], [4, crc32(bytes)], [4, bytes.length],
      [4, bytes.length], [2, named.length], [2, 0],
    ];
    parts.push(record([[4, 0x04034b50], ...common]), named, bytes);
    directory.push(
      record([[4, 0x02014b50], [2, 20], ...common, [2, 0], [2, 0], [2, 0], [4, 0], [4, at]]), named);
    at += 30 + named.length + bytes.length;
  }
  const size = directory.reduce((sum, part) => sum + part.length, 0);
  if (files.length > 65535 || at + size > 0xffffffff) throw new RangeError("too much for one zip file");
  const end = record([
    [4, 0x06054b50], [2, 0], [2, 0], [2, files.length], [2, files.length], [4, size], [4, at], [2, 0],
  ]);
  return new Blob([...parts, ...directory, end], { type: "application/zip" });
}
