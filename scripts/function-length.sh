#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Measures the length of every function in src/ (lines from the opening to
# the closing brace, blank lines and comments included, as clang-tidy's
# readability-function-size counts them) and lists the longest. Fails when
# one is longer than the limit.
#   scripts/function-length.sh [BUILD_DIR] [LIMIT] [SHOWN]
# BUILD_DIR needs a compile_commands.json (build/default by default); LIMIT
# is 40 lines by default; SHOWN how many of the longest functions to list
# (10 by default).
set -eu

build=${1:-build/default}
limit=${2:-40}
shown=${3:-10}

if [ ! -f "$build/compile_commands.json" ]; then
  echo "function-length: $build/compile_commands.json is missing; configure a build first" >&2
  exit 2
fi

report=$(mktemp)
trap 'rm -f "$report"' EXIT

# A threshold of 0 makes clang-tidy report every function with its length.
find src -name '*.cpp' | sort | while read -r file; do
  clang-tidy -p "$build" --quiet --checks='-*,readability-function-size' \
    --config="{CheckOptions: [{key: readability-function-size.LineThreshold, value: 0}]}" \
    --header-filter='src/' --warnings-as-errors='' "$file" 2>/dev/null || true
done | awk '
  /warning: function .* exceeds/ { split($0, part, "'"'"'"); name = part[2]; where = $1 }
  /note: [0-9]+ lines including/ { print $3 "\t" name "\t" where }
' | sort -u | sort -t "$(printf '\t')" -k1,1nr >"$report"

echo "longest functions in src/ (lines):"
head -n "$shown" "$report"
longest=$(head -n 1 "$report" | cut -f1)
if [ "${longest:-0}" -gt "$limit" ]; then
  echo "function-length: functions longer than $limit lines:" >&2
  awk -F '\t' -v limit="$limit" '$1 > limit' "$report" >&2
  exit 1
fi
echo "no function in src/ is longer than $limit lines"
