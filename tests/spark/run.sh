#!/usr/bin/env bash
# Runs the jar for Spark in a cluster of processes, with an executor that is killed on the way, and from
# Python as the README says. What comes out is compared with what the command makes.
#
#   tests/spark/run.sh JAR TEST_CLASSES SPARK_HOME PYTHON COMMAND
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
jar=$1 classes=$2 home=$3 python=$4 command=$5
scratch=$root/build/spark/test
count=500

step() { printf '%s\n' "spark: $*"; }
fail() {
  printf '%s\n' "spark: FAILED: $*" >&2
  exit 1
}
export SPARK_HOME=$home SPARK_LOCAL_IP=127.0.0.1 PYSPARK_PYTHON=$python

rm -rf "$scratch"
mkdir -p "$scratch/tmp" "$scratch/conf"
export SPARK_CONF_DIR=$scratch/conf
cat >"$scratch/conf/spark-defaults.conf" <<CONF
spark.ui.enabled false
spark.sql.shuffle.partitions 4
spark.sql.warehouse.dir $scratch/warehouse
spark.driver.extraJavaOptions -Djava.io.tmpdir=$scratch/tmp
spark.executor.extraJavaOptions -Djava.io.tmpdir=$scratch/tmp
CONF
cp "$root/java/quenby-spark/src/test/resources/log4j2.properties" "$scratch/conf/"

java -cp "$classes:$jar" com.pelorin.photos.quenby.spark.TestPhotos "$scratch/photos" $count 320 240
[ "$(find "$scratch/photos" -type f | wc -l)" -eq $count ] || fail "not $count photos"
"$command" enhance -r "$scratch/photos" -o "$scratch/expected/" --name '{stem}.jpg' -j 2 --quiet
: >"$scratch/photos/empty.jpg"
head -c 5000 "$(find "$scratch/photos/b" -name 'p*.jpg' | sort | head -n 1)" >"$scratch/photos/cut.jpg"

finished() { find "$scratch/out" -name '*.jpg' 2>/dev/null | wc -l; }

step "$count photos on two executors, of which one is killed"
"$home/bin/spark-submit" --master 'local-cluster[2,1,1024]' --driver-memory 512m "$jar" \
  enhance --in "$scratch/photos" --out "$scratch/out" >"$scratch/first.log" 2>&1 &
driver=$!
trap 'kill $driver 2>/dev/null || true' EXIT
for ((i = 0; i < 6000; ++i)); do # ten minutes, where the machine is busy
  [ "$(finished)" -eq 0 ] || break
  kill -0 $driver 2>/dev/null || fail "$(cat "$scratch/first.log")"
  sleep 0.1
done
killed=
for child in $(cat /proc/$driver/task/*/children); do
  if grep -qz CoarseGrainedExecutorBackend "/proc/$child/cmdline"; then
    kill -9 "$child"
    killed=$child
    break
  fi
done
before=$(finished)
[ -n "$killed" ] || fail "no executor to kill"
[ "$before" -lt $count ] || fail "the executor was killed too late: this test shows nothing"
wait $driver || fail "$(cat "$scratch/first.log")"
trap - EXIT
grep -q "^quenby enhance: $count done, 2 failed, 0 done before" "$scratch/first.log" ||
  fail "$(cat "$scratch/first.log")"
[ -z "$(find "$scratch/out" -name '_parts')" ] || fail "parts are left"

step "the files are the command's"
diff -r --exclude=_manifest "$scratch/expected" "$scratch/out" || fail "other files than the command's"

step "the natives were unpacked once for all processes"
[ "$(find "$scratch/tmp" -maxdepth 1 -name 'quenby-*' -type d | wc -l)" -eq 1 ] ||
  fail "$(ls "$scratch/tmp")"

step "Python runs the README's lines, and reads the manifest"
mkdir "$scratch/python"
ln -s "$jar" "$scratch/python/quenby-spark.jar"
ln -s "$scratch/photos" "$scratch/python/photos"
sed -n '/^from pyspark/,/^```/p' "$root/README.md" | sed '/^```/d' >"$scratch/python/readme.py"
[ -s "$scratch/python/readme.py" ] || fail "the README has no lines for Python"
cat "$root/tests/spark/after_readme.py" >>"$scratch/python/readme.py"
(cd "$scratch/python" && "$python" readme.py "$scratch" $count) >"$scratch/python.log" 2>&1 ||
  fail "$(cat "$scratch/python.log")"
step "passed"
