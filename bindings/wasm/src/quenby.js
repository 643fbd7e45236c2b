// Quenby for JavaScript: the C library, its objects as classes. See quenby.d.ts.
import { QuenbyError } from "./errors.js";
import * as layout from "./layout.js";
import { parameterText } from "./parameters.js";
import { bestBuild } from "./vectors.js";

export { bestBuild, parameterText, QuenbyError };

export const kinds = Object.freeze([
  "ok", "invalid-argument", "out-of-memory", "cancelled", "empty-file", "not-a-photo", "unsupported",
  "damaged", "truncated", "too-large", "failed",
]);

const isNode = typeof process !== "undefined" && process.versions?.node !== undefined;

// The exports of a module, whose C++ has been made ready.
async function moduleOf(build, wasm) {
  if (build !== "simd" && build !== "scalar") throw new TypeError(`there is no build "${build}"`);
  const url = build === "simd" // each by its whole name, so that bundlers find it
    ? new URL("./quenby-simd.wasm", import.meta.url)
    : new URL("./quenby-scalar.wasm", import.meta.url);
  if (wasm === undefined && isNode) {
    wasm = await (await import(/* webpackIgnore: true */ "node:fs/promises")).readFile(url);
  }
  let made;
  // All that it asks of its host.
  const imports = {
    env: { emscripten_notify_memory_growth() {} },
    wasi_snapshot_preview1: {
      clock_time_get(_clock, _precision, place) {
        new DataView(made.memory.buffer).setBigUint64(place >>> 0, BigInt(Math.round(performance.now() * 1e6)), true);
        return 0;
      },
      proc_exit() {
        throw new Error("the engine cannot go on");
      },
    },
  };
  const done = wasm === undefined
    ? await WebAssembly.instantiateStreaming(fetch(url), imports)
    : await WebAssembly.instantiate(wasm, imports);
  made = (done.instance ?? done).exports; // an instance alone where a compiled module was given
  made._initialize();
  return made;
}

/** Loads the module: once a worker or program. */
export async function load({ build = bestBuild(), wasm } = {}) {
  return new Quenby(await moduleOf(build, wasm), build);
}

const utf8 = new TextEncoder();

// What one call needs of memory; all of it goes at its end.
class Scope {
  constructor(quenby) {
    this.quenby = quenby;
    this.taken = [];
  }
  allocate(size) {
    const address = this.quenby.malloc(Math.max(1, size));
    if (address === 0) throw new QuenbyError("out-of-memory", "not enough memory");
    this.taken.push(address);
    return address;
  }
  bytes(data) {
    const address = this.allocate(data.length);
    this.quenby.bytes.set(data, address);
    return address;
  }
  text(text) {
    return this.bytes(utf8.encode(`${text}\0`));
  }
  /** Room for a struct, with these values. */
  struct(type, values = {}) {
    const address = this.allocate(type.size);
    type.write(this.quenby.bytes, address, values);
    return address;
  }
  array(type, list) {
    const address = this.allocate(type.size * list.length);
    list.forEach((values, i) => type.write(this.quenby.bytes, address + i * type.size, values));
    return address;
  }
  free() {
    for (const address of this.taken) this.quenby.module.free(address);
  }
}

const openFlags = { asStored: 1, ignoreKnownFaces: 2 };
const saveFlags = {
  dropMetadata: 1, dropLocation: 2, dropThumbnail: 4, dropGainMap: 8, noMark: 16, sourceQuality: 32,
};
const samplings = { "4:4:4": 64, "4:2:2": 128, "4:2:0": 256 };
const keepBits = { copyright: 1, time: 2, exif: 4, xmp: 8, iptc: 16, gainMap: 32 };

function flagsOf(bits, options) {
  return Object.entries(bits).reduce((flags, [name, bit]) => (options[name] ? flags | bit : flags), 0);
}

function openValues(options = {}) {
  return {
    scale: options.scale, rotate: options.rotate, max_bytes: options.maxBytes,
    max_pixels: options.maxPixels, max_scans: options.maxScans, max_segments: options.maxSegments,
    flags: flagsOf(openFlags, options),
  };
}

function saveValues(options = {}) {
  const { sampling, keep = [] } = options;
  if (sampling !== undefined && !(sampling in samplings)) {
    throw new QuenbyError("invalid-argument", `sampling: there is no ${sampling}`);
  }
  const unknown = keep.find((kind) => !(kind in keepBits));
  if (unknown !== undefined) throw new QuenbyError("invalid-argument", `keep: there is no ${unknown}`);
  return {
    quality: options.quality,
    flags: flagsOf(saveFlags, options) | (samplings[sampling] ?? 0),
    keep: keep.reduce((bits, kind) => bits | keepBits[kind], 0),
  };
}

const faceValues = (face) => ({ ...face, in_pixels: face.inPixels ? 1 : 0 });
// A float as it is written: 0.4, not 0.4000000059604645.
const short = (number) => (Number.isFinite(number) ? Number(number.toPrecision(7)) : number);
const known = (number) => (Number.isNaN(number) ? null : number);

function factsOf(raw) {
  return {
    format: raw.format, width: raw.width, height: raw.height, channels: raw.channels,
    orientation: raw.orientation, progressive: raw.progressive !== 0, hasAlpha: raw.has_alpha !== 0,
    captureTime: raw.capture_time, wallClock: known(raw.wall_clock), utc: known(raw.utc),
    lastEdit: raw.last_edit,
  };
}

export class Quenby {
  constructor(module, build) {
    this.module = module;
    this.build = build;
    this.version = this.textAt(module.quenby_version());
  }

  /** All of the module's memory as it is now; another array after it has grown. */
  get bytes() {
    const { buffer } = this.module.memory;
    if (this.view?.buffer !== buffer) this.view = new Uint8Array(buffer);
    return this.view;
  }

  textAt(address) {
    return layout.textAt(this.bytes, address >>> 0);
  }

  // Addresses above 2 GiB come out of the module as negative numbers.
  malloc(size) {
    return this.module.malloc(size) >>> 0;
  }

  scoped(body) {
    const scope = new Scope(this);
    try {
      return body(scope);
    } finally {
      scope.free();
    }
  }

  // Calls a function whose last argument is its error.
  call(name, ...given) {
    return this.scoped((scope) => {
      const error = scope.struct(layout.QuenbyError);
      if (this.module[name](...given, error) === 0) return;
      const { kind, message } = layout.QuenbyError.read(this.bytes, error);
      throw new QuenbyError(kinds[kind] ?? "failed", message);
    });
  }

  // Calls one whose last argument but one receives a number or an address.
  receive(name, ...given) {
    return this.scoped((scope) => {
      const place = scope.allocate(4);
      this.bytes.fill(0, place, place + 4);
      this.call(name, ...given, place);
      return new DataView(this.bytes.buffer).getUint32(place, true);
    });
  }

  // The same for a struct.
  receiveStruct(type, name, ...given) {
    return this.scoped((scope) => {
      const place = scope.struct(type);
      this.call(name, ...given, place);
      return type.read(this.bytes, place);
    });
  }

  // What a call gets that may take `timeout` milliseconds: an object that ends it, null without a limit.
  timed(timeout, body) {
    if (timeout === undefined) return body(0);
    if (!(timeout >= 0 && timeout < 2 ** 32 - 1)) {
      throw new QuenbyError("invalid-argument", "timeout: is not 0 to 4294967294 milliseconds");
    }
    const cancel = this.receive("quenby_cancel_new_after", Math.ceil(timeout));
    try {
      return body(cancel);
    } catch (error) {
      if (error.kind !== "cancelled") throw error;
      throw new QuenbyError(error.kind, `was given up after ${timeout} ms`);
    } finally {
      this.module.quenby_cancel_free(cancel);
    }
  }

  filters() {
    const kindNames = ["number", "boolean", "numbers"];
    return Array.from({ length: this.receive("quenby_filter_count") }, (_, index) => {
      const filter = this.receiveStruct(layout.Filter, "quenby_filter_at", index);
      const parameters = Array.from({ length: filter.parameter_count }, (_none, i) => {
        const row = this.receiveStruct(layout.Parameter, "quenby_parameter_at", filter.name, i);
        return {
          name: this.textAt(row.name), description: this.textAt(row.description),
          wanted: this.textAt(row.wanted), onlyWith: this.textAt(row.only_with),
          kind: kindNames[row.kind], required: row.required !== 0, lowest: short(row.lowest),
          highest: short(row.highest), aboveLowest: row.above_lowest !== 0, fewest: row.fewest,
          standard: known(short(row.standard)),
        };
      });
      return {
        name: this.textAt(filter.name), displayName: this.textAt(filter.display_name),
        description: this.textAt(filter.description), required: this.textAt(filter.required),
        readsFaces: filter.reads_faces !== 0, parameters,
      };
    });
  }

  facts(file, limits) {
    return this.scoped((scope) => factsOf(this.receiveStruct(layout.Facts, "quenby_read_facts_within",
      scope.bytes(file), file.length, scope.struct(layout.OpenOptions, openValues(limits)))));
  }

  open(file, options = {}) {
    return this.scoped((scope) => this.timed(options.timeout, (cancel) =>
      new Photo(this, this.receive("quenby_photo_open", scope.bytes(file), file.length,
        scope.struct(layout.OpenOptions, openValues(options)), cancel))));
  }

  session(picture, faces = []) {
    return this.scoped((scope) => {
      const pixels = this.pixels(scope, picture);
      const handle = this.receive("quenby_session_open", pixels,
        scope.array(layout.Face, faces.map(faceValues)), faces.length, 0);
      return new Session(this, handle, picture.width, picture.height);
    });
  }

  pixels(scope, { data, width, height }) {
    if (data.length !== 4 * width * height) {
      throw new QuenbyError("invalid-argument", "pixels: not four bytes for each of width x height");
    }
    return scope.struct(layout.Pixels,
      { rgba: scope.bytes(data), width, height, stride: 4 * width });
  }

  filterFile(file, filter, parameters, { faces = [], open, format, save, timeout } = {}) {
    return this.scoped((scope) => this.timed(timeout, (cancel) =>
      this.takeFile(this.receive("quenby_filter_file", scope.bytes(file), file.length, scope.text(filter),
        scope.text(parameterText(parameters)), scope.array(layout.Face, faces.map(faceValues)), faces.length,
        scope.struct(layout.OpenOptions, openValues(open)), format ? scope.text(format) : 0,
        scope.struct(layout.SaveOptions, saveValues(save)), cancel))));
  }

  write(picture, format = "JPEG", save = {}) {
    return this.scoped((scope) => this.timed(save.timeout, (cancel) =>
      this.takeFile(this.receive("quenby_write", this.pixels(scope, picture), scope.text(format),
        scope.struct(layout.SaveOptions, saveValues(save)), cancel))));
  }

  // The bytes of a quenby_file, which is freed.
  takeFile(file) {
    try {
      const at = this.module.quenby_file_data(file) >>> 0;
      const losses = Array.from({ length: this.module.quenby_file_loss_count(file) }, (_, i) => {
        const { what, why } = this.receiveStruct(layout.Loss, "quenby_file_loss", file, i);
        return { what: this.textAt(what), why: this.textAt(why) };
      });
      return { bytes: this.bytes.slice(at, at + (this.module.quenby_file_size(file) >>> 0)), losses };
    } finally {
      this.module.quenby_file_free(file);
    }
  }

  score(picture) {
    return this.scoped((scope) => this.scoreOf(this.pixels(scope, picture)));
  }

  scoreOf(pixels) {
    return this.scoped((scope) => {
      const result = scope.struct(layout.Niqe);
      this.call("quenby_niqe", pixels, result, 0, 0);
      return known(layout.Niqe.read(this.bytes, result).score);
    });
  }

  shot(file, options = {}) {
    return this.scoped((scope) => this.timed(options.timeout, (cancel) => this.receiveStruct(layout.Shot,
      "quenby_read_shot", scope.bytes(file), file.length,
      scope.struct(layout.OpenOptions, openValues(options)), cancel)));
  }

  /** @returns for each shot the index of the first of its group, its own where it is in none. */
  duplicates(shots, threshold = 1.5, { timeout } = {}) {
    return this.scoped((scope) => {
      const list = scope.struct(layout.List);
      this.timed(timeout, (cancel) => this.call("quenby_find_pairs", scope.array(layout.Shot, shots),
        shots.length, threshold, cancel, list));
      const { data, count } = layout.List.read(this.bytes, list);
      try {
        const firstOf = scope.allocate(8 * shots.length);
        this.call("quenby_group_pairs", data, count, shots.length, firstOf);
        const view = new DataView(this.bytes.buffer);
        return shots.map((_, i) => Number(view.getBigUint64(firstOf + 8 * i, true)));
      } finally {
        this.module.quenby_pairs_free(list);
      }
    });
  }

  selftest() {
    const table = this.textAt(this.module.quenby_wasm_selftest());
    if (table === "") throw new QuenbyError("out-of-memory", "not enough memory");
    return `quenby ${this.version}\n${table}`;
  }
}

// An object of the library's; without a call of close() its memory goes with the module.
class Held {
  constructor(quenby, handle, free) {
    this.quenby = quenby;
    this.held = handle;
    this.free = free;
  }
  get handle() {
    if (this.held === 0) throw new QuenbyError("invalid-argument", "is closed");
    return this.held;
  }
  close() {
    if (this.held !== 0) this.quenby.module[this.free](this.held);
    this.held = 0;
  }
}

export class Photo extends Held {
  constructor(quenby, handle) {
    super(quenby, handle, "quenby_photo_free");
    this.facts = factsOf(quenby.receiveStruct(layout.Facts, "quenby_photo_facts", handle));
    const { rgba, width, height } = quenby.receiveStruct(layout.Pixels, "quenby_photo_pixels", handle);
    Object.assign(this, { address: rgba, width, height });
    this.notices = [];
    for (let i = 0, at; (at = quenby.module.quenby_photo_notice(handle, i)) !== 0; ++i) {
      this.notices.push(quenby.textAt(at));
    }
    this.faces = quenby.scoped((scope) => {
      const count = quenby.receive("quenby_photo_faces", handle, 0, 0);
      const place = scope.allocate(layout.KnownFace.size * count);
      quenby.receive("quenby_photo_faces", handle, place, count);
      return Array.from({ length: count }, (_, i) =>
        layout.KnownFace.read(quenby.bytes, place + i * layout.KnownFace.size));
    });
  }

  /** The module's own memory: to be copied before anything else is called. */
  get data() {
    const { handle } = this;
    return handle && new Uint8ClampedArray(this.quenby.bytes.buffer, this.address,
      4 * this.width * this.height);
  }

  session(faces = []) {
    return this.quenby.scoped((scope) => new Session(this.quenby,
      this.quenby.receive("quenby_session_open_photo", this.handle,
        scope.array(layout.Face, faces.map(faceValues)), faces.length),
      this.width, this.height));
  }

  save({ picture, format, ...save } = {}) {
    const { quenby } = this;
    return quenby.scoped((scope) => quenby.timed(save.timeout, (cancel) =>
      quenby.takeFile(quenby.receive("quenby_photo_save", this.handle,
        picture ? quenby.pixels(scope, picture) : 0, format ? scope.text(format) : 0,
        scope.struct(layout.SaveOptions, saveValues(save)), cancel))));
  }

  score() {
    const { quenby } = this;
    return quenby.scoped((scope) => quenby.scoreOf(scope.struct(layout.Pixels,
      { rgba: (this.handle, this.address), width: this.width, height: this.height,
        stride: 4 * this.width })));
  }
}

export class Session extends Held {
  constructor(quenby, handle, width, height) {
    super(quenby, handle, "quenby_session_free");
    Object.assign(this, { width, height, output: 0 });
  }

  /** Applies a filter to the picture as it was opened. @returns the module's own memory, which the next
   *  application writes again: to be copied before anything else is called. */
  apply(filter, parameters, { timeout } = {}) {
    const { quenby, handle } = this;
    const size = 4 * this.width * this.height;
    if (this.output === 0) this.output = quenby.malloc(size);
    if (this.output === 0) throw new QuenbyError("out-of-memory", "not enough memory");
    quenby.scoped((scope) => quenby.timed(timeout, (cancel) =>
      quenby.call("quenby_session_apply", handle, scope.text(filter), scope.text(parameterText(parameters)),
        this.output, 4 * this.width, cancel)));
    return new Uint8ClampedArray(quenby.bytes.buffer, this.output, size);
  }

  setSlider(slider, options) {
    return this.apply("AE0", { slider }, options);
  }

  look(name, parameters, options) {
    return this.apply(name, parameters, options);
  }

  /** The NIQE score of what was applied last. */
  score() {
    const { quenby, width, height } = this;
    if (this.output === 0) throw new QuenbyError("invalid-argument", "nothing was applied");
    return quenby.scoped((scope) => quenby.scoreOf(scope.struct(layout.Pixels,
      { rgba: this.output, width, height, stride: 4 * width })));
  }

  close() {
    if (this.held !== 0 && this.output !== 0) this.quenby.module.free(this.output);
    this.output = 0;
    super.close();
  }
}
