#!/usr/bin/env bash
# Static libraries of what the natives use for one toolchain, from Debian's sources:
#
#   tools/static_libraries/build.sh NAME [CMAKE OPTION...]
#
# makes build/static/NAME, to be named in CMAKE_PREFIX_PATH. What is there already and was made from the
# same sources with the same options stays. The sources come by `apt-get source` from where this machine
# has its packages from; nothing outside of build/ changes.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
here=$root/tools/static_libraries
name=$1
shift
prefix=$root/build/static/$name
sources=$root/build/static/sources
packages=(highway lcms2 libjpeg-turbo libpng1.6 pugixml zlib)

# The checksums are those of the authors' archives as Debian has them; its patches, which change with
# its security updates, are covered by its signatures.
archives=$here/archives.sha256

fetch() {
  (cd "$sources" 2>/dev/null && sha256sum --check --quiet "$archives" 2>/dev/null) &&
    [ "$(find "$sources" -name '*.dsc' | wc -l)" -eq ${#packages[@]} ] && return
  rm -rf "$sources"
  mkdir -p "$sources/apt/parts" "$sources/apt/lists/partial" "$sources/apt/cache"
  local file name package version
  for file in /etc/apt/sources.list /etc/apt/sources.list.d/*; do
    name=$sources/apt/parts/${file##*/}
    case $file in
      *.list) [ -f "$file" ] && sed -n 's/^deb /deb-src /p' "$file" >"$name" ;;
      *.sources) sed 's/^Types:.*/Types: deb-src/' "$file" >"$name" ;;
    esac
  done
  local apt=(-qq -o APT::Sandbox::User=root -o Dir::Etc::sourcelist=/dev/null
    -o Dir::Etc::sourceparts="$sources/apt/parts" -o Dir::State::lists="$sources/apt/lists"
    -o Dir::Cache="$sources/apt/cache")
  # Other repositories of the machine may have no sources; a missing package is noticed below.
  apt-get "${apt[@]}" update || true
  for package in "${packages[@]}"; do
    # A mirror may list a version before it has it.
    for version in $(apt-cache "${apt[@]}" showsrc --only-source "$package" |
      sed -n 's/^Version: //p' | sort -rV); do
      (cd "$sources" && apt-get "${apt[@]}" source --download-only "$package=$version") && break
      echo "warning: no sources of $package $version; an older version is taken, if there is one"
    done
  done
  (cd "$sources" && sha256sum --check --quiet "$archives")
  rm -rf "${sources:?}/apt"
}

# library NAME FOLDER [CMAKE OPTION...]: configures, builds and installs.
library() {
  local folder=$2 build=$prefix/build/$1
  shift 2
  mkdir -p "$build"
  cd "$build" # checks of libjpeg-turbo's leave files where they run
  cmake -S "$folder" -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=Release \
    -DCMAKE_INSTALL_PREFIX="$prefix" -DCMAKE_INSTALL_LIBDIR:PATH=lib \
    -DCMAKE_POSITION_INDEPENDENT_CODE=ON -DCMAKE_PREFIX_PATH="$prefix" \
    -DCMAKE_PROJECT_INCLUDE="$root/cmake/Hardening.cmake" "${options[@]}" "$@"
  cmake --build "$build"
  cmake --install "$build"
}

# c_sources PACKAGE LIBRARY FOLDER HEADER...: the same for a folder of sources.
c_sources() {
  local package=$1 library=$2 source=$prefix/source/$1/$3
  shift 3
  local headers=("${@/#/$prefix/source/$package/}")
  library "$package" "$here/c_sources" -DPACKAGE="$package" -DLIBRARY="$library" -DSOURCES="$source" \
    -DHEADERS="$(IFS=';' && echo "${headers[*]}")" \
    -DVERSION="$(sed -n 's/^Version: //p' "$sources/$package"_*.dsc)"
}

# What nobody calls is left out of whatever links them.
export CFLAGS="-ffunction-sections -fdata-sections" CXXFLAGS="-ffunction-sections -fdata-sections"
fetch
options=("$@")
made_from() {
  (cd "$sources" && sha256sum ./*.dsc)
  cat "$here"/*.* "$here"/*/* "$root/cmake/Hardening.cmake"
  for option in "${options[@]}"; do
    echo "$option"
    case $option in -DCMAKE_TOOLCHAIN_FILE=*) cat "${option#*=}" ;; esac
  done
}
stamp=$(made_from | sha256sum)
[ "$(cat "$prefix/stamp" 2>/dev/null)" != "$stamp" ] || exit 0

rm -rf "$prefix"
mkdir -p "$prefix/source" "$prefix/share/licences"
for package in "${packages[@]}"; do
  dpkg-source --no-check -x "$sources/$package"_*.dsc "$prefix/source/$package"
done
# What comes over a network has no more than is called.
jpeg=() png=()
if [ "$name" = wasm ]; then
  "$here/for_browsers.sh" "$prefix/source"
  jpeg=(-DWITH_ARITH_ENC=OFF -DCMAKE_C_FLAGS_RELEASE=-DNDEBUG
    -DCMAKE_PROJECT_libjpeg-turbo_INCLUDE="$here/jpeg_for_browsers.cmake")
  png=(-DDFA_XTRA="$here/png_for_browsers.dfa")
  # Tables are computed, nothing is gzip's, and profiles have no numbers of 16 bits with a point.
  CFLAGS+=" -DDYNAMIC_CRC_TABLE -DBUILDFIXED -DNO_GZIP -DCMS_NO_HALF_SUPPORT"
fi
# All at once: configuring, which is half of it, takes one core.
together=()
# Highway's library chooses among instruction sets; other machines than this take its headers and one.
[[ $* == *-DCMAKE_TOOLCHAIN_FILE=* ]] ||
  library highway "$prefix/source/highway" -DBUILD_SHARED_LIBS=OFF -DHWY_ENABLE_CONTRIB=OFF \
    -DHWY_ENABLE_EXAMPLES=OFF -DHWY_ENABLE_TESTS=OFF -DBUILD_TESTING=OFF &
together+=($!)
library libjpeg-turbo "$prefix/source/libjpeg-turbo" -DENABLE_SHARED=OFF -DWITH_TURBOJPEG=OFF "${jpeg[@]}" &
together+=($!)
c_sources lcms2 lcms2 src include/lcms2.h include/lcms2_plugin.h &
together+=($!)
library pugixml "$prefix/source/pugixml" -DBUILD_SHARED_LIBS=OFF -DBUILD_TESTING=OFF &
together+=($!)
{
  c_sources zlib z . zlib.h zconf.h
  library libpng1.6 "$prefix/source/libpng1.6" -DPNG_SHARED=OFF -DPNG_TESTS=OFF -DPNG_EXECUTABLES=OFF \
    -DZLIB_LIBRARY="$prefix/lib/libz.a" -DZLIB_INCLUDE_DIR="$prefix/include" "${png[@]}"
} &
together+=($!)
failed=0
for job in "${together[@]}"; do wait "$job" || failed=1; done
[ $failed -eq 0 ]
cp "$prefix/source/highway/LICENSE" "$prefix/share/licences/highway.txt"
cp "$prefix/source/libjpeg-turbo/LICENSE.md" "$prefix/share/licences/libjpeg-turbo.txt"
cp "$prefix/source/libjpeg-turbo/README.ijg" "$prefix/share/licences/libjpeg-turbo-ijg.txt"
cp "$prefix/source/lcms2/COPYING" "$prefix/share/licences/lcms2.txt"
cp "$prefix/source/libpng1.6/LICENSE" "$prefix/share/licences/libpng.txt"
cp "$prefix/source/pugixml/LICENSE.md" "$prefix/share/licences/pugixml.txt"
cp "$prefix/source/zlib/LICENSE" "$prefix/share/licences/zlib.txt"
rm -rf "$prefix/source" "$prefix/build" "$prefix/bin" "$prefix/share/man" "$prefix/share/doc"
echo "$stamp" >"$prefix/stamp"
