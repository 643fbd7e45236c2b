#!/usr/bin/env bash
# all.sh QUENBY NATIVES [--only-build]: the tests of the jar for Spark, in one process (JUnit) and in a
# cluster of processes (run.sh). Maven's registry has Spark's classes, Python's has Spark itself. Where
# nothing is to be tested, it tells where they are: the jar, the tests' classes, Spark.
#
# Leaves with 77, and says why, where they cannot be had.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
command=$(readlink -f "$1") natives=$(readlink -f "$2")
scratch=$root/build/spark
version=$(sed -n 's/^project(Quenby VERSION \([0-9.]*\).*/\1/p' "$root/CMakeLists.txt")
spark=$(sed -n 's/.*<spark.version>\(.*\)<.*/\1/p' "$root/java/quenby-spark/pom.xml")
maven=(mvn --batch-mode --no-transfer-progress --quiet -Dstyle.color=never --file "$root/java/pom.xml"
  -Pspark -Dquenby.native.dir="$natives" -Dquenby.build.dir="$scratch/java"
  --projects quenby-spark --also-make)

skipped() {
  echo "spark: skipped: $*" >&2
  exit 77
}
unreachable() { grep -qiE 'unknown host|could not transfer|connection (refused|reset|timed out)|network is unreachable|temporary failure|NewConnectionError' "$1"; }

mkdir -p "$scratch"
log=$scratch/maven.log
tests=(-Dtest='com.pelorin.photos.quenby.spark.*Test' -Dsurefire.failIfNoSpecifiedTests=false)
[ "${3-}" != --only-build ] || tests=(-DskipTests)
[ "${3-}" = --only-build ] || echo "spark: functions, near-duplicates and jobs in one process"
if ! "${maven[@]}" test-compile >"$log" 2>&1; then
  cat "$log" >&2
  unreachable "$log" || exit 1
  skipped "Maven's registry cannot be reached"
fi
if ! "${maven[@]}" -Dquenby.command="$command" "${tests[@]}" package >"$log" 2>&1; then
  cat "$log" >&2
  exit 1
fi

environment=$scratch/environment
if [ "$("$environment/bin/python" -c 'import pyspark; print(pyspark.__version__)' 2>&1)" != "$spark" ]; then
  python3 -m venv --clear "$environment"
  if ! "$environment/bin/pip" install --quiet "pyspark==$spark" >"$scratch/pip.log" 2>&1; then
    cat "$scratch/pip.log" >&2
    unreachable "$scratch/pip.log" || exit 1
    skipped "the cluster of processes: Python's registry cannot be reached"
  fi
fi
home=$("$environment/bin/python" -c 'import os, pyspark; print(os.path.dirname(pyspark.__file__))')
made=("$scratch/java/quenby-spark/quenby-spark-$version.jar"
  "$scratch/java/quenby-spark/test-classes" "$home")
if [ "${3-}" = --only-build ]; then
  echo "${made[@]}"
else
  "$root/tests/spark/run.sh" "${made[@]}" "$environment/bin/python" "$command"
fi
