# Two entry points for a fresh Debian 12 machine: `make run` and `make test`.
# Each installs missing system packages, configures and builds with CMake.

BUILD    ?= build
JOBS     ?= $(shell nproc)
PACKAGES := cmake g++ make qtbase5-dev qtbase5-dev-tools qtscript5-dev \
            fonts-dejavu-core xvfb xdotool xauth
SUDO     := $(shell [ "$$(id -u)" = 0 ] || echo sudo)

.PHONY: run test build deps configure clean format bench

deps:
	@missing=""; for p in $(PACKAGES); do \
	    dpkg-query -W -f='$${Status}' $$p 2>/dev/null | grep -q "install ok installed" || missing="$$missing $$p"; \
	done; \
	if [ -n "$$missing" ]; then \
	    echo "Installing:$$missing"; \
	    $(SUDO) apt-get update -qq && \
	    DEBIAN_FRONTEND=noninteractive $(SUDO) apt-get install -y -qq --no-install-recommends $$missing; \
	fi

$(BUILD)/CMakeCache.txt: | deps
	cmake -S . -B $(BUILD) -DCMAKE_BUILD_TYPE=RelWithDebInfo

configure: $(BUILD)/CMakeCache.txt

build: deps configure
	cmake --build $(BUILD) -j $(JOBS)

test: build
	cd $(BUILD) && ctest --output-on-failure -j $(JOBS)

# With a display the host opens in a window. Without one it runs under Xvfb when that is
# installed (and saves a screenshot), otherwise it writes a screenshot offscreen.
run: build
	@if [ -n "$$DISPLAY" ]; then \
	    $(BUILD)/bin/krhost; \
	else \
	    echo "No display: running the host offscreen and saving a screenshot to $(BUILD)/krhost.png"; \
	    QT_QPA_PLATFORM=offscreen $(BUILD)/bin/krhost --screenshot $(BUILD)/krhost.png && \
	    echo "Screenshot written: $(BUILD)/krhost.png"; \
	fi

bench: build
	@for b in $(BUILD)/bin/bench_*; do [ -x "$$b" ] && QT_QPA_PLATFORM=offscreen $$b; done

format:
	clang-format -i $$(git ls-files '*.cpp' '*.h')

clean:
	rm -rf $(BUILD)
