# Front door: `make demo` and `make test`. Everything else is CMake underneath.
BUILD      ?= build
ASAN_BUILD ?= build-asan
TSAN_BUILD ?= build-tsan
FUZZ_BUILD ?= build-fuzz
FUZZ_SECONDS ?= 180
FUZZ_TARGETS ?=
JOBS       ?= $(shell nproc)
PREFIX     ?= /usr/local
GENERATOR  := $(shell command -v ninja >/dev/null 2>&1 && echo "-G Ninja")

.PHONY: all deps build demo demo-real test test-asan test-tsan fuzz install clean bench deb rpm

all: build

deps:
	@scripts/install-deps.sh

$(BUILD)/CMakeCache.txt:
	cmake -S . -B $(BUILD) $(GENERATOR) -DCMAKE_INSTALL_PREFIX=$(PREFIX)

build: deps $(BUILD)/CMakeCache.txt
	cmake --build $(BUILD) -j $(JOBS)

demo: build
	@scripts/demo.sh $(BUILD)

# The same tour over this machine's real adapters (the adapter library's sysfs source).
demo-real: build
	@DEMO_SOURCE=sysfs scripts/demo.sh $(BUILD)

# The plain build runs every test; the sanitizer builds run them again.
test: build
	cd $(BUILD) && ctest --output-on-failure -j $(JOBS)
	$(MAKE) --no-print-directory test-asan

test-asan: deps
	@[ -f $(ASAN_BUILD)/CMakeCache.txt ] || cmake -S . -B $(ASAN_BUILD) $(GENERATOR) -DVEXLAN_SANITIZE=address -DCMAKE_BUILD_TYPE=Debug
	cmake --build $(ASAN_BUILD) -j $(JOBS)
	cd $(ASAN_BUILD) && ASAN_OPTIONS=detect_leaks=1:abort_on_error=1 UBSAN_OPTIONS=print_stacktrace=1 ctest --output-on-failure -j $(JOBS)

test-tsan: deps
	@[ -f $(TSAN_BUILD)/CMakeCache.txt ] || cmake -S . -B $(TSAN_BUILD) $(GENERATOR) -DVEXLAN_SANITIZE=thread -DCMAKE_BUILD_TYPE=Debug
	cmake --build $(TSAN_BUILD) -j $(JOBS)
	cd $(TSAN_BUILD) && ctest --output-on-failure -L threaded -j $(JOBS)

# The libFuzzer programs of tests/fuzz in their own clang tree (ASan+UBSan),
# each run FUZZ_SECONDS under tests/isolate.sh; FUZZ_TARGETS picks some of them.
fuzz:
	@scripts/install-deps.sh clang libclang-rt-dev
	@[ -f $(FUZZ_BUILD)/CMakeCache.txt ] || cmake -S . -B $(FUZZ_BUILD) $(GENERATOR) -DCMAKE_C_COMPILER=clang -DCMAKE_CXX_COMPILER=clang++ -DVEXLAN_SANITIZE=address -DVEXLAN_FUZZ=ON
	cmake --build $(FUZZ_BUILD) -j $(JOBS) --target fuzzers
	tests/fuzz/run.sh $(FUZZ_BUILD) $(FUZZ_SECONDS) $(FUZZ_TARGETS)

# The installed provider's run path names the prefix's library directory, so
# the build tree learns the prefix before installing.
install: build
	cmake -DCMAKE_INSTALL_PREFIX=$(PREFIX) $(BUILD) > /dev/null
	cmake --build $(BUILD) -j $(JOBS)
	cmake --install $(BUILD) --prefix $(PREFIX)

# The benchmark: builds the driver, runs every scenario under callgrind on
# generated hosts (isolated /opt and /var/tmp) and writes docs/performance.md
# with its plot. Not part of `make test`. BENCH_SIZES=1,16 for a quick look;
# BENCH_WALK_SIZES are the sizes of the runs that count only the fixed cost of
# a request and the walks from one element (their table covers 64 to 4,096 FC
# functions).
BENCH_SIZES ?= 1,16,256,1024
BENCH_WALK_SIZES ?= 16,64,256,1024
bench: build
	@scripts/install-bench-tools.sh
	cmake --build $(BUILD) -j $(JOBS) --target vexlan_bench
	ISOLATE_KEEP_CWD=1 tests/isolate.sh python3 bench/run_bench.py --build $(abspath $(BUILD)) --sizes $(BENCH_SIZES) --walk-sizes $(BENCH_WALK_SIZES) --out $(abspath docs/performance.md)

# The Debian package, from the plain build tree: $(BUILD)/vexlan-cna-provider_<version>_<arch>.deb
deb: build
	@scripts/install-deb-tools.sh
	scripts/make-deb.sh $(BUILD) $(BUILD)

# The RPM, from the plain build tree with rpmbuild and packaging/vexlan-cna-provider.rpmbuild:
# $(BUILD)/vexlan-cna-provider-<version>-1.<arch>.rpm
rpm: build
	@scripts/install-rpm-tools.sh
	scripts/make-rpm.sh $(BUILD) $(BUILD)

clean:
	rm -rf $(BUILD) $(ASAN_BUILD) $(TSAN_BUILD) $(FUZZ_BUILD)
