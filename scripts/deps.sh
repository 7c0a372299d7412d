#!/bin/sh
# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Makes sure the Debian packages a make target needs are present. As root it
# installs what is missing with apt-get (after apt-get update); otherwise it
# stops and prints the exact line to run, as root and through sudo.
#   usage: deps.sh [package] [cross]
#     (none)   building and every test suite of make test
#     package  also the Debian packaging tools (make package)
#     cross    also the cross compilers, qemu-user and GoogleTest's sources
#              (make cross-test)
set -eu

# libclang-rt-14-dev holds clang's sanitizer runtimes and libFuzzer, which clang only
# recommends; libedit-dev gives velt-host's console line editing and history;
# libbenchmark-dev is Google Benchmark; groff-base renders the manual pages
# that a test checks; binutils splits the plug-in's debug information.
PACKAGES="cmake make g++ clang libclang-rt-14-dev clang-format ninja-build pkg-config zlib1g-dev
libedit-dev libgtest-dev libgmock-dev libbenchmark-dev binutils groff-base"
for group in "$@"; do
  case "$group" in
    # dpkg-shlibdeps (dpkg-dev) gives the packages' dependencies; lintian
    # checks them.
    package) PACKAGES="$PACKAGES dpkg-dev lintian" ;;
    # googletest installs the sources that the cross builds compile.
    cross) PACKAGES="$PACKAGES g++-aarch64-linux-gnu g++-arm-linux-gnueabihf qemu-user googletest" ;;
    *) echo "deps: unknown group '$group' (package or cross)" >&2; exit 2 ;;
  esac
done

if ! command -v dpkg-query >/dev/null 2>&1; then
  echo "deps: no dpkg-query here; assuming the tools and libraries are installed" >&2
  exit 0
fi

missing=""
for package in $PACKAGES; do
  status=$(dpkg-query -W -f='${Status}' "$package" 2>/dev/null || true)
  case "$status" in
    *"install ok installed"*) ;;
    *) missing="$missing $package" ;;
  esac
done

if [ -z "$missing" ]; then
  exit 0
fi

install="apt-get install -y --no-install-recommends$missing"
if [ "$(id -u)" -eq 0 ]; then
  echo "deps: installing$missing" >&2
  export DEBIAN_FRONTEND=noninteractive
  apt-get update
  # shellcheck disable=SC2086
  apt-get install -y --no-install-recommends $missing
else
  echo "deps: missing Debian packages. As root, run:" >&2
  echo "  apt-get update && $install" >&2
  if command -v sudo >/dev/null 2>&1; then
    echo "or, through sudo:" >&2
    echo "  sudo apt-get update && sudo $install" >&2
  fi
  exit 1
fi
