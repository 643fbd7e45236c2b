#!/usr/bin/env bash
# run.sh QUENBY: the module in node, its types, then the page in headless Chromium, all as `./quenby web` has
# built them. What npm's registry has is skipped in words where that cannot be reached.
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

cp "$here"/package*.json "$here/types.mts" "$scratch/"
if (cd "$scratch" && timeout 120 npm ci --prefer-offline --ignore-scripts --no-audit --no-fund >npm.log 2>&1); then
  rm -rf "$scratch/node_modules/quenby"
  ln -s "$PACKAGE" "$scratch/node_modules/quenby"
  (cd "$scratch" && node_modules/.bin/tsc --noEmit --strict --target es2022 --module nodenext \
    --moduleResolution nodenext --lib es2022,dom types.mts)
  echo "the types: all well"
  export AXE=$scratch/node_modules/axe-core/axe.min.js
elif grep -qE 'ENOTFOUND|EAI_AGAIN|ECONNREFUSED|ECONNRESET|ETIMEDOUT|ENETUNREACH|E40[34]|E50[0-9]|ENOTCACHED' "$scratch/npm.log" ||
  [ ! -s "$scratch/npm.log" ]; then
  echo "skipped: types and accessibility, since npm's registry cannot be reached"
else
  cat "$scratch/npm.log"
  exit 1
fi
python3 -B "$here/page_test.py" "$root/web/dist"
