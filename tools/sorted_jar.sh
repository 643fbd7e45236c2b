#!/bin/sh
# sorted_jar.sh JAR FOLDER OPTION...: a jar of what is in a folder, the same from the same files: in the
# order of their names and dated by SOURCE_DATE_EPOCH. The options are those of the program `jar`
# (or of what JAVA_JAR names) for making one.
set -eu
out=$1 folder=$2
shift 2
date=$(date -u -d "@${SOURCE_DATE_EPOCH-$(date +%s)}" +%Y-%m-%dT%H:%M:%SZ)
list=$(mktemp)
trap 'rm -f "$list"' EXIT
(cd "$folder" && find . -type f | LC_ALL=C sort) |
  while read -r file; do printf -- '-C "%s" "%s"\n' "$folder" "$file"; done >"$list"
rm -f "$out"
"${JAVA_JAR-jar}" --create --file "$out" --date "$date" "$@" "@$list"
