/** Quenby for JavaScript: browsers, their workers and node. Files are the `quenby` command's, to the byte.
 *
 * Calls work on the thread that calls and return when they are done: in a page, call from a worker, such
 * as worker.js, with which QuenbyWorker of client.js speaks. Whatever cannot be done throws a
 * `QuenbyError` and leaves everything as it was. */

export type Kind =
  | "invalid-argument" | "out-of-memory" | "cancelled" | "empty-file" | "not-a-photo" | "unsupported"
  | "damaged" | "truncated" | "too-large" | "failed";

export class QuenbyError extends Error {
  constructor(kind: Kind, message: string);
  kind: Kind;
  /** One clause for a user: "truncated: the picture data ends early". */
  message: string;
}

/** "simd" where this machine has vectors for WebAssembly, "scalar" elsewhere; the results are the same. */
export function bestBuild(): "simd" | "scalar";

export interface LoadOptions {
  build?: "simd" | "scalar";
  /** The bytes or module of quenby-simd.wasm or quenby-scalar.wasm, where it is not beside the script. */
  wasm?: BufferSource | WebAssembly.Module;
}
export function load(options?: LoadOptions): Promise<Quenby>;

/** Keys and values, `{ slider: 0.4 }`, or the text that they stand for, `"slider=0.4;"`. */
export type Parameters = string | Record<string, number | boolean | number[]>;
export function parameterText(parameters?: Parameters): string;

/** Four bytes a pixel: red, green, blue, alpha, not multiplied in; an ImageData is one. */
export interface Picture {
  data: Uint8ClampedArray | Uint8Array;
  width: number;
  height: number;
}

/** A face in the upright picture, in fractions of its sides or in pixels; may reach beyond it. */
export interface Face {
  left: number;
  top: number;
  right: number;
  bottom: number;
  inPixels?: boolean;
}
export interface KnownFace extends Face {
  /** Empty where the file states none. */
  name: string;
}

export interface Facts {
  format: string;
  /** As stored, before any turning. */
  width: number;
  height: number;
  /** 1 grey, 2 grey and alpha, 3 colour, 4 CMYK or colour and alpha. */
  channels: number;
  /** EXIF, 1 to 8. */
  orientation: number;
  progressive: boolean;
  hasAlpha: boolean;
  /** "2024-05-01T12:30:45+02:00", empty where it is not known. */
  captureTime: string;
  /** Seconds since 1970 by the clock of its place, and in UTC; null where they are not known. */
  wallClock: number | null;
  utc: number | null;
  /** By Quenby: "AE0, slider 0.4"; empty without one. */
  lastEdit: string;
}

/** What may take long can be limited. A call that is given up throws a `QuenbyError` of kind "cancelled" and
 * leaves everything as it was but a session's pixels; steps that have begun are ended first. */
export interface Timed {
  /** Milliseconds, of this call. */
  timeout?: number;
}

/** How much work a file may ask for; more of it is "too-large". */
export interface Limits {
  /** Of the file: 1073741824 unless given. */
  maxBytes?: number;
  /** Of the picture as stored: 268435456 unless given, and 40000000 of a file of a few kB. */
  maxPixels?: number;
  /** Of a JPEG file: 100 unless given. */
  maxScans?: number;
  /** Before a JPEG file's picture data: 4096 unless given. */
  maxSegments?: number;
}

export interface OpenOptions extends Limits {
  /** 1, 2, 4 or 8: what the sides are divided by, rounded up. */
  scale?: 1 | 2 | 4 | 8;
  /** Degrees clockwise beyond upright, a multiple of 90. */
  rotate?: number;
  asStored?: boolean;
  ignoreKnownFaces?: boolean;
}

export interface SaveOptions {
  /** 1 to 100; 90 unless given. */
  quality?: number;
  sourceQuality?: boolean;
  sampling?: "4:4:4" | "4:2:2" | "4:2:0";
  dropMetadata?: boolean;
  dropLocation?: boolean;
  dropThumbnail?: boolean;
  dropGainMap?: boolean;
  /** The file does not tell of the edit. */
  noMark?: boolean;
  /** These kinds of metadata and the colour profile alone. */
  keep?: ("copyright" | "time" | "exif" | "xmp" | "iptc" | "gainMap")[];
}

export interface Loss {
  /** "transparency" */
  what: string;
  /** "a JPEG file has none" */
  why: string;
}
export interface SavedFile {
  bytes: Uint8Array;
  /** What of the photo is not in the file. */
  losses: Loss[];
}

export interface Parameter {
  name: string;
  description: string;
  /** "a number from 0 to 1" */
  wanted: string;
  /** The boolean without which this does nothing; mostly "". */
  onlyWith: string;
  kind: "number" | "boolean" | "numbers";
  required: boolean;
  lowest: number;
  highest: number;
  aboveLowest: boolean;
  fewest: number;
  /** What counts without it; null where no number says it. */
  standard: number | null;
}
export interface Filter {
  name: string;
  displayName: string;
  description: string;
  /** What it cannot do without: "slider=0.4;". */
  required: string;
  readsFaces: boolean;
  parameters: Parameter[];
}

/** What near-duplicates are found by. */
export interface Shot {
  green_cdf: number[];
  orientation: number;
  /** How many pixels the distribution is of; shots of before this was told do without. */
  pixel_count?: number;
  wall_clock: number;
  utc: number;
}

export class Quenby {
  readonly version: string;
  readonly build: "simd" | "scalar";
  filters(): Filter[];
  /** What a file says, without decoding it. */
  facts(file: Uint8Array, limits?: Limits): Facts;
  /** Decodes a JPEG or PNG file and turns the picture upright. */
  open(file: Uint8Array, options?: OpenOptions & Timed): Photo;
  /** A session on pixels, which are copied. */
  session(picture: Picture, faces?: Face[]): Session;
  /** The file that `quenby enhance` and `quenby look` make. It goes by rows: hardly more memory than the
   *  two files and 128 MiB, whatever the size of the photo. */
  filterFile(file: Uint8Array, filter: string, parameters?: Parameters, options?: Timed & {
    faces?: Face[]; open?: OpenOptions; format?: "JPEG" | "PNG"; save?: SaveOptions;
  }): SavedFile;
  /** A file with a picture and no metadata. */
  write(picture: Picture, format?: "JPEG" | "PNG", save?: SaveOptions & Timed): SavedFile;
  /** NIQE: lower is better; null below 96 pixels a side. */
  score(picture: Picture): number | null;
  shot(file: Uint8Array, options?: Limits & Timed): Shot;
  /** For each shot the place of the first of its group, its own where it is in none. */
  duplicates(shots: Shot[], threshold?: number, options?: Timed): number[];
  /** The table of `quenby selftest`. */
  selftest(): string;
}

/** A decoded photo. Its memory is the module's until close(). */
export class Photo {
  readonly width: number;
  readonly height: number;
  readonly facts: Facts;
  /** That the file knows of. */
  readonly faces: KnownFace[];
  /** What a user should know of how it was read. */
  readonly notices: string[];
  /** The module's own memory: copy it before anything else is called. */
  readonly data: Uint8ClampedArray;
  /** @param faces  beside those that the file knows of. */
  session(faces?: Face[]): Session;
  /** A file with this or another picture of the same size, and the photo's metadata. */
  save(options?: SaveOptions & Timed & { picture?: Picture; format?: "JPEG" | "PNG" }): SavedFile;
  score(): number | null;
  close(): void;
}

/** One picture that filters are applied to, again and again: moving a slider costs a fraction of the first
 *  application. */
export class Session {
  readonly width: number;
  readonly height: number;
  /** Applies a filter to the picture as it was opened. The result is the module's own memory, which the
   *  next application writes again: copy it before anything else is called. */
  apply(filter: string, parameters?: Parameters, options?: Timed): Uint8ClampedArray;
  /** Auto-enhance. @param slider  0 to 1. */
  setSlider(slider: number, options?: Timed): Uint8ClampedArray;
  look(name: string, parameters?: Parameters, options?: Timed): Uint8ClampedArray;
  /** Of what was applied last. */
  score(): number | null;
  close(): void;
}
