#!/usr/bin/env bash
# harden.sh RELEASE FUZZ TSAN [SECONDS]: what ./quenby test does a little of, done at length with the builds in the
# folders RELEASE, FUZZ (libFuzzer's) and TSAN (the thread sanitizer's), and as a table in docs/reliability.md. With SECONDS it takes about so
# long, half of it for each; without, every call of the command fails in turn, and targets get 45 s each.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
release=$1 fuzz=$2 tsan=$3 budget=${4-}
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

verbs=$("$release/tests/cli/command_faults_test" --gtest_list_tests | grep -c '^  ')
targets=()
for target in "$fuzz"/fuzz/fuzz_*; do
  [ -f "$target" ] && [ -x "$target" ] && targets+=("$target")
done
faults_seconds=0 fuzz_seconds=45
if [ -n "$budget" ]; then
  faults_seconds=$((budget / 2 / verbs > 0 ? budget / 2 / verbs : 1))
  fuzz_seconds=$((budget / 2 / ${#targets[@]} > 0 ? budget / 2 / ${#targets[@]} : 1))
fi

printf '| What | How often | Seconds | Found |\n|---|---|---|---|\n' >"$work/table"
row() { printf '| %s | %s | %s | %s |\n' "$@" | tee -a "$work/table"; }
# What must be silent where nothing is found.
quietly() {
  "$@" >"$work/log" 2>&1 || {
    tail -n 60 "$work/log" >&2
    exit 1
  }
}
at_least() { # WHAT COUNT LEAST
  [ "$2" -ge "$3" ] && return
  echo "Only $2 of $1 were tried; the least are $3." >&2
  exit 1
}

start=$SECONDS
quietly env QUENBY_HARDEN=$faults_seconds "$release/tests/cli/command_faults_test"
took=$((SECONDS - start))
count() { awk -v kinds="$1" 'index(kinds, " " $1 " ") && NF == 2 { sum += $2 } END { print sum + 0 }' "$work/log"; }
memory=$(count ' memory ') files=$(count ' read write open close rename sync map stat ')
if [ -z "$budget" ]; then
  at_least "the command's allocations" "$memory" 3000
  at_least "the command's calls on files" "$files" 600
fi
row "allocations of the command that fail" "$memory" $took nothing
row "its calls on files that fail, are interrupted or do half" "$files" "the same" nothing

# Those of the natives and of the C library are all tried, always.
summed() { awk -v words="$1" 'index($0, words) { sum += $1 } END { print sum + 0 }' "$work/log"; }
start=$SECONDS
quietly "$release/tests/jni/jni_tests" --gtest_filter='FailingCalls.*'
calls=$(summed 'failing calls')
quietly "$release/tests/jni/jni_machine_tests" --gtest_filter='Registration.*'
calls=$((calls + $(summed 'failing calls')))
quietly "$release/tests/bindings/java/photo_natives_test" --gtest_filter='*UnderFaults.*'
calls=$((calls + $(summed 'failing calls')))
at_least "the natives' calls into Java" "$calls" 300
row "calls of the natives into Java that fail" "$calls" $((SECONDS - start)) nothing
start=$SECONDS
quietly "$release/tests/jni/jni_machine_tests" --gtest_filter='OutOfMemory.*'
memory=$(summed 'injected faults')
quietly "$release/tests/jni/out_of_memory_with_jpeg_test" --gtest_filter='OutOfMemory.*JpegFile*'
memory=$((memory + $(summed 'injected faults')))
quietly "$release/tests/bindings/java/photo_natives_test" --gtest_filter='*UnderFaults.*'
memory=$((memory + $(summed 'injected faults')))
at_least "the natives' allocations" "$memory" 1000
row "their allocations" "$memory" $((SECONDS - start)) nothing
start=$SECONDS
quietly "$release/tests/bindings/c/c_memory_test"
memory=$(summed 'injected faults')
at_least "the C library's allocations" "$memory" 1000
row "allocations of the C library" "$memory" $((SECONDS - start)) nothing
start=$SECONDS
quietly "$release/tests/photo/sqlite_faults_test"
calls=$(summed 'failing calls of SQLite')
at_least "SQLite's calls" "$calls" 1300
row "calls of SQLite that fail under a cache or a ledger" "$calls" $((SECONDS - start)) nothing

# Sessions by the million, threads for as long as a fault of theirs may take to show, libraries that come and go.
# Virtual machines do it in the release's tests.
threads_seconds=$((budget > 0 ? budget / 10 + 1 : 3600)) watched_seconds=$((budget > 0 ? budget / 10 + 1 : 600))
cycles=$((budget > 0 ? 10000 * budget : 1000000))
start=$SECONDS
quietly env QUENBY_CYCLES=$((cycles < 1000000 ? cycles : 1000000)) "$release/tests/jni/endurance_test" \
  --gtest_filter='*LeaveMemoryWhereItWas'
row "sessions that leave memory where it was, to 64 KiB" "$(awk '/sessions:/ { print $1 }' "$work/log")" \
  $((SECONDS - start)) nothing
quietly env QUENBY_SECONDS=$threads_seconds "$release/tests/jni/endurance_test" --gtest_filter='*SerialTwin'
row "results of 8 threads in 8 sessions and every filter beside those of one" \
  "$(awk '/results of/ { print $1 }' "$work/log")" $threads_seconds nothing
quietly env QUENBY_SECONDS=$watched_seconds "$tsan/tests/jni/endurance_test" --gtest_filter='*SerialTwin'
row "the same under the thread sanitizer" "$(awk '/results of/ { print $1 }' "$work/log")" $watched_seconds nothing
start=$SECONDS
quietly env QUENBY_CYCLES=1000 "$release/tests/jni/unloading_test"
row "times that all libraries for Java are loaded and unloaded" 1000 $((SECONDS - start)) nothing

# Inputs that libFuzzer makes, from those that are kept.
"$root/fuzz/corpus.py" unpack "$work/corpus"
for target in "${targets[@]}"; do
  name=$(basename "$target")
  mkdir -p "$work/corpus/$name"
  quietly "$target" -max_total_time="$fuzz_seconds" -max_len=1024 -timeout=30 -print_final_stats=1 \
    -artifact_prefix="$work/" "$work/corpus/$name"
  inputs=$(awk '/number_of_executed_units/ { print $2 }' "$work/log")
  at_least "\`$name\`'s inputs" "$inputs" 1
  row "\`$name\`, inputs" "$inputs" "$fuzz_seconds" nothing
done

awk -v table="$work/table" '
  /<!-- measured -->/ { print; while ((getline line < table) > 0) print line; skip = 1; next }
  /<!-- end -->/ { skip = 0 }
  !skip' "$root/docs/reliability.md" >"$work/page"
cp "$work/page" "$root/docs/reliability.md"
