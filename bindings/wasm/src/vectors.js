// A module of one function whose body is a vector: engines without them refuse it.
export const probe = new Uint8Array([
  0, 97, 115, 109, 1, 0, 0, 0, 1, 5, 1, 96, 0, 1, 123, 3, 2, 1, 0, 10, 10, 1, 8, 0, 65, 0, 253, 15, 253,
  98, 11,
]);

/** The build that this machine can use: "simd" or "scalar". */
export function bestBuild() {
  return WebAssembly.validate(probe) ? "simd" : "scalar";
}
