#!/bin/sh
# Makes sure the Debian packages the build and the tests need are present.
# As root it installs what is missing with apt-get; otherwise it stops and
# prints the exact apt-get line to run.
set -eu

# libclang-rt-14-dev holds clang's sanitizer runtimes and libFuzzer, which clang only
# recommends; libedit-dev gives velt-host's console line editing and history;
# libbenchmark-dev is Google Benchmark.
PACKAGES="cmake make g++ clang libclang-rt-14-dev clang-format ninja-build pkg-config zlib1g-dev
libedit-dev libgtest-dev libgmock-dev libbenchmark-dev"

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

if [ "$(id -u)" -eq 0 ]; then
  echo "deps: installing$missing" >&2
  export DEBIAN_FRONTEND=noninteractive
  apt-get update
  # shellcheck disable=SC2086
  apt-get install -y --no-install-recommends $missing
else
  echo "deps: missing Debian packages. Run:" >&2
  echo "  sudo apt-get install -y$missing" >&2
  exit 1
fi
