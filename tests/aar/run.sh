#!/usr/bin/env bash
# Looks at the library for Android that tools/aar.sh made: what it holds, for which processors and pages,
# and that nothing in it asks for more than the oldest Android that its manifest names.
#
#   tests/aar/run.sh
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
scratch=$root/build/aar_test
aars=("$root"/build/aar/*.aar)
aar=${aars[0]}

step() { printf '%s\n' "aar: $*"; }
fail() {
  printf '%s\n' "aar: FAILED: $*" >&2
  exit 1
}

step "what is inside ${aar##*/}"
rm -rf "$scratch"
mkdir -p "$scratch/classes"
unzip -q "$aar" -d "$scratch/aar"
cd "$scratch/aar"
ndk=()
[[ $aar == *-glibc.aar ]] || ndk=(libc++_shared.so)
{
  printf '%s\n' AndroidManifest.xml R.txt classes.jar proguard.txt
  printf 'META-INF/licences/%s.txt\n' highway lcms2 libjpeg-turbo libjpeg-turbo-ijg libpng pugixml zlib
  for abi in arm64-v8a armeabi-v7a x86_64; do
    printf "jni/$abi/%s\n" libpn.so libpnjni.so libpn_imgproc.so libpn_quenby.so libquenby_photo.so "${ndk[@]}"
  done
} | LC_ALL=C sort >../expected
find . -type f -printf '%P\n' | LC_ALL=C sort | diff ../expected - || fail "other files than these"
[ -z "$(find . -type f -empty ! -name R.txt)" ] || fail "empty files"

step "manifest"
api=$(sed -n 's:.*<quenby.android.api>\(.*\)</.*:\1:p' "$root/java/quenby/pom.xml")
grep -q "android:minSdkVersion=\"$api\"" AndroidManifest.xml ||
  fail "the manifest does not name API level $api, against which the classes are checked"
grep -q 'package="com.pelorin.photos.quenby"' AndroidManifest.xml || fail "no package"

step "processors, pages, libraries"
declare -A machines=([arm64-v8a]=AArch64 [armeabi-v7a]=ARM [x86_64]=X86-64)
for abi in "${!machines[@]}"; do
  for library in jni/"$abi"/*.so; do
    readelf -h "$library" | grep -q "Machine:.*${machines[$abi]}" || fail "$library is another machine's"
    while read -r alignment; do
      ((alignment % 0x4000 == 0)) || fail "$library is aligned to $alignment"
    done < <(readelf --wide --program-headers "$library" | awk '$1 == "LOAD" { print $NF }')
  done
  readelf --dynamic "jni/$abi/libpn_quenby.so" | grep -q 'NEEDED.*libjnigraphics.so' ||
    fail "jni/$abi/libpn_quenby.so does not take the platform's bitmaps"
done
readelf -A jni/armeabi-v7a/libpn_quenby.so | grep -q 'Tag_Advanced_SIMD_arch: NEON' ||
  fail "no NEON for armeabi-v7a"

# What the natives and what is linked in call of the C library, as that of the oldest Android has it:
# strtod_l and strtof_l came with API level 26, everything else before. A new name belongs into the list
# when the manifest's level has it.
step "functions of the C library"
for library in jni/*/*.so; do
  [[ $library != */libc++_shared.so ]] || continue
  nm --dynamic --undefined-only "$library" | awk '{ print $2 }'
done | grep -E '@GLIBC_|@LIBC' | sed 's/@.*//' | LC_ALL=C sort -u >../called
[ -s ../called ] || fail "no functions to compare"
LC_ALL=C comm -23 ../called <(grep -v '^#' "$root/tests/aar/c_library.txt" | LC_ALL=C sort) >../unknown
[ ! -s ../unknown ] || fail "not known to be in Android's C library: $(tr '\n' ' ' <../unknown)"

step "classes, and rules for shrinkers"
unzip -q classes.jar -d "$scratch/classes"
cmp proguard.txt "$scratch/classes/META-INF/proguard/quenby.pro"
for class in EnhanceSession PhotoBytes QuenbyEngine; do
  [ -s "$scratch/classes/com/pelorin/photos/quenby/autoenhance/$class.class" ] || fail "no class $class"
done
[ ! -e "$scratch/classes/android" ] || fail "classes of the platform's"
# What JNI_OnLoad looks up and registers must be kept by name.
while read -r name; do
  class=${name//\//.}
  case $class in com.pelorin.*)
    grep -q "^-keep class $class " proguard.txt || fail "no rule keeps $class" ;;
  esac
done < <(strings jni/x86_64/libpn_quenby.so jni/x86_64/libquenby_photo.so |
  grep -xE 'com/pelorin/photos/quenby/[A-Za-z/]+' | sort -u | tee ../named)
[ "$(wc -l <../named)" -ge 4 ] || fail "the libraries name only: $(cat ../named)"
step "passed"
