// The structs of quenby.h as WebAssembly's C has them: 4 bytes for pointers and size_t, every field at a
// multiple of its own size. A struct_size that disagrees is an error of the library's.

const scalars = {
  i32: [4, (v, at) => v.getInt32(at, true), (v, at, x) => v.setInt32(at, x, true)],
  u32: [4, (v, at) => v.getUint32(at, true), (v, at, x) => v.setUint32(at, x, true)],
  f32: [4, (v, at) => v.getFloat32(at, true), (v, at, x) => v.setFloat32(at, x, true)],
  f64: [8, (v, at) => v.getFloat64(at, true), (v, at, x) => v.setFloat64(at, x, true)],
  u64: [
    8,
    (v, at) => Number(v.getBigUint64(at, true)),
    (v, at, x) => v.setBigUint64(at, BigInt(x), true),
  ],
};

const utf8 = new TextDecoder();

/** The text that ends with 0 at an address, of at most `size` bytes. */
export function textAt(bytes, at, size = Infinity) {
  let end = at;
  while (bytes[end] !== 0 && end - at < size) ++end;
  return utf8.decode(bytes.slice(at, end));
}

/** @param fields  names and types in their order; "text" and a size is an array of char, a type and a
 *                 count in brackets an array of numbers. */
export function struct(fields) {
  let end = 0;
  let alignment = 1;
  const placed = Object.entries(fields).map(([name, type]) => {
    const [, kind, count] = /^([a-z]+[0-9]*)(?:\[(\d+)\])?$/.exec(type);
    const [size, read, write] = kind === "text" ? [1] : scalars[kind];
    const at = Math.ceil(end / size) * size;
    end = at + size * (count ?? 1);
    alignment = Math.max(alignment, size);
    return { name, kind, count: count && Number(count), size, at, read, write };
  });
  const size = Math.ceil(end / alignment) * alignment;
  return {
    size,
    /** What stands at an address. */
    read(bytes, address) {
      const view = new DataView(bytes.buffer);
      const result = {};
      for (const { name, kind, count, size: step, at, read } of placed) {
        const place = address + at;
        if (kind === "text") result[name] = textAt(bytes, place, count);
        else if (count === undefined) result[name] = read(view, place);
        else result[name] = Array.from({ length: count }, (_, i) => read(view, place + i * step));
      }
      return result;
    },
    /** Writes the fields that are given, 0 into the others and its own size into struct_size. */
    write(bytes, address, values) {
      bytes.fill(0, address, address + size);
      const view = new DataView(bytes.buffer);
      for (const { name, count, size: step, at, write } of placed) {
        if (name === "struct_size") write(view, address + at, size);
        else if (values[name] === undefined) continue;
        else if (count === undefined) write(view, address + at, values[name]);
        else values[name].forEach((x, i) => write(view, address + at + i * step, x));
      }
    },
  };
}

export const QuenbyError = struct({ kind: "i32", message: "text[508]" });
export const Pixels = struct({ rgba: "u32", width: "u32", height: "u32", stride: "u32" });
export const Face = struct({ left: "f32", top: "f32", right: "f32", bottom: "f32", in_pixels: "u32" });
export const Filter = struct({
  struct_size: "u32", name: "u32", display_name: "u32", description: "u32", required: "u32",
  parameter_count: "u32", reads_faces: "u32",
});
export const Parameter = struct({
  struct_size: "u32", name: "u32", description: "u32", wanted: "u32", only_with: "u32", kind: "i32",
  required: "u32", lowest: "f32", highest: "f32", above_lowest: "u32", fewest: "u32", standard: "f32",
});
export const OpenOptions = struct({
  struct_size: "u32", scale: "i32", rotate: "i32", max_pixels: "u64", max_scans: "i32", flags: "u32",
  workers: "u32", max_scanned_pixels: "u64", max_compressed_pixels: "u64", max_segments: "i32",
  max_bytes: "u64",
});
export const SaveOptions = struct({ struct_size: "u32", quality: "i32", flags: "u32", keep: "u32" });
export const Facts = struct({
  struct_size: "u32", width: "u32", height: "u32", channels: "i32", orientation: "i32",
  progressive: "u32", has_alpha: "u32", wall_clock: "f64", utc: "f64", format: "text[16]",
  capture_time: "text[64]", last_edit: "text[96]",
});
export const KnownFace = struct({
  left: "f64", top: "f64", right: "f64", bottom: "f64", name: "text[96]",
});
export const Loss = struct({ struct_size: "u32", what: "u32", why: "u32" });
export const Shot = struct({
  green_cdf: "f32[256]", orientation: "i32", pixel_count: "u32", wall_clock: "f64", utc: "f64",
});
export const Pair = struct({
  first: "u64", second: "u64", seconds: "f64", score: "f32", distance: "f32", times_known: "u32",
  same_orientation: "u32",
});
export const List = struct({ data: "u32", count: "u32" });
export const Niqe = struct({
  struct_size: "u32", score: "f32", block_columns: "u32", block_rows: "u32", features: "f32[36]",
});
