#!/usr/bin/env bash
# sdist.sh FOLDER: the Python package as sources, quenby-VERSION.tar.gz, which pip compiles: those of the
# commit that is checked out, without what it needs not, and what pip looks for on top.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
mkdir -p "$1"
out=$(cd "$1" && pwd)
version=$(sed -n 's/^project(Quenby VERSION \([0-9.]*\).*/\1/p' "$root/CMakeLists.txt")
name=quenby-$version
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT

git -C "$root" archive --prefix="$name/" HEAD CMakeLists.txt README.md bindings/c bindings/CMakeLists.txt \
  bindings/python cmake docs/python.md image_processing photo | tar --extract --directory "$scratch"
cd "$scratch/$name"
sed -e 's#\.\./\.\./##g; s#"src/quenby"#"bindings/python/src/quenby"#' \
  -e 's#^minimum-version = .*#&\ncmake.source-dir = "bindings/python"#' \
  bindings/python/pyproject.toml >pyproject.toml
rm bindings/python/pyproject.toml
printf 'Metadata-Version: 2.1\nName: quenby\nVersion: %s\n' "$version" >PKG-INFO
tar --create --sort=name --owner=0 --group=0 --numeric-owner --format=ustar \
  --mode=u=rwX,go=rX --mtime="@$(git -C "$root" log -1 --format=%ct)" --directory "$scratch" "$name" |
  gzip -9 -n >"$out/$name.tar.gz"
