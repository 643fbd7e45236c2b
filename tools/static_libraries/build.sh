#!/usr/bin/env bash
# Static Highway, libjpeg-turbo and Little CMS for one toolchain, from Debian's sources:
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

# The checksums are those of the authors' archives; Debian's patches, which change with its security
# updates, are covered by Debian's signatures.
archives=$here/archives.sha256

fetch() {
  (cd "$sources" 2>/dev/null && sha256sum --check --quiet "$archives" 2>/dev/null) &&
    [ "$(find "$sources" -name '*.dsc' | wc -l)" -eq 3 ] && return
  rm -rf "$sources"
  mkdir -p "$sources/apt/parts" "$sources/apt/lists/partial"
  local file name
  for file in /etc/apt/sources.list /etc/apt/sources.list.d/*; do
    name=$sources/apt/parts/${file##*/}
    case $file in
      *.list) [ -f "$file" ] && sed -n 's/^deb /deb-src /p' "$file" >"$name" ;;
      *.sources) sed 's/^Types:.*/Types: deb-src/' "$file" >"$name" ;;
    esac
  done
  local apt=(apt-get -qq -o APT::Sandbox::User=root -o Dir::Etc::sourcelist=/dev/null
    -o Dir::Etc::sourceparts="$sources/apt/parts" -o Dir::State::lists="$sources/apt/lists")
  # Other repositories of the machine may have no sources; a missing package is noticed below.
  "${apt[@]}" update || true
  (cd "$sources" && "${apt[@]}" source --download-only highway libjpeg-turbo lcms2 &&
    sha256sum --check --quiet "$archives")
  rm -rf "${sources:?}/apt"
}

# library FOLDER [CMAKE OPTION...]: configures, builds and installs.
library() {
  local folder=$1 build=$prefix/build/${1##*/}
  shift
  mkdir -p "$build"
  cd "$build" # checks of libjpeg-turbo's leave files where they run
  cmake -S "$folder" -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=Release \
    -DCMAKE_INSTALL_PREFIX="$prefix" -DCMAKE_INSTALL_LIBDIR:PATH=lib \
    -DCMAKE_POSITION_INDEPENDENT_CODE=ON -DCMAKE_PREFIX_PATH="$prefix" "${options[@]}" "$@"
  cmake --build "$build"
  cmake --install "$build"
}

# What nobody calls is left out of whatever links them.
export CFLAGS="-ffunction-sections -fdata-sections" CXXFLAGS="-ffunction-sections -fdata-sections"
fetch
options=("$@")
made_from() {
  (cd "$sources" && sha256sum ./*.dsc)
  cat "$here"/*.* "$here"/*/*
  for option in "${options[@]}"; do
    echo "$option"
    case $option in -DCMAKE_TOOLCHAIN_FILE=*) cat "${option#*=}" ;; esac
  done
}
stamp=$(made_from | sha256sum)
[ "$(cat "$prefix/stamp" 2>/dev/null)" != "$stamp" ] || exit 0

rm -rf "$prefix"
mkdir -p "$prefix/source" "$prefix/share/licences"
for package in highway libjpeg-turbo lcms2; do
  dpkg-source --no-check -x "$sources/$package"_*.dsc "$prefix/source/$package"
done
library "$prefix/source/highway" -DBUILD_SHARED_LIBS=OFF -DHWY_ENABLE_CONTRIB=OFF \
  -DHWY_ENABLE_EXAMPLES=OFF -DHWY_ENABLE_TESTS=OFF -DBUILD_TESTING=OFF
library "$prefix/source/libjpeg-turbo" -DENABLE_SHARED=OFF -DWITH_TURBOJPEG=OFF
library "$here/lcms2" -DLCMS2_SOURCE="$prefix/source/lcms2"
cp "$prefix/source/highway/LICENSE" "$prefix/share/licences/highway.txt"
cp "$prefix/source/libjpeg-turbo/LICENSE.md" "$prefix/share/licences/libjpeg-turbo.txt"
cp "$prefix/source/libjpeg-turbo/README.ijg" "$prefix/share/licences/libjpeg-turbo-ijg.txt"
cp "$prefix/source/lcms2/COPYING" "$prefix/share/licences/lcms2.txt"
rm -rf "$prefix/source" "$prefix/build" "$prefix/bin" "$prefix/share/man" "$prefix/share/doc"
echo "$stamp" >"$prefix/stamp"
