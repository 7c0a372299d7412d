# Thin wrapper over the CMake presets.
#   make test   builds and runs every test suite (default, asan and tsan builds)
#   make build  builds the default preset only
#   make format applies clang-format; make format-check only checks
#   make tidy   runs clang-tidy on the default build and fails on any finding

SHELL := /bin/sh
JOBS ?= 2
# Ninja when present, make otherwise.
export CMAKE_GENERATOR ?= $(if $(shell command -v ninja 2>/dev/null),Ninja,Unix Makefiles)
FORMAT_DIRS := src hostapi tests host tools bench fuzz examples
FORMAT_FILES = $(shell find $(FORMAT_DIRS) -name '*.h' -o -name '*.cpp' 2>/dev/null | sort)

.PHONY: test deps build format format-check tidy clean $(addprefix suite-,default asan tsan clang)

test: deps format-check suite-default suite-asan suite-tsan
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

format-check:
	@clang-format --dry-run --Werror $(FORMAT_FILES)
	@echo "formatting is clean"

format:
	clang-format -i $(FORMAT_FILES)

# clang-tidy over the library (and through it hostapi/), the reference host
# and the finished tools, with the checks of .clang-tidy; any finding fails.
# Slow, so it is not part of make test.
TIDY_DIRS := src host tools/velt-peer tools/xmlblock
tidy: build
	@command -v run-clang-tidy >/dev/null 2>&1 || \
	  { echo "tidy: run-clang-tidy is missing; install the Debian package clang-tidy" >&2; exit 1; }
	run-clang-tidy -quiet -j $(JOBS) -p build/default $(addsuffix /,$(addprefix $(CURDIR)/,$(TIDY_DIRS)))

clean:
	rm -rf build
