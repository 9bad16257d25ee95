# Set-up, build and test on a fresh Debian 12 machine. See README.md.
SHELL := /bin/bash
JOBS ?= $(shell nproc)
BUILD ?= build
ASAN_BUILD ?= build-asan
TSAN_BUILD ?= build-tsan
WIN_BUILD ?= build-win
CMAKE_FLAGS ?=

.PHONY: all deps build demo test test-plain test-asan test-tsan windows test-windows fuzz bench clean

all: build

deps:
	@bash scripts/deps.sh native

$(BUILD)/build.ninja:
	cmake -S . -B $(BUILD) -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DVT_WERROR=ON $(CMAKE_FLAGS)

build: deps $(BUILD)/build.ninja
	cmake --build $(BUILD) -j $(JOBS)

$(ASAN_BUILD)/build.ninja:
	cmake -S . -B $(ASAN_BUILD) -G Ninja -DCMAKE_BUILD_TYPE=Debug -DVT_WERROR=ON -DVT_SANITIZE=ON -DVT_BUILD_BENCH=OFF $(CMAKE_FLAGS)

demo: build
	@bash scripts/demo.sh $(BUILD)

test-plain: build
	ctest --test-dir $(BUILD) --output-on-failure -j $(JOBS)

test-asan: deps $(ASAN_BUILD)/build.ninja
	cmake --build $(ASAN_BUILD) -j $(JOBS)
	ASAN_OPTIONS=detect_leaks=1 UBSAN_OPTIONS=print_stacktrace=1 ctest --test-dir $(ASAN_BUILD) --output-on-failure -j $(JOBS)

$(TSAN_BUILD)/build.ninja:
	cmake -S . -B $(TSAN_BUILD) -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DVT_WERROR=ON -DVT_SANITIZE_THREAD=ON -DVT_BUILD_BENCH=OFF -DVT_BUILD_TOOLS=OFF $(CMAKE_FLAGS)

# Renders and parameter changes on several threads, under ThreadSanitizer.
test-tsan: deps $(TSAN_BUILD)/build.ninja
	cmake --build $(TSAN_BUILD) -j $(JOBS) --target velatone3 vt_integration_tests
	TSAN_OPTIONS="halt_on_error=1 second_deadlock_stack=1" $(TSAN_BUILD)/tests/integration/vt_integration_tests --gtest_filter='ConcurrentRenders*:Locks*'

test: test-plain test-asan test-tsan

$(WIN_BUILD)/build.ninja:
	@bash scripts/deps.sh windows
	cmake -S . -B $(WIN_BUILD) -G Ninja -DCMAKE_TOOLCHAIN_FILE=cmake/mingw-w64.cmake -DCMAKE_BUILD_TYPE=Release -DVT_WERROR=ON -DVT_BUILD_BENCH=OFF $(CMAKE_FLAGS)

windows: $(WIN_BUILD)/build.ninja
	cmake --build $(WIN_BUILD) -j $(JOBS)

test-windows: windows
	bash scripts/wine-test.sh $(WIN_BUILD)

# libFuzzer over every reader, the text form's scan and unflatten, with clang and the sanitizers:
# FUZZ_SECONDS per target (seven targets), new inputs kept in $(FUZZ_BUILD)/corpus, findings as
# $(FUZZ_BUILD)/crash-* (the run stops at the first).
FUZZ_BUILD ?= build-fuzz
FUZZ_SECONDS ?= 90
FUZZ_TARGETS := point_curve arbitrary_map autodesk_lut quantel_lut settings_preset settings_scan settings_unflatten

$(FUZZ_BUILD)/build.ninja:
	CC=clang CXX=clang++ cmake -S . -B $(FUZZ_BUILD) -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DVT_FUZZ=ON -DVT_SANITIZE=ON \
	  -DVT_BUILD_TOOLS=OFF -DVT_BUILD_BENCH=OFF -DCMAKE_C_FLAGS=-fsanitize=fuzzer-no-link \
	  -DCMAKE_CXX_FLAGS=-fsanitize=fuzzer-no-link $(CMAKE_FLAGS)

fuzz: deps $(FUZZ_BUILD)/build.ninja
	cmake --build $(FUZZ_BUILD) -j $(JOBS) --target vt_fuzzers
	@set -e; for t in $(FUZZ_TARGETS); do \
	  mkdir -p $(FUZZ_BUILD)/corpus/$$t; \
	  echo "== $$t: $(FUZZ_SECONDS) s"; \
	  VT_TEST_DATA=$(CURDIR)/tests/data $(FUZZ_BUILD)/tests/fuzz/$${t}_fuzz -max_total_time=$(FUZZ_SECONDS) \
	    -malloc_limit_mb=512 -rss_limit_mb=2048 -timeout=20 -print_final_stats=1 \
	    -artifact_prefix=$(FUZZ_BUILD)/$${t}- $(FUZZ_BUILD)/corpus/$$t tests/fuzz/corpus/$$t \
	    $$(test -d tests/data/$$t && echo tests/data/$$t); \
	done

bench: build
	@for b in $(BUILD)/bench/*_bench; do echo "== $$b"; $$b; done

clean:
	rm -rf $(BUILD) $(ASAN_BUILD) $(TSAN_BUILD) $(WIN_BUILD)
