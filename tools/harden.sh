#!/usr/bin/env bash
# harden.sh RELEASE FUZZ: what ./quenby test does a little of, done at length with the builds in the folders
# RELEASE and FUZZ (libFuzzer's), and as a table in docs/reliability.md.
# QUENBY_FUZZ_SECONDS: for each target, 45.
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
release=$1 fuzz=$2 seconds=${QUENBY_FUZZ_SECONDS:-45}
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

printf '| What | How often | Found |\n|---|---|---|\n' >"$work/table"
row() { printf '| %s | %s | %s |\n' "$@" | tee -a "$work/table"; }

# Every call of the command fails in turn.
least_memory=3000 least_files=600
QUENBY_HARDEN=1 "$release/tests/cli/command_faults_test" >"$work/faults" || {
  cat "$work/faults"
  exit 1
}
count() { awk -v kinds="$1" 'index(kinds, " " $1 " ") && NF == 2 { sum += $2 } END { print sum + 0 }' "$work/faults"; }
memory=$(count ' memory ') files=$(count ' read write open close rename sync map stat ')
if [ "$memory" -lt $least_memory ] || [ "$files" -lt $least_files ]; then
  echo "Only $memory allocations and $files calls failed; the least are $least_memory and $least_files." >&2
  exit 1
fi
row "allocations of the command that fail" "$memory" nothing
row "its calls on files that fail, are interrupted or do half" "$files" nothing

# Inputs that libFuzzer makes, from those that are kept.
"$root/fuzz/corpus.py" unpack "$work/corpus"
for target in "$fuzz"/fuzz/fuzz_*; do
  [ -f "$target" ] && [ -x "$target" ] || continue
  name=$(basename "$target")
  mkdir -p "$work/corpus/$name"
  "$target" -max_total_time="$seconds" -max_len=1024 -timeout=30 -print_final_stats=1 \
    -artifact_prefix="$work/" "$work/corpus/$name" >"$work/log" 2>&1 || {
    tail -n 40 "$work/log"
    exit 1
  }
  row "\`$name\`, inputs" "$(awk '/number_of_executed_units/ { print $2 }' "$work/log")" nothing
done

awk -v table="$work/table" '
  /<!-- measured -->/ { print; while ((getline line < table) > 0) print line; skip = 1; next }
  /<!-- end -->/ { skip = 0 }
  !skip' "$root/docs/reliability.md" >"$work/page"
cp "$work/page" "$root/docs/reliability.md"
