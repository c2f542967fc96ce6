# The two commands of the README, and a few more.
#   make demo    the simulated device with the program behind a real web server
#   make test    build and pass every test (also under ASan+UBSan with SANITIZE=1)
#   make bench   the benchmark ratios
#   make fuzz    the fuzz targets (clang), each for FUZZ_SECONDS (default 60)
BUILD ?= build
ASAN_BUILD ?= build-asan
JOBS ?= 2
PORT ?= 8080
DEMO ?= demo-device
FUZZ_SECONDS ?= 60
FUZZ_BUILD ?= build-fuzz

.PHONY: all setup build test test-asan bench demo fuzz clean

all: build

setup:
	@scripts/setup-machine

build: setup
	@cmake -S . -B $(BUILD) -DCMAKE_BUILD_TYPE=RelWithDebInfo >/dev/null
	@cmake --build $(BUILD) -j$(JOBS)

CTEST = ctest -j$(JOBS) --output-on-failure

test: build
	@cd $(BUILD) && $(CTEST)

test-asan: setup
	@cmake -S . -B $(ASAN_BUILD) -DCMAKE_BUILD_TYPE=Debug -DNAS_SANITIZE=ON >/dev/null
	@cmake --build $(ASAN_BUILD) -j$(JOBS)
	@cd $(ASAN_BUILD) && $(CTEST)

bench: build
	@NAS_BUILD=$(abspath $(BUILD)) bench/run

demo: build
	@scripts/demo $(DEMO) $(PORT)

fuzz:
	@scripts/setup-machine fuzz
	@FUZZ_SECONDS=$(FUZZ_SECONDS) FUZZ_BUILD=$(FUZZ_BUILD) JOBS=$(JOBS) fuzz/run

clean:
	rm -rf $(BUILD) $(ASAN_BUILD) $(FUZZ_BUILD)
