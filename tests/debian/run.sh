#!/usr/bin/env bash
# The Debian packages: run.sh BUILD SCRATCH [clean]. Makes them, asks lintian, has apt resolve what they
# depend on, and installs, runs and removes them in a root that holds nothing but what the command and the
# library for C ask for. With "clean", in a new system as well, where programs in C and Java use them.
#
# Leaves with 77, and says why, where something for that is missing.
set -euo pipefail
build=$(readlink -f "$1") scratch=$(readlink -f "$2") mode=${3-}
here=$(dirname "$(readlink -f "${BASH_SOURCE[0]}")")
export SOURCE_DATE_EPOCH=${SOURCE_DATE_EPOCH-1700000000} LC_ALL=C

say() { printf 'debian: %s (%d s)\n' "$*" $SECONDS; }
fail() {
  say "FAILED: $*" >&2
  exit 1
}
skipped() {
  say "skipped: $*"
  exit 77
}

for program in cpack dpkg-deb lintian; do
  command -v $program >/dev/null || skipped "$program is not installed"
done
rm -rf "$scratch"
mkdir -p "$scratch"

say "made"
pack() {
  cpack --config "$build/CPackConfig.cmake" -B "$1" >"$scratch/cpack.log" 2>&1 ||
    { cat "$scratch/cpack.log" && fail "cpack"; }
  rm -rf "$1/_CPack_Packages"
}
pack "$scratch/debs"
cd "$scratch/debs"
ls -- *.deb
[ "$(ls -- *.deb | wc -l)" -eq 5 ] || fail "there are not five packages"

say "lintian"
lintian --fail-on error --tag-display-limit 0 -- *.deb || fail "lintian has errors"

say "nothing of the build's folders"
for deb in *.deb; do
  dpkg-deb -x "$deb" "$scratch/contents"
done
! grep -rlF "$build" "$scratch/contents" || fail "names of folders"

[ "$(id -u)" -eq 0 ] || skipped "only root can change the root: nothing was installed"
root=$scratch/root
mkdir -p "$root/var/lib/dpkg" "$scratch/archives/partial"
: >"$scratch/no_packages"
: >"$root/var/lib/dpkg/status"
# A system where nothing is installed yet.
apt=(apt-get -y -o Dir::State::status="$scratch/no_packages" -o Dir::Cache::archives="$scratch/archives"
  -o APT::Sandbox::User=root --no-install-recommends)
"${apt[@]}" -s install ./*.deb >"$scratch/apt.log" 2>&1 || {
  tail -n 20 "$scratch/apt.log"
  apt-cache show libcairo2 >/dev/null 2>&1 && fail "apt cannot resolve what they depend on"
  skipped "apt knows no packages here: nothing was installed"
}
say "all of them would bring $(grep -c '^Inst' "$scratch/apt.log") packages"
# dash and libc-bin are essential: their scripts may call them.
"${apt[@]}" --download-only install dash libc-bin ./quenby_*.deb ./libquenby[0-9]*.deb >"$scratch/apt.log" 2>&1 ||
  { tail -n 20 "$scratch/apt.log" && skipped "packages cannot be had: nothing was installed"; }
for deb in "$scratch"/archives/*.deb; do dpkg-deb -x "$deb" "$root"; done
ln -sf dash "$root/bin/sh"
chroot "$root" /sbin/ldconfig
files() { (cd "$root" && find . -path ./var/lib/dpkg -prune -o -print | sort); }
files >"$scratch/before"

say "installed in a root of what they depend on"
# What they depend on is there and not on record.
dpkg=(dpkg --root="$root" --force-depends --log=/dev/null)
"${dpkg[@]}" -i ./*.deb >"$scratch/dpkg.log" 2>&1 || { cat "$scratch/dpkg.log" && fail "dpkg -i"; }
cc -o "$root/uses_quenby" "$here/../package/uses_c/uses_quenby.c" -I "$root/usr/include" \
  -L "$(dirname "$(find "$root/usr/lib" -name libquenby.so)")" -lquenby
chroot "$root" /usr/bin/quenby --version --json
chroot "$root" /uses_quenby
for file in share/man/man1/quenby.1.gz share/bash-completion/completions/quenby \
  share/zsh/vendor-completions/_quenby share/java/quenby.jar include/quenby/photo/photo.h; do
  [ -s "$root/usr/$file" ] || fail "no $file"
done

say "removed without a trace"
rm "$root/uses_quenby"
mapfile -t names < <(for deb in *.deb; do dpkg-deb -f "$deb" Package; done)
"${dpkg[@]}" --purge "${names[@]}" >"$scratch/dpkg.log" 2>&1 ||
  { cat "$scratch/dpkg.log" && fail "dpkg --purge"; }
files | diff "$scratch/before" - || fail "files stayed, or went that were not theirs"

[ "$mode" = clean ] || exit 0
command -v mmdebstrap >/dev/null || skipped "mmdebstrap is not installed: no new system was tried"
say "in a new system, with what programs need"
photo=/usr/share/matplotlib/mpl-data/sample_data/grace_hopper.jpg
[ -f "$photo" ] || skipped "python-matplotlib-data is not installed: there is no photo"
mmdebstrap --variant=apt --include=g++,pkg-config,default-jdk-headless \
  --customize-hook="touch $scratch/begun" --customize-hook='mkdir -p "$1/debs"' \
  --customize-hook="copy-in $(printf '%s ' "$PWD"/*.deb) /debs" \
  --customize-hook="copy-in $here/../package/uses_c/uses_quenby.c $here/UsesQuenby.java /debs" \
  --customize-hook="copy-in $here/../../examples/enhance_file.cpp $photo /debs" \
  --customize-hook='chroot "$1" sh -ec "
    cd /debs
    apt-get install -y --no-install-recommends ./quenby_*.deb
    quenby --version
    env -u SOURCE_DATE_EPOCH quenby enhance grace_hopper.jpg -o by_command.jpg --slider 0.4
    apt-get install -y --no-install-recommends ./*.deb
    cc -o /uses_c uses_quenby.c \$(pkg-config --cflags --libs quenby)
    /uses_c
    c++ -std=c++20 -o /uses_cpp enhance_file.cpp \$(pkg-config --cflags --libs quenby-photo)
    /uses_cpp grace_hopper.jpg by_program.jpg 0.4
    cmp by_command.jpg by_program.jpg
    java -cp \"/usr/share/java/*\" UsesQuenby.java
    apt-get purge -y quenby \"libquenby*\"
    ! find / -xdev -name \"*quenby*\" -not -path \"/debs/*\" | grep .
  "' "$(. /etc/os-release && echo "$VERSION_CODENAME")" "$scratch/system.tar" >"$scratch/system.log" 2>&1 || {
  tail -n 30 "$scratch/system.log"
  [ -f "$scratch/begun" ] && fail "in a new system"
  skipped "mmdebstrap could make no new system here"
}
rm -f "$scratch/system.tar"
say "passed"
