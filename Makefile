# make run    install what is missing, build, process the demo material
# make test   the same set-up, then every test, also under ASan and UBSan, and
#             the validator's thread checks under TSan
# make bench  realtime factors of plug-ins and kernels
# make compare  ours beside open peers from Debian (installs them as root)
# make screenshots  every editor's picture in docs/editors and the README gallery
# make install [PREFIX=/usr/local]

BUILD_DIR ?= build
ASAN_DIR  ?= build-asan
TSAN_DIR  ?= build-tsan
PREFIX    ?= /usr/local
JOBS      ?= $(shell nproc)
CMAKE     ?= cmake

COMMON_FLAGS := -G Ninja -DZEN_WERROR=ON
ZENFX := $(BUILD_DIR)/bin/zenfx

.PHONY: all setup configure build run test test-release test-asan test-tsan bench compare screenshots install clean

all: build

setup:
	@scripts/install-deps.sh

configure: setup
	@$(CMAKE) -S . -B $(BUILD_DIR) $(COMMON_FLAGS) >/dev/null

build: configure
	@$(CMAKE) --build $(BUILD_DIR) -j $(JOBS)

run: build
	@$(ZENFX) demo -o $(BUILD_DIR)/demo-input.wav
	@$(ZENFX) process -o $(BUILD_DIR)/demo-output.wav \
	    --plugin "De-Esser" \
	    --plugin "Reverb" --preset "Studio Live Room" \
	    --plugin "Soft Clipper" --preset "Gentle Rounding" \
	    --plugin "Limiter" --set Ceiling=-1 \
	    --meters-json $(BUILD_DIR)/demo-meters.json
	@echo "Listen to $(BUILD_DIR)/demo-input.wav and $(BUILD_DIR)/demo-output.wav"

test: test-release test-asan test-tsan

test-release: build
	cd $(BUILD_DIR) && ctest --output-on-failure -j $(JOBS)

# Assertions stay live (Debug) at -O1 so the tests run at a usable speed.
test-asan: setup
	@$(CMAKE) -S . -B $(ASAN_DIR) $(COMMON_FLAGS) -DZEN_SANITIZE=ON -DZEN_BUILD_BENCHMARKS=OFF \
	    -DCMAKE_BUILD_TYPE=Debug "-DCMAKE_CXX_FLAGS_DEBUG=-g -O1" >/dev/null
	@$(CMAKE) --build $(ASAN_DIR) -j $(JOBS)
	cd $(ASAN_DIR) && ASAN_OPTIONS=detect_leaks=1:abort_on_error=1 UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1 \
	    ctest --output-on-failure -j $(JOBS)

# The validator's thread checks under ThreadSanitizer; only the library, zenfx
# and the test libraries are built.
test-tsan: setup
	@$(CMAKE) -S . -B $(TSAN_DIR) $(COMMON_FLAGS) -DZEN_SANITIZE_THREAD=ON -DZEN_BUILD_BENCHMARKS=OFF \
	    -DCMAKE_BUILD_TYPE=Debug "-DCMAKE_CXX_FLAGS_DEBUG=-g -O1" >/dev/null
	@$(CMAKE) --build $(TSAN_DIR) -j $(JOBS) --target zenfx ZenTestPlugins ZenFaultyPlugins
	cd $(TSAN_DIR) && ctest --output-on-failure -j $(JOBS)

bench: build
	$(BUILD_DIR)/bin/ZenBenchmarks --benchmark_counters_tabular=true

# Not a test: prints one table, ours beside each peer on the same material.
compare: build
	@bench/peers.sh $(BUILD_DIR)

screenshots: build
	@scripts/screenshots.sh $(BUILD_DIR) $(JOBS)

install: build
	$(CMAKE) --install $(BUILD_DIR) --prefix $(PREFIX)

clean:
	rm -rf $(BUILD_DIR) $(ASAN_DIR) $(TSAN_DIR)
