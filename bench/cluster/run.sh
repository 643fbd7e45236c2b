#!/usr/bin/env bash
# Photos through Spark on two cores beside the command with -j 2 and beside what one would write with
# javax.imageio, in turn; memory beside the heap; the search for near-duplicates among generated
# fingerprints.
#
#   bench/cluster/run.sh QUENBY NATIVES [PHOTOS [ROUNDS [FINGERPRINTS]]]
#
# "quick" is the job with Java's quick compiler alone (docs/spark.md). Start-up is what the same takes for one photo, and taken off. Processor time is told beside the time
# that passes, since only the former means something on a machine that is busy.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
command=$1 natives=$2 count=${3-1000} rounds=${4-3} fingerprints=${5-1000000}
scratch=$root/build/spark/bench
read -r jar classes home < <("$root/tests/spark/all.sh" "$command" "$natives" --only-build)

rm -rf "$scratch"
mkdir -p "$scratch/conf" "$scratch/one"
export SPARK_HOME=$home SPARK_LOCAL_IP=127.0.0.1 SPARK_CONF_DIR=$scratch/conf
printf 'spark.ui.enabled false\nspark.local.dir %s\nspark.sql.shuffle.partitions 16\n' \
  "$scratch/local" >"$scratch/conf/spark-defaults.conf"
cp "$root/java/quenby-spark/src/test/resources/log4j2.properties" "$scratch/conf/"
(cd "$classes" && jar --create --file "$scratch/bench.jar" com)

distinct=$(((count + 24) / 25))
java -cp "$classes:$jar" com.pelorin.photos.quenby.spark.TestPhotos "$scratch/distinct" $distinct 1600 1250
for ((copy = 0; copy < 25; ++copy)); do
  mkdir -p "$scratch/many/$copy"
  find "$scratch/distinct" -type f -exec cp {} "$scratch/many/$copy/" \;
done
count=$(find "$scratch/many" -type f | wc -l)
find "$scratch/distinct" -type f | head -n 1 | xargs -I{} cp {} "$scratch/one/"

spark() { "$home/bin/spark-submit" --master 'local[2]' --driver-memory 1g "$@"; }
enhance() { spark "$jar" enhance --in "$1" --out "$2"; }
quick() { spark --driver-java-options -XX:TieredStopAtLevel=1 "$jar" enhance --in "$1" --out "$2"; }
imageio() { spark --class com.pelorin.photos.quenby.spark.ImageIoJob "$scratch/bench.jar" "$1" "$2"; }
quenby() { "$command" enhance -r "$1" -o "$2/" -j 2 --quiet; }

took() { # WHAT IN: seconds that passed, and of processors
  rm -rf "$scratch/out"
  local TIMEFORMAT='%R %U %S'
  { time "$1" "$2" "$scratch/out" >"$scratch/log" 2>&1; } 2>&1 || { cat "$scratch/log" >&2 && exit 1; }
}

printf '%-9s %6s %15s %15s %15s\n' "" "start" "photos a second" "processor ms" "of the command"
for ((round = 0; round < rounds; ++round)); do
  for what in quenby enhance quick imageio; do
    printf '%s %s %s %s\n' $what $count "$(took $what "$scratch/one")" "$(took $what "$scratch/many")"
  done
done | awk '
  { rate = ($2 - 1) / ($6 - $3); cost = 1000 * ($7 + $8 - $4 - $5) / ($2 - 1) }
  $1 == "quenby" { own = rate }
  { printf "%-9s %5.1fs %15.1f %15.1f %15.2f\n", $1, $3, rate, cost, rate / own }'

# The heap is taken at once, so that what comes on top is the natives' and the machine's own.
resident() { # FOLDER CORES: MiB at most
  rm -rf "$scratch/out"
  "$home/bin/spark-submit" --master "local[$2]" --driver-memory 512m \
    --driver-java-options '-Xms512m -XX:+AlwaysPreTouch' "$jar" enhance --in "$1" \
    --out "$scratch/out" >"$scratch/log" 2>&1 &
  local job=$! peak=0
  while kill -0 $job 2>/dev/null; do
    peak=$(awk '/^VmHWM/ { print int($2 / 1024) }' /proc/$job/status 2>/dev/null || true)
    [ -z "$peak" ] || local most=$peak
    sleep 0.1
  done
  wait $job || { cat "$scratch/log" >&2 && exit 1; }
  echo "$most"
}
java -cp "$classes:$jar" com.pelorin.photos.quenby.spark.TestPhotos "$scratch/large/0" 3 6000 4000
for ((copy = 1; copy < 20; ++copy)); do cp -r "$scratch/large/0" "$scratch/large/$copy"; done
echo "resident beside a heap of 512 MiB: $(($(resident "$scratch/one" 1) - 512)) MiB for a photo of 2 MP," \
  "$(($(resident "$scratch/large" 1) - 512)) for 60 of 24 MP, $(($(resident "$scratch/large" 2) - 512)) on two cores"

spark --class com.pelorin.photos.quenby.spark.GeneratedFingerprints --jars "$jar" --driver-memory 4g \
  "$scratch/bench.jar" "$fingerprints" "$scratch/fingerprints"
rm -rf "$scratch"
