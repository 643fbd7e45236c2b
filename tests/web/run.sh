#!/usr/bin/env bash
# run.sh QUENBY: the module in node, then the page in headless Chromium, both as `./quenby web` has built
# them. Leaves an error where something is missing: whoever asks for this step wants it.
set -euo pipefail
quenby=$(readlink -f "$1")
here=$(dirname "$(readlink -f "${BASH_SOURCE[0]}")")
root=$(cd "$here/../.." && pwd)
scratch=$root/build/web/test
rm -rf "$scratch/photos"
mkdir -p "$scratch"
"$root/build/release/tests/web/web_photos" "$scratch/photos"

export QUENBY=$quenby PHOTOS=$scratch/photos PACKAGE=$root/build/web/package TABLE=$root/tests/selftest/table.txt
node --test "$here/module.test.mjs"

cp "$here"/package*.json "$scratch/"
(cd "$scratch" && npm ci --prefer-offline --ignore-scripts --no-audit --no-fund >npm.log 2>&1) || {
  cat "$scratch/npm.log"
  exit 1
}
AXE=$scratch/node_modules/axe-core/axe.min.js python3 -B "$here/page_test.py" "$root/web/dist"
