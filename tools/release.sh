#!/usr/bin/env bash
# Makes and checks everything that is handed to others, from the commit that is checked out, in
# build/artefacts: sources, Debian packages, jars, the library for Android, the wheel, the Python package as
# sources, and SHA256SUMS.
#
#   tools/release.sh           makes and checks them
#   tools/release.sh --twice   makes them once more in another folder, too, and compares the sums
#   tools/release.sh --make    makes them alone
#
# Every date in them is the commit's. What is compiled is what ./quenby test tests; run that before.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
out=$root/build/artefacts
version=$(sed -n 's/^project(Quenby VERSION \([0-9.]*\).*/\1/p' "$root/CMakeLists.txt")
mode=${1-}
cd "$root"

say() { printf 'release: %s\n' "$*" >&2; }
fail() {
  say "FAILED: $*"
  exit 1
}

[ -z "$(git status --porcelain)" ] || fail "there are changes that are not committed"
grep -q "^## \($version\|Unreleased\)" CHANGELOG.md || fail "CHANGELOG.md says nothing of $version"
SOURCE_DATE_EPOCH=$(git log -1 --format=%ct)
export SOURCE_DATE_EPOCH LC_ALL=C TZ=UTC
umask 022

rm -rf "$out"
mkdir -p "$out"
git archive --prefix="quenby-$version/" HEAD | gzip -9 -n >"$out/quenby-$version-source.tar.gz"
./quenby deb
cp build/release/packages/*.deb "$out/"
./quenby jar
cp build/jar/quenby/quenby-"$version"*.jar build/jar/quenby-desktop/quenby-desktop-"$version"*.jar "$out/"
ANDROID_NDK=${ANDROID_NDK-} ./quenby aar
cp build/aar/*.aar "$out/"
./quenby wheel
cp build/wheel/*.whl "$out/"
tools/sdist.sh "$out"
(cd "$out" && sha256sum -- * >SHA256SUMS)
[ "$mode" != --make ] || exit 0

say "checking"
tests/debian/run.sh build/release build/debian_test clean
tests/jar/run.sh
tests/aar/run.sh
./quenby test wheel sdist
if [ "$mode" = --twice ]; then
  say "once more, in another folder"
  other=$(mktemp -d)/quenby
  git clone --quiet --no-hardlinks "$root" "$other"
  "$other/tools/release.sh" --make
  diff "$out/SHA256SUMS" "$other/build/artefacts/SHA256SUMS" || fail "two builds differ; the other is $other"
  rm -rf "$(dirname "$other")"
fi
say "all of it is in ${out#"$root"/}"
cat "$out/SHA256SUMS"
