#!/usr/bin/env bash
# Makes and checks everything that is handed to others, from the commit that is checked out, in
# build/artefacts: sources, Debian packages, jars, the library for Android, wheels, the Python package as
# sources, the npm package and its page, the reference, and SHA256SUMS.
#
#   tools/release.sh           makes and checks them
#   tools/release.sh --twice   makes them once more in another folder, too, and compares the sums
#   tools/release.sh --make    makes them alone
#   tools/release.sh --again   makes them once more and compares, after one of the others
#
# Every date in them is the commit's. What is compiled is what ./quenby test tests; run that before.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
out=$root/build/artefacts
version=$(sed -n 's/^project(Quenby VERSION \([0-9.]*\).*/\1/p' "$root/CMakeLists.txt")
mode=${1-}
cd "$root"

say() { printf 'release: %s (%d s)\n' "$*" $SECONDS >&2; }
fail() {
  say "FAILED: $*"
  exit 1
}

[ -z "$(git status --porcelain)" ] || fail "there are changes that are not committed"
grep -q "^## \($version\|Unreleased\)" CHANGELOG.md || fail "CHANGELOG.md says nothing of $version"
SOURCE_DATE_EPOCH=$(git log -1 --format=%ct)
export SOURCE_DATE_EPOCH LC_ALL=C TZ=UTC
umask 022

# pack FOLDER NAME: the folder's contents as build/artefacts/NAME.tar.gz, under that name.
pack() {
  tar --create --sort=name --owner=0 --group=0 --numeric-owner --mode=u=rwX,go=rX --format=ustar \
    --mtime="@$SOURCE_DATE_EPOCH" --directory "$1" --transform "s,^\.,$2," . | gzip -9 -n >"$out/$2.tar.gz"
}

make_all() {
  # Options that somebody gave to an earlier build count for nothing: without precompiled headers, for one,
  # compilers write some functions in another order.
  rm -f build/{release,arm64,armhf,wasm,wasm-scalar,android-*}/CMakeCache.txt
  # Jars that an earlier build made have its date, and stay where no class changed.
  rm -rf build/jar build/release/java/*.jar
  rm -rf "$out"
  mkdir -p "$out"
  git archive --prefix="quenby-$version/" HEAD | gzip -9 -n >"$out/quenby-$version-source.tar.gz"
  ./quenby deb
  cp build/release/packages/*.deb "$out/"
  ./quenby jar -Pspark package
  local name
  for name in quenby quenby-desktop quenby-spark; do
    cp build/jar/$name/$name-"$version"{,-sources,-javadoc}.jar "$out/"
  done
  ./quenby aar
  cp build/aar/*.aar "$out/"
  ./quenby wheel
  ./quenby wheel aarch64
  cp build/wheel/*.whl "$out/"
  tools/sdist.sh "$out"
  ./quenby npm
  cp build/web/*.tgz "$out/"
  pack web/dist "quenby-page-$version"
  ./quenby docs
  pack build/docs/html "quenby-reference-$version"
  (cd "$out" && sha256sum -- * >SHA256SUMS)
  say "made"
}

check_all() {
  local status=0
  tests/debian/run.sh build/release build/debian_test clean || status=$?
  case $status in
    0) ;;
    77) say "the Debian packages were not tested as far as they could be" ;;
    *) fail "the Debian packages" ;;
  esac
  tests/jar/run.sh
  tests/aar/run.sh
  # With a date of its own the command would write that into the marks of its files.
  env -u SOURCE_DATE_EPOCH ./quenby test wheel wheel_aarch64 sdist web
  say "checked"
}

# What is handed over, and the binaries that are inside.
sums() { # FOLDER
  (cd "$1/build" && sha256sum artefacts/* release/cli/quenby release/lib/*.so release/self_contained/*.so \
    arm64/lib/*.so armhf/lib/*.so)
}

# Without a compiler cache, which would hand over the first build's objects.
make_again() {
  say "once more, in another folder"
  local other
  other=$(mktemp -d)/quenby
  git clone --quiet --no-hardlinks "$root" "$other"
  env -u CMAKE_C_COMPILER_LAUNCHER -u CMAKE_CXX_COMPILER_LAUNCHER CCACHE_DISABLE=1 \
    "$other/tools/release.sh" --make
  join -j 2 -a 1 -a 2 -e missing -o 1.1,2.1,0 <(sums "$root" | sort -k 2) <(sums "$other" | sort -k 2) |
    awk '{ same = $1 == $2; different += !same
           printf "%s %s %s\n", same ? "equal  " : "DIFFERS", same ? $1 : $1 " " $2, $3 }
         END { exit different > 0 }' || fail "two builds differ; the other is $other"
  rm -rf "$(dirname "$other")"
}

case $mode in
  --make) make_all ;;
  --again) make_again ;;
  '' | --twice)
    make_all
    check_all
    [ "$mode" != --twice ] || make_again
    say "all of it is in ${out#"$root"/}"
    cat "$out/SHA256SUMS"
    ;;
  *) sed -n 's/^#   //p' "${BASH_SOURCE[0]}" && exit 2 ;;
esac
