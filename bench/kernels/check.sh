#!/usr/bin/env bash
# check.sh PROGRAM RECORD [--record]
# Counts the instructions of every kernel (PROGRAM is count_instructions) and compares them with
# those in the file RECORD, or writes them there.
#
# Instructions rather than time: valgrind counts them the same on a busy machine as on an idle one,
# so a change of two in a hundred is one of the code. They are not time, but what this is to notice
# shows in them: a kernel that lost its vectors, a loop that computes something twice. Valgrind
# knows no AVX-512, whose kernels are counted on the sets below it only.
set -euo pipefail
program=$1 record=$2 mode=${3-}
tolerance=2 # percent
counts=$(mktemp -d)
trap 'rm -rf "$counts"' EXIT

compiler=$(strings -a "$program" | awk '/^GCC: |^clang version/ && !found { print; found = 1 }')
valgrind --quiet --tool=callgrind --collect-atstart=no --callgrind-out-file="$counts/out" \
  "$program" >"$counts/pixels"

# The table of this build: a row a kernel, a column an instruction set, in the order of the run.
awk -v compiler="$compiler" '
  FILENAME ~ /pixels$/ { pixels = $2; next }
  /^desc: Trigger: Client Request: / { set = $5; kernel = $6 }
  /^totals: / && set != "" {
    count[kernel, set] = $2 / pixels
    if (!(kernel in kernels)) { kernels[kernel]; row[++rows] = kernel }
    if (!(set in sets)) { sets[set]; column[++columns] = set }
    set = ""
  }
  END {
    print "# Instructions a pixel; ./quenby bench --check compares, --check --record writes this file."
    print "# " compiler
    printf "%-28s", "kernel"
    for (c = 1; c <= columns; ++c) printf "%10s", column[c]
    print ""
    for (r = 1; r <= rows; ++r) {
      printf "%-28s", row[r]
      for (c = 1; c <= columns; ++c) printf "%10.2f", count[row[r], column[c]]
      print ""
    }
  }' "$counts/pixels" $(ls -v "$counts"/out.*) >"$counts/table"

if [ "$mode" = --record ]; then
  cp "$counts/table" "$record"
  echo "Written to $record."
  exit
fi

[ "$(sed -n 2p "$record")" = "$(sed -n 2p "$counts/table")" ] ||
  echo "Recorded with another compiler, so some difference is to be expected:
  recorded  $(sed -n 2p "$record")
  now       $(sed -n 2p "$counts/table")"
awk -v tolerance="$tolerance" '
  /^#/ { next }
  $1 == "kernel" { delete set; for (i = 2; i <= NF; ++i) set[i] = $i; next }
  NR == FNR { for (i = 2; i <= NF; ++i) recorded[$1, set[i]] = $i; known[$1]; next }
  {
    now[$1]
    if (!($1 in known)) { print "new       " $1; changed = 1; next }
    for (i = 2; i <= NF; ++i) {
      if (!(($1, set[i]) in recorded)) continue
      before = recorded[$1, set[i]]
      percent = before > 0 ? ($i / before - 1) * 100 : 0
      ++compared
      if (percent <= tolerance && percent >= -tolerance) continue
      changed = 1
      if (percent > tolerance) ++worse
      printf "%s %-28s %-6s %8.2f -> %8.2f instructions a pixel, %+.1f %%\n",
             (percent > 0 ? "MORE     " : "fewer    "), $1, set[i], before, $i, percent
    }
  }
  END {
    for (kernel in known) if (!(kernel in now)) { print "GONE      " kernel; ++worse }
    printf "%d counts compared, %d worse by more than %d %%.\n", compared, worse, tolerance
    if (changed && !worse) print "Take the new ones over with ./quenby bench --check --record."
    exit worse > 0
  }' "$record" "$counts/table"
