# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Thin wrapper over the CMake presets.
#   make test        licence and format checks, then every test suite (default,
#                    asan and tsan builds) and the demo once, after the default
#                    suite; the default suite installs into a staging prefix and
#                    builds an outside project against it
#   make build       builds the default preset only
#   make demo        builds the plug-in, velt-host and velt-peer, and runs the demo
#   make package     builds the Debian packages (package preset) into
#                    build/package/packages/ and checks them
#   make cross-test ARCH=arm64|armhf
#                    builds the plug-in and the unit tests with Debian's cross
#                    compiler and runs them under qemu-user
#   make bench       builds the default preset and runs the benchmarks (short runs)
#   make fuzz        builds the fuzz preset and runs each fuzz target for
#                    FUZZ_SECONDS (default 20) from its seed corpus
#   make faults      builds the default preset and runs the fault suite
#                    (docs/reliability.md; FAULTS="case ..." picks cases)
#   make format      applies clang-format; make format-check only checks
#   make licence-check checks the licence header of every source file;
#                    make licence-fix adds the missing ones
#   make tidy        runs clang-tidy on the default build and fails on any finding

SHELL := /bin/sh
JOBS ?= 2
# Ninja when present, make otherwise.
export CMAKE_GENERATOR ?= $(if $(shell command -v ninja 2>/dev/null),Ninja,Unix Makefiles)
FORMAT_DIRS := src hostapi tests host tools bench fuzz examples
FORMAT_FILES = $(shell find $(FORMAT_DIRS) -name '*.h' -o -name '*.cpp' 2>/dev/null | sort)

.PHONY: test deps build demo run-demo bench fuzz faults format format-check tidy clean package \
	cross-test licence-check licence-fix $(addprefix suite-,default asan tsan clang)

test: deps licence-check format-check suite-default run-demo suite-asan suite-tsan
	@echo "all test suites passed"

deps:
	@sh scripts/deps.sh

# One configure, build and test run per preset.
define SUITE
suite-$(1):
	cmake --preset $(1)
	cmake --build --preset $(1) -j $$(JOBS)
	ctest --preset $(1)
endef
$(foreach preset,default asan tsan clang,$(eval $(call SUITE,$(preset))))

build: deps
	cmake --preset default
	cmake --build --preset default -j $(JOBS)

# The programs and the plug-in of a build share its bin/ folder.
DEMO := build/default/bin/velt-host demo

# Only what the demo runs, not every test and benchmark.
demo: deps
	cmake --preset default
	cmake --build --preset default -j $(JOBS) --target velt velt-host velt-peer
	$(DEMO)

# The demo as a test: once, with the default suite's build.
run-demo: suite-default
	$(DEMO)

bench: build
	sh scripts/bench.sh build/default/bin

FUZZ_SECONDS ?= 20
fuzz: deps
	cmake --preset fuzz
	cmake --build --preset fuzz -j $(JOBS)
	sh scripts/fuzz.sh build/fuzz $(FUZZ_SECONDS)

# Slow and partly privileged (mounts, network namespaces), so not in make test.
faults: build
	build/default/tests/faults/fault_suite $(FAULTS)

format-check:
	@clang-format --dry-run --Werror $(FORMAT_FILES)
	@echo "formatting is clean"

format:
	clang-format -i $(FORMAT_FILES)

# clang-tidy over the library (and through it hostapi/), the reference host,
# the tools and the example host, with the checks of .clang-tidy; any finding
# fails. Slow, so it is not part of make test.
TIDY_DIRS := src host tools/velt-peer tools/xmlblock tools/velt-host examples
tidy: build
	@command -v run-clang-tidy >/dev/null 2>&1 || \
	  { echo "tidy: run-clang-tidy is missing; install the Debian package clang-tidy" >&2; exit 1; }
	run-clang-tidy -quiet -j $(JOBS) -p build/default $(addsuffix /,$(addprefix $(CURDIR)/,$(TIDY_DIRS)))

# The Debian packages: built by CPack and checked (dpkg-deb, lintian) as the
# package preset's tests.
package:
	@sh scripts/deps.sh package
	cmake --preset package
	cmake --build --preset package -j $(JOBS)
	ctest --preset package
	@ls -1 build/package/packages/*.deb

ARCH ?= arm64
cross-test:
	@sh scripts/deps.sh cross
	@case "$(ARCH)" in arm64|armhf) ;; \
	  *) echo "cross-test: ARCH must be arm64 or armhf, not '$(ARCH)'" >&2; exit 2 ;; esac
	cmake --preset cross-$(ARCH)
	cmake --build --preset cross-$(ARCH) -j $(JOBS)
	ctest --preset cross-$(ARCH)

licence-check:
	@sh scripts/licence-headers.sh --check

licence-fix:
	sh scripts/licence-headers.sh --fix

clean:
	rm -rf build
