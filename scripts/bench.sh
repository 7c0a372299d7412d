#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Runs every benchmark program of a build with short repetitions and prints
# the aggregates (mean, median, standard deviation), then bench_idle (the
# cost of idle and offline channels) with short windows.
#   sh scripts/bench.sh [FOLDER]  the build's program folder (default
#                                 build/default/bin)
#   BENCH_MIN_TIME     seconds per repetition (default 0.2)
#   BENCH_REPETITIONS  repetitions per benchmark (default 3)
#   BENCH_FILTER       regular expression of the benchmarks to run (default all)
set -eu

dir=${1:-build/default/bin}
min_time=${BENCH_MIN_TIME:-0.2}
repetitions=${BENCH_REPETITIONS:-3}
filter=${BENCH_FILTER:-.}

for program in bench_framing bench_read_path bench_loopback; do
  if [ ! -x "$dir/$program" ]; then
    echo "bench: $dir/$program is missing; is Google Benchmark installed (libbenchmark-dev)?" >&2
    exit 1
  fi
  echo "== $program"
  "$dir/$program" --benchmark_min_time="$min_time" --benchmark_repetitions="$repetitions" \
    --benchmark_report_aggregates_only=true --benchmark_filter="$filter"
done

echo "== bench_idle"
"$dir/bench_idle" --host "$dir/velt-host" --plugin "$dir/libvelt.so" --seconds 1 --runs 1 \
  --reconnects 2
