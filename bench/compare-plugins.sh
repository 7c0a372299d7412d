#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Measures two builds of the plug-in with the same benchmark program, in
# alternating rounds (one before, one after, and again), so that both see
# the same machine; prints the median of every figure over the rounds.
#   bench/compare-plugins.sh BEFORE.so AFTER.so [ROUNDS] [FILTER] [PROGRAM]
# ROUNDS defaults to 5, FILTER (a benchmark name pattern) to all of them,
# PROGRAM to build/default/bin/bench_loopback. Figures a benchmark does not
# report stay empty.
set -eu

if [ $# -lt 2 ]; then
  echo "usage: $0 BEFORE.so AFTER.so [ROUNDS] [FILTER] [PROGRAM]" >&2
  exit 2
fi
before=$1
after=$2
rounds=${3:-5}
filter=${4:-.}
program=${5:-build/default/bin/bench_loopback}

rows=$(mktemp)
trap 'rm -f "$rows"' EXIT

# One benchmark per run: the CSV report's header names the figures of its
# first benchmark only.
names=$("$program" --benchmark_list_tests --benchmark_filter="$filter")

round=1
while [ "$round" -le "$rounds" ]; do
  for name in $names; do
    for which in before after; do
      if [ "$which" = before ]; then plugin=$before; else plugin=$after; fi
      # Each CSV line is kept with the round's plug-in; the header says which
      # column holds which figure.
      VELT_BENCH_PLUGIN=$plugin "$program" --benchmark_filter="^$name\$" \
        --benchmark_format=csv 2>/dev/null | sed "s/^/$which,/" >>"$rows"
    done
  done
  echo "round $round of $rounds done" >&2
  round=$((round + 1))
done

awk -F ',' '
  function median(list,   n, values, i, j, swap) {
    n = split(list, values, " ")
    for (i = 2; i <= n; ++i) {
      for (j = i; j > 1 && values[j - 1] + 0 > values[j] + 0; --j) {
        swap = values[j]; values[j] = values[j - 1]; values[j - 1] = swap
      }
    }
    if (n == 0) return ""
    return n % 2 ? values[(n + 1) / 2] : (values[n / 2] + values[n / 2 + 1]) / 2
  }
  $2 == "name" {
    for (i = 3; i <= NF; ++i) { gsub(/"/, "", $i); column[i] = $i }
    next
  }
  {
    name = $2; gsub(/"/, "", name)
    if (!(name in seen)) { seen[name] = 1; order[++names] = name }
    if ($10 == "true") { failed[$1, name] = $11; next }
    for (i = 3; i <= NF; ++i) {
      if (column[i] ~ /^(iterations|time_unit|label|error_occurred|error_message)$/ || $i == "")
        continue
      if (!((name, column[i]) in known)) { known[name, column[i]] = 1; figures[name] = figures[name] " " column[i] }
      samples[$1, name, column[i]] = samples[$1, name, column[i]] " " $i
    }
  }
  END {
    printf "%-60s %-18s %14s %14s\n", "benchmark", "figure", "before", "after"
    for (k = 1; k <= names; ++k) {
      name = order[k]
      n = split(figures[name], list, " ")
      for (f = 1; f <= n; ++f) {
        printf "%-60s %-18s %14s %14s\n", name, list[f],
               median(samples["before", name, list[f]]), median(samples["after", name, list[f]])
      }
      if (("before", name) in failed) printf "%-60s before failed: %s\n", name, failed["before", name]
      if (("after", name) in failed) printf "%-60s after failed: %s\n", name, failed["after", name]
    }
  }
' "$rows"
