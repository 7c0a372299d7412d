#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Runs each fuzz target of a fuzz build (cmake --preset fuzz) for a bounded
# time. A target starts from its committed seed corpus (fuzz/corpus/<target>,
# only read) and a working corpus under the build folder, which keeps what it
# finds across runs; a crash, leak, sanitizer report or broken property stops
# the run and leaves the input in <build>/fuzz-work/<target>/artifacts/.
#   usage: fuzz.sh [build folder] [seconds per target]
#   FUZZ_TARGETS  the targets to run (default all)
set -eu

build=${1:-build/fuzz}
seconds=${2:-20}
root=$(cd "$(dirname "$0")/.." && pwd)
targets=${FUZZ_TARGETS:-"config datatype ip_address tag_address framing console conversion"}

export ASAN_OPTIONS="${ASAN_OPTIONS:-detect_leaks=1:abort_on_error=1:strict_string_checks=1}"
export UBSAN_OPTIONS="${UBSAN_OPTIONS:-print_stacktrace=1:halt_on_error=1}"

for target in $targets; do
  program="$build/fuzz/fuzz_$target"
  if [ ! -x "$program" ]; then
    echo "fuzz: $program is missing; build the fuzz preset first" >&2
    exit 1
  fi
  work="$build/fuzz-work/$target"
  mkdir -p "$work/corpus" "$work/artifacts"
  set -- -max_total_time="$seconds" -timeout=10 -rss_limit_mb=2048 -print_final_stats=1 \
    -artifact_prefix="$work/artifacts/"
  if [ -f "$root/fuzz/dict/$target.dict" ]; then
    set -- "$@" -dict="$root/fuzz/dict/$target.dict"
  fi
  echo "== fuzz_$target for ${seconds}s"
  "$program" "$@" "$work/corpus" "$root/fuzz/corpus/$target"
done
echo "fuzz: every target ran ${seconds}s without a finding"
