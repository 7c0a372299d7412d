#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Runs each fuzz target of a fuzz build (cmake --preset fuzz) for a bounded
# time. A target starts from its committed seed corpus (fuzz/corpus/<target>,
# only read) and a working corpus under the build folder, which keeps what it
# finds across runs; a crash, leak, sanitizer report or broken property stops
# the run and leaves the input in <build>/fuzz-work/<target>/artifacts/.
#   usage: fuzz.sh [build folder] [seconds per target]
#          fuzz.sh --check [build folder]
#   FUZZ_TARGETS  the targets to run (default: every target the build lists)
#
# The build lists its targets in <build>/fuzz/targets.txt, one "NAME PATH"
# line each. --check only compares that list with what this script would
# run: every listed program must be where the script looks for it, and every
# fuzz program in the build's bin/ must be listed. The test suites run it, so
# a build that moves or adds a program without the script following fails.
set -eu

root=$(cd "$(dirname "$0")/.." && pwd)

program_of() { # build target
  echo "$1/bin/fuzz_$2"
}

listed_targets() { # build
  list="$1/fuzz/targets.txt"
  if [ ! -f "$list" ]; then
    echo "fuzz: $list is missing; configure the build first" >&2
    exit 1
  fi
  while read -r name path; do
    echo "$name"
  done <"$list"
}

check() { # build
  build=$1
  list="$build/fuzz/targets.txt"
  names=$(listed_targets "$build")
  failed=0
  while read -r name path; do
    expected=$(program_of "$build" "$name")
    if [ "$(realpath -m "$expected")" != "$(realpath -m "$path")" ]; then
      echo "fuzz: the build puts fuzz_$name at $path, the script looks at $expected" >&2
      failed=1
    elif [ ! -x "$expected" ]; then
      echo "fuzz: $expected is listed but not built" >&2
      failed=1
    fi
  done <"$list"
  for program in "$build"/bin/fuzz_*; do
    [ -e "$program" ] || continue
    name=${program##*/fuzz_}
    if ! printf '%s\n' $names | grep -qx "$name"; then
      echo "fuzz: $program is built but not listed in $list" >&2
      failed=1
    fi
  done
  if [ "$failed" -ne 0 ]; then
    exit 1
  fi
  echo "fuzz: the script finds all $(printf '%s\n' $names | wc -l) targets of $build:" $names
}

if [ "${1:-}" = "--check" ]; then
  check "${2:-build/fuzz}"
  exit 0
fi

build=${1:-build/fuzz}
seconds=${2:-20}
check "$build"
targets=${FUZZ_TARGETS:-$(listed_targets "$build")}

export ASAN_OPTIONS="${ASAN_OPTIONS:-detect_leaks=1:abort_on_error=1:strict_string_checks=1}"
export UBSAN_OPTIONS="${UBSAN_OPTIONS:-print_stacktrace=1:halt_on_error=1}"

for target in $targets; do
  program=$(program_of "$build" "$target")
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
echo "fuzz: every target ran ${seconds}s without a finding:" $targets
