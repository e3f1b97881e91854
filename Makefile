# Quick start: `make demo` and `make test`. Everything else is for developers.
.PHONY: deps build demo test test-asan bench format clean

JOBS ?= 2
CLI := build/release/apps/nrsynth/nrsynth
DEMO_WAVE ?= examples/ssb_case_c_30khz.json

deps:
	@bash scripts/deps.sh

build: deps
	@cmake --preset release >/dev/null
	@cmake --build --preset release -j $(JOBS)

demo: build
	@bash scripts/demo.sh $(CLI) $(DEMO_WAVE)

test: build
	@ctest --preset release

test-asan: deps
	@cmake --preset asan >/dev/null
	@cmake --build --preset asan -j $(JOBS)
	@ctest --preset asan

bench: build
	@build/release/bench/nrsynth_bench

format:
	@find src apps tests bench include -name '*.cpp' -o -name '*.h' -o -name '*.c' | xargs clang-format -i

clean:
	@rm -rf build
