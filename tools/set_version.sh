#!/usr/bin/env bash
# set_version.sh VERSION: writes it where it stands. CMakeLists.txt is what everything else reads; Maven
# cannot, so that its files have it, too (the build notices when they disagree).
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."
[[ ${1-} =~ ^[0-9]+\.[0-9]+\.[0-9]+$ ]] || { echo "usage: tools/set_version.sh 1.2.3" >&2 && exit 2; }
old=$(sed -n 's/^project(Quenby VERSION \([0-9.]*\).*/\1/p' CMakeLists.txt)
sed -i "s/^\(project(Quenby VERSION \)$old/\1$1/" CMakeLists.txt
sed -i "0,/<version>$old</s//<version>$1</" java/pom.xml java/*/pom.xml
grep -n "$1" CMakeLists.txt java/pom.xml java/*/pom.xml
