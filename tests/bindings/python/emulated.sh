#!/usr/bin/env bash
# emulated.sh WHEEL QUENBY: the tests of the Python package, with a wheel for 64-bit ARM in the Python of
# such a machine under user-mode emulation, beside this machine's command. Debian's packages of Python go
# into a folder, build/python/aarch64, which stays.
#
# Leaves with 77, and says why, where something for that is missing.
set -euo pipefail
here=$(dirname "$(readlink -f "${BASH_SOURCE[0]}")")
root=$(cd "$here/../../.." && pwd)
wheel=$(readlink -f "$1") command=$(readlink -f "$2")
system=$root/build/python/aarch64 unpacked=$root/build/python/aarch64_wheel

skipped() {
  echo "wheel_aarch64: skipped: $*" >&2
  exit 77
}
for program in mmdebstrap qemu-aarch64 unzip; do
  command -v $program >/dev/null || skipped "$program is not installed"
done

rm -rf "$unpacked"
unzip -q "$wheel" -d "$unpacked"
readelf -h "$unpacked/quenby/libquenby.so" | grep -q AArch64
grep -q '^Tag: py3-none-manylinux_.*_aarch64$' "$unpacked"/quenby-*.dist-info/WHEEL
[ -s "$unpacked/quenby/licences/libpng.txt" ]
[ ! -e "$unpacked/quenby.libs" ] # all of it is inside the one library

if [ ! -f "$system/complete" ]; then
  rm -rf "$system"
  # Unpacked and not set up: nothing of the other machine runs for that.
  mmdebstrap --variant=extract --architectures=arm64 --include=python3-numpy,python3-pil,python3-pytest \
    "$(. /etc/os-release && echo "$VERSION_CODENAME")" "$system" >"$root/build/python/aarch64.log" 2>&1 || {
    tail -n 5 "$root/build/python/aarch64.log" >&2
    skipped "a Python for 64-bit ARM cannot be had"
  }
  touch "$system/complete"
fi

libraries=$system/usr/lib/aarch64-linux-gnu
export QUENBY_PYTHON="qemu-aarch64 -L $system $system/usr/bin/python3" QUENBY_COMMAND=$command
# Where Debian's scripts would link to; programs of this machine look past another machine's libraries.
export LD_LIBRARY_PATH=$libraries/blas:$libraries/lapack
PYTHONPATH=$unpacked $QUENBY_PYTHON -m pytest -q -p no:cacheprovider "$here"
