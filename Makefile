# The two commands of the README, and a few more.
#   make demo    the simulated device with the program behind a real web server
#   make test    build and pass every test (also under ASan+UBSan with SANITIZE=1)
#   make bench   the benchmark ratios
#   make fuzz    the fuzz targets (clang), each for FUZZ_SECONDS (default 60)
#   make cross-test ARCH=armhf|arm64
#                the unit, device and web server tests of an ARM build under qemu-user
#   make install DESTDIR=...   the program, the console and the docs (stripped); the
#                paths: NAS_CGI_DIR, NAS_WEB_DIR, NAS_DOC_DIR (see CMakeLists.txt)
#   make deb ARCH=amd64|armhf|arm64   Debian packages in packages/
BUILD ?= build
ASAN_BUILD ?= build-asan
JOBS ?= 2
PORT ?= 8080
DEMO ?= demo-device
FUZZ_SECONDS ?= 60
FUZZ_BUILD ?= build-fuzz
ARCH ?= armhf
CROSS_BUILD ?= build-$(ARCH)

.PHONY: all setup build test test-asan bench demo fuzz cross-build cross-test install deb clean

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

cross-build:
	@scripts/setup-machine $(ARCH)
	@cmake -S . -B $(CROSS_BUILD) -DCMAKE_TOOLCHAIN_FILE=cmake/toolchains/$(ARCH).cmake -DBUILD_TESTING=ON \
	  -DCMAKE_BUILD_TYPE=RelWithDebInfo >/dev/null
	@cmake --build $(CROSS_BUILD) -j$(JOBS)

cross-test: cross-build
	@cd $(CROSS_BUILD) && ctest -j$(JOBS) --output-on-failure -L '^(unit|device|http)$$'

# Paths given on the command line reach the build's cache.
INSTALL_PATHS = $(foreach v,NAS_CGI_DIR NAS_WEB_DIR NAS_DOC_DIR NAS_LIB_DIR,$(if $($(v)),-D$(v)=$($(v))))

install: build
	@$(if $(INSTALL_PATHS),cmake -S . -B $(BUILD) $(INSTALL_PATHS) >/dev/null)
	@DESTDIR=$(DESTDIR) cmake --install $(BUILD) --component program --strip

deb:
	@$(MAKE) --no-print-directory $(if $(filter amd64,$(ARCH)),build,cross-build ARCH=$(ARCH))
	@scripts/make-deb $(ARCH) $(if $(filter amd64,$(ARCH)),$(BUILD),$(CROSS_BUILD)) packages

clean:
	rm -rf $(BUILD) $(ASAN_BUILD) $(FUZZ_BUILD) build-armhf build-arm64
