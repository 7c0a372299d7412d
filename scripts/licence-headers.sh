#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Checks or adds the licence header at the top of every source file:
#   // SPDX-License-Identifier: Apache-2.0
#   // Copyright 2026 The Velt Conduit Authors
# in the comment syntax of the file (// for C++, # for CMake, shell, make
# and pkg-config, /* */ for the linker version script), below a #! line.
#   usage: licence-headers.sh --check|--fix [ROOT]
# --check lists every file without the header and fails if there is one;
# --fix adds the header where it is missing and leaves the rest untouched.
# When ROOT is a git work tree, the files are the tracked and the new
# untracked ones; elsewhere every file under ROOT but build folders.
set -eu

SPDX="SPDX-License-Identifier: Apache-2.0"
COPYRIGHT="Copyright 2026 The Velt Conduit Authors"

mode=${1:-}
root=${2:-$(cd "$(dirname "$0")/.." && pwd -P)}
case "$mode" in
  --check|--fix) ;;
  *) echo "usage: licence-headers.sh --check|--fix [ROOT]" >&2; exit 2 ;;
esac
cd "$root"

list_files() {
  if [ "$(git rev-parse --show-toplevel 2>/dev/null)" = "$(pwd -P)" ]; then
    git ls-files --cached --others --exclude-standard
  else
    find . -path ./build -prune -o -path './build-*' -prune -o -path ./.git -prune -o \
      -type f -print | sed 's|^\./||'
  fi
}

# The comment style of a source file, or nothing for a file that carries no
# header (documents, data, the Debian templates that become package files).
style_of() {
  case "$1" in
    cmake/templates/copyright.in|cmake/templates/changelog.in) ;;
    *.cpp|*.h|*.cc|*.hpp) echo cpp ;;
    *CMakeLists.txt|*.cmake|*.cmake.in|*.pc.in|*.sh|Makefile|*/Makefile|.ci/run) echo hash ;;
    *.map) echo block ;;
  esac
}

header_of() {
  case "$1" in
    cpp) printf '// %s\n// %s\n' "$SPDX" "$COPYRIGHT" ;;
    hash) printf '# %s\n# %s\n' "$SPDX" "$COPYRIGHT" ;;
    block) printf '/* %s\n   %s */\n' "$SPDX" "$COPYRIGHT" ;;
  esac
}

# The file's first two lines after a #! line.
leading_lines() {
  if head -n 1 "$1" | grep -q '^#!'; then
    sed -n '2,3p' "$1"
  else
    sed -n '1,2p' "$1"
  fi
}

add_header() {
  file=$1
  style=$2
  temporary="$file.licence-tmp"
  {
    if head -n 1 "$file" | grep -q '^#!'; then
      head -n 1 "$file"
      header_of "$style"
      echo
      tail -n +2 "$file"
    else
      header_of "$style"
      # A blank line keeps the header apart from the file's own first comment.
      [ -s "$file" ] && echo
      cat "$file"
    fi
  } >"$temporary"
  chmod --reference="$file" "$temporary"
  mv "$temporary" "$file"
}

missing=0
checked=0
for file in $(list_files); do
  [ -f "$file" ] || continue
  style=$(style_of "$file")
  [ -n "$style" ] || continue
  checked=$((checked + 1))
  if [ "$(leading_lines "$file")" = "$(header_of "$style")" ]; then
    continue
  fi
  if [ "$mode" = --fix ]; then
    add_header "$file" "$style"
    echo "licence: added the header to $file"
  else
    echo "licence: no header in $file" >&2
    missing=$((missing + 1))
  fi
done

if [ "$mode" = --check ]; then
  if [ "$missing" -ne 0 ]; then
    echo "licence: $missing of $checked source files lack the header; run make licence-fix" >&2
    exit 1
  fi
  echo "licence headers are present in all $checked source files"
fi
