# Thin wrapper over the CMake presets.
#   make test   builds and runs every test suite (default, asan and tsan builds)
#               and the demo once, after the default suite
#   make build  builds the default preset only
#   make demo   builds the default preset and runs velt-host's demo
#   make bench  builds the default preset and runs the benchmarks (short runs)
#   make fuzz   builds the fuzz preset and runs each fuzz target for
#               FUZZ_SECONDS (default 20) from its seed corpus
#   make faults builds the default preset and runs the fault suite
#               (docs/reliability.md; FAULTS="case ..." picks cases)
#   make format applies clang-format; make format-check only checks
#   make tidy   runs clang-tidy on the default build and fails on any finding

SHELL := /bin/sh
JOBS ?= 2
# Ninja when present, make otherwise.
export CMAKE_GENERATOR ?= $(if $(shell command -v ninja 2>/dev/null),Ninja,Unix Makefiles)
FORMAT_DIRS := src hostapi tests host tools bench fuzz examples
FORMAT_FILES = $(shell find $(FORMAT_DIRS) -name '*.h' -o -name '*.cpp' 2>/dev/null | sort)

.PHONY: test deps build demo run-demo bench fuzz faults format format-check tidy clean \
	$(addprefix suite-,default asan tsan clang)

test: deps format-check suite-default run-demo suite-asan suite-tsan
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

demo: build
	$(DEMO)

# The demo as a test: once, with the default suite's build.
run-demo: suite-default
	$(DEMO)

bench: build
	sh scripts/bench.sh build/default/bench

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

clean:
	rm -rf build
