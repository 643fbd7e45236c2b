#!/usr/bin/env bash
# package.sh: the npm package as a folder, build/web/package, of the two builds of the module.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
here=$root/bindings/wasm
out=$root/build/web/package
version=$(sed -n 's/^project(Quenby VERSION \([0-9.]*\).*/\1/p' "$root/CMakeLists.txt")

rm -rf "$out"
mkdir -p "$out/licences"
cp "$here"/src/* "$here/README.md" "$out/"
sed "s/@VERSION@/$version/" "$here/package.json" >"$out/package.json"
for build in simd scalar; do
  cp "$root/build/wasm/bindings/wasm/quenby-$build.wasm" "$out/"
done
cp "$root"/build/static/wasm/share/licences/* "$out/licences/"
cp /usr/share/doc/libboost-dev/copyright "$out/licences/boost.txt"
# Debian's file names the C and C++ libraries with their licences, too.
cp /usr/share/doc/emscripten/copyright "$out/licences/emscripten.txt"
