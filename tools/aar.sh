#!/usr/bin/env bash
# The library for Android, in build/aar, from natives that are built before:
#
#   tools/aar.sh             from the cross builds: its natives are linked against glibc
#   ANDROID_NDK=... tools/aar.sh
#                            from the NDK's builds, for devices
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
version=$(sed -n 's/^project(Quenby VERSION \([0-9.]*\).*/\1/p' "$root/CMakeLists.txt")
api=$(sed -n 's:.*<quenby.android.api>\(.*\)</.*:\1:p' "$root/java/quenby/pom.xml")
contents=$root/build/aar/contents

rm -rf "$root/build/aar"
mkdir -p "$contents/META-INF/licences"
add_natives() { # ABI LIBRARIES STATIC LIBRARIES
  mkdir -p "$contents/jni/$1"
  local name
  # The bitmaps are the platform's.
  for name in libpn libpnjni libpn_imgproc libpn_quenby libquenby_photo; do
    cp "$root/build/$2/$name.so" "$contents/jni/$1/"
  done
  cp "$root/build/static/$3/share/licences"/* "$contents/META-INF/licences/"
}
if [ -n "${ANDROID_NDK-}" ]; then
  aar=$root/build/aar/quenby-$version.aar
  for abi in arm64-v8a armeabi-v7a x86_64; do
    add_natives $abi android-$abi/lib android-$abi
    shared=$(sed -n 's/^CMAKE_CXX_COMPILER_TARGET:.*=//p' "$root/build/android-$abi/CMakeCache.txt")
    cp "$ANDROID_NDK"/toolchains/llvm/prebuilt/*/sysroot/usr/lib/"$shared"/libc++_shared.so \
      "$contents/jni/$abi/"
  done
else
  aar=$root/build/aar/quenby-$version-glibc.aar
  add_natives arm64-v8a arm64/lib arm64
  add_natives armeabi-v7a armhf/lib armhf
  add_natives x86_64 release/self_contained amd64
fi

cat >"$contents/AndroidManifest.xml" <<XML
<?xml version="1.0" encoding="utf-8"?>
<manifest xmlns:android="http://schemas.android.com/apk/res/android"
    package="com.pelorin.photos.quenby">
    <uses-sdk android:minSdkVersion="$api" />
</manifest>
XML
mvn --batch-mode --no-transfer-progress --quiet -Dstyle.color=never --file "$root/java/pom.xml" \
  -Dquenby.build.dir="$root/build/aar/java" --projects quenby --also-make process-classes
"$root/tools/sorted_jar.sh" "$contents/classes.jar" "$root/build/aar/java/quenby/classes"
cp "$root/java/quenby/src/main/resources/META-INF/proguard/quenby.pro" "$contents/proguard.txt"
: >"$contents/R.txt" # no resources
"$root/tools/sorted_jar.sh" "$aar" "$contents" --no-manifest
