# make demo   installs what is missing, builds, runs the demonstration
# make test   installs what is missing, builds, runs every test: plain, under AddressSanitizer and
#             UndefinedBehaviorSanitizer, and the concurrency tests under ThreadSanitizer
# make bench  builds and runs the benchmarks (optimised build)
# make test-fuzz  builds the libFuzzer targets with clang and runs each for a short time over its
#             seed corpus in fuzz/corpus

JOBS ?= $(shell nproc)
DEPS := libboost-dev pkg-config libgtest-dev libgmock-dev libbenchmark-dev cmake ninja-build g++ binutils \
        clang libclang-rt-14-dev
CMAKE_FLAGS := -G Ninja -DKVSV_WERROR=ON

.PHONY: all deps build demo test test-plain test-asan test-tsan test-fuzz bench clean

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

test-plain: build
	ctest --test-dir build --output-on-failure -j $(JOBS)

test-asan: deps
	cmake -S . -B build-asan $(CMAKE_FLAGS) -DCMAKE_BUILD_TYPE=Debug -DKVSV_BUILD_DEMO=OFF \
	  -DKVSV_SANITIZE=address,undefined
	cmake --build build-asan -j $(JOBS)
	ASAN_OPTIONS=detect_leaks=1:abort_on_error=1 UBSAN_OPTIONS=print_stacktrace=1 \
	  ctest --test-dir build-asan --output-on-failure -j $(JOBS)

test-tsan: deps
	cmake -S . -B build-tsan $(CMAKE_FLAGS) -DCMAKE_BUILD_TYPE=Debug -DKVSV_BUILD_DEMO=OFF \
	  -DKVSV_SANITIZE=thread
	cmake --build build-tsan -j $(JOBS) --target concurrency_tests
	TSAN_OPTIONS=halt_on_error=1 ctest --test-dir build-tsan --output-on-failure -j $(JOBS) -L concurrency

FUZZ_SECONDS ?= 20

# Each fuzzer X_fuzzer starts from fuzz/corpus/X and keeps what it finds in build-fuzz only.
test-fuzz: deps
	CC=clang CXX=clang++ cmake -S . -B build-fuzz $(CMAKE_FLAGS) -DCMAKE_BUILD_TYPE=RelWithDebInfo \
	  -DKVSV_BUILD_TESTS=OFF -DKVSV_BUILD_DEMO=OFF -DKVSV_BUILD_FUZZ=ON
	cmake --build build-fuzz -j $(JOBS)
	@for fuzzer in build-fuzz/fuzz/*_fuzzer; do \
	  name=$$(basename $$fuzzer _fuzzer); mkdir -p build-fuzz/found/$$name; \
	  echo "fuzzing $$name for $(FUZZ_SECONDS) s"; \
	  $$fuzzer -max_total_time=$(FUZZ_SECONDS) -print_final_stats=1 build-fuzz/found/$$name \
	    fuzz/corpus/$$name || exit 1; \
	done

test: test-plain test-asan test-tsan test-fuzz

bench: deps
	cmake -S . -B build-bench $(CMAKE_FLAGS) -DCMAKE_BUILD_TYPE=Release -DKVSV_BUILD_TESTS=OFF \
	  -DKVSV_BUILD_DEMO=OFF -DKVSV_BUILD_BENCH=ON
	cmake --build build-bench -j $(JOBS)
	./build-bench/bench/kvsvbench

clean:
	rm -rf build build-asan build-tsan build-bench build-fuzz
