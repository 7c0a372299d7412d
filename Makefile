# Thin wrapper over the CMake presets.
#   make test   builds and runs every test suite (default, asan and tsan builds)
#   make build  builds the default preset only
#   make bench  builds the default preset and runs the benchmarks (short runs)
#   make fuzz   builds the fuzz preset and runs each fuzz target for
#               FUZZ_SECONDS (default 20) from its seed corpus
#   make format applies clang-format; make format-check only checks

SHELL := /bin/sh
JOBS ?= 2
# Ninja when present, make otherwise.
export CMAKE_GENERATOR ?= $(if $(shell command -v ninja 2>/dev/null),Ninja,Unix Makefiles)
FORMAT_DIRS := src hostapi tests host tools bench fuzz examples
FORMAT_FILES = $(shell find $(FORMAT_DIRS) -name '*.h' -o -name '*.cpp' 2>/dev/null | sort)

.PHONY: test deps build bench fuzz format format-check tidy clean $(addprefix suite-,default asan tsan clang)

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

bench: build
	sh scripts/bench.sh build/default/bench

FUZZ_SECONDS ?= 20
fuzz: deps
	cmake --preset fuzz
	cmake --build --preset fuzz -j $(JOBS)
	sh scripts/fuzz.sh build/fuzz $(FUZZ_SECONDS)

format-check:
	@clang-format --dry-run --Werror $(FORMAT_FILES)
	@echo "formatting is clean"

format:
	clang-format -i $(FORMAT_FILES)

tidy: build
	run-clang-tidy -quiet -p build/default $(CURDIR)/src $(CURDIR)/host $(CURDIR)/tools

clean:
	rm -rf build
