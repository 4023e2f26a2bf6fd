# make demo   installs what is missing, builds, runs the demonstration
# make test   installs what is missing, builds, runs every test under AddressSanitizer and
#             UndefinedBehaviorSanitizer, the concurrency tests under ThreadSanitizer, and each
#             fuzz target for a fixed number of runs; prints its total time at the end
# make bench  builds and runs the benchmarks (optimised build), writes their JSON to bench-out/,
#             runs the python-can peer when its Debian package is there, and draws bench-out/bench.svg
# make stress runs the soak for STRESS_SECONDS under AddressSanitizer and UndefinedBehaviorSanitizer,
#             then under ThreadSanitizer; fails if either run fails

JOBS ?= $(shell nproc)
DEPS := libboost-dev pkg-config libgtest-dev libgmock-dev libbenchmark-dev cmake ninja-build g++ binutils \
        clang libclang-rt-14-dev
CMAKE_FLAGS := -G Ninja -DKVSV_WERROR=ON
# The sanitizer trees need line tables for their reports, not full debug information.
SANITIZER_FLAGS := $(CMAKE_FLAGS) -DCMAKE_BUILD_TYPE=Debug -DCMAKE_C_FLAGS_DEBUG=-g1 \
        -DCMAKE_CXX_FLAGS_DEBUG=-g1 -DKVSV_BUILD_DEMO=OFF

.PHONY: all deps build demo test test-asan test-tsan test-fuzz bench bench-deps stress stress-asan stress-tsan \
        clean

all: build

deps:
	@missing=""; for p in $(DEPS); do dpkg -s $$p >/dev/null 2>&1 || missing="$$missing $$p"; done; \
	if [ -n "$$missing" ]; then \
	  echo "installing:$$missing"; \
	  if [ "$$(id -u)" -eq 0 ]; then sudo=""; else sudo="sudo"; fi; \
	  $$sudo apt-get update -q && $$sudo env DEBIAN_FRONTEND=noninteractive apt-get install -y -q $$missing; \
	fi

build: deps
	cmake -S . -B build $(CMAKE_FLAGS) -DCMAKE_BUILD_TYPE=RelWithDebInfo
	cmake --build build -j $(JOBS)

demo: build
	./build/demo/kvsv-demo

test-asan: deps
	cmake -S . -B build-asan $(SANITIZER_FLAGS) -DKVSV_SANITIZE=address,undefined
	cmake --build build-asan -j $(JOBS)
	ASAN_OPTIONS=detect_leaks=1:abort_on_error=1 UBSAN_OPTIONS=print_stacktrace=1 \
	  ctest --test-dir build-asan --output-on-failure -j $(JOBS)

test-tsan: deps
	cmake -S . -B build-tsan $(SANITIZER_FLAGS) -DKVSV_SANITIZE=thread
	cmake --build build-tsan -j $(JOBS) --target concurrency_tests
	TSAN_OPTIONS=halt_on_error=1 ctest --test-dir build-tsan --output-on-failure -j $(JOBS) -L concurrency

FUZZ_RUNS ?= 4000

# Each fuzzer X_fuzzer starts from fuzz/corpus/X and keeps what it finds in build-fuzz only.
test-fuzz: deps
	CC=clang CXX=clang++ cmake -S . -B build-fuzz $(CMAKE_FLAGS) -DCMAKE_BUILD_TYPE=Debug \
	  -DCMAKE_C_FLAGS_DEBUG=-g1 -DCMAKE_CXX_FLAGS_DEBUG=-g1 -DKVSV_BUILD_TESTS=OFF \
	  -DKVSV_BUILD_DEMO=OFF -DKVSV_BUILD_FUZZ=ON
	cmake --build build-fuzz -j $(JOBS)
	@for fuzzer in build-fuzz/fuzz/*_fuzzer; do \
	  name=$$(basename $$fuzzer _fuzzer); mkdir -p build-fuzz/found/$$name; \
	  echo "fuzzing $$name for $(FUZZ_RUNS) runs"; \
	  $$fuzzer -runs=$(FUZZ_RUNS) -print_final_stats=1 build-fuzz/found/$$name \
	    fuzz/corpus/$$name || exit 1; \
	done

test: deps
	@start=$$(date +%s); \
	$(MAKE) --no-print-directory test-asan test-tsan test-fuzz; status=$$?; \
	echo "make test: $$(( $$(date +%s) - start )) s in all"; exit $$status

# The peer of the end-to-end benchmarks; its absence only skips the peer.
PEER_PYTHON ?= /usr/bin/python3

bench-deps: deps
	@dpkg -s python3-can >/dev/null 2>&1 || { \
	  if [ "$$(id -u)" -eq 0 ]; then sudo=""; else sudo="sudo"; fi; \
	  { $$sudo apt-get update -q && $$sudo env DEBIAN_FRONTEND=noninteractive apt-get install -y -q python3-can; } || \
	  echo "python3-can could not be installed: the peer will be skipped"; }

bench: bench-deps
	cmake -S . -B build-bench $(CMAKE_FLAGS) -DCMAKE_BUILD_TYPE=Release -DKVSV_BUILD_TESTS=OFF \
	  -DKVSV_BUILD_DEMO=OFF -DKVSV_BUILD_BENCH=ON
	cmake --build build-bench -j $(JOBS)
	mkdir -p bench-out
	./build-bench/bench/kvsvbench --benchmark_out=bench-out/kvsvbench.json \
	  --benchmark_out_format=json
	@rm -f bench-out/python_can_peer.json; \
	if $(PEER_PYTHON) -c "import can" 2>/dev/null; then \
	  $(PEER_PYTHON) bench/python_can_peer.py --frames 200000 | tee bench-out/python_can_peer.json; \
	else echo "python-can peer skipped: python3-can is not installed"; fi
	python3 bench/plot_bench.py bench-out

STRESS_SECONDS ?= 60

# Trees of their own, so that a soak never builds into the trees of make test while it runs.
stress-asan: deps
	cmake -S . -B build-stress-asan $(SANITIZER_FLAGS) -DKVSV_SANITIZE=address,undefined
	cmake --build build-stress-asan -j $(JOBS) --target kvsv_soak
	ASAN_OPTIONS=detect_leaks=1:abort_on_error=1 UBSAN_OPTIONS=print_stacktrace=1 \
	  ./build-stress-asan/stress/kvsv_soak $(STRESS_SECONDS)

stress-tsan: deps
	cmake -S . -B build-stress-tsan $(SANITIZER_FLAGS) -DKVSV_SANITIZE=thread
	cmake --build build-stress-tsan -j $(JOBS) --target kvsv_soak
	TSAN_OPTIONS=halt_on_error=1 ./build-stress-tsan/stress/kvsv_soak $(STRESS_SECONDS)

# Both runs happen even when the first fails.
stress: deps
	@status=0; \
	$(MAKE) --no-print-directory stress-asan || status=1; \
	$(MAKE) --no-print-directory stress-tsan || status=1; \
	exit $$status

clean:
	rm -rf bench-out build build-asan build-tsan build-bench build-fuzz build-stress-asan build-stress-tsan
