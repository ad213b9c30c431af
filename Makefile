# Entry points: `make demo`, `make test`, `make bench`, `make fuzz`.
# Build trees: build/ (native), build-asan/ (native under the
# AddressSanitizer and UndefinedBehaviorSanitizer), build-win/ (32-bit
# Windows, run under wine), build-tsan/ (the thread test under the
# ThreadSanitizer), build-fuzz/ (clang: the libFuzzer target).

JOBS ?= $(shell nproc 2>/dev/null || echo 2)
CMAKE ?= cmake

.PHONY: all setup native asan win demo test test-native test-asan test-win test-tsan bench bench-win dist fuzz fuzz-seeds clean

all: native

setup:
	@bash scripts/setup.sh

build/CMakeCache.txt:
	$(CMAKE) -S . -B build -DCMAKE_BUILD_TYPE=Release
build-asan/CMakeCache.txt:
	$(CMAKE) -S . -B build-asan -DCMAKE_BUILD_TYPE=RelWithDebInfo -DZOR_SANITIZE=ON
build-tsan/CMakeCache.txt:
	$(CMAKE) -S . -B build-tsan -DCMAKE_BUILD_TYPE=RelWithDebInfo -DZOR_SANITIZE_THREAD=ON
build-fuzz/CMakeCache.txt:
	CC=clang CXX=clang++ $(CMAKE) -S . -B build-fuzz -DCMAKE_BUILD_TYPE=RelWithDebInfo \
	    -DZOR_SANITIZE=ON -DZOR_FUZZ=ON
build-win/CMakeCache.txt:
	$(CMAKE) -S . -B build-win -DCMAKE_BUILD_TYPE=Release \
	    -DCMAKE_TOOLCHAIN_FILE=cmake/toolchain-mingw32.cmake

native: setup build/CMakeCache.txt
	$(CMAKE) --build build -j $(JOBS)
asan: setup build-asan/CMakeCache.txt
	$(CMAKE) --build build-asan -j $(JOBS)
win: setup build-win/CMakeCache.txt
	$(CMAKE) --build build-win -j $(JOBS)

# The gallery: every family on the bundled photograph and speech clip,
# written to build/gallery/ (open index.html).  Builds only the library and
# the tool.
demo: setup build/CMakeCache.txt
	$(CMAKE) --build build -j $(JOBS) --target zor_tool
	./build/tools/zor demo --out build/gallery

test-native: native
	cd build && ctest --output-on-failure
test-asan: asan
	cd build-asan && ASAN_OPTIONS=detect_leaks=1 UBSAN_OPTIONS=print_stacktrace=1 \
	    ctest --output-on-failure
test-win: win
	cd build-win && ctest --output-on-failure

# Only the thread test runs under the ThreadSanitizer.
test-tsan: setup build-tsan/CMakeCache.txt
	$(CMAKE) --build build-tsan -j $(JOBS) --target zor_threads
	cd build-tsan && TSAN_OPTIONS=halt_on_error=1 ctest --output-on-failure -R '^threads$$'

test: test-native test-asan test-win test-tsan
	@echo "all suites passed: native, sanitizers, wine, threads"

# Three repetitions of each workload, zor and peer in alternation: the table
# pairs their medians, which shared machines need.  BENCH_ARGS adds to these
# (a filter, more repetitions); BENCH_REPEAT= turns them off.
BENCH_REPEAT ?= --benchmark_repetitions=3 --benchmark_enable_random_interleaving=true
bench: native
	./build/bench/zor_bench $(BENCH_REPEAT) $(BENCH_ARGS)

# The release archives in dist/: a Linux tarball from build/ and a Windows
# zip (DLL, import library, .def, header, README) from build-win/.
dist: native win
	$(CMAKE) -DNATIVE=build -DWIN=build-win -DSOURCE=. -DOUT=dist -P cmake/Dist.cmake

# zor alone on the same workloads, as the x86-64 library and as the 32-bit
# DLL under wine, side by side with the ratio DLL / x86-64.
# BENCH_VARIANTS=4,1,0 adds the DLL's x87 variants; see scripts/bench-win.sh.
bench-win: setup build/CMakeCache.txt build-win/CMakeCache.txt
	$(CMAKE) --build build -j $(JOBS) --target zor_variant_bench
	$(CMAKE) --build build-win -j $(JOBS) --target zor_variant_bench
	bash scripts/bench-win.sh

# The libFuzzer target for FUZZ_SECONDS, growing build-fuzz/corpus from the
# seeds (`make fuzz-seeds`: the argument sets of the unit tests).  Calls made
# and anything found are printed at the end; a finding leaves crash-* files.
FUZZ_SECONDS ?= 300
fuzz: setup build-fuzz/CMakeCache.txt
	$(CMAKE) --build build-fuzz -j $(JOBS) --target zor_fuzz
	mkdir -p build-fuzz/corpus build-fuzz/seeds
	cd build-fuzz && ZOR_FUZZ_QUIET=1 ./tests/fuzz/zor_fuzz -max_total_time=$(FUZZ_SECONDS) \
	    -rss_limit_mb=4096 -timeout=30 -print_final_stats=1 $(FUZZ_ARGS) corpus seeds
fuzz-seeds: native build-fuzz/CMakeCache.txt
	ZT_RECORD_CALLS=$(CURDIR)/build/recorded-calls.txt ./build/tests/zor_unit --gtest_brief=1 >/dev/null
	mkdir -p build-fuzz/seeds
	./build/tests/fuzz/zor_calls --encode build/recorded-calls.txt build-fuzz/seeds

clean:
	rm -rf build build-asan build-win build-tsan build-fuzz dist
