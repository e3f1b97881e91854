# Quick start: `make demo` and `make test`. Everything else is for developers.
.PHONY: help deps build demo test test-asan fuzz fuzz-ci bench format clean

JOBS ?= 2
FUZZ_SECONDS ?= 600
CLI := build/release/apps/nrsynth/nrsynth
DEMO_WAVE ?= examples/ssb_case_c_30khz.json

help:
	@echo "make demo            install deps, build the library and the CLI, generate the default example"
	@echo "                     waveform and draw its spectrum and resource grid"
	@echo "make test            install deps, build (g++, release) and run the test suite"
	@echo "make test-asan       the same suite under ASan + UBSan (clang); builds the fuzz targets"
	@echo "make fuzz            run each fuzz target FUZZ_SECONDS (default 600) seconds"
	@echo "make fuzz-ci         run each fuzz target of the asan build for a minute"
	@echo "make bench           run the benchmarks"
	@echo "make format          clang-format the sources"
	@echo "make clean           remove build/"

deps:
	@bash scripts/deps.sh

build: deps
	@cmake --preset release >/dev/null
	@cmake --build --preset release -j $(JOBS)

# The demo needs the library and the command-line tool only; `make test` builds the rest.
demo: deps
	@cmake --preset release >/dev/null
	@cmake --build --preset release -j $(JOBS) --target nrsynth-cli
	@bash scripts/demo.sh $(CLI) $(DEMO_WAVE)

test: build
	@ctest --preset release

test-asan: deps
	@cmake --preset asan >/dev/null
	@cmake --build --preset asan -j $(JOBS)
	@ctest --preset asan

# The fuzz targets are part of the sanitizer build (clang, ASan + UBSan, libFuzzer).
fuzz: deps
	@cmake --preset asan >/dev/null
	@cmake --build --preset asan -j $(JOBS) --target nrsynth_fuzz_document nrsynth_fuzz_valid_document nrsynth_fuzz_dictionary
	@bash scripts/fuzz.sh $(FUZZ_SECONDS)

# CI: a minute per fuzz target on what `make test-asan` built.
fuzz-ci:
	@bash scripts/fuzz.sh 60

bench: build
	@build/release/bench/nrsynth_bench

format:
	@find src apps tests bench include -name '*.cpp' -o -name '*.h' -o -name '*.c' | xargs clang-format -i

clean:
	@rm -rf build
