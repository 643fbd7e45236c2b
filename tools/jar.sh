#!/usr/bin/env bash
# The jars that others use, in build/jar: quenby, and quenby-desktop with natives for every machine,
# each with sources and documentation. The natives are built before:
#
#   tools/jar.sh [MAVEN OPTION...]
#
# where a goal may follow the options, such as install; with -Pspark the jar for Spark as well.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
contents=$root/build/jar/contents

rm -rf "$contents"
add_natives() { # FOLDER LIBRARIES
  mkdir -p "$contents/native/$1"
  local name
  for name in libpn libpnjni libpn_imgproc libjnigraphics libpn_quenby libquenby_photo; do
    cp "$root/build/$2/$name.so" "$contents/native/$1/"
  done
}
add_natives linux-amd64 release/self_contained
add_natives linux-aarch64 arm64/lib
add_natives linux-arm armhf/lib
mkdir -p "$contents/META-INF/licences"
cp "$root"/build/static/amd64/share/licences/* "$contents/META-INF/licences/"

[ $# -gt 0 ] || set -- package
projects=.,quenby,quenby-desktop
[[ " $* " != *" -Pspark "* ]] || projects+=,quenby-spark
# The same from the same files: dated as a release says.
[ -z "${SOURCE_DATE_EPOCH-}" ] ||
  set -- -Dproject.build.outputTimestamp="$(date -u -d "@$SOURCE_DATE_EPOCH" +%Y-%m-%dT%H:%M:%SZ)" "$@"
mvn --batch-mode --no-transfer-progress --quiet -Dstyle.color=never --file "$root/java/pom.xml" -Prelease -DskipTests \
  -Dquenby.jar.contents="$contents" -Dquenby.build.dir="$root/build/jar" \
  --projects $projects "$@"
