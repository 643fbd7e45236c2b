#!/usr/bin/env bash
# Runs the jar for Spark in a cluster of processes, with a driver and an executor that are killed on the
# way, and from Python as the README says; compiles what docs/spark.md has in Scala. What comes out is
# compared with what the command makes.
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
spark.driver.extraJavaOptions -Djava.io.tmpdir=$scratch/tmp -XX:TieredStopAtLevel=1
spark.executor.extraJavaOptions -Djava.io.tmpdir=$scratch/tmp -XX:TieredStopAtLevel=1
CONF
cp "$root/java/quenby-spark/src/test/resources/log4j2.properties" "$scratch/conf/"

java -cp "$classes:$jar" com.pelorin.photos.quenby.spark.TestPhotos "$scratch/photos" $count 320 240
[ "$(find "$scratch/photos" -type f | wc -l)" -eq $count ] || fail "not $count photos"
"$command" enhance -r "$scratch/photos" -o "$scratch/expected/" --name '{stem}.jpg' -j 2 --quiet
: >"$scratch/photos/empty.jpg"
head -c 5000 "$(find "$scratch/photos/b" -name 'p*.jpg' | sort | head -n 1)" >"$scratch/photos/cut.jpg"

finished() { find "$scratch/out" -name '*.jpg' 2>/dev/null | wc -l; }
told() { find "$scratch/out/_manifest" -name 'part-*' -not -path '*_temporary*' 2>/dev/null | wc -l; }
executors() { # of the job
  local child
  for child in $(cat /proc/$job/task/*/children); do
    ! grep -qz CoarseGrainedExecutorBackend "/proc/$child/cmdline" || echo "$child"
  done
}
start() { # LOG
  "$home/bin/spark-submit" --master 'local-cluster[2,1,1024]' --driver-memory 512m "$jar" \
    enhance --in "$scratch/photos" --out "$scratch/out" >"$1" 2>&1 &
  job=$!
  trap 'kill $job 2>/dev/null || true' EXIT
}
reaches() { # COUNT NUMBER LOG: waits until more is counted
  local i
  for ((i = 0; i < 6000; ++i)); do # ten minutes, where the machine is busy
    [ "$($1)" -le "$2" ] || return 0
    kill -0 $job 2>/dev/null || fail "$(cat "$3")"
    sleep 0.1
  done
  fail "nothing happens: $(cat "$3")"
}

step "the driver of $count photos on two executors is killed"
start "$scratch/killed.log"
reaches told 0 "$scratch/killed.log"
left=$(executors)
kill -9 $job
wait $job 2>/dev/null && fail "the driver was killed too late: this test shows nothing"
trap - EXIT
for child in $left; do
  for ((i = 0; i < 600; ++i)); do
    grep -qz CoarseGrainedExecutorBackend "/proc/$child/cmdline" 2>/dev/null || continue 2
    sleep 0.1
  done
  kill -9 "$child"
  fail "an executor outlives its driver"
done
before=$(finished)
[ "$before" -lt $count ] || fail "the driver was killed too late: this test shows nothing"
[ -n "$(find "$scratch/out" -name '_parts')" ] || fail "nothing was under way: this test shows nothing"

step "the job is run again, and an executor is killed"
start "$scratch/second.log"
reaches finished "$before" "$scratch/second.log"
read -r killed _ <<<"$(executors | tr '\n' ' ')"
[ -n "$killed" ] || fail "no executor to kill"
kill -9 "$killed"
[ "$(finished)" -lt $count ] || fail "the executor was killed too late: this test shows nothing"
wait $job || fail "$(cat "$scratch/second.log")"
trap - EXIT
read -r again failed earlier < <(sed -n \
  's/^quenby enhance: \([0-9]*\) done, \([0-9]*\) failed, \([0-9]*\) done before.*/\1 \2 \3/p' \
  "$scratch/second.log") || fail "$(cat "$scratch/second.log")"
[ "$earlier" -gt 0 ] || fail "what was done before the driver was killed was done again"
[ $((again + earlier)) -eq $count ] && [ "$failed" -eq 2 ] || fail "$(cat "$scratch/second.log")"
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
step "Scala compiles what docs/spark.md has"
sed -n '/^```scala/,/^```/p' "$root/docs/spark.md" | sed '/^```/d' >"$scratch/lines.scala"
[ -s "$scratch/lines.scala" ] || fail "docs/spark.md has no Scala"
{
  printf 'class Lines(spark: org.apache.spark.sql.SparkSession) {\n'
  cat "$scratch/lines.scala"
  printf '}\n'
} >"$scratch/Lines.scala"
java -XX:TieredStopAtLevel=1 -cp "$home/jars/*" scala.tools.nsc.Main -cp "$jar:$(printf '%s:' "$home"/jars/*.jar)" \
  -Xfatal-warnings -d "$scratch/tmp" "$scratch/Lines.scala" >"$scratch/scala.log" 2>&1 ||
  fail "$(cat "$scratch/scala.log")"
step "passed"
